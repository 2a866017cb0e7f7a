#pragma once

#include <QString>
#include <QVariant>

namespace quotas {

// An amount column as an old database may hold it: Null, a number, or
// something that is no amount at all (text, infinity, a value beyond what
// NUMERIC(12,2) holds). The reports count what they cannot read instead of
// printing it as 0.
struct StoredAmount {
    enum class State {
        Null,
        Readable,
        Unreadable
    };
    State state = State::Null;
    qint64 cents = 0;  // Readable: the amount in whole cents, half to even
    QString text;      // Unreadable: the stored value as text

    bool readable() const { return state == State::Readable; }
    bool unreadable() const { return state == State::Unreadable; }
    // Null counts as 0, as it does once the maintenance has run.
    qint64 centsOrZero() const { return readable() ? cents : 0; }
};

StoredAmount readReportAmount(const QVariant& value);

}  // namespace quotas
