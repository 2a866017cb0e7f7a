#pragma once

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

}  // namespace quotas
