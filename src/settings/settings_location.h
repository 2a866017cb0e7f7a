#pragma once

#include <QString>

namespace quotas {

// Where the settings file lives: the path given with --registry, else
// $QUOTAS_REGISTRY, else the system path.
QString systemRegistryPath();
void setRegistryPath(const QString& path);  // empty: no longer given
QString registryPath();

}  // namespace quotas
