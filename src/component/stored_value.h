#pragma once

#include <QDate>
#include <QString>
#include <QVariant>

namespace quotas {

// The largest amount a column of money holds (NUMERIC(12,2)): 9 999 999 999,99.
inline constexpr double kMaxAmount = 9999999999.99;

// Whether an amount is finite and, in whole cents, within ±kMaxAmount.
bool amountInRange(double amount);

// A number as the database gave it back. Old installations hold text in
// number columns and values no column should hold, so every value a run
// computes with is read through here and never taken as 0 when it is not a
// number.
struct StoredNumber {
    enum class State {
        Null,
        Number,
        Unreadable,
        NotFinite,
        OutOfRange
    };
    State state = State::Null;
    double value = 0;

    bool isNull() const { return state == State::Null; }
    bool isNumber() const { return state == State::Number; }
    // Neither Null nor a number the run may use.
    bool isBad() const { return !isNull() && !isNumber(); }
    // Why it cannot be used, in Portuguese ("valor ilegível (abc)"); empty
    // for Null and numbers.
    QString problem() const;

    QVariant raw;  // as stored, for the messages
};

// A stored number: a number, or a text of digits with an optional sign and
// at most one decimal separator, "," or "." ("1000,50" and "1000.50" alike);
// spaces around it are ignored. Anything else is Unreadable; infinity and
// NaN are NotFinite. Rates and flags have no range.
StoredNumber readStoredNumber(const QVariant& value);
// The same for money: beyond ±9 999 999 999,99 it is OutOfRange.
StoredNumber readStoredAmount(const QVariant& value);

// A date as the database gave it back: a date, or a text "yyyy-mm-dd" (with
// or without a time after it), "dd/mm/yyyy" or "dd-mm-yyyy". Anything else,
// numbers included, is unreadable: `ok` false.
struct StoredDate {
    bool ok = true;
    QDate date;  // invalid for Null
    bool isNull() const { return ok && !date.isValid(); }
    QString problem() const;  // "data ilegível (20010331)"
    QVariant raw;
};
StoredDate readStoredDate(const QVariant& value);

}  // namespace quotas
