#pragma once

#include <QVariant>
#include <QVariantList>

class QObject;

namespace quotas {

// Calls a Q_INVOKABLE method or slot by name, as the original components were
// called: the first method with that name taking that many arguments, each
// argument converted to the declared type. Exceptions of the callee pass on.

// Throws QuotasError when the object is null or has no such method.
QVariant callByName(QObject* object, const char* method, const QVariantList& args = {});

// False when the object is null or has no such method (nothing is called).
bool tryCallByName(QObject* object, const char* method, const QVariantList& args = {}, QVariant* result = nullptr);

}  // namespace quotas
