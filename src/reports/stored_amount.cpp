#include "reports/stored_amount.h"

#include "component/money.h"

#include <cmath>

namespace quotas {

namespace {

// NUMERIC(12,2): ten whole digits.
constexpr double kLargestAmount = 9999999999.99;

}  // namespace

StoredAmount readReportAmount(const QVariant& value)
{
    StoredAmount a;
    if (!value.isValid() || value.isNull())
        return a;
    bool ok = false;
    const double number = value.metaType().id() == QMetaType::QString ? value.toString().trimmed().toDouble(&ok)
                                                                      : value.toDouble(&ok);
    if (!ok || !std::isfinite(number) || std::fabs(number) > kLargestAmount) {
        a.state = StoredAmount::State::Unreadable;
        a.text = value.toString();
        return a;
    }
    a.state = StoredAmount::State::Readable;
    a.cents = std::llround(roundCents(number) * 100.0);
    return a;
}

}  // namespace quotas
