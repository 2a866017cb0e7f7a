#include "generation/dues_account.h"

#include "component/money.h"
#include "platform/connection.h"
#include "platform/errors.h"

#include <QSqlQuery>
#include <QSqlRecord>

namespace quotas {

namespace {

const QString kColumns =
    QStringLiteral("squota_id, ult_rend1, ult_rend2, ult_perc_sindicato, ult_perc_seguro, total_quotas");
// Which of the month's two dues the member has, as bits (1 << tipo): the
// unique index of the movements finds them.
const QString kChargedTypes = QStringLiteral(
    ", (SELECT MAX(CASE WHEN m.tipo = 1 THEN 2 ELSE 0 END) + MAX(CASE WHEN m.tipo = 2 THEN 4 ELSE 0 END) "
    "FROM tbQuotas_Movimentos m WHERE m.socio_id = ? AND m.ano = ? AND m.mes = ?)");

}  // namespace

bool DuesAccount::read(QSqlQuery& q)
{
    *this = DuesAccount();
    const bool found = q.next();
    if (found) {
        m_key = q.value(0);
        m_rend1 = q.value(1);
        m_rend2 = q.value(2);
        m_percSindicato = q.value(3);
        m_percSeguro = q.value(4);
        m_total = readStoredAmount(q.value(5));
        if (q.record().count() > 6)
            m_chargedTypes = q.value(6).toUInt();
    }
    q.finish();
    return found;
}

bool DuesAccount::lock(Connection& connection, const QVariant& socio, int ano, int mes)
{
    const Dialect& dialect = connection.dialect();
    const bool month = ano > 0;
    // Read after the member's lock was taken, the month's dues are those
    // every run that visited him before has committed.
    return read(connection.run(
        dialect.translate(QStringLiteral("SELECT %1%2 FROM tbQuotas_Socios WHERE (socio_id=?) ORDER BY squota_id")
                              .arg(kColumns, month ? kChargedTypes : QString())
                          + dialect.forUpdate()),
        month ? QVariantList{socio, ano, mes, socio} : QVariantList{socio}));
}

void DuesAccount::create(Connection& connection, const QVariant& socio, int ano, int mes, const QVariant& rend1)
{
    connection.execute(QStringLiteral("INSERT INTO tbQuotas_Socios (socio_id, ult_ano, ult_mes, ult_rend1, ult_rend2, "
                                      "ult_quota_sindicato, ult_quota_seguro, total_quotas, total_pago) "
                                      "VALUES (?,?,?,?,0,0,0,0,0)"),
                       {socio, ano, mes, rend1});
    if (!lock(connection, socio, ano, mes))
        throw DbError(QStringLiteral("Não foi possível criar a conta de quotas do associado."));
}

void DuesAccount::charge(DueType type, double amount, int ano, int mes)
{
    m_added = roundCents(m_added + amount);
    (type == DueType::Sindicato ? m_quotaSindicato : m_quotaSeguro) = amount;
    m_ano = ano;
    m_mes = mes;
    m_charged = true;
}

void DuesAccount::save(Connection& connection)
{
    if (!m_charged)
        return;
    const Dialect& dialect = connection.dialect();
    const QVariant unchanged(QMetaType::fromType<double>());
    const int saved = connection.execute(
        QStringLiteral("UPDATE tbQuotas_Socios SET total_quotas = %1, ult_quota_sindicato = COALESCE(?, ult_quota_sindicato), "
                       "ult_quota_seguro = COALESCE(?, ult_quota_seguro), ult_ano = ?, ult_mes = ? WHERE squota_id = ?")
            .arg(dialect.addToColumn(QStringLiteral("total_quotas"))),
        {m_added, m_quotaSindicato.isValid() ? m_quotaSindicato : unchanged,
         m_quotaSeguro.isValid() ? m_quotaSeguro : unchanged, m_ano, m_mes, m_key});
    if (saved != 1)
        throw ConcurrencyError(QStringLiteral("A conta de quotas do associado foi eliminada durante o processamento."));
    m_charged = false;
}

}  // namespace quotas
