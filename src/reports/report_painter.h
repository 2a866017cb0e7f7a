#pragma once

#include "reports/report_document.h"

#include <QPageRanges>
#include <QString>

class QPagedPaintDevice;
class QPainter;
class QPrinter;

namespace quotas {

// The one drawing routine of the reports: the preview, the printer and the
// PDF file all come through here, so what is previewed is what is printed.
// The device must be set up with setUpReportDevice (A4, no margins, origin at
// the paper's corner); pages outside ranges (when given) are skipped.
void paintReport(const ReportDocument& doc, QPagedPaintDevice& device, const QPageRanges& ranges = {});

// One page, in twips, on a painter already scaled to twips.
void paintReportPage(QPainter& painter, const ReportPage& page);

// A4 portrait, full page: the layouts place their own margins.
void setUpReportDevice(QPagedPaintDevice& device);
void setUpReportPrinter(QPrinter& printer, const ReportDocument& doc);

// Writes the pages to a PDF file, replacing it only once it is complete;
// throws QuotasError when the file cannot be written.
void writeReportPdf(const ReportDocument& doc, const QString& path);

}  // namespace quotas
