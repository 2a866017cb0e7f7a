#include "platform/late_binding.h"

#include "platform/errors.h"

#include <QMetaMethod>
#include <QObject>
#include <array>

namespace quotas {

namespace {

int findMethod(const QMetaObject* meta, const char* name, int argc)
{
    const QByteArray wanted(name);
    for (int i = 0; i < meta->methodCount(); ++i) {
        const QMetaMethod m = meta->method(i);
        if (m.name() == wanted && m.parameterCount() == argc
            && (m.methodType() == QMetaMethod::Method || m.methodType() == QMetaMethod::Slot))
            return i;
    }
    return -1;
}

}  // namespace

bool tryCallByName(QObject* object, const char* method, const QVariantList& args, QVariant* result)
{
    if (!object)
        return false;
    const QMetaObject* meta = object->metaObject();
    const int at = findMethod(meta, method, int(args.size()));
    if (at < 0)
        return false;
    if (args.size() > 10)
        throw QuotasError(QStringLiteral("Demasiados argumentos para \"%1\".").arg(QString::fromLatin1(method)));
    const QMetaMethod m = meta->method(at);
    QVariantList converted;
    converted.reserve(args.size());
    for (int i = 0; i < args.size(); ++i) {
        const QMetaType type = m.parameterMetaType(i);
        QVariant v = args[i];
        if (type.id() != QMetaType::QVariant && v.metaType() != type) {
            if (!v.isValid() || v.isNull())
                v = QVariant(type);
            else if (!v.convert(type))
                throw QuotasError(QStringLiteral("O argumento %1 de \"%2\" não tem o tipo esperado.")
                                      .arg(i + 1)
                                      .arg(QString::fromLatin1(method)));
        }
        converted.append(v);
    }
    std::array<QGenericArgument, 10> generic{};
    for (int i = 0; i < converted.size(); ++i) {
        const QMetaType type = m.parameterMetaType(i);
        // A QVariant parameter takes the variant itself.
        const void* data = type.id() == QMetaType::QVariant ? static_cast<const void*>(&converted[i]) : converted[i].constData();
        generic[size_t(i)] = QGenericArgument(type.name(), data);
    }
    QVariant returned;
    QGenericReturnArgument ret;
    const QMetaType returnType = m.returnMetaType();
    if (returnType.id() == QMetaType::QVariant) {
        ret = QGenericReturnArgument(returnType.name(), &returned);
    } else if (returnType.isValid() && returnType.id() != QMetaType::Void) {
        returned = QVariant(returnType);
        ret = QGenericReturnArgument(returnType.name(), returned.data());
    }
    const bool ok = m.invoke(object, Qt::DirectConnection, ret, generic[0], generic[1], generic[2], generic[3], generic[4],
                             generic[5], generic[6], generic[7], generic[8], generic[9]);
    if (!ok)
        throw QuotasError(QStringLiteral("Não foi possível chamar \"%1\".").arg(QString::fromLatin1(method)));
    if (result)
        *result = returned;
    return true;
}

QVariant callByName(QObject* object, const char* method, const QVariantList& args)
{
    if (!object)
        throw QuotasError(QStringLiteral("Não há objecto para chamar \"%1\".").arg(QString::fromLatin1(method)));
    QVariant result;
    if (!tryCallByName(object, method, args, &result))
        throw QuotasError(QStringLiteral("O objecto \"%1\" não tem o método \"%2\" com %3 argumento(s).")
                              .arg(QString::fromLatin1(object->metaObject()->className()))
                              .arg(QString::fromLatin1(method))
                              .arg(args.size()));
    return result;
}

}  // namespace quotas
