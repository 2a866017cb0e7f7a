#include "generation/entry.h"

#include "component/shared_objects.h"
#include "generation/frm_anular_geracao.h"
#include "generation/frm_gerar_quotas.h"

namespace quotas {

void showGenerationDialog()
{
    SharedObjects& objects = shared();
    if (!objects.frmGerarQuotas)
        objects.frmGerarQuotas = new frmGerarQuotas();
    auto* dialog = static_cast<frmGerarQuotas*>(objects.frmGerarQuotas.data());
    dialog->load(QDate::currentDate());
    dialog->exec();
    // Closed by either button: unloaded, so the next showing starts afresh.
    delete dialog;
}

void showUndoDialog()
{
    frmAnularGeracao dialog;
    dialog.exec();
}

}  // namespace quotas
