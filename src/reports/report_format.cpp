#include "reports/report_format.h"

#include "component/stored_value.h"

#include "component/money.h"

#include <QLocale>
#include <algorithm>
#include <cmath>

namespace quotas {

namespace {

constexpr QChar kDecimal = u',';
constexpr QChar kGroup = u'.';

struct NumberPattern {
    QString prefix;
    QString suffix;
    int decimals = 0;
    int minimumDigits = 0;
    bool grouping = false;
};

bool isDigitPlaceholder(QChar c)
{
    return c == u'#' || c == u'0';
}

// Literal text of a format: quotes and backslashes only protect characters.
QString literal(const QString& text)
{
    QString out;
    for (qsizetype i = 0; i < text.size(); ++i) {
        if (text[i] == u'"')
            continue;
        if (text[i] == u'\\' && i + 1 < text.size()) {
            out += text[++i];
            continue;
        }
        out += text[i];
    }
    return out;
}

NumberPattern parsePattern(const QString& section)
{
    NumberPattern p;
    qsizetype first = -1;
    qsizetype last = -1;
    for (qsizetype i = 0; i < section.size(); ++i) {
        const QChar c = section[i];
        if (isDigitPlaceholder(c) || ((c == u',' || c == u'.') && first >= 0)) {
            if (first < 0)
                first = i;
            last = i;
        }
    }
    if (first < 0) {
        p.prefix = literal(section);
        return p;
    }
    // A trailing separator belongs to the literal text, not to the digits.
    while (last > first && !isDigitPlaceholder(section[last]))
        --last;
    p.prefix = literal(section.left(first));
    p.suffix = literal(section.mid(last + 1));
    const QString digits = section.mid(first, last - first + 1);
    const qsizetype point = digits.indexOf(u'.');
    const QString whole = point < 0 ? digits : digits.left(point);
    p.grouping = whole.contains(u',');
    p.minimumDigits = int(whole.count(u'0'));
    if (point >= 0) {
        for (qsizetype i = point + 1; i < digits.size(); ++i) {
            if (isDigitPlaceholder(digits[i]))
                ++p.decimals;
        }
    }
    return p;
}

QString digitsOf(double magnitude, const NumberPattern& p)
{
    const double rounded = roundHalfEven(magnitude, p.decimals);
    QString text = QString::number(rounded, 'f', p.decimals);
    QString whole = p.decimals > 0 ? text.left(text.size() - p.decimals - 1) : text;
    const QString fraction = p.decimals > 0 ? text.right(p.decimals) : QString();
    if (whole == QStringLiteral("0") && p.minimumDigits == 0)
        whole.clear();
    while (whole.size() < p.minimumDigits)
        whole.prepend(u'0');
    if (p.grouping) {
        QString grouped;
        for (qsizetype i = 0; i < whole.size(); ++i) {
            if (i > 0 && (whole.size() - i) % 3 == 0)
                grouped += kGroup;
            grouped += whole[i];
        }
        whole = grouped;
    }
    return p.decimals > 0 ? whole + kDecimal + fraction : whole;
}

QString formatNumber(double value, const QString& format)
{
    const QStringList sections = format.split(u';');
    const bool negative = roundHalfEven(value, 6) < 0;
    if (negative && sections.size() > 1 && !sections[1].isEmpty()) {
        const NumberPattern p = parsePattern(sections[1]);
        return p.prefix + digitsOf(-value, p) + p.suffix;
    }
    const NumberPattern p = parsePattern(sections[0]);
    QString body = digitsOf(std::fabs(value), p);
    // A negative amount that rounds to zero prints without a sign.
    const bool zero = std::all_of(body.cbegin(), body.cend(), [](QChar c) { return !c.isDigit() || c == u'0'; });
    if (negative && !zero)
        return u'-' + p.prefix + body + p.suffix;
    return p.prefix + body + p.suffix;
}

QString generalNumber(double value)
{
    QString text = QString::number(value, 'g', 15);
    return text.replace(u'.', kDecimal);
}

}  // namespace

QString formatReportValue(const QVariant& value, const QString& format)
{
    if (!value.isValid() || value.isNull())
        return QString();
    const int type = value.metaType().id();
    bool isNumber = type == QMetaType::Double || type == QMetaType::Float || type == QMetaType::Int
                    || type == QMetaType::LongLong || type == QMetaType::UInt || type == QMetaType::ULongLong;
    double number = 0;
    if (isNumber) {
        number = value.toDouble();
    } else if (type == QMetaType::QString && !format.isEmpty()) {
        bool ok = false;
        number = value.toString().trimmed().toDouble(&ok);
        isNumber = ok;
    }
    // An amount no column should hold is shown as such, never as digits.
    if (isNumber && !amountInRange(number))
        return QStringLiteral("valor inválido");
    if (isNumber && !format.isEmpty())
        return formatNumber(number, format);
    if (type == QMetaType::Double || type == QMetaType::Float)
        return generalNumber(number);
    if (type == QMetaType::QDate)
        return value.toDate().toString(QStringLiteral("dd-MM-yyyy"));
    return value.toString();
}

QString formatCents(qint64 cents, const QString& format)
{
    return formatReportValue(double(cents) / 100.0, format);
}

QString longPortugueseDate(const QDate& date)
{
    static const QLocale portuguese(QLocale::Portuguese, QLocale::Portugal);
    return portuguese.toString(date, QStringLiteral("d 'de' MMMM 'de' yyyy"));
}

}  // namespace quotas
