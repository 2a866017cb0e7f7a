// The dues import: a file of N lines (about 3% with an unknown staff number)
// against a month of N charged movements, beside the set-based lower bound
// of the same work: the file read and loaded into a table, the postable
// lines joined to their movements and accounts, two UPDATE ... FROM and one
// INSERT ... SELECT for the rejects, in one transaction.

#include "bench/benchmark.h"
#include "component/shared_objects.h"
#include "import/csv_import_source.h"
#include "import/csv_reader.h"
#include "import/processar_importacao.h"
#include "platform/components.h"
#include "platform/connection.h"
#include "platform/errors.h"
#include "platform/recordset.h"
#include "platform/transaction.h"
#include "support/test_database.h"

#include <QDate>
#include <QFile>
#include <algorithm>

namespace quotas::bench {

namespace {

// The month the generation would have charged, set up set-based.
void chargeMarch2004(Connection& c)
{
    Transaction tx(c);
    c.execute(QStringLiteral("INSERT INTO tbQuotas_Movimentos (socio_id, data, ano, mes, tipo, ref, quota_no, rend1, rend2, "
                             "quota, pago) SELECT socio_id, ?, 2004, 3, 1, 'Sindicato', socio_id, 1000, 0, 15, 0 FROM tbSocios"),
              {QDate(2004, 3, 1)});
    c.execute(QStringLiteral("INSERT INTO tbQuotas_Socios (socio_id, ult_ano, ult_mes, ult_rend1, ult_rend2, "
                             "ult_quota_sindicato, ult_perc_sindicato, ult_quota_seguro, ult_perc_seguro, total_quotas, "
                             "total_pago) SELECT socio_id, 2004, 3, 1000, 0, 15, 0.015, 0, 0, 15, 0 FROM tbSocios"));
    tx.commit();
}

// One line per member; every 30th staff number is unknown.
QString writeList(Connection& c, const QString& path)
{
    Recordset members;
    members.open(QStringLiteral("SELECT no_tap FROM tbSocios ORDER BY socio_id"), c);
    QByteArray text = "no_tap;quota;rend1;nome\n";
    int n = 0;
    for (; !members.eof(); members.moveNext(), ++n) {
        const QByteArray key = members.value(0).toString().toUtf8();
        text += (n % 30 == 29 ? "X" + key : key) + ";14.50;1000.00;Jo\xC3\xA3o\n";
    }
    QFile file(path);
    file.open(QIODevice::WriteOnly | QIODevice::Truncate);
    file.write(text);
    return path;
}

void importSetBased(Connection& c, const QString& path)
{
    const CsvTable table = readCsvFile(path);
    Transaction tx(c);
    c.execute(QStringLiteral("CREATE TEMP TABLE bench_lines (no_tap VARCHAR(20), quota DECIMAL(12,2), rend1 DECIMAL(12,2), "
                             "nome VARCHAR(100))"));
    // The lines go in as a set: a few multi-row inserts, not one statement each.
    constexpr qsizetype kChunk = 500;
    for (qsizetype from = 0; from < table.rows.size(); from += kChunk) {
        const qsizetype n = std::min(kChunk, table.rows.size() - from);
        QStringList marks;
        QVariantList values;
        for (qsizetype i = from; i < from + n; ++i) {
            const QStringList& row = table.rows[i];
            marks << QStringLiteral("(?, ?, ?, ?)");
            values << row[0] << row[1].toDouble() << row[2].toDouble() << row[3];
        }
        c.execute(QStringLiteral("INSERT INTO bench_lines VALUES ") + marks.join(u','), values);
    }
    c.execute(QStringLiteral("CREATE INDEX bench_lines_no_tap ON bench_lines (no_tap)"));
    // The matched, postable lines with their movement and account, indexed,
    // so that both updates are joins on a key.
    c.execute(QStringLiteral(
        "CREATE TEMP TABLE bench_posts AS SELECT m.quota_id, m.socio_id, l.quota AS q, l.rend1, m.quota AS oldq "
        "FROM bench_lines l JOIN tbSocios s ON s.no_tap = l.no_tap JOIN tbQuotas_Movimentos m ON m.socio_id = s.socio_id "
        "AND m.ano = 2004 AND m.mes = 3 AND m.tipo = 1 JOIN tbQuotas_Socios a ON a.socio_id = m.socio_id "
        "WHERE (m.pago = 0 AND l.quota <> 0) OR l.quota > m.quota"));
    c.execute(QStringLiteral("CREATE UNIQUE INDEX bench_posts_socio ON bench_posts (socio_id)"));
    c.execute(QStringLiteral(
        "UPDATE tbQuotas_Socios SET ult_rend1 = x.rend1, ult_rend2 = 0, ult_quota_sindicato = x.q, "
        "ult_perc_sindicato = x.q / x.rend1, ult_ano = 2004, ult_mes = 3, total_quotas = total_quotas - x.oldq + x.q, "
        "total_pago = total_pago + x.q FROM bench_posts x WHERE tbQuotas_Socios.socio_id = x.socio_id"));
    c.execute(QStringLiteral("UPDATE tbQuotas_Movimentos SET rend1 = x.rend1, rend2 = 0, pago = x.q, quota = x.q "
                             "FROM bench_posts x WHERE tbQuotas_Movimentos.quota_id = x.quota_id"));
    c.execute(QStringLiteral("DELETE FROM extras"));
    c.execute(QStringLiteral("INSERT INTO extras (Field0, Field1, Field2, Field3) SELECT no_tap, CAST(quota AS VARCHAR(20)), "
                             "CAST(rend1 AS VARCHAR(20)), nome FROM bench_lines l WHERE NOT EXISTS (SELECT 1 FROM tbSocios "
                             "s WHERE s.no_tap = l.no_tap)"));
    c.execute(QStringLiteral("DROP TABLE bench_posts"));
    c.execute(QStringLiteral("DROP TABLE bench_lines"));
    tx.commit();
}

[[maybe_unused]] const bool registered = registerBenchmark(QStringLiteral("import"), [](Context& c) {
    Figure run;
    {
        auto db = c.freshDatabase();
        chargeMarch2004(db->connection());
        const QString path = writeList(db->connection(), db->scratch(QStringLiteral("lista.csv")));
        db->login();
        registerComponent(QStringLiteral("Dorvanta.General"),
                          [path] { return std::make_unique<CsvImportSource>(CsvImportSource::fixedFile(path)); });
        const RejectsListing previous = setRejectsListing([] {});
        ImportSummary summary;
        run = measured(QStringLiteral("import"), [&] { summary = ProcessarImportacao(3, 2004, 1); });
        setRejectsListing(previous);
        if (summary.posted + summary.rejected != c.members || summary.failed != 0)
            throw QuotasError(QStringLiteral("the import posted %1 and rejected %2 of %3 lines")
                                  .arg(summary.posted)
                                  .arg(summary.rejected)
                                  .arg(c.members));
    }
    {
        auto db = c.freshDatabase();
        chargeMarch2004(db->connection());
        const QString path = writeList(db->connection(), db->scratch(QStringLiteral("lista.csv")));
        run.lowerBound = timed([&] { importSetBased(db->connection(), path); });
    }
    return QList<Figure>{run};
});

}  // namespace

}  // namespace quotas::bench
