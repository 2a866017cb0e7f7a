#include "platform/components.h"

#include "platform/errors.h"

#include <QHash>
#include <QObject>
#include <QMutex>

namespace quotas {

namespace {

struct Registry {
    QMutex mutex;
    QHash<QString, ComponentFactory> factories;
};

Registry& registry()
{
    static Registry r;
    return r;
}

}  // namespace

void registerComponent(const QString& progId, const ComponentFactory& factory)
{
    Registry& r = registry();
    QMutexLocker lock(&r.mutex);
    r.factories.insert(progId.toLower(), factory);
}

void unregisterComponent(const QString& progId)
{
    Registry& r = registry();
    QMutexLocker lock(&r.mutex);
    r.factories.remove(progId.toLower());
}

std::unique_ptr<QObject> createComponent(const QString& progId)
{
    ComponentFactory factory;
    {
        Registry& r = registry();
        QMutexLocker lock(&r.mutex);
        factory = r.factories.value(progId.toLower());
    }
    std::unique_ptr<QObject> object = factory ? factory() : nullptr;
    if (!object)
        throw QuotasError(QStringLiteral("Não foi possível criar o componente \"%1\".").arg(progId));
    return object;
}

}  // namespace quotas
