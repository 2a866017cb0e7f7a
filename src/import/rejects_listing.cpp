#include "import/rejects_listing.h"

#include "component/shared_objects.h"
#include "import/prt_extra.h"
#include "reports/report.h"

namespace quotas {

namespace {

Report& rejectsListing()
{
    return heldReport(shared().prtExtra, rejectsListingLayout);
}

}  // namespace

void showRejectsListing()
{
    ClosesResultSet closing(Data().Extras);
    rejectsListing().showPreview();
}

void writeRejectsListingPdf(const QString& path)
{
    ClosesResultSet closing(Data().Extras);
    rejectsListing().writePdf(path);
}

}  // namespace quotas
