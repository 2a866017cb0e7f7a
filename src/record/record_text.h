#pragma once

#include <QDate>
#include <QLocale>
#include <QString>
#include <QVariant>

namespace quotas {

// "dd-mmm-yyyy" with the Portuguese month abbreviations ("05-fev-2003"); an
// empty text for Null or an invalid date.
QString formatDataQuota(const QVariant& date);

// A number as the user types it: the locale's decimal separator, no group
// separators, no trailing zeros, at most 15 significant digits (so a
// difference such as 10.10 - 4.05 reads "6.05", not its binary residue).
QString plainNumber(double value, const QLocale& locale = QLocale());

// The share of the remunerations that a due represents, rounded to 5
// decimal places half to even; "0" when the remunerations add up to 0.
QString participationText(double quota, double remunerations, const QLocale& locale = QLocale());

// A column value as the window computes with it: Null counts as 0. A value
// that is not a finite number within range stops the computation with
// QuotasError naming the column: it is never taken as 0.
double amountOf(const QVariant& value, const QString& column);

// An amount as the window shows it: empty for Null, the money format for a
// number, and a value that is not one as it is stored.
QString amountText(const QVariant& value, const QLocale& locale = QLocale());

}  // namespace quotas
