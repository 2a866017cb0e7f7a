#pragma once

#include "reports/report_layout.h"

namespace quotas {

// prtListagemDividas: the members whose unpaid dues exceed one euro, by
// name, with the count of staff numbers listed and the total debt. Rows come
// from the command Dividas.
ReportLayout debtListingLayout();

}  // namespace quotas
