// quotas: the dues module from the command line, for cron jobs, scripts and
// tests. Message boxes print as lines on stdout. The commands, their options
// and the exit statuses are listed in cli/commands.cpp and cli/help.cpp.

#include "cli/commands.h"
#include "cli/console_boxes.h"
#include "cli/console_progress.h"
#include "cli/help.h"
#include "component/shared_objects.h"
#include "settings/settings_location.h"

#include <QApplication>
#include <QDir>
#include <cerrno>
#include <cstdio>
#include <sys/stat.h>
#include <unistd.h>
#include <algorithm>

namespace {

void print(FILE* stream, const QString& text) { std::fputs(text.toUtf8().constData(), stream); }

void printError(const QString& text) { print(stderr, QStringLiteral("quotas: ") + text + u'\n'); }

int dispatch(QStringList args)
{
    using namespace quotas::cli;
    if (args.size() >= 2 && args.front() == QStringLiteral("--registry")) {
        quotas::setRegistryPath(args[1]);
        args = args.mid(2);
    } else if (!args.isEmpty() && args.front().startsWith(QStringLiteral("--registry="))) {
        quotas::setRegistryPath(args.front().mid(11));
        args = args.mid(1);
    }
    const auto isHelp = [](const QString& arg) { return arg == QStringLiteral("--help") || arg == QStringLiteral("-h"); };
    if (args.isEmpty()) {
        printError(QStringLiteral("falta o comando (veja \"quotas --help\")."));
        return 2;
    }
    if (isHelp(args.front())) {
        print(stdout, generalHelp());
        return 0;
    }
    if (args.front() == QStringLiteral("--version")) {
        print(stdout, versionText());
        return 0;
    }
    const Command* command = findCommand(args.front());
    if (!command) {
        printError(QStringLiteral("comando desconhecido \"%1\" (veja \"quotas --help\").").arg(args.front()));
        return 2;
    }
    args.removeFirst();
    if (std::any_of(args.cbegin(), args.cend(), isHelp)) {
        print(stdout, commandHelp(*command));
        return 0;
    }
    return command->run(args);
}

}  // namespace

int main(int argc, char** argv)
{
    // The command line never shows a window; without a display it must not need one.
    if (qEnvironmentVariableIsEmpty("QT_QPA_PLATFORM"))
        qputenv("QT_QPA_PLATFORM", "offscreen");
    // Run from cron or as root there is often no runtime folder; Qt would warn on every run.
    if (qEnvironmentVariableIsEmpty("XDG_RUNTIME_DIR")) {
        const QByteArray runtime = QDir::tempPath().toLocal8Bit() + "/quotas-runtime-" + QByteArray::number(::getuid());
        if (::mkdir(runtime.constData(), 0700) == 0 || errno == EEXIST)
            qputenv("XDG_RUNTIME_DIR", runtime);
    }
    QApplication app(argc, argv);
    QApplication::setApplicationName(QStringLiteral("quotas"));

    quotas::cli::ConsoleBoxes consoleBoxes;
    quotas::setBoxes(&consoleBoxes);
    quotas::cli::registerConsoleProgress();

    int status = 1;
    try {
        status = dispatch(QApplication::arguments().mid(1));
    } catch (const quotas::cli::UsageError& e) {
        printError(e.message());
        status = 2;
    } catch (const quotas::QuotasError& e) {
        printError(e.message());
        status = 1;
    } catch (const std::exception& e) {
        printError(QString::fromLocal8Bit(e.what()));
        status = 1;
    }
    quotas::releaseShared();
    quotas::setBoxes(nullptr);
    return status;
}
