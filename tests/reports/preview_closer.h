#pragma once

#include <QApplication>
#include <QPrintPreviewDialog>
#include <QPrintPreviewWidget>
#include <QTest>
#include <QTimer>

namespace quotas::test {

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
            const auto* preview = dialog->findChild<QPrintPreviewWidget*>();
            titles << dialog->windowTitle();
            pageCounts << (preview ? preview->pageCount() : -1);
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
