#include "cli/commands.h"
#include "cli/options.h"
#include "platform/connection.h"
#include "schema/demo_data.h"
#include "schema/schema.h"
#include "settings/login.h"
#include "settings/settings_location.h"

#include <QDir>
#include <QFileInfo>
#include <cstdio>

namespace quotas::cli {

int initDb(const QStringList& args)
{
    const Options options(QStringLiteral("init-db"), args);
    const int demo = options.isSet(QStringLiteral("demo")) ? options.number(QStringLiteral("demo"), 0, 10000000) : 0;
    LoginSettings settings;
    QString missing;
    if (!readLoginSettings(settings, &missing))
        missingSetting(missing);
    Connection connection(QStringLiteral("init-db"));
    connection.setConnectionString(connectionString(settings));
    const ConnectionTarget target = ConnectionTarget::fromConnectionString(connection.connectionString());
    if (target.engine == Engine::SQLite)
        QDir().mkpath(QFileInfo(target.file).absolutePath());
    connection.open(Connection::OpenMode::CreateIfMissing);
    const QStringList created = createSchema(connection);
    // Members the host numbered itself must not meet the demo's.
    moveSequencesPastKeys(connection);
    QString report = created.isEmpty() ? QStringLiteral("A base de dados já tinha todas as tabelas.\n")
                                       : QStringLiteral("Tabelas criadas: %1.\n").arg(created.join(QStringLiteral(", ")));
    if (demo > 0)
        report += QStringLiteral("%1 associados de demonstração adicionados.\n").arg(addDemoMembers(connection, demo));
    // A separate step: the tables are there whatever it finds.
    report += addIndexes(connection).text();
    std::fputs(report.toUtf8().constData(), stdout);
    return 0;
}

}  // namespace quotas::cli
