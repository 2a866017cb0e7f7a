// The schema on both engines: every table and column the runs use, created
// once and left alone afterwards; keys, money and the demo members.

#include "component/shared_objects.h"
#include "platform/errors.h"
#include "platform/recordset.h"
#include "schema/demo_data.h"
#include "schema/schema.h"
#include "support/test_database.h"

#include <QTest>

using namespace quotas;
using quotas::test::TestDatabase;

class SchemaTest : public QObject {
    Q_OBJECT
private slots:
    void everyTableHasTheColumnsTheRunsUse_data()
    {
        QTest::addColumn<QString>("table");
        QTest::addColumn<QStringList>("columns");
        const QStringList account = {"squota_id", "socio_id", "ult_ano", "ult_mes", "ult_rend1", "ult_rend2",
                                     "ult_quota_sindicato", "ult_perc_sindicato", "ult_quota_seguro", "ult_perc_seguro",
                                     "total_quotas", "total_pago"};
        const QStringList movement = {"quota_id", "socio_id", "data", "ano", "mes", "tipo", "ref",
                                      "quota_no", "rend1", "rend2", "quota", "pago", "doc_no"};
        QTest::newRow("tbSocios") << "tbSocios"
                                  << QStringList{"socio_id", "no_tap", "nome", "nome_guerra", "morada1", "code_postal1",
                                                 "localidade1", "fuv", "empresa", "seguro", "seguro_data_rescisao"};
        QTest::newRow("tbQuotas_Socios") << "tbQuotas_Socios" << account;
        QTest::newRow("tbQuotas_Socios_Inactivos") << "tbQuotas_Socios_Inactivos" << account;
        QTest::newRow("tbQuotas_Movimentos") << "tbQuotas_Movimentos" << movement;
        QTest::newRow("tbQuotas_Movimentos_Inactivos") << "tbQuotas_Movimentos_Inactivos" << movement;
        QTest::newRow("tbQuotas_Movimentos_Historico") << "tbQuotas_Movimentos_Historico" << movement;
        QStringList fields = {"extra_id"};
        for (int i = 0; i <= 20; ++i)
            fields << QStringLiteral("Field%1").arg(i);
        QTest::newRow("extras") << "extras" << fields;
    }
    void everyTableHasTheColumnsTheRunsUse()
    {
        QFETCH(QString, table);
        QFETCH(QStringList, columns);
        TestDatabase db;
        Recordset rs;
        rs.open(QStringLiteral("SELECT * FROM %1 WHERE 1 = 0").arg(table), db.connection());
        for (const QString& column : columns)
            QVERIFY2(rs.hasField(column), qPrintable(column));
        if (table == QStringLiteral("extras")) {
            QCOMPARE(rs.fieldCount(), columns.size());
            QCOMPARE(rs.fieldName(0), QStringLiteral("extra_id"));
        }
    }

    void creatingTwiceChangesNothing()
    {
        TestDatabase db(false);
        QCOMPARE(createSchema(db.connection()), schemaTables());
        db.connection().execute(QStringLiteral("INSERT INTO tbSocios (socio_id, nome) VALUES (77, 'Ana')"));
        QVERIFY(createSchema(db.connection()).isEmpty());
        QCOMPARE(db.connection().scalar(QStringLiteral("SELECT nome FROM tbSocios WHERE socio_id = 77")).toString(),
                 QStringLiteral("Ana"));
        QCOMPARE(db.connection().scalar(QStringLiteral("SELECT COUNT(*) FROM tbmeses")).toInt(), 12);
    }

    void keysAndMoney()
    {
        TestDatabase db;
        Connection& c = db.connection();
        c.execute(QStringLiteral("INSERT INTO tbQuotas_Socios (socio_id) VALUES (1)"));
        c.execute(QStringLiteral("INSERT INTO tbQuotas_Socios (socio_id) VALUES (2)"));
        QCOMPARE(c.scalar(QStringLiteral("SELECT COUNT(DISTINCT squota_id) FROM tbQuotas_Socios")).toInt(), 2);
        QCOMPARE(c.scalar(QStringLiteral("SELECT total_pago FROM tbQuotas_Socios WHERE socio_id = 1")).toDouble(), 0.0);
        // One account per member, one due of a type per member and month.
        QVERIFY_THROWS_EXCEPTION(DbError, c.execute(QStringLiteral("INSERT INTO tbQuotas_Socios (socio_id) VALUES (1)")));
        const QString due = QStringLiteral("INSERT INTO tbQuotas_Movimentos (socio_id, ano, mes, tipo, quota) VALUES (1, 2003, 1, 1, ?)");
        c.execute(due, {1234567.89});
        QVERIFY_THROWS_EXCEPTION(DbError, c.execute(due, {1.0}));
        QCOMPARE(c.scalar(QStringLiteral("SELECT quota FROM tbQuotas_Movimentos")).toDouble(), 1234567.89);
        if (c.engine() == Engine::PostgreSQL) {
            c.execute(QStringLiteral("UPDATE tbQuotas_Movimentos SET rend1 = ?"), {10.005});
            QCOMPARE(c.scalar(QStringLiteral("SELECT rend1 FROM tbQuotas_Movimentos")).toDouble(), 10.01);
        }
        // The member key also takes a value given by the host.
        c.execute(QStringLiteral("INSERT INTO tbSocios (socio_id, nome) VALUES (500, 'Rui')"));
        QCOMPARE(c.scalar(QStringLiteral("SELECT nome FROM tbSocios WHERE socio_id = 500")).toString(), QStringLiteral("Rui"));
    }

    void theDataEnvironmentsCommandsRun()
    {
        TestDatabase db;
        addDemoMembers(db.connection(), 5);
        db.login();
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
            TestDatabase db;
            QCOMPARE(addDemoMembers(db.connection(), 300), 300);
            Recordset rs;
            rs.open(select, db.connection());
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

QTEST_GUILESS_MAIN(SchemaTest)
#include "tst_schema.moc"
