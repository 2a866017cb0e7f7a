#pragma once

#include <QString>

namespace quotas {

class Connection;

// The running number of the dues: column quotas of the first row of
// tbcontadores, one number for both types, all members and all runs. The
// table may have no other column and no key.
//
// reserve() must run inside the caller's transaction: the counter row is read
// with a lock (PostgreSQL) or under the writer lock (SQLite) that lasts until
// that transaction ends, so two runs at once never hand out the same number,
// and a rolled back posting gives its numbers back.
class DuesCounter {
public:
    explicit DuesCounter(Connection& connection) : m_connection(connection) {}

    // Takes the next count numbers (count > 0) and returns the first: a
    // member's dues take theirs with one change of the row. When the table is
    // empty it gains its row and the count starts at 1.
    int reserve(int count);

private:
    Connection& m_connection;
    QString m_firstRow;  // the locking read of the first row's address
    QString m_take;      // the change of the first row, returning its new count
};

}  // namespace quotas
