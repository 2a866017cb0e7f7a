#include "record/entry.h"

#include "component/shared_objects.h"
#include "record/frm_quota.h"

#include <QApplication>

namespace quotas {

void showRecordWindow(General& owner, std::shared_ptr<Recordset> rows, const QVariant& pkey, QObject* caller)
{
    SharedObjects& objects = shared();
    auto* frm = qobject_cast<FrmQuota*>(objects.frmQuota.data());
    if (!frm) {
        frm = new FrmQuota(QApplication::activeWindow());
        objects.frmQuota = frm;
    }
    frm->setOwner(&owner);
    frm->setCaller(caller);
    try {
        frm->bind(std::move(rows), pkey);
    } catch (...) {
        // A window that could not be bound is never shown; the next Registo
        // starts from a fresh one.
        delete frm;
        throw;
    }
    frm->exec();
}

}  // namespace quotas
