#pragma once

// Reading laid-out pages as a reader of the printed report would, and closing
// the modal previews that show them.

#include "reports/report_document.h"

#include <QApplication>
#include <QPrintPreviewDialog>
#include <QPrintPreviewWidget>
#include <QTest>
#include <QTimer>
#include <algorithm>

namespace quotas::test {

// The items of that layout name, in page order (on one page when page >= 0).
inline std::vector<const PlacedItem*> placed(const ReportDocument& doc, const QString& name, int page = -1)
{
    std::vector<const PlacedItem*> found;
    for (int p = 0; p < doc.pageCount(); ++p) {
        for (const PlacedItem& item : doc.pages[p].items) {
            if (item.item->name == name && (page < 0 || page == p))
                found.push_back(&item);
        }
    }
    return found;
}

inline QStringList textsNamed(const ReportDocument& doc, const QString& name)
{
    QStringList texts;
    for (const PlacedItem* item : placed(doc, name))
        texts << item->text;
    return texts;
}

// The texts of several items side by side, one "a|b|c" line per detail.
inline QStringList rowsOf(const ReportDocument& doc, const QStringList& names)
{
    QStringList rows = textsNamed(doc, names.front());
    for (const QString& name : names.mid(1)) {
        const QStringList column = textsNamed(doc, name);
        for (int i = 0; i < rows.size(); ++i)
            rows[i] += u'|' + column.value(i, QStringLiteral("?"));
    }
    return rows;
}

inline QList<int> countsPerPage(const ReportDocument& doc, const QString& name)
{
    QList<int> counts;
    for (int p = 0; p < doc.pageCount(); ++p)
        counts << int(placed(doc, name, p).size());
    return counts;
}

inline QList<int> tops(const ReportDocument& doc, const QString& name)
{
    QList<int> found;
    for (const PlacedItem* item : placed(doc, name))
        found << item->rect.top();
    return found;
}

// The first item of that name as "text | left,top widthxheight | font | alignment", placed
// from the report's left edge and from top.
inline QString describe(const ReportDocument& doc, const QString& name, int top)
{
    const auto found = placed(doc, name);
    if (found.empty())
        return QStringLiteral("no item ") + name;
    const PlacedItem& p = *found.front();
    const ReportFont& f = p.item->font;
    const QRect r = p.rect.translated(-PaperSetup::leftMargin(*doc.layout), -top);
    const char* aligns[] = {"left", "center", "right"};
    return QStringLiteral("%1 | %2,%3 %4x%5 | %6 %7%8%9 | %10")
        .arg(p.text).arg(r.left()).arg(r.top()).arg(r.width()).arg(r.height())
        .arg(f.family).arg(f.pointSize).arg(f.bold ? " bold" : "", f.italic ? " italic" : "", aligns[int(p.item->align)]);
}

// Every text on a page, top to bottom and left to right.
inline QStringList pageTexts(const ReportPage& page)
{
    std::vector<const PlacedItem*> items;
    for (const PlacedItem& item : page.items) {
        if (!item.text.isEmpty())
            items.push_back(&item);
    }
    std::stable_sort(items.begin(), items.end(), [](const PlacedItem* a, const PlacedItem* b) {
        return std::pair(a->rect.top(), a->rect.left()) < std::pair(b->rect.top(), b->rect.left());
    });
    QStringList texts;
    for (const PlacedItem* item : items)
        texts << item->text;
    return texts;
}

// Closes every modal print preview as soon as it is on screen, with the
// Escape key as a user would, after noting its title and page count.
class PreviewCloser {
public:
    PreviewCloser()
    {
        QObject::connect(&m_timer, &QTimer::timeout, [this] {
            auto* dialog = qobject_cast<QPrintPreviewDialog*>(QApplication::activeModalWidget());
            if (!dialog || !dialog->isVisible())
                return;
            titles << dialog->windowTitle();
            pageCounts << dialog->findChild<QPrintPreviewWidget*>()->pageCount();
            QTest::keyClick(dialog, Qt::Key_Escape);
        });
        m_timer.start(10);
    }
    QStringList titles;
    QList<int> pageCounts;

private:
    QTimer m_timer;
};

}  // namespace quotas::test
