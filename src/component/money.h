#pragma once

#include <QLocale>
#include <QString>
#include <optional>

namespace quotas {

// Rounds to n decimal places: multiply by 10^n, round to the nearest whole
// number with ties to the even number, divide by 10^n.
double roundHalfEven(double value, int decimals);
inline double roundCents(double amount) { return roundHalfEven(amount, 2); }

// Reads a typed or imported amount as a decimal number into a double (never
// single precision). Accepts an optional sign, the locale's decimal separator
// and its group separator where grouping puts it; anything else (an empty
// text, letters, a misplaced separator) gives nothing.
std::optional<double> parseDecimal(const QString& text, const QLocale& locale = QLocale());

// "€ #,##0.00;(€ #,##0.00)" with the locale's separators: negatives in parentheses.
QString formatMoney(double amount, const QLocale& locale = QLocale());

}  // namespace quotas
