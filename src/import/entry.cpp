#include "import/entry.h"

#include "component/shared_objects.h"
#include "import/frm_importar_quotas.h"

#include <QApplication>
#include <QPointer>
#include <QScreen>

namespace quotas {

void showImportDialog()
{
    SharedObjects& s = shared();
    if (!s.frmImportarQuotas) {
        QWidget* owner = QApplication::activeWindow();
        auto* dialog = new FrmImportarQuotas(owner);
        const QRect area = owner ? owner->frameGeometry()
                                 : (dialog->screen() ? dialog->screen()->availableGeometry() : QRect());
        if (area.isValid())
            dialog->move(area.center() - dialog->rect().center());
        s.frmImportarQuotas = dialog;
    }
    QWidget* dialog = s.frmImportarQuotas;
    if (dialog->isVisible())
        dialog->raise();  // open already, perhaps behind the host
    else
        dialog->show();
    dialog->activateWindow();
}

void showDryRunDialog()
{
    QPointer<FrmImportarQuotas> dialog = new FrmImportarQuotas(QApplication::activeWindow(), FrmImportarQuotas::Mode::DryRun);
    dialog->exec();
    delete dialog.data();  // closed, it deletes itself later; once is enough
}

}  // namespace quotas
