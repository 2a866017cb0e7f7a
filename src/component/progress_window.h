#pragma once

#include <QElapsedTimer>
#include <QWidget>

class QLabel;
class QProgressBar;

namespace quotas {

// The progress display "Velumo.General": a small window with the message,
// the title and a bar. The runs keep the thread busy while it shows, so it
// repaints itself and lets pending paint events through as it advances.
class ProgressWindow : public QWidget {
    Q_OBJECT
public:
    explicit ProgressWindow(QWidget* parent = nullptr);

    // Shows the window: the bar at 0 of maximum, the message, the title.
    Q_INVOKABLE void Iniciar(int maximum, const QString& message, const QString& title = QString());
    // Adds the work just done to the bar.
    Q_INVOKABLE void setvalor(int done);
    // Hides the window.
    Q_INVOKABLE void terminar();

private:
    void refresh(bool force);

    QLabel* m_message;
    QProgressBar* m_bar;
    QElapsedTimer m_sinceRepaint;
};

}  // namespace quotas
