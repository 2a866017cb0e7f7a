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

bool insuranceCharged(const QVariant& seguro, const QVariant& endDate, int ano, int mes)
{
    if (seguro.isNull() || seguro.toDouble() == 0)
        return false;
    if (endDate.isNull())
        return true;
    const QDate end = endDate.toDate();
    if (!end.isValid())
        return true;  // no date to compare: the insurance is taken as running
    return end.year() * 12 + end.month() >= ano * 12 + mes;
}

std::optional<double> dueRate(const QVariant& personalRate, bool employerFound, const QVariant& employerRate)
{
    if (!personalRate.isNull() && personalRate.toDouble() > 0)
        return personalRate.toDouble();
    if (!employerFound)
        return kDefaultRate;
    if (employerRate.isNull())
        return std::nullopt;
    return employerRate.toDouble();
}

double dueAmount(double rend1, double rend2, double rate)
{
    // (rend1 + rend2) x rate x 100, rounded, / 100: roundCents does the last two.
    return roundCents((rend1 + rend2) * rate);
}

}  // namespace quotas
