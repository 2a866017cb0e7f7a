#include "generation/dues_counter.h"

#include "platform/connection.h"
#include "platform/errors.h"

namespace quotas {

QVariant DuesCounter::firstRow()
{
    return m_connection.scalar(QStringLiteral("SELECT contador_id FROM tbcontadores ORDER BY contador_id"));
}

int DuesCounter::next()
{
    static const QString increment =
        QStringLiteral("UPDATE tbcontadores SET quotas = COALESCE(quotas, 0) + 1 WHERE contador_id = ? RETURNING quotas");
    for (int attempt = 0; attempt < 3; ++attempt) {
        if (!m_row.isValid())
            m_row = firstRow();
        if (m_row.isValid()) {
            const QVariant number = m_connection.scalar(increment, {m_row});
            if (number.isValid())
                return number.toInt();
            m_row = QVariant();  // the row went away since: look again
            continue;
        }
        // An empty table. The row gets a fixed key, so that a second run
        // adding it at the same moment waits for this one and then finds it,
        // instead of starting a second count.
        m_connection.execute(QStringLiteral(
            "INSERT INTO tbcontadores (contador_id, quotas) VALUES (1, 0) ON CONFLICT (contador_id) DO NOTHING"));
    }
    throw DbError(QStringLiteral("Não foi possível obter o número da quota na tabela tbcontadores."));
}

}  // namespace quotas
