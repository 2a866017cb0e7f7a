#pragma once

#include <QDate>

class QListWidget;

namespace quotas {

// The dialogs' choice of a month: the years from 1999 to next year and the
// twelve months, today's year and month chosen. The lists are emptied first.
void fillYearAndMonthLists(QListWidget* years, QListWidget* months, QDate today);

}  // namespace quotas
