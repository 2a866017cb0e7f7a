// "quotas copiar": the installation under test (demo members, two months of
// dues, every table filled, Null values) copied to a new database on the
// test server and compared table by table; a target holding rows refused;
// "gerar" on the copy; a failed copy leaving the target as it was; and
// "init-db --demo" beside members numbered by the host.

#include "generation/processar_quotas.h"
#include "schema/demo_data.h"
#include "schema/schema.h"
#include "support/cli_process.h"
#include "support/recording_progress.h"
#include "support/rows_text.h"
#include "support/test_database.h"

#include <QRegularExpression>
#include <QTest>

using namespace quotas;
using namespace quotas::test;

class CopyTest : public QObject {
    Q_OBJECT

    std::unique_ptr<TestDatabase> source;
    QString registry;

    // A table's rows in key order, dates as text on both engines.
    static QStringList table(Connection& c, const QString& name)
    {
        QStringList columns = tableColumns(name).all;
        for (QString& column : columns)
            if (column == QLatin1String("data") || column == QLatin1String("seguro_data_rescisao"))
                column = QStringLiteral("CAST(%1 AS VARCHAR(10))").arg(column);
        return rowsText(c, QStringLiteral("SELECT %1 FROM %2 ORDER BY 1").arg(columns.join(QStringLiteral(", ")), name));
    }
    CliRun copyTo(const TestDatabase& target)
    {
        return runQuotas(registry, {"copiar", "--data-source", target.dataSource(), "--catalog", target.catalog(), "--user",
                                    target.user(), "--password", target.password()});
    }

private slots:
    void initTestCase()
    {
        source = std::make_unique<TestDatabase>();
        registry = source->useAsSettings();
        RecordingProgress::install();
        Connection& c = source->connection();
        addDemoMembers(c, 40);
        // A member the host numbered far ahead, and one with hardly anything known.
        c.execute(QStringLiteral("INSERT INTO tbSocios (socio_id, no_tap, nome, seguro) VALUES (5000, '9500', 'Numerado', 0)"));
        c.execute(QStringLiteral("INSERT INTO tbSocios (socio_id) VALUES (5001)"));
        ProcessarQuotas(c, 2004, 1, 0, QDate(2004, 1, 2));
        ProcessarQuotas(c, 2004, 2, 0, QDate(2004, 2, 2));
        c.execute(QStringLiteral("UPDATE tbQuotas_Movimentos SET pago = NULL, doc_no = 'R 1' WHERE quota_id = 3"));
        c.execute(QStringLiteral("UPDATE tbQuotas_Movimentos SET pago = quota, doc_no = '' WHERE quota_id = 5"));
        for (const char* t : {"tbQuotas_Movimentos_Inactivos", "tbQuotas_Movimentos_Historico"})
            c.execute(QStringLiteral("INSERT INTO %1 (socio_id, data, ano, mes, tipo, ref, quota_no, rend1, rend2, quota, pago) "
                                     "SELECT socio_id, data, 2001, mes, tipo, ref, quota_no, rend1, NULL, quota, pago FROM "
                                     "tbQuotas_Movimentos WHERE socio_id % 3 = 0")
                          .arg(QLatin1String(t)));
        c.execute(QStringLiteral("INSERT INTO tbQuotas_Socios_Inactivos (socio_id, total_quotas, total_pago, ult_rend1) "
                                 "VALUES (900, 12.34, NULL, NULL)"));
        c.execute(QStringLiteral("INSERT INTO extras (Field0, Field1, Field20) VALUES ('1003', NULL, 'ç ã É')"));
    }

    void copiedTableByTableThenRefusedThenCharged()
    {
        TestDatabase target(Engine::PostgreSQL, false);
        CliRun copy = copyTo(target);
        QVERIFY2(copy.status == 0, qPrintable(copy.out + copy.err));
        const QString out = copy.out;
        for (const QString& name : schemaTables()) {
            QVERIFY2(out.contains(QRegularExpression(QStringLiteral("\n  %1: +registos (\\d+) / \\1.*  certo\n").arg(name))),
                     qPrintable(name + ": " + out));
            QCOMPARE(table(target.connection(), name), table(source->connection(), name));
        }
        // The runs' indexes, as init-db makes them.
        QVERIFY2(out.contains("\nÍndices presentes: ux_tbquotas_socios_socio"), qPrintable(out));
        QCOMPARE(rowsText(target.connection(), "SELECT COUNT(*) FROM pg_indexes WHERE indexname = 'ux_tbquotas_movimentos_due'"),
                 QStringList{"1"});
        QVERIFY2(out.endsWith(QStringLiteral("quotas config --data-source %1 --catalog %2 --user %3 --password %4\n")
                                  .arg(target.dataSource(), target.catalog(), target.user(), target.password())),
                 qPrintable(out));

        const QStringList copied = table(target.connection(), QStringLiteral("tbQuotas_Movimentos"));
        copy = copyTo(target);
        QCOMPARE(copy.status, 2);
        QVERIFY2(copy.err.contains("a base de dados de destino já tem dados: tbSocios (42 registos)"), qPrintable(copy.err));
        QCOMPARE(table(target.connection(), QStringLiteral("tbQuotas_Movimentos")), copied);

        // On the copy, rows inserted without a key take keys past the copied ones.
        Connection& t = target.connection();
        t.execute(QStringLiteral("INSERT INTO tbSocios (no_tap, nome, fuv, empresa, seguro) VALUES ('9600', 'Novo', 'A1', "
                                 "'TAP', 1)"));
        const CliRun charged = runQuotas(target.useAsSettings(), {"gerar", "--ano", "2004", "--mes", "3"});
        QVERIFY2(charged.status == 0, qPrintable(charged.err));
        QCOMPARE(rowsText(t, "SELECT socio_id FROM tbSocios WHERE no_tap = '9600'"), QStringList{"5002"});
        QCOMPARE(rowsText(t, "SELECT COUNT(*), COUNT(DISTINCT quota_no) FROM tbQuotas_Movimentos WHERE mes = 3"),
                 rowsText(source->connection(), "SELECT COUNT(*) + 2, COUNT(DISTINCT quota_no) + 2 FROM tbQuotas_Movimentos "
                                                "WHERE mes = 2"));
    }

    // The target refuses a row half-way (a text where the source's SQLite
    // kept it in an amount column, or a table of the same name whose
    // columns differ): nothing of the copy stays.
    void aFailedCopyLeavesTheTargetAsItWas()
    {
        TestDatabase target(Engine::PostgreSQL, false);
        target.connection().execute(QStringLiteral("CREATE TABLE extras (extra_id INTEGER PRIMARY KEY)"));
        const CliRun copy = copyTo(target);
        QCOMPARE(copy.status, 1);
        QVERIFY2(copy.err.contains("A base de dados de destino ficou como estava."), qPrintable(copy.err));
        QStringList left;
        for (const QString& name : schemaTables())
            if (target.connection().hasTable(name))
                left << name;
        QCOMPARE(left, QStringList{"extras"});
    }

    // Members numbered by the host and then demo members on the same database.
    void initDbDemoAfterNumberedMembers()
    {
        TestDatabase target(Engine::PostgreSQL, true);
        target.connection().execute(QStringLiteral("INSERT INTO tbSocios (socio_id, nome) VALUES (1, 'A'), (2, 'B')"));
        const CliRun demo = runQuotas(target.useAsSettings(), {"init-db", "--demo", "3"});
        QVERIFY2(demo.status == 0, qPrintable(demo.err));
        QCOMPARE(rowsText(target.connection(), "SELECT MAX(socio_id), COUNT(*) FROM tbSocios"), QStringList{"5|5"});
    }
};

QTEST_MAIN(CopyTest)
#include "tst_copy_installation.moc"
