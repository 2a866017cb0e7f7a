#pragma once

#include <QElapsedTimer>
#include <QObject>
#include <QString>

namespace quotas::cli {

// The progress display "Velumo.General" of the command line: one line on
// stderr, rewritten in place as the run advances.
class ConsoleProgress : public QObject {
    Q_OBJECT
public:
    Q_INVOKABLE void Iniciar(int maximum, const QString& message, const QString& title = QString());
    Q_INVOKABLE void setvalor(int done);
    Q_INVOKABLE void terminar();

private:
    void draw(bool force);

    QString m_message;
    int m_maximum = 0;
    int m_value = 0;
    int m_drawn = -1;
    bool m_showing = false;
    QElapsedTimer m_sinceDraw;
};

// Puts the console display in place of the progress window.
void registerConsoleProgress();

}  // namespace quotas::cli
