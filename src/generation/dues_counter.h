#pragma once

#include <QString>

namespace quotas {

class Connection;

// The running number of the dues: column quotas of the first row of
// tbcontadores, one number for both types, all members and all runs. The
// table may have no other column and no key.
//
// next() must run inside the caller's transaction: the counter row is read
// with a lock (PostgreSQL) or under the writer lock (SQLite) that lasts until
// that transaction ends, so two runs at once never hand out the same number,
// and a rolled back posting gives its number back.
class DuesCounter {
public:
    explicit DuesCounter(Connection& connection) : m_connection(connection) {}

    // The next number; when the table is empty it gains its row and the
    // count starts at 1.
    int next();

private:
    Connection& m_connection;
    QString m_firstRow;  // the locking read of the first row's address
};

}  // namespace quotas
