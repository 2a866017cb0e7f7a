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

}  // namespace quotas
