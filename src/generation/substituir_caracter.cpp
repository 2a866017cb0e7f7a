#include "generation/substituir_caracter.h"

#include "platform/errors.h"

#include <QDate>
#include <QLocale>

namespace quotas {

namespace {

QString textForm(const QVariant& value)
{
    if (!value.isValid())
        return QString();  // an empty variant reads as the empty text
    if (value.isNull())
        throw QuotasError(QStringLiteral("Utilização inválida de Null: o valor não tem forma de texto."));
    QLocale local;
    local.setNumberOptions(QLocale::OmitGroupSeparator);
    switch (value.metaType().id()) {
    case QMetaType::Double:
    case QMetaType::Float:
        // Positional, never exponent notation: the callers read the text back as a number.
        return local.toString(value.toDouble(), 'f', QLocale::FloatingPointShortest);
    case QMetaType::Int:
    case QMetaType::Short:
    case QMetaType::Long:
    case QMetaType::LongLong:
        return local.toString(value.toLongLong());
    case QMetaType::UInt:
    case QMetaType::UShort:
    case QMetaType::ULong:
    case QMetaType::ULongLong:
        return local.toString(value.toULongLong());
    case QMetaType::QDate:
        return local.toString(value.toDate(), QLocale::ShortFormat);
    default:
        return value.toString();
    }
}

}  // namespace

QString SubstituirCaracter(const QVariant& value, const QString& findCharacter, const QString& replacementCharacter)
{
    if (findCharacter.size() != 1 || replacementCharacter.size() != 1)
        return QString();
    QString text = textForm(value);
    text.replace(findCharacter.front(), replacementCharacter.front(), Qt::CaseSensitive);
    return text;
}

}  // namespace quotas
