#include "reports/debt_letters.h"

namespace quotas {

ReportLayout debtLettersLayout(const Letterhead& letterhead)
{
    const QString money = QStringLiteral("#,##0.00 Esc");
    const ReportFont body = arial(9.75);
    ReportLayout r;
    r.name = QStringLiteral("prtCartasDividas");
    r.title = QStringLiteral("Cartas de Dívidas");
    r.command = QStringLiteral("Dividas");
    r.width = 10575;

    r.reportHeader = reportBand(QStringLiteral("Section4"), 0);
    r.pageHeader = reportBand(QStringLiteral("Section2"), 0);
    r.detail = reportBand(
        QStringLiteral("Section1"), 15240,
        {label(QStringLiteral("lblSindicato"), letterhead.name, 30, 75, 10485, 300, arial(11.25, true), Align::Center),
         label(QStringLiteral("lblMoradaSindicato"), letterhead.address, 15, 360, 10485, 330, arial(9.75), Align::Center),
         label(QStringLiteral("lblNoEmpresa"), QStringLiteral("Nº Empresa:"), 3165, 1935, 1050, 240, arial(8.25, true)),
         field(QStringLiteral("txtNoTap"), QStringLiteral("no_tap"), 4470, 1935, 1650, 225),
         label(QStringLiteral("lblAssociado"), QStringLiteral("Associado:"), 3165, 2250, 1065, 240, arial(8.25, true)),
         field(QStringLiteral("txtNome"), QStringLiteral("nome"), 4470, 2250, 5265, 225),
         label(QStringLiteral("lblMorada"), QStringLiteral("Morada:"), 3165, 2565, 1020, 240, arial(8.25, true)),
         field(QStringLiteral("txtMorada"), QStringLiteral("morada1"), 4470, 2565, 5265, 495),
         label(QStringLiteral("lblLocalidade"), QStringLiteral("Localidade:"), 3165, 3060, 1020, 240, arial(8.25, true)),
         field(QStringLiteral("txtCodigoPostal"), QStringLiteral("Codigo_Postal"), 4470, 3060, 5265, 225),
         label(QStringLiteral("lblData"), QStringLiteral("%D"), 105, 4755, 5580, 300, arial(9, false, true)),
         label(QStringLiteral("lblAssunto"), QStringLiteral("Assunto:"), 120, 5235, 915, 300, arial(11.25)),
         label(QStringLiteral("lblRegularizacao"), QStringLiteral("Regularização de Débitos"), 1065, 5235, 4065, 300,
               arial(11.25, true)),
         label(QStringLiteral("lblSaudacao"), QStringLiteral("Caro(a) Associado(a);"), 150, 6765, 4140, 300, body),
         label(QStringLiteral("lblTexto1"),
               QStringLiteral("Na sequência do incumprimento do pagamento das quotizações ao Orbela, o saldo devedor é,"),
               150, 7590, 9915, 300, body),
         label(QStringLiteral("lblTexto2"), QStringLiteral(" na presente data, de ESC:"), 150, 8040, 2700, 300, body),
         field(QStringLiteral("txtDivida"), QStringLiteral("total_divida"), 2895, 8055, 4815, 300, body, Align::Left,
               money),
         label(QStringLiteral("lblTexto3"),
               QStringLiteral("Lembramos que o referido saldo está sujeito a acertos resultantes de eventuais "
                              "modificações salariais."),
               150, 8715, 10230, 300, body),
         label(QStringLiteral("lblTexto4"),
               QStringLiteral("Assim solicitamos a sua presença no Sindicato o mais breve possivel a fim de regularizar o "
                              "seu débito."),
               120, 9240, 10230, 300, body),
         label(QStringLiteral("lblCumprimentos"), QStringLiteral("Com os nossos melhores cumprimentos,"), 120, 9915, 10230,
               300, body),
         label(QStringLiteral("lblDireccao"), QStringLiteral("A Direcção"), 5970, 12195, 2310, 300, arial(11.25))},
        true);
    r.pageFooter = reportBand(QStringLiteral("Section3"), 390,
                              {hline(QStringLiteral("linRodape"), 75, 60, 10500),
                               label(QStringLiteral("lblProcessado"), QStringLiteral("Processado por Computador"), 60, 105,
                                     2130, 225, arial(6.75))});
    r.reportFooter = reportBand(QStringLiteral("Section5"), 0);
    return r;
}

}  // namespace quotas
