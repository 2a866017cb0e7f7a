#include "cli/commands.h"
#include "cli/options.h"
#include "component/shared_objects.h"
#include "maintenance/maintenance_panel.h"
#include "maintenance/processar_manutencao.h"

#include <cstdio>

namespace quotas::cli {

namespace {

// The dialog's five bars as lines on stderr: one per pass when it is done.
// There is no animation on a console and no buttons to change.
class ConsolePanel final : public MaintenancePanel {
public:
    QString caption() const override { return maintenanceCaption(); }

    void startBar(int pass, int maximum) override
    {
        m_pass = pass;
        m_maximum = std::max(maximum, 1);
        m_value = 0;
    }

    void stepBar(int pass) override
    {
        if (pass != m_pass || m_value >= m_maximum)
            return;
        if (++m_value == m_maximum) {
            static const char* const labels[] = {"Movimentos Activos:", "Movimentos Inactivos:",
                                                 "Histórico de Movimentos:", "Acumulados Activos:",
                                                 "Acumulados Inactivos:"};
            const QString line = QStringLiteral("%1 %2/%2\n").arg(QString::fromUtf8(labels[std::clamp(pass, 1, 5) - 1])).arg(m_maximum);
            std::fputs(line.toUtf8().constData(), stderr);
            std::fflush(stderr);
        }
    }

    void playAnimation(const QString&) override {}
    void stopAnimation() override {}
    void showFinished() override {}

private:
    int m_pass = 0;
    int m_maximum = 1;
    int m_value = 0;
};

}  // namespace

int manutencao(const QStringList& args)
{
    const Options options(QStringLiteral("manutencao"), args);
    connectOrFail();
    ConsolePanel panel;
    // The same run as the dialog's "&Iniciar": the completion box prints on
    // stdout; a failure comes back as the error, for stderr and exit status 1.
    // Movements left out of the totals: the count is on stdout already.
    return ProcessarManutencao(Data().SqlServer, panel) > 0 ? 3 : 0;
}

}  // namespace quotas::cli
