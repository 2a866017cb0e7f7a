#include "cli/commands.h"
#include "cli/options.h"
#include "component/shared_objects.h"
#include "platform/connection.h"
#include "schema/copy_installation.h"
#include "schema/schema.h"
#include "settings/login.h"

#include <QRegularExpression>
#include <cstdio>

namespace quotas::cli {

namespace {

// Quoted for a POSIX shell, so the printed command can be pasted as it is.
QString shellWord(const QString& text)
{
    static const QRegularExpression plain(QStringLiteral("^[A-Za-z0-9_.,:/@%+=-]+$"));
    if (plain.match(text).hasMatch())
        return text;
    QString quoted = text;
    quoted.replace(u'\'', QStringLiteral("'\\''"));
    return u'\'' + quoted + u'\'';
}

}  // namespace

// Copies the installation in use to a PostgreSQL database; the settings are
// left pointing where they were until the printed command is run.
int copiar(const QStringList& args)
{
    const Options options(QStringLiteral("copiar"), args);
    LoginSettings to;
    to.securityInfo = QStringLiteral("False");
    to.dataSource = options.value(QStringLiteral("data-source")).trimmed();
    to.catalog = options.value(QStringLiteral("catalog")).trimmed();
    to.user = options.value(QStringLiteral("user"));
    to.password = options.value(QStringLiteral("password"));
    if (to.dataSource.isEmpty() || to.catalog.isEmpty())
        throw UsageError(QStringLiteral("copiar: faltam --data-source ou --catalog."));
    Connection target(QStringLiteral("copiar"));
    target.setConnectionString(connectionString(to));
    if (ConnectionTarget::fromConnectionString(target.connectionString()).engine != Engine::PostgreSQL)
        throw UsageError(QStringLiteral("copiar: o destino tem de ser um servidor PostgreSQL (HOST ou HOST,PORTA), não um "
                                        "ficheiro."));
    connectOrFail();
    target.open();
    try {
        const CopyVerification verification = copyInstallation(Data().SqlServer, target, [](const QString& line) {
            std::fputs((line + u'\n').toUtf8().constData(), stderr);
        });
        // The copy's tables are made as init-db makes them, without the
        // indexes the runs need at scale: init-db's index step follows.
        const QString indexes = addIndexes(target).text();
        const QString command = QStringLiteral("quotas config --data-source %1 --catalog %2 --user %3 --password %4")
                                    .arg(shellWord(to.dataSource), shellWord(to.catalog), shellWord(to.user),
                                         shellWord(to.password));
        std::fputs((verification.text() + u'\n' + indexes
                    + QStringLiteral("Cópia concluída e verificada. Para passar a usar o servidor:\n  ")
                    + command + u'\n')
                       .toUtf8()
                       .constData(),
                   stdout);
    } catch (const TargetNotEmpty& e) {
        throw UsageError(QStringLiteral("copiar: ") + e.message());
    }
    return 0;
}

}  // namespace quotas::cli
