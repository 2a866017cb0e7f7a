// The host's member register on N members with a year of union dues each:
// opening the window (reading the register and showing it) and refreshing it
// after an action, beside the bound of merely reading its rows.

#include "bench/benchmark.h"
#include "component/general.h"
#include "component/shared_objects.h"
#include "host/main_window.h"
#include "platform/recordset.h"
#include "platform/transaction.h"
#include "support/test_database.h"

#include <QApplication>
#include <ctime>

namespace quotas::bench {

namespace {

// Twelve dues per member, the first nine paid; every tenth account's totals
// left behind the movements, as a cancellation leaves them.
void addYear(Connection& c)
{
    Transaction tx(c);
    c.execute(QStringLiteral("WITH RECURSIVE m(mes) AS (SELECT 1 UNION ALL SELECT mes + 1 FROM m WHERE mes < 12) "
                             "INSERT INTO tbQuotas_Movimentos (socio_id, data, ano, mes, tipo, ref, quota_no, rend1, rend2, "
                             "quota, pago) SELECT s.socio_id, '2003-01-05', 2003, m.mes, 1, 'Sindicato', s.socio_id * 12 + m.mes, "
                             "1000, 0, 15, CASE WHEN m.mes < 10 THEN 15 ELSE 0 END FROM tbSocios s, m"));
    c.execute(QStringLiteral("INSERT INTO tbQuotas_Socios (socio_id, ult_ano, ult_mes, total_quotas, total_pago) "
                             "SELECT socio_id, 2003, 12, CASE WHEN socio_id % 10 = 0 THEN 195 ELSE 180 END, 135 FROM tbSocios"));
    tx.commit();
}

// Processor seconds of this process taken by f: on a machine shared with
// other work the clock on the wall says more about the neighbours.
template <typename F>
double cpuTimed(F&& f)
{
    timespec a{}, b{};
    clock_gettime(CLOCK_PROCESS_CPUTIME_ID, &a);
    f();
    clock_gettime(CLOCK_PROCESS_CPUTIME_ID, &b);
    return double(b.tv_sec - a.tv_sec) + double(b.tv_nsec - a.tv_nsec) / 1e9;
}

[[maybe_unused]] const bool registered = registerBenchmark(QStringLiteral("register"), [](Context& c) {
    auto db = c.freshDatabase();
    addYear(db->connection());
    db->login();
    const double read = timed([&] {
        Recordset rs;
        rs.open(QStringLiteral("SELECT tbSocios.socio_id, tbSocios.no_tap, tbSocios.nome, tbQuotas_Socios.total_quotas, "
                               "tbQuotas_Socios.total_pago FROM tbSocios LEFT OUTER JOIN tbQuotas_Socios "
                               "ON tbSocios.socio_id = tbQuotas_Socios.socio_id"),
                Data().SqlServer, Cursor::ForwardOnly, Lock::ReadOnly);
    });
    General general;
    std::unique_ptr<host::MainWindow> window;
    const double open = timed([&] {
        window = std::make_unique<host::MainWindow>(general);
        window->refreshMembers();
        window->show();
        QApplication::processEvents();
    });
    const auto refreshing = [&] {
        window->refreshMembers();
        QApplication::processEvents();
    };
    const double refresh = timed(refreshing);
    const double refreshCpu = cpuTimed(refreshing);
    return QList<Figure>{{QStringLiteral("register-open"), open, read},
                         {QStringLiteral("register-refresh"), refresh, read},
                         {QStringLiteral("register-refresh-cpu"), refreshCpu, 0}};
});

}  // namespace

}  // namespace quotas::bench
