#pragma once

#include "reports/report_document.h"

#include <QStringList>
#include <vector>

namespace quotas::test {

// The items of a laid-out document by the name of their layout item, in
// page order: what a reader of the printed pages would see of them.
std::vector<const PlacedItem*> itemsNamed(const ReportDocument& doc, const QString& name);
std::vector<const PlacedItem*> itemsNamed(const ReportPage& page, const QString& name);
QStringList textsNamed(const ReportDocument& doc, const QString& name);
// The one item of that name on the page; fails the test when there is not exactly one.
const PlacedItem& onlyItem(const ReportPage& page, const QString& name);
// Every text on a page, top to bottom and left to right.
QStringList pageTexts(const ReportPage& page);

}  // namespace quotas::test
