#pragma once

#include "reports/report_document.h"

#include <QDate>
#include <memory>

namespace quotas {

class Recordset;

// Lays a report out on A4 pages in two passes. The first places the bands:
// the report header once at the top of page 1, the page header at the top
// and the page footer at the bottom of every page, one detail per row (a
// detail that does not fit above the page footer starts the next page, and
// nothing follows a band marked pageBreakAfter on its page), the report
// footer once after the last detail. The second fills the items in, now
// that "%P" can know the page count.
//
// Reads every row of rows from the first; fields name its columns (a
// missing column is a QuotasError). Count and Sum cover all rows; sums are
// kept in whole cents. printed is the date "%D" shows.
ReportDocument layOutReport(const std::shared_ptr<const ReportLayout>& layout, Recordset& rows,
                            const QDate& printed = QDate::currentDate());

}  // namespace quotas
