// Connection strings: any text parses or is refused with QuotasError, and a
// value quoted by quoteConnectionValue reads back as itself, never adding
// properties of its own.
#include "platform/connection_string.h"
#include "platform/errors.h"

#include <cstdint>
#include <cstdlib>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const QString text = QString::fromUtf8(reinterpret_cast<const char*>(data), qsizetype(size));
    try {
        quotas::parseConnectionString(text);
    } catch (const quotas::QuotasError&) {
    }
    const QString built = QStringLiteral("Data Source=q.db;User ID=") + quotas::quoteConnectionValue(text)
                          + QStringLiteral(";Password=x");
    const QMap<QString, QString> read = quotas::parseConnectionString(built);
    if (read.value(QStringLiteral("user id")) != text || read.value(QStringLiteral("password")) != QStringLiteral("x")
        || read.value(QStringLiteral("data source")) != QStringLiteral("q.db") || read.size() != 3)
        std::abort();
    return 0;
}
