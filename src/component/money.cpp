#include "component/money.h"

#include <algorithm>
#include <cmath>

namespace quotas {

double roundHalfEven(double value, int decimals)
{
    const double scale = std::pow(10.0, decimals);
    const double scaled = value * scale;
    // A value this large has no digits left at that place: scaling it would
    // only overflow to infinity.
    if (!std::isfinite(scaled))
        return value;
    // nearbyint follows the default rounding mode: to nearest, ties to even.
    return std::nearbyint(scaled) / scale;
}

std::optional<double> parseDecimal(const QString& text)
{
    const QString t = text.trimmed();
    const qsizetype point = std::max(t.lastIndexOf(u'.'), t.lastIndexOf(u','));
    const QStringView whole = point < 0 ? QStringView(t) : QStringView(t).left(point);
    const QStringView fraction = point < 0 ? QStringView() : QStringView(t).mid(point + 1);
    const QChar group = point < 0 ? QChar() : (t[point] == u'.' ? u',' : u'.');
    QString plain;
    qsizetype digits = 0, sinceGroup = 0;
    bool grouped = false;
    for (qsizetype i = 0; i < whole.size(); ++i) {
        const QChar c = whole[i];
        if ((c == u'-' || c == u'+') && i == 0) {
            plain += c;
        } else if (c.isDigit() && c.unicode() < 128) {
            plain += c;
            ++digits;
            ++sinceGroup;
        } else if ((c == group || c == u' ' || c == QChar::Nbsp || c == u'\u202f') && sinceGroup >= 1 && (grouped ? sinceGroup == 3 : sinceGroup <= 3)) {
            grouped = true;
            sinceGroup = 0;
        } else {
            return std::nullopt;
        }
    }
    if (grouped && sinceGroup != 3)
        return std::nullopt;
    for (const QChar c : fraction) {
        if (!c.isDigit() || c.unicode() >= 128)
            return std::nullopt;
        ++digits;
    }
    if (digits == 0)
        return std::nullopt;
    plain += u'.' + fraction.toString();
    bool ok = false;
    const double value = QLocale::c().toDouble(plain, &ok);
    if (!ok || !std::isfinite(value))
        return std::nullopt;
    return value;
}

namespace {

QString grouped(double amount, QChar decimal, QChar group)
{
    // The digits come from the decimal text, not from a whole number of
    // cents: an amount beyond 64 bits of cents must still show.
    const QString fixed = QString::number(std::fabs(roundHalfEven(amount, 2)), 'f', 2);
    const QString digits = fixed.left(fixed.size() - 3);
    QString out;
    for (qsizetype i = 0; i < digits.size(); ++i) {
        if (i > 0 && (digits.size() - i) % 3 == 0)
            out += group;
        out += digits[i];
    }
    return out + decimal + fixed.right(2);
}

}  // namespace

QString formatMoney(double amount, const QLocale& locale)
{
    const QString body = QStringLiteral("€ ") + grouped(amount, locale.decimalPoint().front(), locale.groupSeparator().front());
    return roundHalfEven(amount, 2) < 0 ? u'(' + body + u')' : body;
}

}  // namespace quotas
