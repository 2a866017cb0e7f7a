// quotas-host: a small member register that stands in for the union's host
// application. It creates General, calls Login, lists the members and calls
// every method of General from its "Quotas" menu.

#include "component/general.h"
#include "component/shared_objects.h"
#include "host/main_window.h"
#include "platform/errors.h"
#include "platform/message_boxes.h"
#include "platform/portuguese.h"
#include "settings/settings_location.h"

#include <QApplication>
#include <QCommandLineParser>
#include <cstdio>
#include <string_view>

namespace {

// Qt's own --help and --version would answer in English.
const char* const kHelp =
    "Utilização: quotas-host [--registry FICHEIRO]\n"
    "            quotas-host --help | --version\n\n"
    "O registo de associados com o menu Quotas.\n\n"
    "Opções:\n"
    "  --registry FICHEIRO  Ficheiro de configuração (senão $QUOTAS_REGISTRY, senão /etc/quotas/registry.reg).\n"
    "  -h, --help           Mostra esta ajuda.\n"
    "  --version            Mostra a versão.\n\n"
    "Estado de saída:\n"
    "  0  o programa foi fechado normalmente;\n"
    "  1  não foi possível ligar à base de dados;\n"
    "  2  erro de utilização ou falta a configuração.\n";

}  // namespace

int main(int argc, char** argv)
{
    // Help and version need no display, so they are answered before Qt starts.
    for (int i = 1; i < argc; ++i) {
        const std::string_view arg(argv[i]);
        if (arg == "--help" || arg == "-h") {
            std::fputs(kHelp, stdout);
            return 0;
        }
        if (arg == "--version") {
            std::fputs("quotas-host " QUOTAS_VERSION "\n", stdout);
            return 0;
        }
    }
    QApplication app(argc, argv);
    QApplication::setApplicationName(QStringLiteral("quotas-host"));
    QApplication::setApplicationDisplayName(QStringLiteral("Quotas"));
    quotas::installPortugueseTranslation(app);
    // The list that has the focus says so: a clerk moves between lists with Tab.
    app.setStyleSheet(QStringLiteral("QAbstractItemView:focus { border: 2px solid palette(highlight); }"));

    QCommandLineParser parser;
    parser.addOption({QStringLiteral("registry"), QStringLiteral("Ficheiro de configuração."), QStringLiteral("FICHEIRO")});
    if (!parser.parse(QApplication::arguments()) || !parser.positionalArguments().isEmpty()) {
        const QString reason = parser.errorText().isEmpty() ? QStringLiteral("argumentos a mais.") : parser.errorText();
        std::fputs(("quotas-host: " + reason + u'\n').toUtf8().constData(), stderr);
        std::fputs(kHelp, stderr);
        return 2;
    }
    if (parser.isSet(QStringLiteral("registry")))
        quotas::setRegistryPath(parser.value(QStringLiteral("registry")));

    int status = 0;
    {
        quotas::General general;
        bool connected = false;
        try {
            connected = general.Login();
            if (!connected) {
                quotas::msgBox(QStringLiteral("Não foi encontrada a configuração da base de dados em %1.\n\n"
                                              "Escreva-a com \"quotas config\".")
                                   .arg(quotas::registryPath()),
                               quotas::Buttons::Ok, quotas::Icon::Critical);
                status = 2;
            }
        } catch (const quotas::QuotasError& e) {
            quotas::msgBox(QStringLiteral("Não foi possível ligar à base de dados.\n\n") + e.message(), quotas::Buttons::Ok,
                           quotas::Icon::Critical);
            status = 1;
        }
        if (connected) {
            host::MainWindow window(general);
            window.refreshMembers();
            window.show();
            status = app.exec();
        }
    }
    quotas::releaseShared();
    return status;
}
