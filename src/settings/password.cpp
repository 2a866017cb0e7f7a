#include "settings/password.h"

#include <QByteArray>

namespace quotas {

namespace {
const QString kPrefix = QStringLiteral("b64:");
}

QString encodePassword(const QString& plain)
{
    return kPrefix + QString::fromLatin1(plain.toUtf8().toBase64());
}

QString decodePassword(const QString& stored)
{
    if (!stored.startsWith(kPrefix))
        return stored;
    return QString::fromUtf8(QByteArray::fromBase64(stored.mid(kPrefix.size()).toLatin1()));
}

}  // namespace quotas
