#include "reports/stored_amount.h"

#include "component/money.h"
#include "component/stored_value.h"

#include <cmath>

namespace quotas {

// The reports read amounts by the runs' rules, so a value the runs compute
// with is the value a report sums, and one they refuse is counted apart.
StoredAmount readReportAmount(const QVariant& value)
{
    const StoredNumber stored = readStoredAmount(value);
    StoredAmount a;
    if (stored.isNull())
        return a;
    if (!stored.isNumber()) {
        a.state = StoredAmount::State::Unreadable;
        a.text = value.toString();
        return a;
    }
    a.state = StoredAmount::State::Readable;
    a.cents = std::llround(roundCents(stored.value) * 100.0);
    return a;
}

}  // namespace quotas
