#pragma once

// Rows and checks shared by the maintenance tests, on either engine.

#include "component/money.h"
#include "platform/connection.h"

#include <QDate>
#include <QString>
#include <QVariant>
#include <cmath>

namespace quotas::test {

inline QVariant null()
{
    return QVariant(QMetaType::fromType<double>());
}

struct Amounts {
    QVariant rend1;
    QVariant rend2;
    QVariant quota;
    QVariant pago;
};

// Adds a movement and returns its quota_id. Every movement gets a month of
// its own, so the active table's one-due-a-month rule never trips.
inline int addMovement(Connection& c, const QString& table, int socio, const Amounts& a)
{
    static int next = 0;
    const int n = next++;
    const int month = 1 + n % 12;
    const int year = 2000 + n / 12;
    c.execute(QStringLiteral("INSERT INTO %1 (socio_id, data, ano, mes, tipo, ref, quota_no, rend1, rend2, quota, pago) "
                             "VALUES (?, ?, ?, ?, 1, 'Sindicato', ?, ?, ?, ?, ?)")
                  .arg(table),
              {socio, QDate(year, month, 1), year, month, n, a.rend1, a.rend2, a.quota, a.pago});
    return c.scalar(QStringLiteral("SELECT MAX(quota_id) FROM %1").arg(table)).toInt();
}

inline int addMovement(Connection& c, const QString& table, int socio, double quota, double pago)
{
    return addMovement(c, table, socio, {1000.0, 0.0, quota, pago});
}

inline void addAccount(Connection& c, const QString& table, int socio, double totalQuotas, double totalPago)
{
    c.execute(QStringLiteral("INSERT INTO %1 (socio_id, ult_ano, ult_mes, ult_rend1, total_quotas, total_pago) "
                             "VALUES (?, 2003, 5, 1234.5, ?, ?)")
                  .arg(table),
              {socio, totalQuotas, totalPago});
}

struct Totals {
    bool exists = false;
    double quotas = 0;
    double pago = 0;
};

inline Totals totalsOf(Connection& c, const QString& table, int socio)
{
    Totals t;
    const QVariant count = c.scalar(QStringLiteral("SELECT COUNT(*) FROM %1 WHERE socio_id = ?").arg(table), {socio});
    t.exists = count.toInt() > 0;
    if (t.exists) {
        t.quotas = c.scalar(QStringLiteral("SELECT total_quotas FROM %1 WHERE socio_id = ?").arg(table), {socio}).toDouble();
        t.pago = c.scalar(QStringLiteral("SELECT total_pago FROM %1 WHERE socio_id = ?").arg(table), {socio}).toDouble();
    }
    return t;
}

// Balances compare at cent precision: SQLite keeps REALs.
inline bool sameCents(double a, double b)
{
    return qint64(std::llround(a * 100)) == qint64(std::llround(b * 100));
}

// Notes every UPDATE of a movement table in "written" (table, quota_id), to
// tell which rows a run rewrote.
inline void noteWrites(Connection& c)
{
    const QStringList tables = {QStringLiteral("tbQuotas_Movimentos"), QStringLiteral("tbQuotas_Movimentos_Inactivos"),
                                QStringLiteral("tbQuotas_Movimentos_Historico")};
    c.execute(QStringLiteral("CREATE TABLE IF NOT EXISTS written (tbl VARCHAR(60), id INTEGER)"));
    if (c.engine() == Engine::PostgreSQL)
        c.execute(QStringLiteral("CREATE OR REPLACE FUNCTION note_write() RETURNS trigger AS $$ BEGIN "
                                 "INSERT INTO written VALUES (TG_TABLE_NAME, NEW.quota_id); RETURN NEW; END $$ "
                                 "LANGUAGE plpgsql"));
    for (const QString& t : tables) {
        if (c.engine() == Engine::SQLite)
            c.execute(QStringLiteral("CREATE TRIGGER IF NOT EXISTS w_%1 AFTER UPDATE ON %1 BEGIN "
                                     "INSERT INTO written VALUES ('%1', NEW.quota_id); END")
                          .arg(t));
        else
            c.execute(QStringLiteral("CREATE OR REPLACE TRIGGER w_%1 AFTER UPDATE ON %1 FOR EACH ROW "
                                     "EXECUTE FUNCTION note_write()")
                          .arg(t));
    }
    c.execute(QStringLiteral("DELETE FROM written"));
}

inline int writesOf(Connection& c, const QString& table, int quotaId)
{
    return c.scalar(QStringLiteral("SELECT COUNT(*) FROM written WHERE LOWER(tbl) = LOWER(?) AND id = ?"),
                    {table, quotaId})
        .toInt();
}

inline int movementWrites(Connection& c)
{
    return c.scalar(QStringLiteral("SELECT COUNT(*) FROM written")).toInt();
}

// Makes every UPDATE of a table fail where the condition (on NEW) holds:
// a database failure in the middle of a pass.
inline void failUpdates(Connection& c, const QString& table, const QString& condition)
{
    if (c.engine() == Engine::SQLite) {
        c.execute(QStringLiteral("CREATE TRIGGER simulated_failure BEFORE UPDATE ON %1 WHEN %2 BEGIN "
                                 "SELECT RAISE(ABORT, 'falha simulada'); END")
                      .arg(table, condition));
    } else {
        c.execute(QStringLiteral("CREATE OR REPLACE FUNCTION simulated_failure() RETURNS trigger AS $$ BEGIN "
                                 "IF %1 THEN RAISE EXCEPTION 'falha simulada'; END IF; RETURN NEW; END $$ "
                                 "LANGUAGE plpgsql")
                      .arg(condition));
        c.execute(QStringLiteral("CREATE TRIGGER simulated_failure BEFORE UPDATE ON %1 FOR EACH ROW "
                                 "EXECUTE FUNCTION simulated_failure()")
                      .arg(table));
    }
}

inline void stopFailing(Connection& c, const QString& table)
{
    if (c.engine() == Engine::SQLite)
        c.execute(QStringLiteral("DROP TRIGGER IF EXISTS simulated_failure"));
    else
        c.execute(QStringLiteral("DROP TRIGGER IF EXISTS simulated_failure ON %1").arg(table));
}

}  // namespace quotas::test
