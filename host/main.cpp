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

int main(int argc, char** argv)
{
    QApplication app(argc, argv);
    QApplication::setApplicationName(QStringLiteral("quotas-host"));
    QApplication::setApplicationDisplayName(QStringLiteral("Quotas"));
    quotas::installPortugueseTranslation(app);
    // The list that has the focus says so: a clerk moves between lists with Tab.
    app.setStyleSheet(QStringLiteral("QAbstractItemView:focus { border: 2px solid palette(highlight); }"));

    QCommandLineParser parser;
    parser.addHelpOption();
    parser.addOption({QStringLiteral("registry"), QStringLiteral("Ficheiro de configuração."), QStringLiteral("FICHEIRO")});
    parser.process(app);
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
