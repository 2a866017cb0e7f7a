#pragma once

#include <QString>
#include <QVariantList>

namespace quotas {

class Recordset;

// The database work of the record window, kept apart from its widgets. Each
// function writes in one transaction on the movement's connection, so a
// failure leaves nothing half-written, and throws DbError (ConcurrencyError
// when another user changed the rows first) with a Portuguese message.

// The movement columns that other users' work changes (another record
// window, the import, the maintenance run). The movement is saved only where
// all of them still hold what was read, so an edit made on a stale row is
// refused whole instead of being merged column by column.
const QStringList& movementAmountColumns();

// The values of movementAmountColumns() in the current row, as the window
// last read or saved them.
QVariantList movementAmounts(const Recordset& movement);

// The last values of the member's dues account (the ult_ columns) as they
// stand now; an empty list when the member has no account.
QVariantList accountLastValues(const Recordset& movement);

// The save step Gravar: the movement's remunerations, due and rate become
// the last values of the member's dues account (a new account also takes
// the movement's year and month), then the movement row is saved. The
// account's totals are not touched. A movement without changes writes
// nothing: a window that only looked must not put its stale values back.
// Refused with ConcurrencyError when the account's last values are no
// longer accountAsRead (accountLastValues when the window read the movement).
void gravarQuota(Recordset& movement, const QVariantList& accountAsRead);

// Records a payment: the account's total_pago grows by amount (added in the
// database, so a payment another user records at the same time is kept; a
// member without an account gets none), the movement's pago grows by amount
// and doc_no takes document. On failure the movement row is as before.
void liquidarQuota(Recordset& movement, double amount, const QString& document);

// Deletes the movement, unless another user changed its amounts since they
// were asRead (movementAmounts). A movement already gone is not an error.
// The account is not touched.
void anularQuota(Recordset& movement, const QVariantList& asRead);

}  // namespace quotas
