#pragma once

#include <QVariant>

namespace quotas {

class Connection;

// The running number of the dues: column quotas of the first row of
// tbcontadores, one number for both types, all members and all runs.
//
// next() must run inside the caller's transaction: the increment is one
// atomic statement whose row lock (PostgreSQL) lasts until that transaction
// ends, so two runs at once never hand out the same number, and a rolled
// back posting gives its number back.
class DuesCounter {
public:
    explicit DuesCounter(Connection& connection) : m_connection(connection) {}

    // The next number; when the table is empty it gains its row and the
    // count starts at 1.
    int next();

private:
    QVariant firstRow();

    Connection& m_connection;
    QVariant m_row;  // contador_id of the counter row, once known
};

}  // namespace quotas
