#include "platform/connection_string.h"

#include "platform/errors.h"

namespace quotas {

QString quoteConnectionValue(const QString& value)
{
    const bool outerSpace = !value.isEmpty() && (value.front().isSpace() || value.back().isSpace());
    const bool hasDouble = value.contains(u'"');
    const bool hasSingle = value.contains(u'\'');
    // A leading "=" would read as the escaped "=" of a longer keyword.
    if (!outerSpace && !hasDouble && !hasSingle && !value.contains(u';') && !value.startsWith(u'='))
        return value;
    if (!hasDouble)
        return u'"' + value + u'"';
    if (!hasSingle)
        return u'\'' + value + u'\'';
    QString doubled = value;
    doubled.replace(u'"', QStringLiteral("\"\""));
    return u'"' + doubled + u'"';
}

QMap<QString, QString> parseConnectionString(const QString& text)
{
    QMap<QString, QString> result;
    qsizetype i = 0;
    const qsizetype n = text.size();
    while (i < n) {
        const qsizetype eq = text.indexOf(u'=', i);
        const qsizetype semi = text.indexOf(u';', i);
        if (eq < 0 || (semi >= 0 && semi < eq)) {
            // A piece without "=" carries no property; skip it.
            if (semi < 0)
                break;
            i = semi + 1;
            continue;
        }
        const QString key = text.mid(i, eq - i).trimmed().toLower();
        i = eq + 1;
        while (i < n && text[i] == u' ')
            ++i;
        QString value;
        if (i < n && (text[i] == u'"' || text[i] == u'\'')) {
            const QChar quote = text[i++];
            bool closed = false;
            while (i < n) {
                if (text[i] == quote) {
                    if (i + 1 < n && text[i + 1] == quote) {
                        value += quote;
                        i += 2;
                        continue;
                    }
                    closed = true;
                    ++i;
                    break;
                }
                value += text[i++];
            }
            if (!closed)
                throw QuotasError(QStringLiteral("Texto de ligação inválido: falta fechar as aspas do valor de \"%1\".").arg(key));
            while (i < n && text[i] == u' ')
                ++i;
            if (i < n && text[i] != u';')
                throw QuotasError(QStringLiteral("Texto de ligação inválido depois do valor de \"%1\".").arg(key));
        } else {
            const qsizetype end = semi < 0 ? n : semi;
            value = text.mid(i, end - i).trimmed();
            i = end;
        }
        if (i < n && text[i] == u';')
            ++i;
        if (!key.isEmpty())
            result.insert(key, value);
    }
    return result;
}

}  // namespace quotas
