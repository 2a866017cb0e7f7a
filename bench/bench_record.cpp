// The record window's database work: opening Registo's rows on a movement,
// and the save step plus a payment, one member after another as users at the
// window would do them, beside the same changes made set-based.

#include "bench/benchmark.h"
#include "platform/recordset.h"
#include "platform/transaction.h"
#include "record/movement_saving.h"
#include "support/test_database.h"

#include <QStringList>
#include <algorithm>

namespace quotas::bench {

namespace {

// One union due per member for January 2003 and an account for each.
QList<QVariant> addDues(Connection& c)
{
    Transaction tx(c);
    c.execute(QStringLiteral("INSERT INTO tbQuotas_Movimentos (socio_id, data, ano, mes, tipo, ref, quota_no, rend1, rend2, "
                             "quota, pago) SELECT socio_id, '2003-01-05', 2003, 1, 1, 'Sindicato', socio_id, 1000, 0, 15, 0 "
                             "FROM tbSocios"));
    c.execute(QStringLiteral("INSERT INTO tbQuotas_Socios (socio_id, ult_ano, ult_mes, total_quotas, total_pago) "
                             "SELECT socio_id, 2003, 1, 15, 0 FROM tbSocios"));
    tx.commit();
    Recordset keys;
    keys.open(QStringLiteral("SELECT socio_id FROM tbSocios ORDER BY socio_id"), c, Cursor::ForwardOnly, Lock::ReadOnly);
    QList<QVariant> members;
    for (; !keys.eof(); keys.moveNext())
        members << keys.value(0);
    return members;
}

QString registoText(const QString& where)
{
    return QStringLiteral("SELECT tbQuotas_Movimentos.*, tbSocios.no_tap, tbSocios.nome, tbSocios.nome_guerra "
                          "FROM tbQuotas_Movimentos INNER JOIN tbSocios ON tbQuotas_Movimentos.socio_id = "
                          "tbSocios.socio_id")
           + where + QStringLiteral(" ORDER BY ano, mes, tipo");
}

[[maybe_unused]] const bool registered = registerBenchmark(QStringLiteral("record"), [](Context& context) {
    QList<Figure> figures;
    auto db = context.freshDatabase();
    Connection& c = db->connection();
    const QList<QVariant> members = addDues(c);
    const QVariant lastKey = c.scalar(QStringLiteral("SELECT max(quota_id) FROM tbQuotas_Movimentos"));

    // Registo on every movement at once, positioned on the last one.
    const double openOnly = timed([&] {
        Recordset rows;
        rows.open(registoText(QString()), c, Cursor::Dynamic, Lock::Optimistic);
    });
    const double openAndFind = timed([&] {
        Recordset rows;
        rows.open(registoText(QString()), c, Cursor::Dynamic, Lock::Optimistic);
        rows.moveFirst();
        rows.find(QStringLiteral("quota_id"), lastKey);
    });
    figures.append({QStringLiteral("registo-open"), openAndFind, openOnly});

    // The window's work for one member at a time: open the member's rows,
    // correct the remuneration, Sair's save step, then a payment of 1.00.
    const int count = int(std::min<qsizetype>(members.size(), 500));
    const double perMember = timed([&] {
        for (int i = 0; i < count; ++i) {
            Recordset rows;
            rows.open(registoText(QStringLiteral(" WHERE tbQuotas_Movimentos.socio_id = %1").arg(members[i].toLongLong())),
                      c, Cursor::Dynamic, Lock::Optimistic);
            rows.moveFirst();
            const QVariantList account = accountLastValues(rows);
            rows.setValue(QStringLiteral("rend1"), 1100.0);
            rows.setValue(QStringLiteral("quota"), 16.5);
            gravarQuota(rows, account);
            liquidarQuota(rows, 1.0, QStringLiteral("R"));
        }
    });
    QStringList chosen;
    for (int i = 0; i < count; ++i)
        chosen << QString::number(members[i].toLongLong());
    const QString in = QStringLiteral(" WHERE socio_id IN (") + chosen.join(u',') + u')';
    const double setBased = timed([&] {
        Transaction tx(c);
        c.execute(QStringLiteral("UPDATE tbQuotas_Movimentos SET rend1 = 1200, quota = 18, pago = pago + 1, doc_no = 'R'") + in);
        c.execute(QStringLiteral("UPDATE tbQuotas_Socios SET ult_rend1 = 1200, ult_rend2 = 0, ult_quota_sindicato = 18, "
                                 "ult_perc_sindicato = 0.015, total_pago = total_pago + 1")
                  + in);
        tx.commit();
    });
    figures.append({QStringLiteral("save+pay x%1").arg(count), perMember, setBased});
    return figures;
});

}  // namespace

}  // namespace quotas::bench
