#pragma once

#include <QStringList>

namespace quotas {

class Connection;

// Creates every table of the dues database that does not exist yet, with its
// indexes, on SQLite or PostgreSQL; tables that exist are left as they are.
// Keys are assigned by the database (tbSocios.socio_id also takes a given
// value); money has two decimals. Returns the tables it created.
QStringList createSchema(Connection& connection);

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
