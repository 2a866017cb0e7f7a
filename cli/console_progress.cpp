#include "cli/console_progress.h"

#include "platform/components.h"

#include <cstdio>
#include <unistd.h>

namespace quotas::cli {

void ConsoleProgress::Iniciar(int maximum, const QString& message, const QString& title)
{
    m_message = title.isEmpty() ? message : title + QStringLiteral(": ") + message;
    m_maximum = std::max(maximum, 0);
    m_value = 0;
    m_drawn = -1;
    m_showing = true;
    draw(true);
}

void ConsoleProgress::setvalor(int done)
{
    m_value = std::min(m_value + done, m_maximum);
    draw(m_value == m_maximum);
}

void ConsoleProgress::terminar()
{
    if (!m_showing)
        return;
    draw(true);
    if (::isatty(STDERR_FILENO))
        std::fputc('\n', stderr);
    m_showing = false;
}

void ConsoleProgress::draw(bool force)
{
    // On a terminal the line is redrawn at most ten times a second; into a
    // file or pipe only the first and last states are written.
    const bool terminal = ::isatty(STDERR_FILENO);
    if (!force && (!terminal || (m_sinceDraw.isValid() && m_sinceDraw.elapsed() < 100)))
        return;
    if (!terminal && m_value == m_drawn)
        return;
    m_drawn = m_value;
    m_sinceDraw.start();
    const int percent = m_maximum > 0 ? int(qint64(m_value) * 100 / m_maximum) : 100;
    const QString line = QStringLiteral("%1 %2/%3 (%4%)").arg(m_message).arg(m_value).arg(m_maximum).arg(percent);
    if (terminal)
        std::fputs("\r\033[K", stderr);
    std::fputs(line.toUtf8().constData(), stderr);
    if (!terminal)
        std::fputc('\n', stderr);
    std::fflush(stderr);
}

void registerConsoleProgress()
{
    registerComponent(QStringLiteral("Velumo.General"), [] { return std::make_unique<ConsoleProgress>(); });
}

}  // namespace quotas::cli
