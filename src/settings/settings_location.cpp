#include "settings/settings_location.h"

namespace quotas {

namespace {

QString& givenPath()
{
    static QString path;
    return path;
}

}  // namespace

QString systemRegistryPath()
{
    return QStringLiteral("/etc/quotas/registry.reg");
}

void setRegistryPath(const QString& path)
{
    givenPath() = path;
}

QString registryPath()
{
    if (!givenPath().isEmpty())
        return givenPath();
    const QString fromEnvironment = qEnvironmentVariable("QUOTAS_REGISTRY");
    return fromEnvironment.isEmpty() ? systemRegistryPath() : fromEnvironment;
}

}  // namespace quotas
