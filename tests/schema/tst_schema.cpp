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
    void creatingTwiceChangesNothing()
    {
        TestDatabase db(false);
        QCOMPARE(createSchema(db.connection()), schemaTables());
        db.connection().execute(QStringLiteral("INSERT INTO tbSocios (socio_id, nome) VALUES (77, 'Ana')"));
        QVERIFY(createSchema(db.connection()).isEmpty());
        QCOMPARE(db.connection().scalar(QStringLiteral("SELECT nome FROM tbSocios WHERE socio_id = 77")).toString(),
                 QStringLiteral("Ana"));
        QCOMPARE(db.connection().scalar(QStringLiteral("SELECT COUNT(*) FROM tbmeses")).toInt(), 12);
        // The rejects table: a key the database fills, then Field0 to Field20.
        Recordset extras;
        extras.open(QStringLiteral("SELECT * FROM extras"), db.connection());
        QCOMPARE(extras.fieldCount(), 22);
        QCOMPARE(extras.fieldName(0), QStringLiteral("extra_id"));
        QCOMPARE(extras.fieldName(21).toLower(), QStringLiteral("field20"));
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
