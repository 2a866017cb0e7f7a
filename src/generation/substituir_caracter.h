#pragma once

#include <QString>
#include <QVariant>

namespace quotas {

// Replaces every find character by the replacement character in the value's
// text form; a number is written in the local number format (twelve and a
// half reads "12,5" where the comma is the decimal separator). The match is
// exact, case included, and the length never changes. A find or replacement
// text that is not exactly one character gives the empty text. A Null value
// has no text form: QuotasError.
QString SubstituirCaracter(const QVariant& value, const QString& findCharacter, const QString& replacementCharacter);

}  // namespace quotas
