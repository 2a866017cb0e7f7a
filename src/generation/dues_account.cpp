#include "generation/dues_account.h"

#include "component/money.h"
#include "platform/connection.h"
#include "platform/errors.h"

#include <QSqlQuery>

namespace quotas {

bool DuesAccount::lock(Connection& connection, const QVariant& socio)
{
    *this = DuesAccount();
    const Dialect& dialect = connection.dialect();
    QSqlQuery& q = connection.run(
        dialect.translate(QStringLiteral("SELECT squota_id, ult_rend1, ult_rend2, ult_perc_sindicato, ult_perc_seguro, "
                                         "total_quotas FROM tbQuotas_Socios WHERE (socio_id=?) ORDER BY squota_id")
                          + dialect.forUpdate()),
        {socio});
    const bool found = q.next();
    if (found) {
        m_key = q.value(0);
        m_rend1 = q.value(1);
        m_rend2 = q.value(2);
        m_percSindicato = q.value(3);
        m_percSeguro = q.value(4);
        m_total = readStoredAmount(q.value(5));
    }
    q.finish();
    return found;
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
