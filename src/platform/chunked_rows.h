#pragma once

#include "platform/recordset.h"

namespace quotas {

class Connection;

// The rows of a query read a chunk at a time, in the order of a column that
// is unique and never Null: the next chunk starts after the last key read.
// A run over a whole table so holds one chunk, whatever the table's size, and
// may write between rows (each chunk is read to its end before it is used).
//
// sql carries "%1" where the condition on the key goes (it becomes
// " AND key > ?" after the first chunk, so it follows a WHERE, and its value
// is bound after params) and ends with its ORDER BY on the key; the reader
// adds the LIMIT. keyField names the key
// in the result, keyExpression in the query.
class ChunkedRows {
public:
    ChunkedRows(Connection& connection, QString sql, QString keyExpression, QString keyField,
                QVariantList params = {}, int chunkSize = 2000);

    bool eof() const { return m_rows.eof(); }
    void moveNext();
    // The current row, as a result set positioned on it (read only).
    const Recordset& row() const { return m_rows; }
    QVariant value(int column) const { return m_rows.value(column); }
    int fieldIndex(const QString& name) const { return m_rows.fieldIndex(name); }

private:
    void read(const QVariant& after);

    Connection& m_connection;
    QString m_sql;
    QString m_keyExpression;
    QString m_keyField;
    QVariantList m_params;
    int m_chunkSize;
    Recordset m_rows;
};

}  // namespace quotas
