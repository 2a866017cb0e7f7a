#include "component/installation.h"

#include <QDir>
#include <QFile>
#include <QFileInfo>
#include <dlfcn.h>

namespace quotas {

namespace {

// The share/quotas of the installation this library was loaded from, found
// from the library's own path, so that any prefix works and a host program
// elsewhere finds it too. Empty for the library of a build tree.
QString installedDataDir()
{
    Dl_info info{};
    if (::dladdr(reinterpret_cast<void*>(&installationDataDir), &info) == 0 || !info.dli_fname)
        return {};
    const QString libraryDir = QFileInfo(QFile::decodeName(info.dli_fname)).canonicalPath();
    if (!libraryDir.endsWith(QStringLiteral("/" QUOTAS_INSTALL_LIBDIR)))
        return {};
    return QDir::cleanPath(libraryDir + QStringLiteral("/" QUOTAS_LIBDIR_TO_DATADIR));
}

}  // namespace

QString installationDataDir()
{
    QString fromEnvironment = qEnvironmentVariable("QUOTAS_DATA_DIR");
    if (!fromEnvironment.isEmpty())
        return fromEnvironment;
    // An installed library never reaches back into the tree it was built from.
    static const QString installed = installedDataDir();
    return installed.isEmpty() ? QStringLiteral(QUOTAS_SOURCE_DATA_DIR) : installed;
}

}  // namespace quotas
