#include "record/entry.h"

#include "component/not_available.h"

namespace quotas {

void showRecordWindow(General&, std::shared_ptr<Recordset>, const QVariant&, QObject*)
{
    windowNotAvailable(QStringLiteral("Quota"));
}

}  // namespace quotas
