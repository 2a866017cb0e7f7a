#include "settings/password.h"

#include <QByteArray>
#include <QStringDecoder>

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
    // A leading U+FEFF is part of the password, not a byte order mark.
    QStringDecoder utf8(QStringDecoder::Utf8, QStringDecoder::Flag::Stateless | QStringDecoder::Flag::ConvertInitialBom);
    return utf8(QByteArray::fromBase64(stored.mid(kPrefix.size()).toLatin1()));
}

}  // namespace quotas
