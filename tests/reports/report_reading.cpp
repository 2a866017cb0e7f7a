#include "report_reading.h"

#include <QTest>
#include <algorithm>

namespace quotas::test {

std::vector<const PlacedItem*> itemsNamed(const ReportPage& page, const QString& name)
{
    std::vector<const PlacedItem*> found;
    for (const PlacedItem& item : page.items) {
        if (item.item->name == name)
            found.push_back(&item);
    }
    return found;
}

std::vector<const PlacedItem*> itemsNamed(const ReportDocument& doc, const QString& name)
{
    std::vector<const PlacedItem*> found;
    for (const ReportPage& page : doc.pages) {
        const auto onPage = itemsNamed(page, name);
        found.insert(found.end(), onPage.begin(), onPage.end());
    }
    return found;
}

QStringList textsNamed(const ReportDocument& doc, const QString& name)
{
    QStringList texts;
    for (const PlacedItem* item : itemsNamed(doc, name))
        texts << item->text;
    return texts;
}

const PlacedItem& onlyItem(const ReportPage& page, const QString& name)
{
    const auto found = itemsNamed(page, name);
    if (found.size() != 1)
        qFatal("expected one item %s on the page, found %d", qPrintable(name), int(found.size()));
    return *found.front();
}

QStringList pageTexts(const ReportPage& page)
{
    std::vector<const PlacedItem*> items;
    for (const PlacedItem& item : page.items) {
        if (!item.text.isEmpty())
            items.push_back(&item);
    }
    std::stable_sort(items.begin(), items.end(), [](const PlacedItem* a, const PlacedItem* b) {
        return a->rect.top() != b->rect.top() ? a->rect.top() < b->rect.top() : a->rect.left() < b->rect.left();
    });
    QStringList texts;
    for (const PlacedItem* item : items)
        texts << item->text;
    return texts;
}

}  // namespace quotas::test
