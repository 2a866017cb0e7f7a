#pragma once

#include <QVariant>
#include <memory>

class QObject;

namespace quotas {

class General;
class Recordset;

// The second half of Registo: rows is open on SqlServer (dynamic cursor,
// optimistic locking), not empty, on its first row. Creates frmQuota if
// needed, gives it owner and caller, binds it to rows, searches forward from
// the first row for quota_id = pkey (back to the first row when none), and
// shows it modally; returns when it has closed.
void showRecordWindow(General& owner, std::shared_ptr<Recordset> rows, const QVariant& pkey, QObject* caller);

}  // namespace quotas
