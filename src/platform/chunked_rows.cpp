#include "platform/chunked_rows.h"

#include "platform/connection.h"

namespace quotas {

ChunkedRows::ChunkedRows(Connection& connection, QString sql, QString keyExpression, QString keyField,
                         QVariantList params, int chunkSize)
    : m_connection(connection), m_sql(std::move(sql)), m_keyExpression(std::move(keyExpression)),
      m_keyField(std::move(keyField)), m_params(std::move(params)), m_chunkSize(chunkSize)
{
    read(QVariant());
}

void ChunkedRows::read(const QVariant& after)
{
    const bool first = !after.isValid();
    const QString sql = m_sql.arg(first ? QString() : QStringLiteral(" AND %1 > ?").arg(m_keyExpression))
                        + QStringLiteral(" LIMIT %1").arg(m_chunkSize);
    m_rows.open(sql, m_connection, Cursor::ForwardOnly, Lock::ReadOnly, first ? m_params : m_params + QVariantList{after});
}

void ChunkedRows::moveNext()
{
    m_rows.moveNext();
    if (!m_rows.eof() || m_rows.recordCount() < m_chunkSize)
        return;
    m_rows.moveLast();
    read(m_rows.value(m_keyField));
}

}  // namespace quotas
