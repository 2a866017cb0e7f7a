// quotas: the dues module from the command line, for cron jobs, scripts and
// tests. Message boxes print as lines on stdout. Exit status 0 when all was
// done, 3 when done with something left out (the count on stdout), 1 for a
// failure (the reason on stderr), 2 for a usage or settings problem.

#include "cli/commands.h"
#include "cli/console_boxes.h"
#include "cli/console_progress.h"
#include "component/shared_objects.h"
#include "settings/settings_location.h"

#include <QApplication>
#include <QDir>
#include <cerrno>
#include <cstdio>
#include <sys/stat.h>
#include <unistd.h>
#include <functional>
#include <map>

namespace {

const char* const kUsage =
    "Utilização: quotas [--registry FICHEIRO] COMANDO [OPÇÕES]\n"
    "  config --data-source DS [--catalog NOME] [--user U] [--password P] [--security-info TEXTO]\n"
    "  init-db [--demo N]\n"
    "  login [--print-connection-string]\n"
    "  gerar --ano A --mes M [--no-tap N]\n"
    "  anular-geracao --ano A --mes M [--tipo 1|2] [--no-tap N] [--confirmar]\n"
    "  importar --ano A --mes M --tipo 1|2 [--sem-separador] [--pdf SAIDA | --simular] FICHEIRO\n"
    "  manutencao\n"
    "  copiar --data-source HOST[,PORTA] --catalog BD --user U --password P\n"
    "  listagem --pdf SAIDA | cartas --pdf SAIDA | rejeitados --pdf SAIDA\n"
    "  extrato --no-tap N [--desde AAAA-MM] [--ate AAAA-MM] [--todos-os-movimentos] --pdf SAIDA\n"
    "  resumo --ano A --mes M [--pdf SAIDA] [--csv SAIDA]\n"
    "Estado de saída: 0 feito; 3 feito, mas ficou algo por fazer (quotas por gerar, linhas rejeitadas;\n"
    "  a contagem sai no stdout); 1 falhou (a razão sai no stderr); 2 utilização ou configuração.\n";

void printError(const QString& text)
{
    std::fputs(("quotas: " + text + "\n").toUtf8().constData(), stderr);
}

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
    if (args.isEmpty() || args.front() == QStringLiteral("--help") || args.front() == QStringLiteral("-h")) {
        std::fputs(kUsage, args.isEmpty() ? stderr : stdout);
        return args.isEmpty() ? 2 : 0;
    }
    static const std::map<QString, std::function<int(const QStringList&)>> commands = {
        {QStringLiteral("config"), config},
        {QStringLiteral("init-db"), initDb},
        {QStringLiteral("login"), login},
        {QStringLiteral("gerar"), gerar},
        {QStringLiteral("anular-geracao"), anularGeracao},
        {QStringLiteral("copiar"), copiar},
        {QStringLiteral("importar"), importar},
        {QStringLiteral("manutencao"), manutencao},
        {QStringLiteral("listagem"), listagem},
        {QStringLiteral("cartas"), cartas},
        {QStringLiteral("rejeitados"), rejeitados},
        {QStringLiteral("extrato"), extrato},
        {QStringLiteral("resumo"), resumo},
    };
    const auto command = commands.find(args.front());
    if (command == commands.end()) {
        printError(QStringLiteral("comando desconhecido \"%1\".").arg(args.front()));
        std::fputs(kUsage, stderr);
        return 2;
    }
    return command->second(args.mid(1));
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
