#pragma once

// Reading laid-out pages as a reader of the printed report would, and closing
// the modal previews that show them.

#include "reports/report_document.h"

#include <QApplication>
#include <QPrintPreviewDialog>
#include <QPrintPreviewWidget>
#include <QTest>
#include <QTimer>

using namespace Qt::StringLiterals;

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

// The texts of the items of those names side by side, "a|b|c", one line per
// item of the first name (per detail, per letter).
inline QStringList texts(const ReportDocument& doc, const QStringList& names)
{
    QStringList lines;
    for (int n = 0; n < names.size(); ++n) {
        const auto items = placed(doc, names[n]);
        for (int i = 0; i < int(items.size()); ++i) {
            if (n == 0)
                lines << items[i]->text;
            else if (i < lines.size())
                lines[i] += u'|' + items[i]->text;
        }
    }
    return lines;
}

inline QList<int> countsPerPage(const ReportDocument& doc, const QString& name)
{
    QList<int> counts;
    for (int p = 0; p < doc.pageCount(); ++p)
        counts << int(placed(doc, name, p).size());
    return counts;
}

// The first item of that name as "text | left,top widthxheight | font | alignment",
// placed from the report's left edge and from top.
inline QString describe(const ReportDocument& doc, const QString& name, int top)
{
    const auto found = placed(doc, name);
    if (found.empty())
        return u"no item "_s + name;
    const PlacedItem& p = *found.front();
    const ReportFont& f = p.item->font;
    const QRect r = p.rect.translated(-PaperSetup::leftMargin(*doc.layout), -top);
    const char* aligns[] = {"left", "center", "right"};
    return u"%1 | %2,%3 %4x%5 | %6 %7%8%9 | %10"_s.arg(p.text).arg(r.left()).arg(r.top()).arg(r.width()).arg(r.height())
        .arg(f.family).arg(f.pointSize).arg(f.bold ? " bold" : "", f.italic ? " italic" : "", aligns[int(p.item->align)]);
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
