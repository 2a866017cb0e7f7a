#include "import/rejects_listing.h"

#include "component/not_available.h"

namespace quotas {

void showRejectsListing()
{
    windowNotAvailable(QStringLiteral("Listagem de Dados não Importados"));
}

void writeRejectsListingPdf(const QString&)
{
    windowNotAvailable(QStringLiteral("Listagem de Dados não Importados"));
}

}  // namespace quotas
