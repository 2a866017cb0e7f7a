#include "preview_closer.h"

#include <QApplication>
#include <QPrintPreviewDialog>
#include <QPrintPreviewWidget>
#include <QTest>

namespace quotas::test {

PreviewCloser::PreviewCloser()
{
    connect(&m_timer, &QTimer::timeout, this, &PreviewCloser::poll);
    m_timer.start(10);
}

void PreviewCloser::poll()
{
    auto* dialog = qobject_cast<QPrintPreviewDialog*>(QApplication::activeModalWidget());
    if (!dialog || !dialog->isVisible())
        return;
    const auto* preview = dialog->findChild<QPrintPreviewWidget*>();
    titles << dialog->windowTitle();
    pageCounts << (preview ? preview->pageCount() : -1);
    QTest::keyClick(dialog, Qt::Key_Escape);
}

}  // namespace quotas::test
