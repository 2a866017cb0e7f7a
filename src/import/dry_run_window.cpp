#include "import/dry_run_window.h"

#include "platform/errors.h"
#include "platform/message_boxes.h"
#include "platform/recordset.h"
#include "reports/report.h"
#include "reports/report_format.h"

#include <QHeaderView>
#include <QLabel>
#include <QPushButton>
#include <QTableWidget>
#include <QVBoxLayout>

namespace quotas {

namespace {

const QString kTitle = QStringLiteral("Simular Importação");

QString amount(qint64 cents)
{
    return formatReportValue(double(cents) / 100.0, QStringLiteral("#,##0.00"));
}

}  // namespace

QStringList dryRunCells(const ImportVerdict& v)
{
    const auto shown = [&](qint64 cents) { return v.matched ? amount(cents) : QString(); };
    const bool posted = v.kind == ImportVerdict::Kind::Post;
    return {QString::number(v.line), v.noTap, v.kindText(), shown(v.quotaBefore), shown(v.pagoBefore),
            posted ? amount(v.quotaAfter) : QString(), posted ? amount(v.pagoAfter) : QString(), v.reason};
}

namespace {

const QStringList& headers()
{
    static const QStringList h = {QStringLiteral("Linha"), QStringLiteral("Nº Empresa"),
                                  QStringLiteral("Decisão"), QStringLiteral("Quota antes"),
                                  QStringLiteral("Pago antes"), QStringLiteral("Quota depois"),
                                  QStringLiteral("Pago depois"), QStringLiteral("Motivo")};
    return h;
}

}  // namespace

QString dryRunTotals(const ImportVerdicts& v)
{
    using K = ImportVerdict::Kind;
    return QStringLiteral("A registar: %1 linha(s), %2 Esc; a deixar (já registadas): %3; a rejeitar: %4.")
        .arg(v.count(K::Post))
        .arg(amount(v.postedCents()))
        .arg(v.count(K::LeaveAlone))
        .arg(v.count(K::Reject));
}

ReportDocument layOutDryRun(const ImportVerdicts& verdicts, const QString& subject, const QDate& printed)
{
    auto layout = std::make_shared<ReportLayout>();
    ReportLayout& r = *layout;
    r.name = QStringLiteral("prtSimulacaoImportacao");
    r.title = kTitle;
    r.width = 10575;
    const ReportFont bold = arial(8.25, true);
    // left, width and alignment of each column, in the order of headers()
    const struct {
        int left, width;
        Align align;
    } columns[] = {{60, 500, Align::Right}, {640, 1000, Align::Left}, {1700, 800, Align::Left}, {2540, 1000, Align::Right}, {3580, 1000, Align::Right}, {4620, 1000, Align::Right}, {5660, 1000, Align::Right}, {6760, 3780, Align::Left}};
    const QStringList fields = {QStringLiteral("linha"), QStringLiteral("no_tap"), QStringLiteral("decisao"),
                                QStringLiteral("quota_antes"), QStringLiteral("pago_antes"), QStringLiteral("quota_depois"),
                                QStringLiteral("pago_depois"), QStringLiteral("motivo")};
    r.reportHeader = reportBand(
        QStringLiteral("Cabecalho"), 990,
        {label(QStringLiteral("lblTitulo"), kTitle, 90, 135, 10470, 255, timesNewRoman(12, true), Align::Center),
         label(QStringLiteral("lblAssunto"), subject, 90, 540, 5700, 240, bold),
         label(QStringLiteral("lblData"), QStringLiteral("%D"), 5880, 540, 4665, 240, arial(8.25, false, true),
               Align::Right)});
    std::vector<ReportItem> head = {
        box(QStringLiteral("shpCabecalho"), 15, 30, 10515, 345, QColor(192, 192, 192), QColor(64, 64, 64))};
    std::vector<ReportItem> detail;
    for (int i = 0; i < int(fields.size()); ++i) {
        const auto& c = columns[i];
        head.push_back(label(QStringLiteral("lbl") + fields[i], headers()[i], c.left, 75, c.width, 240, bold, c.align));
        detail.push_back(field(QStringLiteral("txt") + fields[i], fields[i], c.left, 30, c.width, 240, arial(), c.align));
    }
    r.pageHeader = reportBand(QStringLiteral("CabecalhoPagina"), 428, std::move(head));
    r.detail = reportBand(QStringLiteral("Detalhe"), 270, std::move(detail));
    r.reportFooter = reportBand(QStringLiteral("Totais"), 420,
                                {hline(QStringLiteral("linTotais"), 75, 15, 10500),
                                 label(QStringLiteral("lblTotais"), dryRunTotals(verdicts), 60, 120, 10400, 240, bold)});
    r.pageFooter = numberedPageFooter(QStringLiteral("RodapePagina"));

    Recordset rows;
    rows.openInMemory(fields);
    for (const ImportVerdict& v : verdicts.lines) {
        rows.addNew();
        const QStringList cells = dryRunCells(v);
        for (int i = 0; i < int(cells.size()); ++i)
            rows.setValue(i, cells[i]);
        rows.update();
    }
    return layOutObservedReport(layout, rows, printed);
}

DryRunWindow::DryRunWindow(ImportVerdicts verdicts, QString subject, QWidget* parent)
    : QDialog(parent), m_verdicts(std::move(verdicts)), m_subject(std::move(subject)), m_table(new QTableWidget(this))
{
    setObjectName(QStringLiteral("frmSimularImportacao"));
    setWindowTitle(kTitle + QStringLiteral(" - ") + m_subject);
    m_table->setColumnCount(int(headers().size()));
    m_table->setHorizontalHeaderLabels(headers());
    m_table->setRowCount(int(m_verdicts.lines.size()));
    m_table->setEditTriggers(QAbstractItemView::NoEditTriggers);
    m_table->setSelectionBehavior(QAbstractItemView::SelectRows);
    m_table->verticalHeader()->hide();
    m_table->horizontalHeader()->setStretchLastSection(true);
    for (int row = 0; row < int(m_verdicts.lines.size()); ++row) {
        const QStringList cells = dryRunCells(m_verdicts.lines[size_t(row)]);
        for (int column = 0; column < int(cells.size()); ++column) {
            auto* item = new QTableWidgetItem(cells[column]);
            if (column == 0 || (column >= 3 && column <= 6))
                item->setTextAlignment(Qt::AlignRight | Qt::AlignVCenter);
            m_table->setItem(row, column, item);
        }
    }
    m_table->resizeColumnsToContents();

    auto* totals = new QLabel(dryRunTotals(m_verdicts), this);
    totals->setObjectName(QStringLiteral("lblTotais"));
    auto* print = new QPushButton(QStringLiteral("&Imprimir"), this);
    print->setObjectName(QStringLiteral("cmdImprimir"));
    auto* close = new QPushButton(QStringLiteral("&Fechar"), this);
    close->setObjectName(QStringLiteral("cmdFechar"));
    auto* buttons = new QHBoxLayout;
    buttons->addWidget(totals, 1);
    buttons->addWidget(print);
    buttons->addWidget(close);
    auto* layout = new QVBoxLayout(this);
    layout->addWidget(m_table);
    layout->addLayout(buttons);
    resize(900, 500);

    connect(close, &QPushButton::clicked, this, &QDialog::accept);
    connect(print, &QPushButton::clicked, this, [this] {
        try {
            showReportPreview(layOutDryRun(m_verdicts, m_subject), this);
        } catch (const QuotasError& e) {
            msgBox(e.message(), Buttons::Ok, Icon::Critical, kTitle);
        }
    });
}

}  // namespace quotas
