#pragma once

#include <QMap>
#include <QString>

namespace quotas {

// Connection strings are "Key=Value" pairs separated by ";". A value that holds
// ";", a quote or outer spaces is enclosed in quotes so that it cannot add
// properties of its own; ordinary values are written as they are.
QString quoteConnectionValue(const QString& value);

// Keys are returned in lower case; values unquoted. A later duplicate key
// replaces an earlier one. Throws QuotasError on an unterminated quote.
QMap<QString, QString> parseConnectionString(const QString& text);

}  // namespace quotas
