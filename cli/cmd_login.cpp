#include "cli/commands.h"
#include "cli/options.h"
#include "component/shared_objects.h"
#include "settings/login.h"
#include "settings/registry_file.h"
#include "settings/settings_location.h"

#include <QFileInfo>
#include <cstdio>

namespace quotas::cli {

void missingSetting(const QString& name)
{
    // A value the reader cannot find may be in a file it cannot read: say
    // which file and which line, not which value.
    if (QFileInfo::exists(registryPath())) {
        try {
            RegistryFile::load(registryPath());
        } catch (const QuotasError& e) {
            throw UsageError(e.message());
        }
    }
    throw UsageError(QStringLiteral("falta a configuração \"%1\" em %2 (use \"quotas config\").").arg(name, registryPath()));
}

void connectOrFail()
{
    DataEnvironment& data = Data();
    // What General::Login does, keeping the name of a missing setting.
    const LoginOutcome outcome = quotas::login(data.SqlServer, data.SqlServer_Prints);
    if (!outcome.ok)
        missingSetting(outcome.missing);
}

int login(const QStringList& args)
{
    const Options options(QStringLiteral("login"), args);
    connectOrFail();
    if (options.isSet(QStringLiteral("print-connection-string")))
        std::fputs((Data().SqlServer.connectionString() + u'\n').toUtf8().constData(), stdout);
    else
        std::fputs("Ligação à base de dados estabelecida.\n", stdout);
    return 0;
}

}  // namespace quotas::cli
