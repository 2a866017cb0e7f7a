// The monthly dues generation on N demo members, beside the same rows
// written set-based: a few INSERT ... SELECT and UPDATE statements in one
// transaction, which no member-by-member run can beat.

#include "bench/benchmark.h"
#include "generation/processar_quotas.h"
#include "platform/errors.h"
#include "platform/transaction.h"
#include "support/test_database.h"

#include <QDate>

namespace quotas::bench {

namespace {

constexpr int kAno = 2003;
constexpr int kMes = 1;

int movementCount(Connection& c)
{
    return c.scalar(QStringLiteral("SELECT COUNT(*) FROM tbQuotas_Movimentos")).toInt();
}

void postSetBased(Connection& c, int tipo, const QString& ref, const QString& rateColumn, const QString& condition)
{
    const QDate today = QDate::currentDate();
    const int base = c.scalar(QStringLiteral("SELECT COALESCE(MAX(quota_no), 0) FROM tbQuotas_Movimentos")).toInt();
    c.execute(QStringLiteral(
                  "INSERT INTO tbQuotas_Movimentos (data, ano, mes, socio_id, ref, rend1, rend2, quota, pago, tipo, quota_no) "
                  "SELECT ?, ?, ?, s.socio_id, ?, a.ult_rend1, a.ult_rend2, "
                  "ROUND(CAST((a.ult_rend1 + a.ult_rend2) * CASE WHEN a.%1 > 0 THEN a.%1 "
                  "WHEN e.code IS NOT NULL THEN e.percent_sindicato ELSE 0.015 END AS NUMERIC), 2), "
                  "0, ?, ? + ROW_NUMBER() OVER (ORDER BY s.socio_id) "
                  "FROM tbSocios s JOIN tbQuotas_Socios a ON a.socio_id = s.socio_id "
                  "LEFT JOIN tbEmpresas e ON e.code = s.empresa "
                  "WHERE NOT EXISTS (SELECT 1 FROM tbQuotas_Movimentos m WHERE m.socio_id = s.socio_id "
                  "AND m.ano = ? AND m.mes = ? AND m.tipo = ?)%2")
                  .arg(rateColumn, condition),
              condition.isEmpty()
                  ? QVariantList{today, kAno, kMes, ref, tipo, base, kAno, kMes, tipo}
                  : QVariantList{today, kAno, kMes, ref, tipo, base, kAno, kMes, tipo, QDate(kAno, kMes, 1)});
}

void generateSetBased(Connection& c)
{
    Transaction tx(c);
    c.execute(QStringLiteral(
                  "INSERT INTO tbQuotas_Socios (socio_id, ult_ano, ult_mes, ult_rend1, ult_rend2, ult_quota_sindicato, "
                  "ult_quota_seguro, total_quotas, total_pago) "
                  "SELECT s.socio_id, ?, ?, COALESCE(f.rend1, 100000), 0, 0, 0, 0, 0 FROM tbSocios s "
                  "LEFT JOIN tbfuvs f ON f.code = s.fuv "
                  "WHERE NOT EXISTS (SELECT 1 FROM tbQuotas_Socios a WHERE a.socio_id = s.socio_id)"),
              {kAno, kMes});
    postSetBased(c, 1, QStringLiteral("Sindicato"), QStringLiteral("ult_perc_sindicato"), QString());
    // The end date's month at or after the processing month: on or after its first day.
    postSetBased(c, 2, QStringLiteral("Seguro"), QStringLiteral("ult_perc_seguro"),
                 QStringLiteral(" AND s.seguro <> 0 AND (s.seguro_data_rescisao IS NULL OR s.seguro_data_rescisao >= ?)"));
    // One aggregate joined once: a correlated subquery per account would be
    // planned as a scan per account on tables that have no statistics yet.
    c.execute(QStringLiteral("UPDATE tbQuotas_Socios SET total_quotas = total_quotas + d.total, "
                             "ult_quota_sindicato = COALESCE(d.sindicato, ult_quota_sindicato), "
                             "ult_quota_seguro = COALESCE(d.seguro, ult_quota_seguro), ult_ano = ?, ult_mes = ? "
                             "FROM (SELECT socio_id, SUM(quota) AS total, MAX(CASE WHEN tipo = 1 THEN quota END) AS sindicato, "
                             "MAX(CASE WHEN tipo = 2 THEN quota END) AS seguro FROM tbQuotas_Movimentos "
                             "WHERE ano = ? AND mes = ? GROUP BY socio_id) d WHERE tbQuotas_Socios.socio_id = d.socio_id"),
              {kAno, kMes, kAno, kMes});
    c.execute(QStringLiteral("INSERT INTO tbcontadores (quotas) SELECT COALESCE(MAX(quota_no), 0) FROM tbQuotas_Movimentos"));
    tx.commit();
}

[[maybe_unused]] const bool registered = registerBenchmark(QStringLiteral("generation"), [](Context& c) {
    auto runDb = c.freshDatabase();
    Figure run = measured(QStringLiteral("generation"), [&] { ProcessarQuotas(runDb->connection(), kAno, kMes, 0); });
    const int posted = movementCount(runDb->connection());
    runDb.reset();

    auto boundDb = c.freshDatabase();
    run.lowerBound = timed([&] { generateSetBased(boundDb->connection()); });
    // The bound means something only if it wrote the same dues.
    if (movementCount(boundDb->connection()) != posted)
        throw QuotasError(QStringLiteral("the set-based generation wrote %1 dues, the run %2")
                              .arg(movementCount(boundDb->connection()))
                              .arg(posted));
    return QList<Figure>{run};
});

}  // namespace

}  // namespace quotas::bench
