// The schema on both engines: the keys that refuse a second account or due,
// the data environment's commands, and the demo members.

#include "component/shared_objects.h"
#include "platform/errors.h"
#include "platform/recordset.h"
#include "schema/demo_data.h"
#include "support/test_database.h"

#include <QTest>

using namespace quotas;
using quotas::test::TestDatabase;

class SchemaTest : public QObject {
    Q_OBJECT
private slots:
    // One account per member, one due of a type per member and month.
    void keysRefuseASecondAccountOrDue()
    {
        TestDatabase db;
        Connection& c = db.connection();
        c.execute(QStringLiteral("INSERT INTO tbQuotas_Socios (socio_id) VALUES (1)"));
        QVERIFY_THROWS_EXCEPTION(DbError, c.execute(QStringLiteral("INSERT INTO tbQuotas_Socios (socio_id) VALUES (1)")));
        const QString due = QStringLiteral("INSERT INTO tbQuotas_Movimentos (socio_id, ano, mes, tipo, quota) VALUES (1, 2003, 1, 1, 1)");
        c.execute(due);
        QVERIFY_THROWS_EXCEPTION(DbError, c.execute(due));
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
