#pragma once

#include "reports/report_layout.h"

namespace quotas {

// prtExtra: the first four columns of every row of table extras (the import
// lines that matched no member) under neutral headings, with the count of
// rows whose first column holds a value. Rows come from the command Extras.
ReportLayout rejectsListingLayout();

}  // namespace quotas
