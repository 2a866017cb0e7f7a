#include "import/rejects_listing.h"

#include "component/shared_objects.h"
#include "import/prt_extra.h"
#include "reports/report.h"

namespace quotas {

namespace {

Report& rejectsListing()
{
    QPointer<QObject>& held = shared().prtExtra;
    if (!held)
        held = new Report(rejectsListingLayout());
    return *qobject_cast<Report*>(held.data());
}

// However the showing ends, the next one reads extras afresh.
class ClosesExtras {
public:
    ClosesExtras() = default;
    ~ClosesExtras()
    {
        Recordset& rs = Data().Extras.recordset();
        if (rs.isOpen())
            rs.close();
    }
    ClosesExtras(const ClosesExtras&) = delete;
    ClosesExtras& operator=(const ClosesExtras&) = delete;
};

}  // namespace

void showRejectsListing()
{
    ClosesExtras closing;
    rejectsListing().showPreview();
}

void writeRejectsListingPdf(const QString& path)
{
    ClosesExtras closing;
    rejectsListing().writePdf(path);
}

}  // namespace quotas
