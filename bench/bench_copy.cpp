// Copying an SQLite installation of N members with 24 months of dues each
// to an empty database on the PostgreSQL server, verification included.
// Runs once, under the PostgreSQL engine, since the target is always a server.

#include "bench/benchmark.h"
#include "schema/copy_installation.h"
#include "schema/demo_data.h"
#include "support/test_database.h"

namespace quotas::bench {

namespace {

void twoYearsOfDues(Connection& c)
{
    c.execute(QStringLiteral(
        "WITH RECURSIVE m(n) AS (SELECT 0 UNION ALL SELECT n + 1 FROM m WHERE n < 23) "
        "INSERT INTO tbQuotas_Movimentos (socio_id, data, ano, mes, tipo, ref, quota_no, rend1, rend2, quota, pago, doc_no) "
        "SELECT s.socio_id, '2003-01-01', 2003 + m.n / 12, m.n % 12 + 1, 1, 'Sindicato', s.socio_id * 24 + m.n, "
        "900 + (s.socio_id % 50) * 10, 0, 13.5 + (s.socio_id % 50) * 0.15, "
        "CASE WHEN m.n < 20 THEN 13.5 + (s.socio_id % 50) * 0.15 ELSE 0 END, "
        "CASE WHEN m.n % 5 = 0 THEN 'R' || s.socio_id END FROM tbSocios s, m"));
    c.execute(QStringLiteral("INSERT INTO tbQuotas_Socios (socio_id, ult_ano, ult_mes, ult_rend1, ult_rend2, total_quotas, "
                             "total_pago) SELECT socio_id, 2004, 12, 1000, 0, SUM(quota), SUM(pago) FROM "
                             "tbQuotas_Movimentos GROUP BY socio_id"));
}

[[maybe_unused]] const bool registered = registerBenchmark(QStringLiteral("copy"), [](Context& c) {
    if (c.engine != Engine::PostgreSQL)
        return QList<Figure>{};
    test::TestDatabase from(Engine::SQLite, true);
    addDemoMembers(from.connection(), c.members);
    twoYearsOfDues(from.connection());
    test::TestDatabase to(Engine::PostgreSQL, false);
    const double seconds = timed([&] { copyInstallation(from.connection(), to.connection()); });
    return QList<Figure>{{QStringLiteral("copy-to-server"), seconds, 0}};
});

}  // namespace

}  // namespace quotas::bench
