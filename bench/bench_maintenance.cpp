// The maintenance run on N members with a year of dues each (24 movements,
// a few percent of amounts Null), a smaller inactive table and a history,
// beside the set-based lower bound of the same repair and rebuild. Both
// start from identical databases and must end with identical totals.

#include "bench/benchmark.h"
#include "maintenance/maintenance_panel.h"
#include "maintenance/processar_manutencao.h"
#include "platform/errors.h"
#include "support/test_database.h"

namespace quotas::bench {

namespace {

// Notes when the last row of the Null passes is done, to split the figure.
class QuietPanel final : public MaintenancePanel {
public:
    QElapsedTimer clock;
    double repairsDone = 0;

    QString caption() const override { return maintenanceCaption(); }
    void startBar(int, int) override {}
    void stepBar(int pass) override
    {
        if (pass == 3)
            repairsDone = double(clock.nsecsElapsed()) / 1e9;
    }
    void playAnimation(const QString&) override {}
    void stopAnimation() override {}
    void showFinished() override {}
};

const char* const kMovementTables[] = {"tbQuotas_Movimentos", "tbQuotas_Movimentos_Inactivos",
                                       "tbQuotas_Movimentos_Historico"};

// Which members have rows in a table: every member for the active one, one
// in ten inactive, one in five with a history.
void fillMovements(Connection& c, const char* table, int every, int year)
{
    c.execute(QStringLiteral(
                  "WITH RECURSIVE m(mes) AS (SELECT 1 UNION ALL SELECT mes + 1 FROM m WHERE mes < 12), "
                  "t(tipo) AS (SELECT 1 UNION ALL SELECT 2) "
                  "INSERT INTO %1 (socio_id, ano, mes, tipo, ref, quota_no, rend1, rend2, quota, pago) "
                  "SELECT s.socio_id, %2, m.mes, t.tipo, CASE t.tipo WHEN 1 THEN 'Sindicato' ELSE 'Seguro' END, "
                  "s.socio_id * 24 + m.mes * 2 + t.tipo, "
                  "CASE WHEN (s.socio_id + m.mes) % 53 = 0 THEN NULL ELSE 900 + (s.socio_id % 50) * 10 END, "
                  "CASE WHEN (s.socio_id + m.mes * 7) % 59 = 0 THEN NULL ELSE 0 END, "
                  "CASE WHEN (s.socio_id * 3 + m.mes + t.tipo) % 61 = 0 THEN NULL "
                  "ELSE 13.5 + (s.socio_id % 50) * 0.15 + t.tipo * 0.01 END, "
                  "CASE WHEN (s.socio_id + t.tipo * 5 + m.mes) % 67 = 0 THEN NULL "
                  "WHEN m.mes < 10 THEN 13.5 + (s.socio_id % 50) * 0.15 + t.tipo * 0.01 ELSE 0 END "
                  "FROM tbSocios s, m, t WHERE s.socio_id % %3 = 0")
                  .arg(QLatin1String(table))
                  .arg(year)
                  .arg(every));
}

void fill(Connection& c)
{
    fillMovements(c, "tbQuotas_Movimentos", 1, 2003);
    fillMovements(c, "tbQuotas_Movimentos_Inactivos", 10, 2002);
    fillMovements(c, "tbQuotas_Movimentos_Historico", 5, 2001);
    // Most members have an account with stale totals; the rest get one.
    c.execute(QStringLiteral("INSERT INTO tbQuotas_Socios (socio_id, ult_ano, ult_mes, total_quotas, total_pago) "
                             "SELECT socio_id, 2003, 12, 100, 50 FROM tbSocios WHERE socio_id % 20 <> 7"));
    c.execute(QStringLiteral("INSERT INTO tbQuotas_Socios_Inactivos (socio_id, total_quotas, total_pago) "
                             "SELECT socio_id, 10, 0 FROM tbSocios WHERE socio_id % 20 = 0"));
}

void setBasedRepairs(Connection& c)
{
    for (const char* table : kMovementTables)
        for (const char* column : {"rend1", "rend2", "quota", "pago"})
            c.execute(QStringLiteral("UPDATE %1 SET %2 = 0 WHERE %2 IS NULL").arg(QLatin1String(table), QLatin1String(column)));
}

void setBasedTotals(Connection& c)
{
    const struct {
        const char* accounts;
        const char* movements;
    } pairs[] = {{"tbQuotas_Socios", "tbQuotas_Movimentos"},
                 {"tbQuotas_Socios_Inactivos", "tbQuotas_Movimentos_Inactivos"}};
    for (const auto& p : pairs) {
        const QString accounts = QLatin1String(p.accounts);
        const QString movements = QLatin1String(p.movements);
        c.execute(QStringLiteral("UPDATE %1 SET total_quotas = 0, total_pago = 0").arg(accounts));
        c.execute(QStringLiteral("UPDATE %1 SET total_quotas = g.q, total_pago = g.p FROM "
                                 "(SELECT socio_id, ROUND(SUM(quota), 2) AS q, ROUND(SUM(pago), 2) AS p FROM %2 "
                                 "GROUP BY socio_id) AS g WHERE %1.socio_id = g.socio_id")
                      .arg(accounts, movements));
        c.execute(QStringLiteral("INSERT INTO %1 (socio_id, total_quotas, total_pago) "
                                 "SELECT socio_id, ROUND(SUM(quota), 2), ROUND(SUM(pago), 2) FROM %2 "
                                 "WHERE socio_id NOT IN (SELECT socio_id FROM %1) GROUP BY socio_id")
                      .arg(accounts, movements));
    }
}

QString outcome(Connection& c)
{
    QStringList parts;
    for (const char* accounts : {"tbQuotas_Socios", "tbQuotas_Socios_Inactivos"})
        parts << c.scalar(QStringLiteral("SELECT COUNT(*) || ' ' || ROUND(SUM(total_quotas), 2) || ' ' || "
                                         "ROUND(SUM(total_pago), 2) FROM %1")
                              .arg(QLatin1String(accounts)))
                     .toString();
    for (const char* table : kMovementTables)
        parts << c.scalar(QStringLiteral("SELECT COUNT(*) FROM %1 WHERE rend1 IS NULL OR rend2 IS NULL "
                                         "OR quota IS NULL OR pago IS NULL")
                              .arg(QLatin1String(table)))
                     .toString();
    return parts.join(QStringLiteral("; "));
}

[[maybe_unused]] const bool registered = registerBenchmark(QStringLiteral("maintenance"), [](Context& c) {
    auto runDb = c.freshDatabase();
    fill(runDb->connection());
    QuietPanel panel;
    panel.clock.start();
    Figure run = measured(QStringLiteral("maintenance"), [&] { ProcessarManutencao(runDb->connection(), panel); });

    auto boundDb = c.freshDatabase();
    fill(boundDb->connection());
    const double repairs = timed([&] { setBasedRepairs(boundDb->connection()); });
    const double totals = timed([&] { setBasedTotals(boundDb->connection()); });

    const QString got = outcome(runDb->connection());
    const QString want = outcome(boundDb->connection());
    if (got != want)
        throw QuotasError(QStringLiteral("the run and the set-based bound disagree: %1 / %2").arg(got, want));
    run.lowerBound = repairs + totals;
    return QList<Figure>{run, {QStringLiteral(" passes 1-3"), panel.repairsDone, repairs}, {QStringLiteral(" passes 4-5"), run.seconds - panel.repairsDone, totals}};
});

}  // namespace

}  // namespace quotas::bench
