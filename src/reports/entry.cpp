#include "reports/entry.h"

#include "component/shared_objects.h"
#include "platform/errors.h"
#include "reports/debt_letters.h"
#include "reports/debt_listing.h"
#include "reports/frm_resumo_mes.h"
#include "reports/month_summary.h"
#include "reports/report_painter.h"
#include "reports/prints_connection.h"
#include "reports/report.h"

#include <QApplication>
#include <QSaveFile>

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

MemberStatement statementOf(const StatementRequest& request)
{
    DataEnvironment& data = Data();
    prepareReportsConnection(data);
    return readMemberStatement(data.SqlServer_Prints, request);
}

MonthSummary summaryOf(int year, int month)
{
    DataEnvironment& data = Data();
    prepareReportsConnection(data);
    return readMonthSummary(data.SqlServer_Prints, year, month);
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

void showMemberStatement(const StatementRequest& request)
{
    showReportPreview(layOutMemberStatement(statementOf(request), readLetterhead()));
}

int writeMemberStatementPdf(const StatementRequest& request, const QString& path)
{
    const ReportDocument doc = layOutMemberStatement(statementOf(request), readLetterhead());
    writeReportPdf(doc, path);
    return doc.pageCount();
}

void showMonthSummaryDialog()
{
    frmResumoMes dialog(QDate::currentDate(), QApplication::activeWindow());
    dialog.exec();
}

void showMonthSummary(int year, int month)
{
    showReportPreview(layOutMonthSummary(summaryOf(year, month)));
}

int writeMonthSummaryPdf(int year, int month, const QString& path)
{
    const ReportDocument doc = layOutMonthSummary(summaryOf(year, month));
    writeReportPdf(doc, path);
    return doc.pageCount();
}

void writeMonthSummaryCsv(int year, int month, const QString& path)
{
    const QByteArray csv = monthSummaryCsv(summaryOf(year, month));
    QSaveFile file(path);
    if (!file.open(QIODevice::WriteOnly) || file.write(csv) != csv.size() || !file.commit())
        throw QuotasError(QStringLiteral("Não foi possível escrever o ficheiro %1: %2").arg(path, file.errorString()));
}

}  // namespace quotas
