#include "component/progress_window.h"

#include "platform/components.h"

#include <QApplication>
#include <QLabel>
#include <QProgressBar>
#include <QVBoxLayout>

namespace quotas {

namespace {

[[maybe_unused]] const bool registered = [] {
    registerComponent(QStringLiteral("Velumo.General"), [] { return std::make_unique<ProgressWindow>(); });
    return true;
}();

}  // namespace

ProgressWindow::ProgressWindow(QWidget* parent)
    : QWidget(parent, Qt::Dialog | Qt::WindowTitleHint | Qt::CustomizeWindowHint),
      m_message(new QLabel(this)),
      m_bar(new QProgressBar(this))
{
    auto* layout = new QVBoxLayout(this);
    m_message->setWordWrap(true);
    m_message->setMinimumWidth(360);
    layout->addWidget(m_message);
    layout->addWidget(m_bar);
    setWindowModality(Qt::ApplicationModal);
}

void ProgressWindow::Iniciar(int maximum, const QString& message, const QString& title)
{
    m_message->setText(message);
    setWindowTitle(title.isEmpty() ? QApplication::applicationDisplayName() : title);
    m_bar->setRange(0, std::max(maximum, 0));
    m_bar->setValue(0);
    show();
    raise();
    refresh(true);
}

void ProgressWindow::setvalor(int done)
{
    m_bar->setValue(std::min(m_bar->value() + done, m_bar->maximum()));
    refresh(false);
}

void ProgressWindow::terminar()
{
    hide();
}

void ProgressWindow::refresh(bool force)
{
    // A repaint every few hundredths of a second is enough for the eye and
    // costs the run next to nothing.
    if (!force && m_sinceRepaint.isValid() && m_sinceRepaint.elapsed() < 40)
        return;
    m_sinceRepaint.start();
    repaint();
    QCoreApplication::processEvents(QEventLoop::ExcludeUserInputEvents);
}

}  // namespace quotas
