#include "cli/console_boxes.h"

#include <QRegularExpression>
#include <cstdio>

namespace quotas::cli {

namespace {

void printLine(const QString& text)
{
    static const QRegularExpression breaks(QStringLiteral("\\s*[\\r\\n]+\\s*"));
    QString line = text;
    line.replace(breaks, QStringLiteral(" "));
    std::fputs(line.trimmed().toUtf8().constData(), stdout);
    std::fputc('\n', stdout);
    std::fflush(stdout);
}

}  // namespace

Answer ConsoleBoxes::message(const QString& text, Buttons buttons, Icon, const QString&)
{
    printLine(text);
    switch (buttons) {
    case Buttons::YesNo:
    case Buttons::YesNoCancel: return Answer::Yes;
    default: return Answer::Ok;
    }
}

std::optional<QString> ConsoleBoxes::input(const QString& prompt, const QString&, const QString& defaultText)
{
    printLine(prompt);
    return defaultText;
}

}  // namespace quotas::cli
