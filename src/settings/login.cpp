#include "settings/login.h"

#include "platform/connection.h"
#include "platform/connection_string.h"
#include "settings/password.h"
#include "settings/registry_reader.h"

namespace quotas {

QString loginKeyPath()
{
    return QStringLiteral("HKEY_LOCAL_MACHINE\\SOFTWARE\\Nortavel\\Sindicato");
}

QStringList loginValueNames()
{
    return {QStringLiteral("dtSecurityInfo"), QStringLiteral("dtUser"), QStringLiteral("dtPassword"),
            QStringLiteral("dtInitialCatalog"), QStringLiteral("dtDataSource")};
}

QString connectionString(const LoginSettings& s)
{
    return QStringLiteral("Provider=MSDataShape.1;") + QStringLiteral("Persist Security Info=")
           + quoteConnectionValue(s.securityInfo) + QStringLiteral(";") + QStringLiteral("Connect Timeout=15;")
           + QStringLiteral("Data Source=") + quoteConnectionValue(s.dataSource) + QStringLiteral(";")
           + QStringLiteral("User ID=") + quoteConnectionValue(s.user) + QStringLiteral(";")
           + QStringLiteral("Password=") + quoteConnectionValue(s.password) + QStringLiteral(";")
           + QStringLiteral("Initial Catalog=") + quoteConnectionValue(s.catalog) + QStringLiteral(";")
           + QStringLiteral("Data Provider=SQLOLEDB.1");
}

bool readLoginSettings(LoginSettings& settings, QString* missing)
{
    QString* targets[] = {&settings.securityInfo, &settings.user, &settings.password, &settings.catalog,
                          &settings.dataSource};
    const QStringList names = loginValueNames();
    for (int i = 0; i < names.size(); ++i) {
        // The reader rewrites the path it is given.
        QString keyPath = loginKeyPath();
        QString valueName = names[i];
        const QVariant value = registry::QueryValue(keyPath, valueName);
        if (registry::isNullMarker(value) || registry::isEmptyVariant(value)) {
            if (missing)
                *missing = names[i];
            return false;
        }
        *targets[i] = value.toString();
    }
    settings.password = decodePassword(settings.password);
    return true;
}

LoginOutcome login(Connection& sqlServer, Connection& sqlServerPrints)
{
    LoginOutcome outcome;
    LoginSettings settings;
    if (!readLoginSettings(settings, &outcome.missing))
        return outcome;
    for (Connection* connection : {&sqlServer, &sqlServerPrints}) {
        if (connection->state() == 1)
            connection->close();
        connection->setConnectionString(connectionString(settings));
        connection->open();
    }
    outcome.ok = true;
    return outcome;
}

}  // namespace quotas
