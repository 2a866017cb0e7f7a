#pragma once

#include "component/stored_value.h"

#include <QDate>
#include <QString>
#include <QVariant>
#include <optional>

namespace quotas {

// The two dues a member is charged every month.
enum class DueType {
    Sindicato = 1,
    Seguro = 2
};

// What differs between the two dues when they are posted.
struct DueTypeInfo {
    int tipo;
    QString ref;           // written to the movement
    QString personalRate;  // account column holding the member's own rate
    QString amountColumn;  // account column receiving the last amount
};
const DueTypeInfo& dueTypeInfo(DueType type);

// The rate applied when neither the member nor his employer gives one.
inline constexpr double kDefaultRate = 15.0 / 1000.0;

// Whether a member is charged the insurance due for month mes of year ano:
// he holds the insurance (seguro non-zero) and it has not ended before that
// month. The end date's year and month are compared together, so an
// insurance ending in March 2001 is still charged for December 2000.
// A Null seguro means no insurance; a Null end date, one that runs on. The
// caller has turned unreadable values away.
bool insuranceCharged(const StoredNumber& seguro, const StoredDate& endDate, int ano, int mes);

// The rate of one due: the member's own rate when it is above 0; else the
// employer's rate when the employer was found; else the default rate.
// Nothing when the employer was found but its rate is empty: no amount can
// be computed from it. The caller has turned unreadable rates away.
std::optional<double> dueRate(const StoredNumber& personalRate, bool employerFound, const StoredNumber& employerRate);

// The rate applied to the sum of both remunerations, in whole cents with
// halves going to the even cent.
double dueAmount(double rend1, double rend2, double rate);

}  // namespace quotas
