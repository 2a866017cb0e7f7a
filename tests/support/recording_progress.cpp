#include "support/recording_progress.h"

#include "component/progress_window.h"
#include "platform/components.h"

namespace quotas::test {

ProgressLog& RecordingProgress::log()
{
    static ProgressLog l;
    return l;
}

void RecordingProgress::install()
{
    log() = ProgressLog();
    registerComponent(QStringLiteral("Velumo.General"), [] {
        ++log().created;
        return std::make_unique<RecordingProgress>();
    });
}

void RecordingProgress::uninstall()
{
    registerComponent(QStringLiteral("Velumo.General"), [] { return std::make_unique<ProgressWindow>(); });
}

void RecordingProgress::Iniciar(int maximum, const QString& message, const QString& title)
{
    log().calls << QStringLiteral("Iniciar(%1, %2, %3)").arg(maximum).arg(message, title);
    log().maximum = maximum;
    log().value = 0;
    log().showing = true;
}

void RecordingProgress::setvalor(int done)
{
    log().calls << QStringLiteral("setvalor(%1)").arg(done);
    log().value += done;
    if (log().afterStep)
        log().afterStep();
}

void RecordingProgress::terminar()
{
    log().calls << QStringLiteral("terminar()");
    log().showing = false;
}

}  // namespace quotas::test
