// The employer's file as bytes: decoding and parsing either give a table that
// keeps its promises or refuse with QuotasError; nothing else may happen.
#include "import/csv_reader.h"
#include "import/text_encoding.h"
#include "platform/errors.h"

#include <cstdint>
#include <cstdlib>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const QByteArray bytes = QByteArray::fromRawData(reinterpret_cast<const char*>(data), qsizetype(size));
    const QString text = quotas::decodeImportText(bytes);
    quotas::detectDelimiter(text.section(u'\n', 0, 0));
    try {
        const quotas::CsvTable table = quotas::parseCsv(text, QStringLiteral("fuzz.csv"));
        for (const QStringList& row : table.rows) {
            if (row.size() > table.header.size())
                std::abort();  // the callers index rows by the header
        }
    } catch (const quotas::QuotasError&) {
    }
    return 0;
}
