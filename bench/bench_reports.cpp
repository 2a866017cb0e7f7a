// The debt listing and the debt letters written to PDF for N accounts, about
// half of them in debt, beside the bound of merely reading their rows.

#include "bench/benchmark.h"
#include "component/shared_objects.h"
#include "reports/entry.h"
#include "support/test_database.h"

#include <QFile>

namespace quotas::bench {

namespace {

// One account per demo member, built in one statement: every even member has
// paid everything, every odd one owes between 2.50 and 125.00.
void addAccounts(Connection& c)
{
    c.execute(QStringLiteral("INSERT INTO tbQuotas_Socios (socio_id, total_quotas, total_pago) "
                             "SELECT socio_id, 150 + (socio_id % 50) * 2.5, "
                             "CASE WHEN socio_id % 2 = 0 THEN 150 + (socio_id % 50) * 2.5 ELSE 150 - 2.5 END "
                             "FROM tbSocios"));
}

[[maybe_unused]] const bool registered = registerBenchmark(QStringLiteral("reports"), [](Context& c) {
    auto db = c.freshDatabase();
    addAccounts(db->connection());
    db->login();
    const QString pdf = db->scratch(QStringLiteral("report.pdf"));

    // The bound: the rows of Dividas read once, with nothing laid out.
    const double read = timed([&] {
        Data().Dividas.execute();
        Data().Dividas.recordset().close();
    });
    const double listing = timed([&] { writeDebtListingPdf(pdf); });
    const double letters = timed([&] { writeDebtLettersPdf(pdf); });
    QFile::remove(pdf);
    return QList<Figure>{{QStringLiteral("listing-pdf"), listing, read}, {QStringLiteral("letters-pdf"), letters, read}};
});

}  // namespace

}  // namespace quotas::bench
