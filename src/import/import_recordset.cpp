#include "import/import_recordset.h"

#include "import/csv_reader.h"

namespace quotas {

ImportRecordset* ImportRecordset::fromTable(const CsvTable& table, QObject* parent)
{
    auto* set = new ImportRecordset(parent);
    Recordset& rows = set->rows();
    rows.openInMemory(table.header);
    for (const QStringList& line : table.rows) {
        rows.addNew();
        for (int i = 0; i < line.size(); ++i)
            rows.setValue(i, line[i]);
    }
    if (!table.rows.isEmpty())
        rows.moveFirst();
    return set;
}

}  // namespace quotas
