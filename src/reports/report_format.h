#pragma once

#include <QDate>
#include <QString>
#include <QVariant>

namespace quotas {

// The reports' own fixed formats, the same on every machine whatever the
// user's locale: a printed listing must read the same wherever it is printed.

// The layouts' money format.
inline const QString kMoneyEsc = QStringLiteral("#,##0.00 Esc");

// A value as a report field prints it. Null prints nothing. A number format
// such as "#,##0.00 Esc" groups thousands with "." and writes two decimals
// after "," (Portuguese practice), rounded half to even, with the literal
// text around the digits kept ("1.234,50 Esc"); a second section after ";"
// is used for negative amounts, else they get a leading "-". Text that reads
// as a number is formatted as one; other text prints as it stands.
QString formatReportValue(const QVariant& value, const QString& format = QString());

// An amount in cents, printed as formatReportValue prints its value in euros.
QString formatCents(qint64 cents, const QString& format);

// "%D": the long Portuguese date of a letter's heading, "6 de dezembro de
// 2026" (day without a leading zero, month in lower case, no weekday).
QString longPortugueseDate(const QDate& date);

}  // namespace quotas
