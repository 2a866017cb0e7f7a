#include "generation/dues_counter.h"

#include "platform/connection.h"
#include "platform/errors.h"

namespace quotas {

int DuesCounter::reserve(int count)
{
    const Dialect& dialect = m_connection.dialect();
    if (m_firstRow.isEmpty()) {
        // The first row in the key's order when the table has a key, else in
        // the order the rows were stored.
        const QString address = dialect.rowAddress();
        const QString key = m_connection.primaryKey(QStringLiteral("tbcontadores"));
        m_firstRow = QStringLiteral("SELECT %1 FROM tbcontadores ORDER BY %2 LIMIT 1%3")
                         .arg(address, key.isEmpty() ? address : key, dialect.forUpdate());
        m_take = QStringLiteral("UPDATE tbcontadores SET quotas = COALESCE(quotas, 0) + ? WHERE %1 = (%2) RETURNING quotas")
                     .arg(address, m_firstRow);
    }
    for (int attempt = 0; attempt < 3; ++attempt) {
        // The row is locked before it is changed: a second run waits there.
        // When it was changed meanwhile, this statement no longer sees it
        // and changes nothing; the row is ours by then, and the next
        // statement sees the number the other run took.
        const QVariant number = m_connection.scalar(m_take, {count});
        if (number.isValid())
            return number.toInt() - count + 1;
        if (m_connection.scalar(m_firstRow).isValid())
            continue;
        // An empty table. Those who would add the first row queue on one
        // lock, so the second finds the row the first added.
        m_connection.lock(Connection::LockSpace::FirstCounter);
        if (m_connection.scalar(m_firstRow).isValid())
            continue;
        m_connection.execute(QStringLiteral("INSERT INTO tbcontadores (quotas) VALUES (?)"), {count});
        return 1;
    }
    throw DbError(QStringLiteral("Não foi possível obter o número da quota na tabela tbcontadores."));
}

}  // namespace quotas
