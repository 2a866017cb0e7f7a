#include "record/record_text.h"

#include "component/money.h"
#include "component/stored_value.h"
#include "platform/errors.h"

#include <algorithm>
#include <cmath>

namespace quotas {

QString formatDataQuota(const QVariant& date)
{
    static const char* const months[] = {"jan", "fev", "mar", "abr", "mai", "jun",
                                         "jul", "ago", "set", "out", "nov", "dez"};
    if (date.isNull())
        return QString();
    const QDate d = date.toDate();
    if (!d.isValid())
        return QString();
    return QStringLiteral("%1-%2-%3")
        .arg(d.day(), 2, 10, QLatin1Char('0'))
        .arg(QLatin1String(months[d.month() - 1]))
        .arg(d.year(), 4, 10, QLatin1Char('0'));
}

QString plainNumber(double value, const QLocale& locale)
{
    if (!std::isfinite(value) || value == 0.0)
        return QStringLiteral("0");
    const int magnitude = int(std::floor(std::log10(std::fabs(value))));
    const int decimals = std::clamp(14 - magnitude, 0, 15);
    QLocale plain = locale;
    plain.setNumberOptions(QLocale::OmitGroupSeparator);
    QString text = plain.toString(value, 'f', decimals);
    const QString point = plain.decimalPoint();
    if (decimals > 0 && text.contains(point)) {
        while (text.endsWith(u'0'))
            text.chop(1);
        if (text.endsWith(point))
            text.chop(point.size());
    }
    if (text == QStringLiteral("-0"))
        return QStringLiteral("0");
    return text;
}

QString participationText(double quota, double remunerations, const QLocale& locale)
{
    if (remunerations == 0.0)
        return QStringLiteral("0");
    return plainNumber(roundHalfEven(quota / remunerations, 5), locale);
}

double amountOf(const QVariant& value, const QString& column)
{
    const StoredNumber amount = readStoredAmount(value);
    if (amount.isBad())
        throw QuotasError(QStringLiteral("O campo \"%1\" desta quota tem um %2: não é possível fazer contas com ele. "
                                         "Corrija-o primeiro.")
                              .arg(column, amount.problem()));
    return amount.isNull() ? 0.0 : amount.value;
}

QString amountText(const QVariant& value, const QLocale& locale)
{
    const StoredNumber amount = readStoredAmount(value);
    if (amount.isNull())
        return QString();
    return amount.isNumber() ? formatMoney(amount.value, locale) : value.toString();
}

}  // namespace quotas
