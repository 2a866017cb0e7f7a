#pragma once

#include "platform/recordset.h"

#include <QObject>

namespace quotas {

struct CsvTable;

// What the build of an import source ("Dorvanta.General") returns, late
// bound as a QObject*: the employer's lines as an in-memory result set of
// text columns, named as the source names them, positioned on its first
// line. The source owns it (it is the source's child) and it lives until
// the source is released. The run takes any other result, or none, for
// "no usable set".
class ImportRecordset : public QObject {
    Q_OBJECT
public:
    explicit ImportRecordset(QObject* parent = nullptr) : QObject(parent) {}

    Recordset& rows() { return m_rows; }

    // The table's lines; missing values at the end of a short line are Null.
    static ImportRecordset* fromTable(const CsvTable& table, QObject* parent);

private:
    Recordset m_rows;
};

}  // namespace quotas
