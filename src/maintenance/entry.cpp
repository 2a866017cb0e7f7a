#include "maintenance/entry.h"

#include "component/shared_objects.h"
#include "maintenance/frm_manutencao_dados.h"

namespace quotas {

void showMaintenanceDialog()
{
    QPointer<QWidget>& slot = shared().frmManutencaoDados;
    if (!slot) {
        // No owner window; closing unloads it, so the next call starts afresh.
        auto* dialog = new FrmManutencaoDados();
        dialog->setAttribute(Qt::WA_DeleteOnClose);
        slot = dialog;
    }
    auto* dialog = static_cast<FrmManutencaoDados*>(slot.data());
    if (dialog->isVisible()) {
        dialog->raise();
        dialog->activateWindow();
        return;
    }
    dialog->exec();
}

}  // namespace quotas
