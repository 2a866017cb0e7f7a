#pragma once

class QSqlDatabase;

namespace quotas {

// Registers on an open SQLite connection the collation "portugues": text
// compared as a Portuguese reader orders it (accents and letter case after
// the letters themselves), whatever the machine's locale. PostgreSQL gets the
// same order from the server's ICU collation (see Dialect::translate).
// False when the connection is not SQLite's or refused it.
bool registerPortugueseCollation(QSqlDatabase& db);

}  // namespace quotas
