#pragma once

#include "reports/letterhead.h"
#include "reports/report_layout.h"

namespace quotas {

// prtCartasDividas: one reminder letter per row of the command Dividas, each
// on a page of its own, headed with the union's letterhead.
ReportLayout debtLettersLayout(const Letterhead& letterhead);

}  // namespace quotas
