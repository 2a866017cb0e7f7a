#include "generation/entry.h"

#include "component/not_available.h"

namespace quotas {

void showGenerationDialog()
{
    windowNotAvailable(QStringLiteral("Gerar Quotas"));
}

}  // namespace quotas
