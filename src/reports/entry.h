#pragma once

#include "reports/member_statement.h"

#include <QString>

namespace quotas {

// Prepare SqlServer_Prints, show the report's preview modally, then close
// the Dividas result set, so that the next showing reads the debts afresh.
// Failures pass to the caller as QuotasError.
void showDebtListing();
void showDebtLetters();

// The same preparation and closing around the pages written to a PDF file
// (the command line); each returns the number of pages.
int writeDebtListingPdf(const QString& path);
int writeDebtLettersPdf(const QString& path);

// A member's dues statement (prtExtratoQuotas), read through
// SqlServer_Prints: previewed modally, or written to a PDF file (returns the
// number of pages).
void showMemberStatement(const StatementRequest& request);
int writeMemberStatementPdf(const StatementRequest& request, const QString& path);

// The month's reconciliation summary (prtResumoMes): the dialog that
// chooses the month, the preview of one month, its PDF (returns the number
// of pages) and its CSV file for a spreadsheet.
void showMonthSummaryDialog();
void showMonthSummary(int year, int month);
int writeMonthSummaryPdf(int year, int month, const QString& path);
void writeMonthSummaryCsv(int year, int month, const QString& path);

}  // namespace quotas
