#include "reports/member_statement.h"

#include "platform/connection.h"
#include "platform/errors.h"
#include "platform/recordset.h"
#include "reports/report.h"
#include "reports/report_engine.h"
#include "reports/report_format.h"

#include <algorithm>

namespace quotas {

namespace {

const QString kMoney = QStringLiteral("#,##0.00");

struct MovementTable {
    const char* name;
    const char* origin;
};

constexpr MovementTable kTables[] = {{"tbQuotas_Movimentos", ""},
                                     {"tbQuotas_Movimentos_Inactivos", "Inactivo"},
                                     {"tbQuotas_Movimentos_Historico", "Histórico"}};

QString period(int yearMonth)
{
    return QStringLiteral("%1/%2").arg(yearMonth % 100, 2, 10, QLatin1Char('0')).arg(yearMonth / 100);
}

// The amount as its column prints it: blank for Null, the stored text when unreadable.
QString amountText(const StoredAmount& a)
{
    if (a.unreadable())
        return a.text;
    return a.readable() ? QString::number(double(a.cents) / 100.0, 'f', 2) : QString();
}

QString dateText(const QVariant& value)
{
    // SQLite hands a DATE back as its ISO text.
    if (value.metaType().id() == QMetaType::QString) {
        const QDate date = QDate::fromString(value.toString().left(10), Qt::ISODate);
        if (date.isValid())
            return formatReportValue(date);
    }
    return formatReportValue(value);
}

QString scopeOf(const StatementRequest& request)
{
    QString text = request.allMovements ? QStringLiteral("activos, inactivos e do histórico") : QStringLiteral("activos");
    if (request.fromPeriod && request.toPeriod)
        text += QStringLiteral(", de %1 a %2").arg(period(request.fromPeriod), period(request.toPeriod));
    else if (request.fromPeriod)
        text += QStringLiteral(", desde %1").arg(period(request.fromPeriod));
    else if (request.toPeriod)
        text += QStringLiteral(", até %1").arg(period(request.toPeriod));
    else
        text += QStringLiteral(", todos os meses");
    return text;
}

}  // namespace

QVariant memberByStaffNumber(Connection& connection, const QString& noTap, QString* problem)
{
    Recordset rs;
    rs.open(QStringLiteral("SELECT socio_id FROM tbSocios WHERE no_tap = ? ORDER BY socio_id"), connection,
            Cursor::ForwardOnly, Lock::ReadOnly, {noTap});
    if (rs.recordCount() == 1)
        return rs.value(0);
    *problem = rs.recordCount() == 0
                   ? QStringLiteral("Não há nenhum associado com o Nº Empresa %1.").arg(noTap)
                   : QStringLiteral("O Nº Empresa %1 pertence a %2 associados: corrija o registo de associados.")
                         .arg(noTap)
                         .arg(rs.recordCount());
    return QVariant();
}

MemberStatement readMemberStatement(Connection& connection, const StatementRequest& request)
{
    MemberStatement s;
    Recordset member;
    member.open(QStringLiteral("SELECT tbSocios.no_tap, tbSocios.nome, tbSocios.nome_guerra, tbSocios.morada1, "
                               "tbSocios.code_postal1, tbSocios.localidade1, tbQuotas_Socios.squota_id, "
                               "tbQuotas_Socios.total_quotas, tbQuotas_Socios.total_pago FROM tbSocios LEFT OUTER JOIN "
                               "tbQuotas_Socios ON tbSocios.socio_id = tbQuotas_Socios.socio_id WHERE tbSocios.socio_id = ?"),
                connection, Cursor::ForwardOnly, Lock::ReadOnly, {request.socioId});
    if (member.eof())
        throw QuotasError(QStringLiteral("O associado %1 não existe.").arg(request.socioId.toString()));
    s.noTap = member.value(QStringLiteral("no_tap")).toString();
    s.nome = member.value(QStringLiteral("nome")).toString();
    s.nomeGuerra = member.value(QStringLiteral("nome_guerra")).toString();
    s.morada = member.value(QStringLiteral("morada1")).toString();
    s.localidade = QStringList{member.value(QStringLiteral("code_postal1")).toString(),
                               member.value(QStringLiteral("localidade1")).toString()}
                       .join(u' ')
                       .trimmed();
    s.hasAccount = !member.isNull(QStringLiteral("squota_id"));
    s.scope = scopeOf(request);

    // The account's totals are compared with every active movement, whatever
    // the period shown: they are what the maintenance would rebuild them from.
    qint64 activeCharged = 0;
    qint64 activePaid = 0;
    bool activeUnreadable = false;
    const int tables = request.allMovements ? 3 : 1;
    for (int t = 0; t < tables; ++t) {
        Recordset rs;
        rs.open(QStringLiteral("SELECT data, ano, mes, tipo, ref, quota_no, quota, pago, doc_no FROM %1 WHERE socio_id = ?")
                    .arg(QLatin1String(kTables[t].name)),
                connection, Cursor::ForwardOnly, Lock::ReadOnly, {request.socioId});
        for (; !rs.eof(); rs.moveNext()) {
            StatementLine line;
            line.date = rs.value(0);
            line.ano = rs.value(1).toInt();
            line.mes = rs.value(2).toInt();
            line.tipo = rs.value(3).toInt();
            line.ref = rs.value(4).toString();
            line.quotaNo = rs.value(5);
            line.due = readReportAmount(rs.value(6));
            line.paid = readReportAmount(rs.value(7));
            line.document = rs.value(8).toString();
            line.origin = QString::fromUtf8(kTables[t].origin);
            if (t == 0) {
                activeCharged += line.due.centsOrZero();
                activePaid += line.paid.centsOrZero();
                activeUnreadable = activeUnreadable || !line.openKnown();
            }
            const int yearMonth = line.ano * 100 + line.mes;
            if ((request.fromPeriod && yearMonth < request.fromPeriod) || (request.toPeriod && yearMonth > request.toPeriod))
                continue;
            s.lines.push_back(std::move(line));
        }
    }
    // Active before inactive before history within one month and type.
    std::stable_sort(s.lines.begin(), s.lines.end(), [](const StatementLine& a, const StatementLine& b) {
        return std::tie(a.ano, a.mes, a.tipo) < std::tie(b.ano, b.mes, b.tipo);
    });
    qint64 balance = 0;
    for (StatementLine& line : s.lines) {
        s.unreadable += int(line.due.unreadable()) + int(line.paid.unreadable());
        s.charged += line.due.centsOrZero();
        s.paid += line.paid.centsOrZero();
        if (line.openKnown())
            balance += line.open();
        line.balance = balance;
    }
    const StoredAmount storedCharged = readReportAmount(member.value(QStringLiteral("total_quotas")));
    const StoredAmount storedPaid = readReportAmount(member.value(QStringLiteral("total_pago")));
    s.storedCharged = storedCharged;
    s.storedPaid = storedPaid;
    if (s.hasAccount)
        s.accountDiffers = activeUnreadable || storedCharged.unreadable() || storedPaid.unreadable()
                           || storedCharged.centsOrZero() != activeCharged || storedPaid.centsOrZero() != activePaid;
    else
        s.accountDiffers = activeCharged != 0 || activePaid != 0;
    return s;
}

ReportDocument layOutMemberStatement(const MemberStatement& s, const Letterhead& letterhead, const QDate& printed)
{
    auto layout = std::make_shared<ReportLayout>();
    ReportLayout& r = *layout;
    r.name = QStringLiteral("prtExtratoQuotas");
    r.title = QStringLiteral("Extrato de Quotas");
    r.width = 10575;

    const ReportFont bold = arial(8.25, true);
    std::vector<ReportItem> head = {
        label(QStringLiteral("lblSindicato"), letterhead.name, 30, 75, 10485, 300, arial(11.25, true), Align::Center),
        label(QStringLiteral("lblMoradaSindicato"), letterhead.address, 15, 360, 10485, 330, arial(9.75), Align::Center),
        label(QStringLiteral("lblTitulo"), QStringLiteral("Extrato de Quotas"), 90, 780, 10470, 300,
              timesNewRoman(12, true), Align::Center),
        label(QStringLiteral("lblData"), QStringLiteral("%D"), 5880, 1200, 4665, 240, arial(8.25, false, true), Align::Right),
        label(QStringLiteral("lblNoEmpresa"), QStringLiteral("Nº Empresa:"), 120, 1200, 1350, 240, bold),
        label(QStringLiteral("txtNoTap"), s.noTap, 1500, 1200, 3000, 240),
        label(QStringLiteral("lblAssociado"), QStringLiteral("Nome:"), 120, 1470, 1350, 240, bold),
        label(QStringLiteral("txtNome"), s.nome, 1500, 1470, 9000, 240),
        label(QStringLiteral("lblNomeGuerra"), QStringLiteral("Nome Guerra:"), 120, 1740, 1350, 240, bold),
        label(QStringLiteral("txtNomeGuerra"), s.nomeGuerra, 1500, 1740, 9000, 240),
        label(QStringLiteral("lblMorada"), QStringLiteral("Morada:"), 120, 2010, 1350, 240, bold),
        label(QStringLiteral("txtMorada"), s.morada, 1500, 2010, 9000, 240),
        label(QStringLiteral("lblLocalidade"), QStringLiteral("Localidade:"), 120, 2280, 1350, 240, bold),
        label(QStringLiteral("txtLocalidade"), s.localidade, 1500, 2280, 9000, 240),
        label(QStringLiteral("lblPeriodo"), QStringLiteral("Movimentos:"), 120, 2550, 1350, 240, bold),
        label(QStringLiteral("txtPeriodo"), s.scope, 1500, 2550, 9000, 240),
    };
    r.reportHeader = reportBand(QStringLiteral("Cabecalho"), 2900, std::move(head));

    r.pageHeader = reportBand(
        QStringLiteral("CabecalhoPagina"), 428,
        {box(QStringLiteral("shpCabecalho"), 15, 30, 10515, 345, QColor(192, 192, 192), QColor(64, 64, 64)),
         label(QStringLiteral("lblColData"), QStringLiteral("Data"), 60, 75, 950, 240, bold),
         label(QStringLiteral("lblColMes"), QStringLiteral("Mês/Ano"), 1040, 75, 700, 240, bold),
         label(QStringLiteral("lblColTipo"), QStringLiteral("Tipo"), 1780, 75, 900, 240, bold),
         label(QStringLiteral("lblColNumero"), QStringLiteral("Nº Quota"), 2700, 75, 760, 240, bold, Align::Right),
         label(QStringLiteral("lblColQuota"), QStringLiteral("Quota"), 3500, 75, 1040, 240, bold, Align::Right),
         label(QStringLiteral("lblColPago"), QStringLiteral("Pago"), 4580, 75, 1040, 240, bold, Align::Right),
         label(QStringLiteral("lblColAberto"), QStringLiteral("Em Aberto"), 5660, 75, 1040, 240, bold, Align::Right),
         label(QStringLiteral("lblColDocumento"), QStringLiteral("Documento"), 6820, 75, 1300, 240, bold),
         label(QStringLiteral("lblColSaldo"), QStringLiteral("Saldo"), 8160, 75, 1100, 240, bold, Align::Right),
         label(QStringLiteral("lblColOrigem"), QStringLiteral("Origem"), 9380, 75, 1150, 240, bold)});

    r.detail = reportBand(QStringLiteral("Detalhe"), 270,
                          {field(QStringLiteral("txtData"), QStringLiteral("data"), 60, 30, 950, 240),
                           field(QStringLiteral("txtMes"), QStringLiteral("mes_ano"), 1040, 30, 700, 240),
                           field(QStringLiteral("txtTipo"), QStringLiteral("ref"), 1780, 30, 900, 240),
                           field(QStringLiteral("txtNumero"), QStringLiteral("quota_no"), 2700, 30, 760, 240, arial(),
                                 Align::Right),
                           field(QStringLiteral("txtQuota"), QStringLiteral("quota"), 3500, 30, 1040, 240, arial(),
                                 Align::Right, kMoney),
                           field(QStringLiteral("txtPago"), QStringLiteral("pago"), 4580, 30, 1040, 240, arial(),
                                 Align::Right, kMoney),
                           field(QStringLiteral("txtAberto"), QStringLiteral("em_aberto"), 5660, 30, 1040, 240, arial(),
                                 Align::Right, kMoney),
                           field(QStringLiteral("txtDocumento"), QStringLiteral("doc_no"), 6820, 30, 1300, 240),
                           field(QStringLiteral("txtSaldo"), QStringLiteral("saldo"), 8160, 30, 1100, 240, arial(),
                                 Align::Right, kMoney),
                           field(QStringLiteral("txtOrigem"), QStringLiteral("origem"), 9380, 30, 1150, 240)});

    r.pageFooter = numberedPageFooter(QStringLiteral("RodapePagina"));

    std::vector<ReportItem> totals = {
        hline(QStringLiteral("linTotais"), 75, 15, 10500),
        label(QStringLiteral("lblTotalQuotas"), QStringLiteral("Total de quotas:"), 5505, 120, 2310, 240, bold),
        label(QStringLiteral("txtTotalQuotas"), formatCents(s.charged, kMoneyEsc), 7845, 120, 1800, 240, arial(), Align::Right),
        label(QStringLiteral("lblTotalPago"), QStringLiteral("Total pago:"), 5505, 390, 2310, 240, bold),
        label(QStringLiteral("txtTotalPago"), formatCents(s.paid, kMoneyEsc), 7845, 390, 1800, 240, arial(), Align::Right),
        label(QStringLiteral("lblTotalAberto"), QStringLiteral("Total em aberto:"), 5505, 660, 2310, 240, bold),
        label(QStringLiteral("txtTotalAberto"), formatCents(s.open(), kMoneyEsc), 7845, 660, 1800, 240, arial(), Align::Right),
    };
    int footer = 960;
    if (s.unreadable > 0) {
        totals.push_back(label(QStringLiteral("lblIlegiveis"),
                               QStringLiteral("%1 valor(es) ilegível(eis) na base de dados ficaram fora dos totais.")
                                   .arg(s.unreadable),
                               120, footer, 10400, 240, bold));
        footer += 270;
    }
    if (s.accountDiffers) {
        const QString stored =
            s.hasAccount ? QStringLiteral("Na conta: %1 de quotas, %2 pagos; ")
                               .arg(s.storedCharged.unreadable() ? s.storedCharged.text
                                                                 : formatCents(s.storedCharged.centsOrZero(), kMoneyEsc),
                                    s.storedPaid.unreadable() ? s.storedPaid.text
                                                              : formatCents(s.storedPaid.centsOrZero(), kMoneyEsc))
                         : QStringLiteral("O associado não tem conta de quotas; ");
        totals.push_back(label(QStringLiteral("lblAcumulados"),
                               stored + QStringLiteral("os acumulados da conta diferem: corra a Manutenção de Dados."), 120,
                               footer, 10400, 240, bold));
        footer += 270;
    }
    r.reportFooter = reportBand(QStringLiteral("Totais"), footer + 60, std::move(totals));

    Recordset rows;
    rows.openInMemory({QStringLiteral("data"), QStringLiteral("mes_ano"), QStringLiteral("ref"), QStringLiteral("quota_no"),
                       QStringLiteral("quota"), QStringLiteral("pago"), QStringLiteral("em_aberto"),
                       QStringLiteral("doc_no"), QStringLiteral("saldo"), QStringLiteral("origem")});
    for (const StatementLine& line : s.lines) {
        rows.addNew();
        rows.setValue(0, dateText(line.date));
        rows.setValue(1, period(line.ano * 100 + line.mes));
        rows.setValue(2, line.ref);
        rows.setValue(3, line.quotaNo);
        rows.setValue(4, amountText(line.due));
        rows.setValue(5, amountText(line.paid));
        if (line.openKnown())
            rows.setValue(6, QString::number(double(line.open()) / 100.0, 'f', 2));
        rows.setValue(7, line.document);
        rows.setValue(8, QString::number(double(line.balance) / 100.0, 'f', 2));
        rows.setValue(9, line.origin);
        rows.update();
    }
    return layOutObservedReport(layout, rows, printed);
}

}  // namespace quotas
