#include "component/installation.h"

namespace quotas {

QString installationDataDir()
{
    const QString fromEnvironment = qEnvironmentVariable("QUOTAS_DATA_DIR");
    return fromEnvironment.isEmpty() ? QStringLiteral(QUOTAS_DEFAULT_DATA_DIR) : fromEnvironment;
}

}  // namespace quotas
