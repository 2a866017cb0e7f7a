#include "reports/debt_listing.h"

namespace quotas {

ReportLayout debtListingLayout()
{
    const QString money = QStringLiteral("#,##0.00 Esc");
    ReportLayout r;
    r.name = QStringLiteral("prtListagemDividas");
    r.title = QStringLiteral("Listagem de Quotas em Dívida por Associado");
    r.command = QStringLiteral("Dividas");
    r.width = 10575;

    r.reportHeader = reportBand(QStringLiteral("Section4"), 990,
                                {label(QStringLiteral("lblTitulo"), QStringLiteral("Listagem de Quotas em Dívida por Associado"), 90,
                                       135, 10470, 255, timesNewRoman(12, true), Align::Center),
                                 label(QStringLiteral("lblData"), QStringLiteral("%D"), 5880, 540, 4665, 240, arial(8.25, false, true),
                                       Align::Right)});

    r.pageHeader = reportBand(QStringLiteral("Section2"), 428,
                              {box(QStringLiteral("shpCabecalho"), 15, 30, 10515, 345, QColor(192, 192, 192), QColor(64, 64, 64)),
                               label(QStringLiteral("lblNoTap"), QStringLiteral("Nº TAP"), 210, 75, 1425, 240, arial(8.25, true)),
                               label(QStringLiteral("lblNome"), QStringLiteral("Nome"), 1710, 90, 2700, 240, arial(8.25, true)),
                               label(QStringLiteral("lblDivida"), QStringLiteral("Dívida"), 7965, 75, 2130, 240, arial(8.25, true))});

    r.detail = reportBand(QStringLiteral("Section1"), 322,
                          {field(QStringLiteral("txtNoTap"), QStringLiteral("no_tap"), 210, 45, 1440, 270),
                           field(QStringLiteral("txtNome"), QStringLiteral("nome"), 1710, 45, 6045, 270),
                           field(QStringLiteral("txtDivida"), QStringLiteral("total_divida"), 7800, 45, 2250, 270, arial(),
                                 Align::Right, money)});

    r.pageFooter = numberedPageFooter(QStringLiteral("Section3"));

    r.reportFooter = reportBand(QStringLiteral("Section5"), 840,
                                {hline(QStringLiteral("linTotais"), 75, 15, 10500),
                                 label(QStringLiteral("lblTotalRegistos"), QStringLiteral("Total de registos listados:"), 5505, 165,
                                       2310, 195, arial(8.25, true)),
                                 countOf(QStringLiteral("fnRegistos"), QStringLiteral("no_tap"), 7845, 150, 1665, 225, arial(),
                                         Align::Right),
                                 label(QStringLiteral("lblTotalDividas"), QStringLiteral("Total de Dívidas:"), 5520, 570, 2310, 195,
                                       arial(8.25, true)),
                                 sumOf(QStringLiteral("fnDividas"), QStringLiteral("total_divida"), money, 7860, 555, 1635, 225,
                                       arial(), Align::Right)});
    return r;
}

}  // namespace quotas
