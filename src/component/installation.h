#pragma once

#include <QString>

namespace quotas {

// The installation's data folder (the animation clip, the letterhead texts):
// $QUOTAS_DATA_DIR when set, else the data/ folder of the source tree the
// library was built from.
QString installationDataDir();

}  // namespace quotas
