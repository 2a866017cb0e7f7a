#pragma once

#include <QStringList>

namespace quotas {

class Connection;

// Creates every table of the dues database that does not exist yet, on
// SQLite or PostgreSQL, in the shape the host's installations have: keys
// assigned by the database (tbSocios.socio_id also takes a given value),
// money with two decimals, no unique index. Tables that exist are left as
// they are. Returns the tables it created.
QStringList createSchema(Connection& connection);

// What addIndexes did.
struct IndexReport {
    QStringList added;    // the indexes that exist now, by name
    QStringList blocked;  // the unique indexes the rows prevent, each followed by its repeated rows

    // What the administrator reads: the indexes present and, when some
    // unique ones were prevented, the rows that prevent them and what to do.
    QString text() const;
};

// Adds to the dues tables the indexes that speed the runs up, and the unique
// ones (one account per member, one due of a type per member and month)
// where no two rows prevent them; where some do, a plain index takes the
// unique one's place and the rows are listed. The runs keep those rules by
// themselves, so they work without the unique indexes. Never changes a row
// nor a table of the host's (tbSocios, tbfuvs, tbEmpresas).
IndexReport addIndexes(Connection& connection);

// The tables createSchema knows, in creation order.
QStringList schemaTables();

// A table's columns as createSchema makes them: all, those holding money,
// and the key the database assigns ("" when the key is a code).
struct TableColumns {
    QStringList all;
    QStringList money;
    QString identity;
};
TableColumns tableColumns(const QString& table);

// Moves each key sequence past the highest key in its table. Rows inserted
// with their own key (a copy, a host that numbers its members) leave the
// sequence behind, and the next row inserted without one would be given a
// key already taken. SQLite takes the highest key plus one by itself.
void moveSequencesPastKeys(Connection& connection);

}  // namespace quotas
