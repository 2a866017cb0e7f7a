#include "component/money.h"

#include <cmath>

namespace quotas {

double roundHalfEven(double value, int decimals)
{
    const double scale = std::pow(10.0, decimals);
    // nearbyint follows the default rounding mode: to nearest, ties to even.
    return std::nearbyint(value * scale) / scale;
}

std::optional<double> parseDecimal(const QString& text, const QLocale& locale)
{
    QString t = text.trimmed();
    if (t.isEmpty())
        return std::nullopt;
    bool ok = false;
    const double value = locale.toDouble(t, &ok);
    if (!ok || !std::isfinite(value))
        return std::nullopt;
    return value;
}

namespace {

QString grouped(double amount, QChar decimal, QChar group)
{
    const double cents = std::fabs(roundHalfEven(amount, 2));
    const qint64 whole = qint64(cents);
    const int fraction = int(std::llround((cents - double(whole)) * 100.0));
    QString digits = QString::number(whole);
    QString out;
    for (qsizetype i = 0; i < digits.size(); ++i) {
        if (i > 0 && (digits.size() - i) % 3 == 0)
            out += group;
        out += digits[i];
    }
    return out + decimal + QStringLiteral("%1").arg(fraction, 2, 10, QLatin1Char('0'));
}

}  // namespace

QString formatMoney(double amount, const QLocale& locale)
{
    const QString body = QStringLiteral("€ ") + grouped(amount, locale.decimalPoint().front(), locale.groupSeparator().front());
    return roundHalfEven(amount, 2) < 0 ? u'(' + body + u')' : body;
}

}  // namespace quotas
