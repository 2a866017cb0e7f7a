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
// single precision), whatever the desktop's language: "2800,50" and
// "2800.50" alike. Of "," and ".", the last one in the text is the decimal
// separator and the other (or a space) may group thousands before it
// ("2.800,50", "2,800.50", "2 800,50"). An optional sign; anything else (an empty text, letters, a
// misplaced or repeated separator) gives nothing.
std::optional<double> parseDecimal(const QString& text);

// "€ #,##0.00;(€ #,##0.00)" with the locale's separators: negatives in parentheses.
QString formatMoney(double amount, const QLocale& locale = QLocale());

}  // namespace quotas
