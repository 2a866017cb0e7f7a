#pragma once

#include <QString>
#include <functional>
#include <memory>

class QObject;

namespace quotas {

// Components created by their programmatic identifier ("Velumo.General",
// "Dorvanta.General") and called late-bound by method name.
using ComponentFactory = std::function<std::unique_ptr<QObject>()>;

// Registers or replaces the factory of a ProgID (the command line replaces
// the progress window by a console one; tests replace it by a recorder).
void registerComponent(const QString& progId, const ComponentFactory& factory);
void unregisterComponent(const QString& progId);

// Throws QuotasError when nothing is registered under the ProgID.
std::unique_ptr<QObject> createComponent(const QString& progId);

}  // namespace quotas
