// The member statement of a member with 120 movements and the month's
// summary of N members, each written to PDF, beside the bound of merely
// reading their rows.

#include "bench/benchmark.h"
#include "component/shared_objects.h"
#include "platform/recordset.h"
#include "platform/transaction.h"
#include "reports/entry.h"
#include "support/test_database.h"

#include <QDate>
#include <QFile>

namespace quotas::bench {

namespace {

constexpr int kAno = 2003;
constexpr int kMes = 1;

// One union due per member for the month, a third deducted by the list, a
// third paid at the desk, a third open; the accounts follow.
void chargeMonth(Connection& c)
{
    Transaction tx(c);
    c.execute(QStringLiteral("INSERT INTO tbQuotas_Socios (socio_id, ult_rend1, ult_rend2, total_quotas, total_pago) "
                             "SELECT socio_id, 1000, 0, 0, 0 FROM tbSocios"));
    c.execute(QStringLiteral("INSERT INTO tbQuotas_Movimentos (data, ano, mes, socio_id, ref, rend1, rend2, quota, pago, "
                             "tipo, quota_no, doc_no) SELECT ?, ?, ?, socio_id, 'Sindicato', 1000, 0, 10 + (socio_id % 50) * 0.25, "
                             "CASE WHEN socio_id % 3 = 2 THEN 0 ELSE 10 + (socio_id % 50) * 0.25 END, 1, socio_id, "
                             "CASE WHEN socio_id % 3 = 1 THEN 'R-' || socio_id END FROM tbSocios"),
              {QDate(kAno, kMes, 1), kAno, kMes});
    tx.commit();
}

// Ten years of both dues for member socio.
void addHistory(Connection& c, const QVariant& socio)
{
    Transaction tx(c);
    int number = 1000000;
    for (int year = 1994; year < 2004; ++year) {
        for (int month = 1; month <= 12; ++month) {
            const int tipo = month % 2 + 1;
            c.execute(QStringLiteral("INSERT INTO tbQuotas_Movimentos (data, ano, mes, socio_id, ref, rend1, rend2, quota, "
                                     "pago, tipo, quota_no) VALUES (?, ?, ?, ?, ?, 1000, 0, 15, ?, ?, ?)"),
                      {QDate(year, month, 1), year, month, socio, tipo == 1 ? QStringLiteral("Sindicato") : QStringLiteral("Seguro"),
                       month % 3 ? 15.0 : 0.0, tipo, ++number});
        }
    }
    tx.commit();
}

[[maybe_unused]] const bool statement = registerBenchmark(QStringLiteral("statement"), [](Context& c) {
    auto db = c.freshDatabase();
    const QVariant socio = db->connection().scalar(QStringLiteral("SELECT MIN(socio_id) FROM tbSocios"));
    addHistory(db->connection(), socio);
    db->login();
    const QString pdf = db->scratch(QStringLiteral("extrato.pdf"));
    const double read = timed([&] {
        Recordset rows;
        rows.open(QStringLiteral("SELECT * FROM tbQuotas_Movimentos WHERE socio_id = ?"), db->connection(),
                  Cursor::ForwardOnly, Lock::ReadOnly, {socio});
    });
    StatementRequest request;
    request.socioId = socio;
    const double run = timed([&] { writeMemberStatementPdf(request, pdf); });
    QFile::remove(pdf);
    return QList<Figure>{{QStringLiteral("statement-pdf"), run, read}};
});

[[maybe_unused]] const bool summary = registerBenchmark(QStringLiteral("summary"), [](Context& c) {
    auto db = c.freshDatabase();
    chargeMonth(db->connection());
    db->login();
    const QString pdf = db->scratch(QStringLiteral("resumo.pdf"));
    // The bound: the month's sums taken by the database in one statement.
    const double read = timed([&] {
        Recordset sums;
        sums.open(QStringLiteral("SELECT tipo, COUNT(*), SUM(quota), SUM(pago) FROM tbQuotas_Movimentos WHERE ano = ? AND "
                                 "mes = ? GROUP BY tipo"),
                  db->connection(), Cursor::ForwardOnly, Lock::ReadOnly, {kAno, kMes});
    });
    const double run = timed([&] { writeMonthSummaryPdf(kAno, kMes, pdf); });
    QFile::remove(pdf);
    return QList<Figure>{{QStringLiteral("summary-pdf"), run, read}};
});

}  // namespace

}  // namespace quotas::bench
