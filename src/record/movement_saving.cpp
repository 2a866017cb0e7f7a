#include "record/movement_saving.h"

#include "component/money.h"
#include "platform/connection.h"
#include "platform/errors.h"
#include "platform/recordset.h"
#include "platform/transaction.h"
#include "record/record_text.h"

#include <cmath>

namespace quotas {

namespace {

Connection& connectionOf(const Recordset& movement)
{
    if (!movement.connection())
        throw DbError(QStringLiteral("O registo da quota não está ligado à base de dados."));
    return *movement.connection();
}

QVariant cents(const QVariant& amount)
{
    return amount.isNull() ? QVariant() : QVariant(roundCents(amount.toDouble()));
}

// Marks every amount column as changed with the value it holds, so that the
// save checks them all against what was read.
void guardWholeRow(Recordset& movement)
{
    for (const QString& column : movementAmountColumns())
        movement.setValue(column, movement.value(column));
}

bool sameValue(const QVariant& a, const QVariant& b, bool money)
{
    if (a.isNull() || b.isNull())
        return a.isNull() && b.isNull();
    if (money)
        return std::llround(a.toDouble() * 100.0) == std::llround(b.toDouble() * 100.0);
    return a.toString() == b.toString();
}

const QStringList& accountLastColumns()
{
    static const QStringList columns = {QStringLiteral("ult_rend1"), QStringLiteral("ult_rend2"),
                                        QStringLiteral("ult_quota_sindicato"), QStringLiteral("ult_perc_sindicato"),
                                        QStringLiteral("ult_quota_seguro"), QStringLiteral("ult_perc_seguro")};
    return columns;
}

QVariantList lastValuesOf(const Recordset& account)
{
    QVariantList values;
    if (!account.eof()) {
        for (const QString& column : accountLastColumns())
            values << account.value(column);
    }
    return values;
}

bool sameLastValues(const QVariantList& now, const QVariantList& asRead)
{
    if (now.size() != asRead.size())
        return false;
    for (int i = 0; i < now.size(); ++i) {
        if (!sameValue(now[i], asRead[i], !accountLastColumns()[i].startsWith(QLatin1String("ult_perc"))))
            return false;
    }
    return true;
}

}  // namespace

QVariantList accountLastValues(const Recordset& movement)
{
    Recordset account;
    account.open(QStringLiteral("SELECT ") + accountLastColumns().join(QStringLiteral(", "))
                     + QStringLiteral(" FROM tbQuotas_Socios WHERE socio_id = ?"),
                 connectionOf(movement), Cursor::ForwardOnly, Lock::ReadOnly, {movement.value(QStringLiteral("socio_id"))});
    return lastValuesOf(account);
}

const QStringList& movementAmountColumns()
{
    static const QStringList columns = {QStringLiteral("rend1"), QStringLiteral("rend2"), QStringLiteral("quota"),
                                        QStringLiteral("pago"), QStringLiteral("doc_no")};
    return columns;
}

QVariantList movementAmounts(const Recordset& movement)
{
    QVariantList values;
    for (const QString& column : movementAmountColumns())
        values << movement.value(column);
    return values;
}

void gravarQuota(Recordset& movement, const QVariantList& accountAsRead)
{
    if (!movement.editing())
        return;
    Connection& connection = connectionOf(movement);
    const QVariant socio = movement.value(QStringLiteral("socio_id"));
    const QVariant rend1 = movement.value(QStringLiteral("rend1"));
    const QVariant rend2 = movement.value(QStringLiteral("rend2"));
    const QVariant quota = movement.value(QStringLiteral("quota"));
    // Read first: a value that is not a number stops the save before anything is written.
    const double remunerations = amountOf(rend1, QStringLiteral("rend1")) + amountOf(rend2, QStringLiteral("rend2"));
    const double due = amountOf(quota, QStringLiteral("quota"));
    // Without remunerations there is no rate to derive; 0 is what the window
    // shows for it, and a rate of 0 makes the next generation use the
    // employer's rate rather than a personal one.
    QVariant rate;
    if (!quota.isNull())
        rate = remunerations == 0.0 ? 0.0 : due / remunerations;

    Transaction tx(connection);
    // A movement of no member belongs to no account.
    if (!socio.isNull()) {
        // A generation reaching the member meanwhile waits, and then finds
        // the account this save creates instead of adding a second one.
        connection.lockMember(socio);
        Recordset account;
        account.open(QStringLiteral("Select * from tbQuotas_Socios where socio_id=?"), connection, Cursor::Keyset,
                     Lock::Optimistic, {socio});
        // An account whose last values another user changed since the window
        // read them is not overwritten; one that has gone is made again. Every
        // last value is guarded, so the save checks them all once more.
        if (!account.eof()) {
            if (!sameLastValues(lastValuesOf(account), accountAsRead))
                throw ConcurrencyError(QStringLiteral("A conta do associado foi alterada por outro utilizador depois de lida. "
                                                      "As alterações não foram gravadas."));
            for (const QString& column : accountLastColumns())
                account.setValue(column, account.value(column));
        }
        if (account.eof()) {
            account.addNew();
            account.setValue(QStringLiteral("socio_id"), socio);
            account.setValue(QStringLiteral("ult_ano"), movement.value(QStringLiteral("ano")));
            account.setValue(QStringLiteral("ult_mes"), movement.value(QStringLiteral("mes")));
        }
        account.setValue(QStringLiteral("ult_rend1"), cents(rend1));
        account.setValue(QStringLiteral("ult_rend2"), cents(rend2));
        if (movement.value(QStringLiteral("ref")).toString() == QLatin1String("Sindicato")) {
            account.setValue(QStringLiteral("ult_quota_sindicato"), cents(quota));
            account.setValue(QStringLiteral("ult_perc_sindicato"), rate);
        } else {
            account.setValue(QStringLiteral("ult_quota_seguro"), cents(quota));
            account.setValue(QStringLiteral("ult_perc_seguro"), rate);
        }
        account.update();
        account.close();
    }

    guardWholeRow(movement);
    movement.update();
    tx.commit();
}

void liquidarQuota(Recordset& movement, double amount, const QString& document)
{
    Connection& connection = connectionOf(movement);
    const double paid = roundCents(amount);
    const bool hadEdits = movement.editing();
    const QVariant pagoBefore = movement.value(QStringLiteral("pago"));
    const QVariant docBefore = movement.value(QStringLiteral("doc_no"));
    try {
        Transaction tx(connection);
        Recordset account;
        account.open(QStringLiteral("select * from tbquotas_socios where socio_id =?"), connection, Cursor::Dynamic,
                     Lock::Optimistic, {movement.value(QStringLiteral("socio_id"))});
        if (!account.eof()) {
            account.addTo(QStringLiteral("total_pago"), paid);
            account.update();
        }
        account.close();

        guardWholeRow(movement);
        movement.setValue(QStringLiteral("pago"), roundCents(amountOf(pagoBefore, QStringLiteral("pago")) + paid));
        // A cancelled document box leaves an empty text, not Null.
        movement.setValue(QStringLiteral("doc_no"), document.isNull() ? QString(QLatin1String("")) : document);
        movement.update();
        tx.commit();
    } catch (...) {
        if (!hadEdits) {
            movement.cancelUpdate();
        } else {
            movement.setValue(QStringLiteral("pago"), pagoBefore);
            movement.setValue(QStringLiteral("doc_no"), docBefore);
        }
        throw;
    }
}

void anularQuota(Recordset& movement, const QVariantList& asRead)
{
    Connection& connection = connectionOf(movement);
    const QVariant id = movement.value(QStringLiteral("quota_id"));
    const QStringList& columns = movementAmountColumns();

    Transaction tx(connection);
    Recordset now;
    now.open(QStringLiteral("SELECT ") + columns.join(QStringLiteral(", "))
                 + QStringLiteral(" FROM tbQuotas_Movimentos WHERE quota_id = ?") + connection.dialect().forUpdate(),
             connection, Cursor::ForwardOnly, Lock::ReadOnly, {id});
    if (!now.eof()) {
        for (int i = 0; i < columns.size() && i < asRead.size(); ++i) {
            const bool money = columns[i] != QLatin1String("doc_no");
            if (!sameValue(now.value(i), asRead[i], money))
                throw ConcurrencyError(QStringLiteral("A quota foi alterada por outro utilizador depois de lida: "
                                                      "feche a janela e volte a abri-la antes de a eliminar."));
        }
    }
    now.close();
    connection.execute(QStringLiteral("DELETE  FROM tbQuotas_Movimentos WHERE tbQuotas_Movimentos.quota_id=?"), {id});
    tx.commit();
}

}  // namespace quotas
