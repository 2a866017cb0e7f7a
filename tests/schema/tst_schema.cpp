// The schema on both engines: the keys that refuse a second account or due,
// the data environment's commands, the demo members, and a month on a
// database of the host's original shape: no unique index, a counter table of
// one column, a text insurance date, and values no column should hold. Every
// run there goes through the command line.

#include "component/shared_objects.h"
#include "platform/errors.h"
#include "platform/recordset.h"
#include "schema/demo_data.h"
#include "schema/schema.h"
#include "support/database_fixture.h"

#include <QProcess>
#include <QTest>
#include <limits>

using namespace quotas;
using namespace quotas::test;

class SchemaTest : public QObject, DatabaseFixture {
    Q_OBJECT

    bool lite() { return c().engine() == Engine::SQLite; }

    // What the host's installations hold: tbSocios is theirs, with the
    // insurance end kept as text; the dues tables as init-db makes them on an
    // empty database, which is the original shape.
    void originalShape()
    {
        db = std::make_unique<TestDatabase>(false);
        c().execute(QStringLiteral("CREATE TABLE tbSocios (socio_id BIGINT PRIMARY KEY, no_tap VARCHAR(20), nome VARCHAR(100), "
                                   "nome_guerra VARCHAR(60), morada1 VARCHAR(100), code_postal1 VARCHAR(20), localidade1 "
                                   "VARCHAR(60), fuv VARCHAR(10), empresa VARCHAR(10), seguro INTEGER, seguro_data_rescisao "
                                   "VARCHAR(20))"));
        createSchema(c());
        registry = db->useAsSettings();
    }
    void member(int socio, const QVariant& nome, int seguro = 0, const QVariant& end = QVariant(QMetaType::fromType<QString>()))
    {
        c().execute(QStringLiteral("INSERT INTO tbSocios (socio_id, no_tap, nome, fuv, empresa, seguro, seguro_data_rescisao) "
                                   "VALUES (?, ?, ?, 'A1', 'TAP', ?, ?)"),
                    {socio, QString::number(1000 + socio), nome, seguro, end});
    }
    void account(int socio, const QVariant& rend1, const QVariant& rate = kNullNumber)
    {
        c().execute(QStringLiteral("INSERT INTO tbQuotas_Socios (socio_id, ult_rend1, ult_rend2, ult_perc_sindicato, "
                                   "total_quotas, total_pago) VALUES (?, ?, 0, ?, 0, 0)"),
                    {socio, rend1, rate});
    }
    void movement(const QString& table, const QVariant& socio, int mes, const QVariant& quota, const QVariant& pago)
    {
        c().execute(QStringLiteral("INSERT INTO %1 (socio_id, ano, mes, tipo, ref, rend1, rend2, quota, pago) VALUES "
                                   "(?, 2003, ?, 1, 'Sindicato', 0, 0, ?, ?)")
                        .arg(table),
                    {socio, mes, quota, pago});
    }

private slots:
    void aMonthOnTheOriginalShape()
    {
        originalShape();
        const QVariant null = kNullNumber;
        c().execute(QStringLiteral("INSERT INTO tbEmpresas (code, nome, percent_sindicato) VALUES ('TAP', 'TAP', 0.015)"));
        c().execute(QStringLiteral("INSERT INTO tbfuvs (code, descrit, rend1) VALUES ('A1', 'A1', 800)"));
        member(1, "José Silva", 1, "31/03/2003");
        member(2, "João Sousa");  // no account yet
        member(3, "Fátima Reis", 1, "20010331");
        member(4, "Fernando Luz");
        member(5, "Lúcia Alves");
        member(6, "Luís Costa");
        member(7, "álvaro Mendes");
        member(8, "Álvaro Mendes");
        member(9, QVariant(QMetaType::fromType<QString>()));
        account(1, 1000);
        // A number kept as text in the comma notation: PostgreSQL's NUMERIC
        // cannot hold it, so there the same amount is a number.
        account(3, lite() ? QVariant(QStringLiteral("1000,50")) : QVariant(1000.50));
        account(4, 1000, std::numeric_limits<double>::infinity());
        for (int socio = 5; socio <= 9; ++socio)
            account(socio, 1000);
        // Lúcia's January due is recorded with a payment but no amount.
        movement(QStringLiteral("tbQuotas_Movimentos"), 5, 1, null, 5.0);
        movement(QStringLiteral("tbQuotas_Movimentos"), 5, 0, 20.0, 0.0);
        movement(QStringLiteral("tbQuotas_Movimentos"), 4, 0, 10.0, 0.0);
        movement(QStringLiteral("tbQuotas_Movimentos"), QVariant(QMetaType::fromType<int>()), 0, 3.0, 0.0);

        // Two runs at once: the counter's first row and João's account are
        // made once, each due once.
        const QStringList gerar = {"gerar", "--ano", "2003", "--mes", "1"};
        QProcess* first = startQuotas(this, registry, gerar);
        QProcess* second = startQuotas(this, registry, gerar);
        const CliRun a = finishQuotas(first), b = finishQuotas(second);
        QVERIFY2(QList<int>({0, 3}).contains(a.status) && QList<int>({0, 3}).contains(b.status), qPrintable(a.out + a.err + b.out + b.err));
        QVERIFY2(a.out.contains("1003 (seguro_data_rescisao: data ilegível (20010331))")
                     && a.out.contains("1004 (ult_perc_sindicato: valor não finito"),
                 qPrintable(a.out));
        QCOMPARE(rows("SELECT socio_id, tipo, quota_no, quota, pago FROM tbQuotas_Movimentos WHERE mes = 1 AND quota_no IS "
                      "NOT NULL ORDER BY quota_no")
                     + rows("SELECT quotas FROM tbcontadores")
                     + rows("SELECT socio_id, ult_rend1 FROM tbQuotas_Socios WHERE socio_id = 2"),
                 QStringList({"1|1|1|15|0", "1|2|2|15|0", "2|1|3|12|0", "3|1|4|15.01|0", "6|1|5|15|0", "7|1|6|15|0",
                              "8|1|7|15|0", "9|1|8|15|0", "8", "2|800"}));

        // Posted; left alone beside a Null amount; too large, infinite, unknown: listed.
        const QString list = writeFile("lista.csv", "no_tap;quota\n1001;15,00\n1005;1,00\n1006;1e308\n1007;2e23\n1008;6299999999999999999999.51\n9999;5\n");
        const CliRun imported = quotas({"importar", "--ano", "2003", "--mes", "1", "--tipo", "1", list});
        QVERIFY2(imported.status != 1, qPrintable(imported.err));
        QCOMPARE(rows("SELECT socio_id, quota, pago FROM tbQuotas_Movimentos WHERE mes = 1 AND socio_id IN (1, 5) AND tipo = 1 "
                      "ORDER BY socio_id")
                     + rows("SELECT Field0, Field1 FROM extras ORDER BY extra_id"),
                 QStringList({"1|15|15", "5|-|5", "1006|1e308", "1007|2e23", "1008|6299999999999999999999.51", "9999|5"}));

        // The maintenance stops at a value that is not a number, naming it;
        // once it is mended, the movement without a member is left out and
        // told, every time alike.
        movement(QStringLiteral("tbQuotas_Movimentos_Inactivos"), 4, 1, null, 0.0);
        c().execute(QStringLiteral("INSERT INTO tbQuotas_Movimentos_Inactivos (socio_id, ano, mes, tipo, rend1, rend2, quota, "
                                   "pago) VALUES (4, 2003, 2, 1, 0, 0, %1, 0)")
                        .arg(lite() ? "'abc'" : "'NaN'"));
        const CliRun stopped = quotas({"manutencao"});
        QCOMPARE(stopped.status, 1);
        QVERIFY2(stopped.err.contains(QStringLiteral("na tabela tbQuotas_Movimentos_Inactivos, o movimento com quota_id %1 tem "
                                                     "na coluna quota um valor %2")
                                          .arg(c().scalar("SELECT MAX(quota_id) FROM tbQuotas_Movimentos_Inactivos").toString(),
                                               lite() ? "ilegível (abc)" : "não finito")),
                 qPrintable(stopped.err));
        c().execute(QStringLiteral("UPDATE tbQuotas_Movimentos_Inactivos SET quota = 2 WHERE mes = 2"));
        const QString totals = QStringLiteral("SELECT socio_id, total_quotas, total_pago FROM tbQuotas_Socios ORDER BY socio_id");
        QStringList after;
        for (int run = 0; run < 2; ++run) {
            const CliRun done = quotas({"manutencao"});
            QCOMPARE(done.status, 3);
            QVERIFY2(done.out.contains("1 movimentos sem associado"), qPrintable(done.out));
            after << (rows(totals) + rows("SELECT COUNT(*) FROM tbQuotas_Socios_Inactivos")).join(u' ');
        }
        QCOMPARE(after, QStringList(2, "1|30|15 2|12|0 3|15.01|0 4|10|0 5|20|5 6|15|0 7|15|0 8|15|0 9|15|0 1"));

        // The debts in Portuguese order, a member without a name first.
        db->login();
        QStringList names;
        for (Recordset& debts = Data().Dividas.execute(); !debts.eof(); debts.moveNext())
            names << debts.value(QStringLiteral("nome")).toString();
        QCOMPARE(names, QStringList({"", "álvaro Mendes", "Álvaro Mendes", "Fátima Reis", "Fernando Luz", "João Sousa",
                                     "José Silva", "Lúcia Alves", "Luís Costa"}));
        QCOMPARE(quotas({"listagem", "--pdf", db->scratch("listagem.pdf")}).status, 0);
        QCOMPARE(quotas({"cartas", "--pdf", db->scratch("cartas.pdf")}).status, 0);
    }

    // init-db on a database it did not make: the indexes the rows allow,
    // the repeated rows listed, no row changed.
    void initDbListsWhatBlocksAUniqueIndex()
    {
        originalShape();
        member(1, "Ana");
        account(1, 1000);
        account(1, 1000);
        movement(QStringLiteral("tbQuotas_Movimentos"), 1, 1, 15.0, 0.0);
        movement(QStringLiteral("tbQuotas_Movimentos"), 1, 1, 15.0, 0.0);
        const QString everything = QStringLiteral("SELECT (SELECT COUNT(*) FROM tbQuotas_Socios), COUNT(*) FROM tbQuotas_Movimentos");
        const QStringList before = rows(everything);
        const CliRun run = quotas({"init-db"});
        QCOMPARE(run.status, 0);
        const QStringList keys = rows("SELECT squota_id FROM tbQuotas_Socios ORDER BY 1") + rows("SELECT quota_id FROM "
                                                                                                 "tbQuotas_Movimentos ORDER BY 1");
        QVERIFY2(run.out.contains(QStringLiteral("O índice único ux_tbquotas_socios_socio (uma conta por associado) não foi "
                                                 "criado: em tbQuotas_Socios há registos repetidos.\n  associado 1 (Nº Empresa "
                                                 "1001): registos %1, %2\n")
                                      .arg(keys[0], keys[1]))
                     && run.out.contains(QStringLiteral("associado 1 (Nº Empresa 1001), 2003/01, tipo 1: registos %1, %2\n")
                                             .arg(keys[2], keys[3]))
                     && run.out.contains("Os processamentos funcionam sem estes índices únicos"),
                 qPrintable(run.out));
        QCOMPARE(rows(everything), before);
        // The inactive accounts had no repeats: their unique index is there.
        c().execute(QStringLiteral("INSERT INTO tbQuotas_Socios_Inactivos (socio_id) VALUES (1)"));
        QVERIFY_THROWS_EXCEPTION(
            QuotasError, c().execute(QStringLiteral("INSERT INTO tbQuotas_Socios_Inactivos (socio_id) VALUES (1)")));
    }

    // One account per member, one due of a type per member and month.
    void keysRefuseASecondAccountOrDue()
    {
        openDatabase();
        c().execute(QStringLiteral("INSERT INTO tbQuotas_Socios (socio_id) VALUES (1)"));
        QVERIFY_THROWS_EXCEPTION(DbError, c().execute(QStringLiteral("INSERT INTO tbQuotas_Socios (socio_id) VALUES (1)")));
        const QString due = QStringLiteral("INSERT INTO tbQuotas_Movimentos (socio_id, ano, mes, tipo, quota) VALUES (1, 2003, 1, 1, 1)");
        c().execute(due);
        QVERIFY_THROWS_EXCEPTION(DbError, c().execute(due));
    }

    void theDataEnvironmentsCommandsRun()
    {
        openDatabase();
        addDemoMembers(c(), 5);
        Recordset& months = Data().Meses.execute();
        QCOMPARE(months.recordCount(), 12);
        QCOMPARE(months.value(QStringLiteral("completo")).toString(), QStringLiteral("01 - Janeiro"));
        QCOMPARE(Data().Command2.execute().recordCount(), 2);
        QCOMPARE(Data().Extras.execute().recordCount(), 0);
        QVERIFY(Data().Dividas.execute().eof());
        QCOMPARE(&Data().command(QStringLiteral("dividas")), &Data().Dividas);
    }

    void demoMembersAreTheSameEverywhere()
    {
        const QString select = QStringLiteral(
            "SELECT COUNT(*), SUM(seguro), COUNT(seguro_data_rescisao), SUM(CASE WHEN fuv = 'Z9' THEN 1 ELSE 0 END), "
            "SUM(CASE WHEN empresa = 'XPT' THEN 1 ELSE 0 END), MIN(nome), MAX(morada1) FROM tbSocios");
        QStringList runs;
        for (int attempt = 0; attempt < 2; ++attempt) {
            TestDatabase fresh;
            QCOMPARE(addDemoMembers(fresh.connection(), 300), 300);
            Recordset rs;
            rs.open(select, fresh.connection());
            QStringList row;
            for (int i = 0; i < rs.fieldCount(); ++i)
                row << rs.value(i).toString();
            // Some insured, some with an end date, some unknown categories and employers.
            QVERIFY(row[1].toInt() > 60 && row[2].toInt() > 5 && row[3].toInt() > 0 && row[4].toInt() > 0);
            runs << row.join(u'|');
        }
        QCOMPARE(runs[0], runs[1]);
    }
};

QTEST_MAIN(SchemaTest)
#include "tst_schema.moc"
