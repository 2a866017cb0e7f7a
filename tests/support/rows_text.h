#pragma once

#include <QStringList>
#include <QVariantList>

namespace quotas {
class Connection;
}

namespace quotas::test {

// The rows a query gives, each as "value|value|...", for comparing a whole
// end state at once: Null reads "-", numbers are written to ten significant
// digits, so SQLite's REAL and PostgreSQL's NUMERIC read alike.
QStringList rowsText(Connection& connection, const QString& sql, const QVariantList& params = {});

}  // namespace quotas::test
