#pragma once

#include <QString>

namespace quotas {

// The listing of the import lines that could not be matched (prtExtra): the
// rows of table extras, read through the command Extras on SqlServer_Prints,
// which the caller has opened. The command's result set is closed again after
// each showing, so the next one reads extras afresh.

// A modal print preview; returns when it is closed.
void showRejectsListing();
// The same pages written to a PDF file.
void writeRejectsListingPdf(const QString& path);

}  // namespace quotas
