#include "import/import_recordset.h"

#include "import/csv_reader.h"

namespace quotas {

ImportRecordset::ImportRecordset(std::unique_ptr<CsvLines> lines, QObject* parent)
    : QObject(parent), m_lines(std::move(lines))
{
}

ImportRecordset::~ImportRecordset() = default;

const QStringList& ImportRecordset::columns() const
{
    return m_lines->header();
}

qsizetype ImportRecordset::lineCount() const
{
    return m_lines->lineCount();
}

bool ImportRecordset::next(QStringList& line)
{
    return m_lines->next(line);
}

}  // namespace quotas
