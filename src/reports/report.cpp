#include "reports/report.h"

#include "component/shared_objects.h"
#include "platform/errors.h"
#include "reports/report_engine.h"
#include "reports/report_painter.h"

#include <QApplication>
#include <QPrintPreviewDialog>
#include <QPrinter>
#include <QScreen>

namespace quotas {

namespace {

std::function<void(const ReportDocument&)>& observer()
{
    thread_local std::function<void(const ReportDocument&)> o;
    return o;
}

}  // namespace

Report::Report(ReportLayout layout, QObject* parent)
    : QObject(parent), m_layout(std::make_shared<const ReportLayout>(std::move(layout)))
{
    setObjectName(m_layout->name);
}

void Report::setLayout(ReportLayout layout)
{
    m_layout = std::make_shared<const ReportLayout>(std::move(layout));
}

void Report::setObserver(std::function<void(const ReportDocument&)> o)
{
    observer() = std::move(o);
}

ReportDocument Report::run(const QDate& printed)
{
    Recordset& read = Data().command(m_layout->command).execute();
    return layOutObservedReport(m_layout, m_layout->rows ? m_layout->rows(read) : read, printed);
}

void Report::showPreview(QWidget* parent)
{
    showReportPreview(run(), parent);
}

ReportDocument layOutObservedReport(const std::shared_ptr<const ReportLayout>& layout, Recordset& rows, const QDate& printed)
{
    ReportDocument doc = layOutReport(layout, rows, printed);
    if (observer())
        observer()(doc);
    return doc;
}

void showReportPreview(const ReportDocument& doc, QWidget* parent)
{
    QPrinter printer(QPrinter::HighResolution);
    setUpReportPrinter(printer, doc);
    if (!parent)
        parent = QApplication::activeWindow();
    QPrintPreviewDialog dialog(&printer, parent);
    dialog.setWindowTitle(doc.layout->title);
    dialog.setWindowModality(Qt::ApplicationModal);
    if (const QScreen* screen = parent ? parent->screen() : QGuiApplication::primaryScreen()) {
        const QRect area = screen->availableGeometry();
        dialog.resize(qMin(1000, area.width()), area.height() * 9 / 10);
    }
    // An error inside the paint request cannot cross Qt's signal; it is kept
    // and raised once the dialog is closed.
    QString failure;
    QObject::connect(&dialog, &QPrintPreviewDialog::paintRequested, &dialog, [&](QPrinter* target) {
        try {
            paintReport(doc, *target, target->pageRanges());
        } catch (const QuotasError& e) {
            failure = e.message();
            dialog.reject();
        }
    });
    dialog.exec();
    if (!failure.isEmpty())
        throw QuotasError(failure);
}

int Report::writePdf(const QString& path)
{
    const ReportDocument doc = run();
    writeReportPdf(doc, path);
    return doc.pageCount();
}

Report& heldReport(QPointer<QObject>& slot, const std::function<ReportLayout()>& layout)
{
    if (!slot)
        slot = new Report(layout());
    return *qobject_cast<Report*>(slot.data());
}

}  // namespace quotas
