#pragma once

#include <QString>

namespace quotas {

// The installation's data folder (the animation clip, the example letterhead,
// the sample import files): $QUOTAS_DATA_DIR when set; else, for a library
// loaded from an installation, that installation's share/quotas; else the
// data/ folder of the source tree the library was built from.
QString installationDataDir();

}  // namespace quotas
