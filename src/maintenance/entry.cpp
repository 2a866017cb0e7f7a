#include "maintenance/entry.h"

#include "component/not_available.h"

namespace quotas {

void showMaintenanceDialog()
{
    windowNotAvailable(QStringLiteral("Manutenção da Base de Dados"));
}

}  // namespace quotas
