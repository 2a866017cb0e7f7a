#include "import/entry.h"

#include "component/not_available.h"

namespace quotas {

void showImportDialog()
{
    windowNotAvailable(QStringLiteral("Importar Registos de Quotas"));
}

}  // namespace quotas
