#include "reports/entry.h"

#include "component/not_available.h"

namespace quotas {

void showDebtListing()
{
    windowNotAvailable(QStringLiteral("Listagem de Dívidas"));
}

void showDebtLetters()
{
    windowNotAvailable(QStringLiteral("Cartas de Dívidas"));
}

}  // namespace quotas
