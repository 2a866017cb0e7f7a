#include "component/year_month_lists.h"

#include "component/month_names.h"

#include <QListWidget>

namespace quotas {

void fillYearAndMonthLists(QListWidget* years, QListWidget* months, QDate today)
{
    years->clear();
    for (int year = 1999; year <= today.year() + 1; ++year)
        years->addItem(QString::number(year));
    years->setCurrentRow(today.year() - 1999);
    months->clear();
    months->addItems(monthNames());
    months->setCurrentRow(today.month() - 1);
}

}  // namespace quotas
