#include "generation/due_rules.h"

#include "component/money.h"

namespace quotas {

const DueTypeInfo& dueTypeInfo(DueType type)
{
    static const DueTypeInfo sindicato{1, QStringLiteral("Sindicato"), QStringLiteral("ult_perc_sindicato"),
                                       QStringLiteral("ult_quota_sindicato")};
    static const DueTypeInfo seguro{2, QStringLiteral("Seguro"), QStringLiteral("ult_perc_seguro"),
                                    QStringLiteral("ult_quota_seguro")};
    return type == DueType::Sindicato ? sindicato : seguro;
}

bool insuranceCharged(const StoredNumber& seguro, const StoredDate& endDate, int ano, int mes)
{
    if (!seguro.isNumber() || seguro.value == 0)
        return false;
    if (!endDate.date.isValid())
        return true;
    return endDate.date.year() * 12 + endDate.date.month() >= ano * 12 + mes;
}

std::optional<double> dueRate(const StoredNumber& personalRate, bool employerFound, const StoredNumber& employerRate)
{
    if (personalRate.isNumber() && personalRate.value > 0)
        return personalRate.value;
    if (!employerFound)
        return kDefaultRate;
    if (!employerRate.isNumber())
        return std::nullopt;
    return employerRate.value;
}

double dueAmount(double rend1, double rend2, double rate)
{
    // (rend1 + rend2) x rate x 100, rounded, / 100: roundCents does the last two.
    return roundCents((rend1 + rend2) * rate);
}

}  // namespace quotas
