#include "component/stored_value.h"

#include "component/money.h"

#include <QDateTime>
#include <QRegularExpression>
#include <cmath>

namespace quotas {

namespace {

bool isTextual(const QVariant& value)
{
    const int id = value.metaType().id();
    return id == QMetaType::QString || id == QMetaType::QByteArray;
}

QString shown(const QVariant& raw)
{
    const double number = raw.metaType().id() == QMetaType::Double ? raw.toDouble() : 0;
    QString text = number != 0 && std::isfinite(number) && std::fabs(number) < 1e18 ? QString::number(number, 'f', 2)
                                                                                    : raw.toString();
    if (text.size() > 30)
        text = text.left(30) + QStringLiteral("...");
    return text;
}

}  // namespace

bool amountInRange(double amount)
{
    return std::isfinite(amount) && std::fabs(roundCents(amount)) <= kMaxAmount;
}

QString StoredNumber::problem() const
{
    switch (state) {
    case State::Unreadable: return QStringLiteral("valor ilegível (%1)").arg(shown(raw));
    case State::NotFinite: return QStringLiteral("valor não finito (%1)").arg(shown(raw));
    case State::OutOfRange:
        return QStringLiteral("valor fora dos limites de ±9.999.999.999,99 (%1)").arg(shown(raw));
    case State::Null:
    case State::Number: break;
    }
    return QString();
}

StoredNumber readStoredNumber(const QVariant& value)
{
    StoredNumber n;
    n.raw = value;
    if (!value.isValid() || value.isNull())
        return n;
    if (isTextual(value)) {
        static const QRegularExpression number(QStringLiteral("^[+-]?(\\d+([.,]\\d*)?|[.,]\\d+)$"));
        QString text = value.toString().trimmed();
        if (!number.match(text).hasMatch()) {
            const QString word = text.toLower().remove(u'+').remove(u'-');
            n.state = word == QLatin1String("inf") || word == QLatin1String("infinity") || word == QLatin1String("nan")
                          ? StoredNumber::State::NotFinite
                          : StoredNumber::State::Unreadable;
            return n;
        }
        text.replace(u',', u'.');
        n.value = text.toDouble();
    } else {
        bool ok = false;
        n.value = value.toDouble(&ok);
        if (!ok) {
            n.state = StoredNumber::State::Unreadable;
            return n;
        }
    }
    n.state = std::isfinite(n.value) ? StoredNumber::State::Number : StoredNumber::State::NotFinite;
    return n;
}

StoredNumber readStoredAmount(const QVariant& value)
{
    StoredNumber n = readStoredNumber(value);
    if (n.isNumber() && !amountInRange(n.value))
        n.state = StoredNumber::State::OutOfRange;
    return n;
}

QString StoredDate::problem() const
{
    return ok ? QString() : QStringLiteral("data ilegível (%1)").arg(shown(raw));
}

StoredDate readStoredDate(const QVariant& value)
{
    StoredDate d;
    d.raw = value;
    if (!value.isValid() || value.isNull())
        return d;
    const int id = value.metaType().id();
    if (id == QMetaType::QDate)
        d.date = value.toDate();
    else if (id == QMetaType::QDateTime)
        d.date = value.toDateTime().date();
    else if (isTextual(value)) {
        const QString text = value.toString().trimmed();
        static const QRegularExpression iso(QStringLiteral("^(\\d{4})-(\\d{2})-(\\d{2})([ T].*)?$"));
        static const QRegularExpression written(QStringLiteral("^(\\d{1,2})[/-](\\d{1,2})[/-](\\d{4})$"));
        if (const auto m = iso.match(text); m.hasMatch())
            d.date = QDate(m.captured(1).toInt(), m.captured(2).toInt(), m.captured(3).toInt());
        else if (const auto w = written.match(text); w.hasMatch())
            d.date = QDate(w.captured(3).toInt(), w.captured(2).toInt(), w.captured(1).toInt());
    }
    d.ok = d.date.isValid();
    return d;
}

}  // namespace quotas
