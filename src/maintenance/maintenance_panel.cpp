#include "maintenance/maintenance_panel.h"

namespace quotas {

QString maintenanceCaption()
{
    return QStringLiteral("Manutenção da Base de Dados");
}

}  // namespace quotas
