// A settings file brought from another installation: parsing either refuses
// with QuotasError or gives keys whose values can be read; what the writer
// makes of them must parse again.
#include "platform/errors.h"
#include "settings/registry_file.h"

#include <cstdint>
#include <cstdlib>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const QByteArray bytes = QByteArray::fromRawData(reinterpret_cast<const char*>(data), qsizetype(size));
    const QString key = QStringLiteral("HKEY_LOCAL_MACHINE\\SOFTWARE\\Nortavel\\Sindicato");
    quotas::RegistryFile file;
    try {
        file = quotas::RegistryFile::parse(bytes);
    } catch (const quotas::QuotasError&) {
        return 0;
    }
    file.hasKey(key);
    const std::optional<QByteArray> before = file.data(key, QStringLiteral("dtSecurityInfo"));
    file.setString(key, QStringLiteral("dtUser"), QStringLiteral("utilizador"));
    try {
        const quotas::RegistryFile again = quotas::RegistryFile::parse(file.serialize());
        if (again.data(key, QStringLiteral("dtSecurityInfo")) != before
            || again.data(key, QStringLiteral("dtUser")) != file.data(key, QStringLiteral("dtUser")))
            std::abort();  // the writer changed a value it was not asked to change
    } catch (const quotas::QuotasError&) {
        std::abort();  // the writer made a file the reader refuses
    }
    return 0;
}
