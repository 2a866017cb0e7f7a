#pragma once

#include <QObject>
#include <QStringList>
#include <functional>

namespace quotas::test {

// What the runs did with their progress display.
struct ProgressLog {
    QStringList calls;  // "Iniciar(3, message, title)", "setvalor(1)", "terminar()"
    int created = 0;
    int maximum = 0;
    int value = 0;
    bool showing = false;
    // Called after each step, to let a second user act while a run is under way.
    std::function<void()> afterStep;
};

// A progress display under "Velumo.General" that only records; install()
// puts it in place and empties the log, and the destructor restores the
// library's own window.
class RecordingProgress : public QObject {
    Q_OBJECT
public:
    static ProgressLog& log();
    static void install();
    static void uninstall();

    Q_INVOKABLE void Iniciar(int maximum, const QString& message, const QString& title = QString());
    Q_INVOKABLE void setvalor(int done);
    Q_INVOKABLE void terminar();
};

}  // namespace quotas::test
