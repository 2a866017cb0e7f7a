#include "import/month_dues.h"

#include "component/money.h"
#include "component/stored_value.h"
#include "platform/connection.h"
#include "platform/errors.h"
#include "platform/recordset.h"
#include "platform/transaction.h"

#include <QSqlQuery>
#include <cmath>

namespace quotas {

namespace {

// The staff numbers of a chunk go into one statement, padded with Null so
// that every chunk runs the same prepared statement.
constexpr int kStaffNumbers = 500;

// The account's columns in the order of DueAccount, "%1" and "%2" the due
// type's last due and rate.
const QString kAccountColumns =
    QStringLiteral("squota_id, ult_rend1, ult_rend2, %1, %2, ult_ano, ult_mes, total_quotas, total_pago");

void readAccount(DueAccount& account, const QVariantList& values)
{
    account = DueAccount{values.value(0), values.value(1), values.value(2), values.value(3), values.value(4),
                         values.value(5), values.value(6), values.value(7), values.value(8)};
}

QVariantList rowValues(const QSqlQuery& q, int from, int count)
{
    QVariantList values;
    values.reserve(count);
    for (int i = from; i < from + count; ++i)
        values << q.value(i);
    return values;
}

[[noreturn]] void changedMeanwhile()
{
    throw ConcurrencyError(QStringLiteral("O registo foi alterado ou eliminado por outro utilizador depois de lido. "
                                          "As alterações não foram gravadas."));
}

}  // namespace

MonthDues::MonthDues(Connection& connection, int month, int year, int tipo)
    : m_connection(connection), m_month(month), m_year(year), m_tipo(tipo),
      m_dueColumn(tipo == 1 ? QStringLiteral("ult_quota_sindicato") : QStringLiteral("ult_quota_seguro")),
      m_rateColumn(tipo == 1 ? QStringLiteral("ult_perc_sindicato") : QStringLiteral("ult_perc_seguro"))
{
}

bool MonthDues::anyCharged()
{
    return m_connection
               .scalar(QStringLiteral("SELECT COUNT(*) FROM (SELECT 1 FROM tbQuotas_Movimentos WHERE ano = ? AND mes = ? AND "
                                      "tipo = ? LIMIT 1) charged"),
                       {m_year, m_month, m_tipo})
               .toInt()
           > 0;
}

void MonthDues::read(const QStringList& staffNumbers)
{
    m_dues.clear();
    m_accounts.clear();
    m_byStaffNumber.clear();
    QHash<qint64, int> accountByKey;
    for (qsizetype from = 0; from < staffNumbers.size(); from += kStaffNumbers) {
        QVariantList params;
        for (qsizetype i = from; i < from + kStaffNumbers; ++i)
            params << (i < staffNumbers.size() ? QVariant(staffNumbers[i]) : QVariant(QMetaType::fromType<QString>()));
        params << m_year << m_month << m_tipo;
        QStringList marks;
        for (int i = 0; i < kStaffNumbers; ++i)
            marks << QStringLiteral("(?)");
        // The first due by key of a staff number, and the member's first
        // account by key, as a search of the month's dues and of the accounts
        // in their order would find them. Each staff number is looked up by
        // index, whatever the server believes of the tables: the month just
        // generated is not yet in its statistics, and a plan that starts from
        // the month's dues reads them all for every chunk. PostgreSQL keeps
        // to that order only through LATERAL subqueries that OFFSET 0 keeps
        // apart; SQLite does by itself.
        const QString accountColumns =
            QString(kAccountColumns).replace(QStringLiteral(", "), QStringLiteral(", a.")).arg(m_dueColumn, m_rateColumn);
        const QString sql =
            m_connection.engine() == Engine::PostgreSQL
                ? QStringLiteral(
                      "SELECT s.no_tap, m.quota_id, m.quota, m.pago, m.rend1, m.rend2, a.%1 FROM (VALUES %2) k "
                      "CROSS JOIN LATERAL (SELECT socio_id, no_tap FROM tbSocios WHERE no_tap = k.column1 OFFSET 0) s "
                      "CROSS JOIN LATERAL (SELECT quota_id, socio_id, quota, pago, rend1, rend2 FROM tbQuotas_Movimentos "
                      "WHERE socio_id = s.socio_id AND ano = ? AND mes = ? AND tipo = ? OFFSET 0) m "
                      "LEFT OUTER JOIN LATERAL (SELECT %3 FROM tbQuotas_Socios WHERE socio_id = m.socio_id OFFSET 0) a "
                      "ON TRUE ORDER BY m.quota_id, a.squota_id")
                      .arg(accountColumns, marks.join(u','), QString(kAccountColumns).arg(m_dueColumn, m_rateColumn))
                : QStringLiteral("SELECT s.no_tap, m.quota_id, m.quota, m.pago, m.rend1, m.rend2, a.%1 FROM (VALUES %2) k "
                                 "JOIN tbSocios s ON s.no_tap = k.column1 JOIN tbQuotas_Movimentos m ON m.socio_id = "
                                 "s.socio_id LEFT OUTER JOIN tbQuotas_Socios a ON a.socio_id = m.socio_id WHERE m.ano = ? "
                                 "AND m.mes = ? AND m.tipo = ? ORDER BY m.quota_id, a.squota_id")
                      .arg(accountColumns, marks.join(u','));
        Recordset rows;
        rows.open(sql,
                  m_connection, Cursor::ForwardOnly, Lock::ReadOnly, params);
        QVariant lastDue;
        for (; !rows.eof(); rows.moveNext()) {
            const QVariant dueKey = rows.value(1);
            if (dueKey == lastDue)
                continue;  // the member's other accounts
            lastDue = dueKey;
            ChargedDue due{dueKey, rows.value(2), rows.value(3), rows.value(4), rows.value(5)};
            const QVariant accountKey = rows.value(6);
            if (!accountKey.isNull()) {
                auto known = accountByKey.constFind(accountKey.toLongLong());
                if (known == accountByKey.constEnd()) {
                    QVariantList values;
                    for (int i = 6; i < 15; ++i)
                        values << rows.value(i);
                    m_accounts.emplace_back();
                    readAccount(m_accounts.back(), values);
                    known = accountByKey.insert(accountKey.toLongLong(), int(m_accounts.size()) - 1);
                }
                due.account = *known;
            }
            m_dues.push_back(std::move(due));
            const QString staffNumber = rows.value(0).toString();
            if (!m_byStaffNumber.contains(staffNumber))  // the first due by key
                m_byStaffNumber.insert(staffNumber, int(m_dues.size()) - 1);
        }
    }
}

ChargedDue* MonthDues::find(const QString& staffNumber)
{
    const auto found = m_byStaffNumber.constFind(staffNumber);
    return found == m_byStaffNumber.constEnd() ? nullptr : &m_dues[size_t(*found)];
}

DueAccount* MonthDues::accountOf(const ChargedDue& due)
{
    return due.account < 0 ? nullptr : &m_accounts[size_t(due.account)];
}

const QString& MonthDues::postSql(bool withRend1, bool learnsRate, bool movement)
{
    QString& cached = m_postSql[(withRend1 ? 4 : 0) + (learnsRate ? 2 : 0) + (movement ? 1 : 0)];
    if (cached.isEmpty())
        cached = m_connection.dialect().translate(writeSql(withRend1, learnsRate, movement));
    return cached;
}

QString MonthDues::writeSql(bool withRend1, bool learnsRate, bool movement) const
{
    const Dialect& dialect = m_connection.dialect();
    const auto checked = [&](const QString& prefix, const QStringList& columns) {
        QStringList checks;
        for (const QString& column : columns)
            checks << dialect.nullSafeEquals(prefix + column);
        return checks.join(QStringLiteral(" AND "));
    };
    // The movement: every column it writes is checked against what was read.
    const QStringList movementColumns{QStringLiteral("rend1"), QStringLiteral("rend2"), QStringLiteral("pago"),
                                      QStringLiteral("quota")};
    const QString movementUpdate = QStringLiteral("UPDATE tbQuotas_Movimentos SET rend1 = ?, rend2 = ?, pago = ?, quota = ?");
    // The account: the last values it writes are checked, the totals added to.
    QStringList written;
    if (withRend1)
        written << QStringLiteral("ult_rend1") << QStringLiteral("ult_rend2");
    written << m_dueColumn;
    if (learnsRate)
        written << m_rateColumn;
    written << QStringLiteral("ult_ano") << QStringLiteral("ult_mes");
    QStringList sets;
    for (const QString& column : written)
        sets << column + QStringLiteral(" = ?");
    sets << QStringLiteral("total_quotas = ") + dialect.addToColumn(QStringLiteral("total_quotas"))
         << QStringLiteral("total_pago = ") + dialect.addToColumn(QStringLiteral("total_pago"));
    const QString accountUpdate = QStringLiteral("UPDATE tbQuotas_Socios SET ") + sets.join(QStringLiteral(", "));
    const QString accountReturned = QString(kAccountColumns).arg(m_dueColumn, m_rateColumn);
    const QString movementReturned = movementColumns.join(QStringLiteral(", "));
    if (m_connection.engine() == Engine::PostgreSQL) {
        // One statement: both rows are checked and locked first, then both
        // written; neither when a check fails.
        return QStringLiteral("WITH ok AS (SELECT m.quota_id, a.squota_id FROM tbQuotas_Movimentos m, tbQuotas_Socios a "
                              "WHERE m.quota_id = ? AND %1 AND a.squota_id = ? AND %2 FOR UPDATE), "
                              "mov AS (%3 WHERE quota_id = (SELECT quota_id FROM ok) RETURNING %4), "
                              "acc AS (%5 WHERE squota_id = (SELECT squota_id FROM ok) RETURNING %6) "
                              "SELECT mov.*, acc.* FROM mov, acc")
            .arg(checked(QStringLiteral("m."), movementColumns), checked(QStringLiteral("a."), written), movementUpdate,
                 movementReturned, accountUpdate, accountReturned);
    }
    if (movement)
        return QStringLiteral("%1 WHERE quota_id = ? AND %2 RETURNING %3")
            .arg(movementUpdate, checked(QString(), movementColumns), movementReturned);
    return QStringLiteral("%1 WHERE squota_id = ? AND %2 RETURNING %3").arg(accountUpdate, checked(QString(), written), accountReturned);
}

void MonthDues::post(ChargedDue& due, DueAccount& account, const Deduction& deduction)
{
    const double q = deduction.amount;
    const std::optional<double>& r = deduction.rend1;
    const double base = r ? *r : readStoredAmount(account.ultRend1).value + readStoredAmount(account.ultRend2).value;
    // Without remunerations there is no rate to learn: the last one stays.
    const bool learnsRate = base != 0;

    const QVariantList movementSets{r ? QVariant(*r) : account.ultRend1, 0.0, q, q};
    const QVariantList movementChecks{due.rend1, due.rend2, due.pago, due.quota};
    QVariantList accountSets;
    QVariantList accountChecks;
    if (r) {
        accountSets << *r << 0.0;
        accountChecks << account.ultRend1 << account.ultRend2;
    }
    accountSets << q;
    accountChecks << account.ultQuota;
    if (learnsRate) {
        accountSets << q / base;
        accountChecks << account.ultPerc;
    }
    accountSets << m_year << m_month;
    accountChecks << account.ultAno << account.ultMes;
    // The old charge leaves the total, the deduction enters both.
    const double chargedOff = std::llround(deduction.charged * 100.0) > 0 ? roundCents(-deduction.charged) : 0.0;
    accountSets << chargedOff + roundCents(q) << roundCents(q);

    const auto adopt = [&](const QSqlQuery& saved, int movementAt, int accountAt) {
        if (movementAt >= 0) {
            const QVariantList m = rowValues(saved, movementAt, 4);
            due.rend1 = m[0];
            due.rend2 = m[1];
            due.pago = m[2];
            due.quota = m[3];
        }
        if (accountAt >= 0)
            readAccount(account, rowValues(saved, accountAt, 9));
    };

    if (m_connection.engine() == Engine::PostgreSQL) {
        QSqlQuery& q = m_connection.run(postSql(r.has_value(), learnsRate, true),
                                        QVariantList{due.quotaId} + movementChecks + QVariantList{account.squotaId}
                                            + accountChecks + movementSets + accountSets);
        const bool saved = q.next();
        if (saved)
            adopt(q, 0, 4);
        q.finish();
        if (!saved)
            changedMeanwhile();
        return;
    }
    Transaction line(m_connection);
    for (const bool movement : {true, false}) {
        QSqlQuery& q = m_connection.run(postSql(r.has_value(), learnsRate, movement),
                                        movement ? movementSets + QVariantList{due.quotaId} + movementChecks
                                                 : accountSets + QVariantList{account.squotaId} + accountChecks);
        const bool saved = q.next();
        if (saved)
            adopt(q, movement ? 0 : -1, movement ? -1 : 0);
        q.finish();
        if (!saved)
            changedMeanwhile();
    }
    line.commit();
}

void MonthDues::reread(ChargedDue& due)
{
    QSqlQuery& m = m_connection.run(
        m_connection.dialect().translate(QStringLiteral("SELECT quota, pago, rend1, rend2 FROM tbQuotas_Movimentos WHERE quota_id = ?")),
        {due.quotaId});
    if (m.next()) {  // a row gone stays as read: posting it again is refused
        due.quota = m.value(0);
        due.pago = m.value(1);
        due.rend1 = m.value(2);
        due.rend2 = m.value(3);
    }
    m.finish();
    DueAccount* account = accountOf(due);
    if (!account)
        return;
    QSqlQuery& a = m_connection.run(
        m_connection.dialect().translate(QStringLiteral("SELECT %1 FROM tbQuotas_Socios WHERE squota_id = ?")
                                             .arg(QString(kAccountColumns).arg(m_dueColumn, m_rateColumn))),
        {account->squotaId});
    if (a.next())
        readAccount(*account, rowValues(a, 0, 9));
    a.finish();
}

}  // namespace quotas
