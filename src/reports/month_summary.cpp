#include "reports/month_summary.h"

#include "component/month_names.h"
#include "generation/due_rules.h"
#include "platform/connection.h"
#include "platform/recordset.h"
#include "reports/report.h"
#include "reports/report_format.h"
#include "reports/stored_amount.h"

#include <QHash>
#include <QSet>

namespace quotas {

namespace {

struct Attention {
    QString caption;
    int count;
};

std::vector<Attention> attentionOf(const MonthSummary& s)
{
    std::vector<Attention> lines = {
        {QStringLiteral("Linhas rejeitadas na última importação:"), s.rejectedLines},
        {QStringLiteral("Associados sem conta de quotas:"), s.membersWithoutAccount},
        {QStringLiteral("Quotas do mês que a geração não pôde calcular:"), s.duesNotComputed},
    };
    if (const int unreadable = s.total().unreadable)
        lines.push_back({QStringLiteral("Valores ilegíveis nas quotas do mês (fora das somas):"), unreadable});
    return lines;
}

QString monthTitle(const MonthSummary& s)
{
    return QStringLiteral("%1 de %2").arg(monthNames().value(s.month - 1)).arg(s.year);
}

// Dues generation would have to post this month but cannot: the account
// lacks a remuneration, or the employer's rate is empty.
int duesNotComputed(Connection& connection, int year, int month, const std::array<QSet<qint64>, 2>& charged,
                    int* withoutAccount)
{
    QHash<QString, QVariant> employerRates;
    Recordset employers;
    employers.open(QStringLiteral("SELECT code, percent_sindicato FROM tbEmpresas"), connection, Cursor::ForwardOnly,
                   Lock::ReadOnly);
    for (; !employers.eof(); employers.moveNext())
        employerRates.insert(employers.value(0).toString(), employers.value(1));

    Recordset members;
    members.open(QStringLiteral("SELECT tbSocios.socio_id, tbSocios.empresa, tbSocios.seguro, tbSocios.seguro_data_rescisao, "
                                "tbQuotas_Socios.squota_id, tbQuotas_Socios.ult_rend1, tbQuotas_Socios.ult_rend2, "
                                "tbQuotas_Socios.ult_perc_sindicato, tbQuotas_Socios.ult_perc_seguro FROM tbSocios LEFT "
                                "OUTER JOIN tbQuotas_Socios ON tbSocios.socio_id = tbQuotas_Socios.socio_id"),
                 connection, Cursor::ForwardOnly, Lock::ReadOnly);
    int count = 0;
    for (; !members.eof(); members.moveNext()) {
        if (members.value(4).isNull()) {
            ++*withoutAccount;
            continue;
        }
        const qint64 socio = members.value(0).toLongLong();
        const bool remunerations = readReportAmount(members.value(5)).readable()
                                   && readReportAmount(members.value(6)).readable();
        const QString employer = members.value(1).toString();
        const bool employerFound = !members.value(1).isNull() && employerRates.contains(employer);
        for (const DueType type : {DueType::Sindicato, DueType::Seguro}) {
            const int t = int(type) - 1;
            if (charged[size_t(t)].contains(socio))
                continue;
            if (type == DueType::Seguro && !insuranceCharged(readStoredNumber(members.value(2)), readStoredDate(members.value(3)), year, month))
                continue;
            const QVariant personal = members.value(type == DueType::Sindicato ? 7 : 8);
            if (!remunerations || !dueRate(readStoredNumber(personal), employerFound, readStoredNumber(employerRates.value(employer))))
                ++count;
        }
    }
    return count;
}

// How the in-memory rows carry an amount to a formatted field.
QString dotted(qint64 cents)
{
    return QString::number(double(cents) / 100.0, 'f', 2);
}

}  // namespace

MonthTypeFigures& MonthTypeFigures::operator+=(const MonthTypeFigures& o)
{
    members += o.members;
    dues += o.dues;
    charged += o.charged;
    deducted += o.deducted;
    paidOtherwise += o.paidOtherwise;
    open += o.open;
    unreadable += o.unreadable;
    return *this;
}

MonthTypeFigures MonthSummary::total() const
{
    MonthTypeFigures t;
    t.ref = QStringLiteral("Total");
    for (const MonthTypeFigures& type : types)
        t += type;
    return t;
}

MonthSummary readMonthSummary(Connection& connection, int year, int month)
{
    MonthSummary s;
    s.year = year;
    s.month = month;
    s.types[0].tipo = 1;
    s.types[0].ref = QStringLiteral("Sindicato");
    s.types[1].tipo = 2;
    s.types[1].ref = QStringLiteral("Seguro");

    // The sums are taken here in whole cents, one movement at a time, so that
    // they are exact on both engines and read each amount as the statement does.
    std::array<QSet<qint64>, 2> charged;
    Recordset rs;
    rs.open(QStringLiteral("SELECT socio_id, tipo, quota, pago, doc_no FROM tbQuotas_Movimentos WHERE ano = ? AND mes = ?"),
            connection, Cursor::ForwardOnly, Lock::ReadOnly, {year, month});
    for (; !rs.eof(); rs.moveNext()) {
        const int t = rs.value(1).toInt() == 1 ? 0 : 1;
        MonthTypeFigures& f = s.types[size_t(t)];
        charged[size_t(t)].insert(rs.value(0).toLongLong());
        ++f.dues;
        const StoredAmount due = readReportAmount(rs.value(2));
        const StoredAmount paid = readReportAmount(rs.value(3));
        f.unreadable += int(due.unreadable()) + int(paid.unreadable());
        f.charged += due.centsOrZero();
        if (rs.value(4).toString().trimmed().isEmpty())
            f.deducted += paid.centsOrZero();
        else
            f.paidOtherwise += paid.centsOrZero();
        if (!due.unreadable() && !paid.unreadable())
            f.open += due.centsOrZero() - paid.centsOrZero();
    }
    for (int t = 0; t < 2; ++t)
        s.types[size_t(t)].members = int(charged[size_t(t)].size());

    s.rejectedLines = connection.scalar(QStringLiteral("SELECT COUNT(*) FROM extras")).toInt();
    s.duesNotComputed = duesNotComputed(connection, year, month, charged, &s.membersWithoutAccount);
    return s;
}

ReportDocument layOutMonthSummary(const MonthSummary& s, const QDate& printed)
{
    auto layout = std::make_shared<ReportLayout>();
    ReportLayout& r = *layout;
    r.name = QStringLiteral("prtResumoMes");
    r.title = QStringLiteral("Resumo do Mês");
    r.width = 10575;
    const ReportFont bold = arial(8.25, true);

    r.reportHeader = reportBand(
        QStringLiteral("Cabecalho"), 1000,
        {label(QStringLiteral("lblTitulo"), QStringLiteral("Resumo do Mês"), 90, 135, 10470, 255, timesNewRoman(12, true),
               Align::Center),
         label(QStringLiteral("lblMes"), monthTitle(s), 90, 420, 10470, 255, timesNewRoman(11), Align::Center),
         label(QStringLiteral("lblData"), QStringLiteral("%D"), 5880, 720, 4665, 240, arial(8.25, false, true),
               Align::Right)});

    // Captions on two lines, so that each fits over its column.
    const auto caption = [&](const QString& name, const QString& first, const QString& second, int left, int width,
                             Align align) {
        return std::vector<ReportItem>{label(name + u'1', first, left, 60, width, 240, bold, align),
                                       label(name + u'2', second, left, 290, width, 240, bold, align)};
    };
    struct Column {
        const char* name;
        QString first, second;
        const char* field;
        int left, width;
    };
    const std::vector<Column> columns = {
        {"Tipo", QStringLiteral("Tipo"), QString(), "ref", 120, 1300},
        {"Socios", QStringLiteral("Sócios"), QStringLiteral("cobrados"), "socios", 1440, 900},
        {"Quotas", QStringLiteral("Nº de"), QStringLiteral("quotas"), "quotas", 2380, 800},
        {"Valor", QStringLiteral("Valor das"), QStringLiteral("quotas"), "valor", 3220, 1780},
        {"Descontado", QStringLiteral("Descontado"), QStringLiteral("na lista"), "descontado", 5040, 1780},
        {"Outros", QStringLiteral("Pago de"), QStringLiteral("outra forma"), "outros", 6860, 1780},
        {"Aberto", QStringLiteral("Em"), QStringLiteral("aberto"), "aberto", 8680, 1780},
    };
    std::vector<ReportItem> head = {
        box(QStringLiteral("shpCabecalho"), 15, 30, 10515, 540, QColor(192, 192, 192), QColor(64, 64, 64))};
    std::vector<ReportItem> detail;
    std::vector<ReportItem> footer = {hline(QStringLiteral("linTotais"), 75, 15, 10500)};
    for (const Column& c : columns) {
        const bool text = QLatin1String(c.field) == QLatin1String("ref");
        const bool amount = c.width > 1000;
        const Align align = text ? Align::Left : Align::Right;
        for (ReportItem& i : caption(QStringLiteral("lbl") + QLatin1String(c.name), c.first, c.second, c.left, c.width, align))
            head.push_back(std::move(i));
        detail.push_back(field(QStringLiteral("txt") + QLatin1String(c.name), QLatin1String(c.field), c.left, 45, c.width,
                               240, arial(), align, amount ? kMoneyEsc : QString()));
    }
    r.pageHeader = reportBand(QStringLiteral("CabecalhoPagina"), 620, std::move(head));
    r.detail = reportBand(QStringLiteral("Detalhe"), 330, std::move(detail));

    // The totals line, then what needs attention.
    const MonthTypeFigures t = s.total();
    const QStringList totals = {QStringLiteral("Total"),
                                QString::number(t.members),
                                QString::number(t.dues),
                                formatCents(t.charged, kMoneyEsc),
                                formatCents(t.deducted, kMoneyEsc),
                                formatCents(t.paidOtherwise, kMoneyEsc),
                                formatCents(t.open, kMoneyEsc)};
    for (size_t i = 0; i < columns.size(); ++i)
        footer.push_back(label(QStringLiteral("tot") + QLatin1String(columns[i].name), totals[qsizetype(i)], columns[i].left,
                               75, columns[i].width, 240, bold, i == 0 ? Align::Left : Align::Right));
    int top = 600;
    footer.push_back(label(QStringLiteral("lblAtencao"), QStringLiteral("A verificar:"), 120, top, 3000, 240, bold));
    int n = 0;
    for (const Attention& a : attentionOf(s)) {
        top += 290;
        footer.push_back(label(QStringLiteral("lblAtencao%1").arg(++n), a.caption, 420, top, 6000, 240));
        footer.push_back(label(QStringLiteral("txtAtencao%1").arg(n), QString::number(a.count), 6480, top, 1000, 240,
                               arial(), Align::Right));
    }
    r.reportFooter = reportBand(QStringLiteral("Totais"), top + 400, std::move(footer));
    r.pageFooter = numberedPageFooter(QStringLiteral("RodapePagina"));

    Recordset rows;
    rows.openInMemory({QStringLiteral("ref"), QStringLiteral("socios"), QStringLiteral("quotas"), QStringLiteral("valor"),
                       QStringLiteral("descontado"), QStringLiteral("outros"), QStringLiteral("aberto")});
    for (const MonthTypeFigures& f : s.types) {
        rows.addNew();
        rows.setValue(0, f.ref);
        rows.setValue(1, QString::number(f.members));
        rows.setValue(2, QString::number(f.dues));
        rows.setValue(3, dotted(f.charged));
        rows.setValue(4, dotted(f.deducted));
        rows.setValue(5, dotted(f.paidOtherwise));
        rows.setValue(6, dotted(f.open));
        rows.update();
    }
    return layOutObservedReport(layout, rows, printed);
}

QByteArray monthSummaryCsv(const MonthSummary& s)
{
    QStringList lines;
    lines << QStringLiteral("Resumo do Mês;%1").arg(monthTitle(s));
    lines << QStringLiteral("Tipo;Sócios cobrados;Nº de quotas;Valor das quotas;Descontado na lista;Pago de outra forma;"
                            "Em aberto");
    std::vector<MonthTypeFigures> rows(s.types.begin(), s.types.end());
    rows.push_back(s.total());
    for (const MonthTypeFigures& f : rows)
        lines << QStringList{f.ref,
                             QString::number(f.members),
                             QString::number(f.dues),
                             formatCents(f.charged, QStringLiteral("0.00")),
                             formatCents(f.deducted, QStringLiteral("0.00")),
                             formatCents(f.paidOtherwise, QStringLiteral("0.00")),
                             formatCents(f.open, QStringLiteral("0.00"))}
                     .join(u';');
    lines << QString();
    for (const Attention& a : attentionOf(s))
        lines << QStringLiteral("%1;%2").arg(a.caption.chopped(1)).arg(a.count);
    return QByteArray("\xEF\xBB\xBF") + lines.join(QStringLiteral("\r\n")).toUtf8() + "\r\n";
}

}  // namespace quotas
