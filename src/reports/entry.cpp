#include "reports/entry.h"

#include "component/shared_objects.h"
#include "reports/debt_letters.h"
#include "reports/debt_listing.h"
#include "reports/prints_connection.h"
#include "reports/report.h"

namespace quotas {

namespace {

Report& debtListing()
{
    return heldReport(shared().prtListagemDividas, debtListingLayout);
}

Report& debtLetters()
{
    const auto layout = [] { return debtLettersLayout(readLetterhead()); };
    const bool existed = !shared().prtCartasDividas.isNull();
    Report& letters = heldReport(shared().prtCartasDividas, layout);
    // The letterhead file may have been edited since the last letters.
    if (existed)
        letters.setLayout(layout());
    return letters;
}

template <typename Show>
auto withReportsConnection(Show&& show)
{
    DataEnvironment& data = Data();
    prepareReportsConnection(data);
    ClosesResultSet closing(data.Dividas);
    return show();
}

}  // namespace

void showDebtListing()
{
    withReportsConnection([] { debtListing().showPreview(); });
}

void showDebtLetters()
{
    withReportsConnection([] { debtLetters().showPreview(); });
}

int writeDebtListingPdf(const QString& path)
{
    return withReportsConnection([&] { return debtListing().writePdf(path); });
}

int writeDebtLettersPdf(const QString& path)
{
    return withReportsConnection([&] { return debtLetters().writePdf(path); });
}

}  // namespace quotas
