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
    QPointer<QObject>& held = shared().prtListagemDividas;
    if (!held)
        held = new Report(debtListingLayout());
    return *qobject_cast<Report*>(held.data());
}

Report& debtLetters()
{
    QPointer<QObject>& held = shared().prtCartasDividas;
    if (!held)
        held = new Report(debtLettersLayout(readLetterhead()));
    else
        // The letterhead file may have been edited since the last letters.
        qobject_cast<Report*>(held.data())->setLayout(debtLettersLayout(readLetterhead()));
    return *qobject_cast<Report*>(held.data());
}

// Closes rsDividas however the showing ends: after a failure too, so that a
// later showing never presents the rows of an earlier one.
class ClosesDividas {
public:
    explicit ClosesDividas(DataEnvironment& data) : m_data(data) {}
    ~ClosesDividas()
    {
        if (m_data.Dividas.recordset().isOpen())
            m_data.Dividas.recordset().close();
    }
    ClosesDividas(const ClosesDividas&) = delete;
    ClosesDividas& operator=(const ClosesDividas&) = delete;

private:
    DataEnvironment& m_data;
};

template <typename Show>
auto withReportsConnection(Show&& show)
{
    DataEnvironment& data = Data();
    prepareReportsConnection(data);
    ClosesDividas closing(data);
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
