// The generation run on both engines: rates and amounts as stored, new
// accounts, the running number, idempotence, one member, the empty set, the
// insurance end month, empty values reported, and a failure midway.

#include "generation/processar_quotas.h"
#include "platform/errors.h"
#include "support/recording_progress.h"
#include "support/test_database.h"
#include "generation_fixture.h"

#include <QLocale>
#include <QTest>

using namespace quotas;
using quotas::test::GenerationFixture;
using quotas::test::kNull;
using quotas::test::RecordingProgress;
using quotas::test::TestDatabase;

namespace {

const QDate kToday(2003, 1, 20);
const QString kMessage = QStringLiteral("Criando registos de quotas, aguarde alguns momentos . . .");

}  // namespace

class ProcessarQuotasTest : public QObject {
    Q_OBJECT

    std::unique_ptr<TestDatabase> db;
    Connection& c() { return db->connection(); }
    GenerationFixture f() { return GenerationFixture{c()}; }
    GenerationOutcome run(int ano, int mes, int socio = 0) { return ProcessarQuotas(c(), ano, mes, socio, kToday); }

    double quotaOf(int socio, int ano, int mes, int tipo)
    {
        Recordset rs;
        f().movement(rs, socio, ano, mes, tipo);
        return rs.eof() ? -1 : rs.value(QStringLiteral("quota")).toDouble();
    }

private slots:
    void initTestCase()
    {
        db = std::make_unique<TestDatabase>();
        RecordingProgress::install();
    }
    void cleanupTestCase()
    {
        RecordingProgress::uninstall();
        db.reset();
    }
    void init()
    {
        db->clear();
        RecordingProgress::log() = {};
        f().employer(QStringLiteral("TAP"), 0.015);
        f().employer(QStringLiteral("PGA"), 0.01);
        f().category(QStringLiteral("A1"), 2500.0);
    }

    void ratesAndAmounts_data()
    {
        QTest::addColumn<QVariant>("rend1");
        QTest::addColumn<QVariant>("rend2");
        QTest::addColumn<QVariant>("percSindicato");
        QTest::addColumn<QVariant>("percSeguro");
        QTest::addColumn<QString>("empresa");
        QTest::addColumn<double>("sindicato");
        QTest::addColumn<double>("seguro");
        QTest::newRow("employer unknown: 1.5%") << QVariant(1000.0) << QVariant(0.0) << kNull << kNull << "XPT" << 15.0 << 15.0;
        QTest::newRow("personal 0.125: 12.5 cents to 12") << QVariant(1.0) << QVariant(0.0) << QVariant(0.125) << QVariant(0.375) << "TAP" << 0.12 << 0.38;
        QTest::newRow("personal 0: the employer's, both dues") << QVariant(1000.0) << QVariant(200.0) << QVariant(0.0) << kNull << "PGA" << 12.0 << 12.0;
        QTest::newRow("personal insurance rate only") << QVariant(1000.0) << QVariant(0.0) << kNull << QVariant(0.02) << "TAP" << 15.0 << 20.0;
    }
    void ratesAndAmounts()
    {
        QFETCH(QVariant, rend1);
        QFETCH(QVariant, rend2);
        QFETCH(QVariant, percSindicato);
        QFETCH(QVariant, percSeguro);
        QFETCH(QString, empresa);
        QFETCH(double, sindicato);
        QFETCH(double, seguro);
        f().member(1, QStringLiteral("1001"), QStringLiteral("A1"), empresa, 1);
        f().account(1, rend1, rend2, percSindicato, percSeguro, 10.10);
        run(2003, 1);
        QCOMPARE(quotaOf(1, 2003, 1, 1), sindicato);
        QCOMPARE(quotaOf(1, 2003, 1, 2), seguro);
        Recordset account;
        f().accountOf(account, 1);
        QVERIFY(test::sameCents(account.value(QStringLiteral("total_quotas")).toDouble(), 10.10 + sindicato + seguro));
        QCOMPARE(account.value(QStringLiteral("ult_quota_sindicato")).toDouble(), sindicato);
        QCOMPARE(account.value(QStringLiteral("ult_quota_seguro")).toDouble(), seguro);
        QCOMPARE(account.value(QStringLiteral("ult_ano")).toInt(), 2003);
        QCOMPARE(account.value(QStringLiteral("ult_mes")).toInt(), 1);
        Recordset mv;
        f().movement(mv, 1, 2003, 1, 2);
        QCOMPARE(mv.value(QStringLiteral("ref")).toString(), QStringLiteral("Seguro"));
        QCOMPARE(mv.value(QStringLiteral("data")).toDate(), kToday);
        QCOMPARE(mv.value(QStringLiteral("rend1")).toDouble(), rend1.toDouble());
        QCOMPARE(mv.value(QStringLiteral("rend2")).toDouble(), rend2.toDouble());
        QCOMPARE(mv.value(QStringLiteral("pago")).toDouble(), 0.0);
    }

    void newAccounts_data()
    {
        QTest::addColumn<QVariant>("fuv");
        QTest::addColumn<double>("rend1");
        QTest::addColumn<double>("due");
        QTest::newRow("category unknown: 100000") << QVariant(QStringLiteral("Z9")) << 100000.0 << 1500.0;
        QTest::newRow("no category: 100000") << kNull << 100000.0 << 1500.0;
        QTest::newRow("category's rend1, comma locale") << QVariant(QStringLiteral("C2")) << 4100.5 << 61.51;
    }
    void newAccounts()
    {
        QFETCH(QVariant, fuv);
        QFETCH(double, rend1);
        QFETCH(double, due);
        const QLocale before;
        QLocale::setDefault(QLocale(QLocale::Portuguese, QLocale::Portugal));
        f().category(QStringLiteral("C2"), 4100.5);
        f().member(7, QStringLiteral("1007"), fuv, QStringLiteral("XPT"), 1);
        const GenerationOutcome outcome = run(2003, 1);
        QLocale::setDefault(before);
        QCOMPARE(outcome.accountsCreated, 1);
        Recordset account;
        f().accountOf(account, 7);
        QCOMPARE(account.recordCount(), 1);
        QCOMPARE(account.value(QStringLiteral("ult_rend1")).toDouble(), rend1);
        QCOMPARE(account.value(QStringLiteral("ult_rend2")).toDouble(), 0.0);
        QVERIFY(account.isNull(QStringLiteral("ult_perc_sindicato")));
        QCOMPARE(account.value(QStringLiteral("total_pago")).toDouble(), 0.0);
        QCOMPARE(quotaOf(7, 2003, 1, 1), due);
        QCOMPARE(quotaOf(7, 2003, 1, 2), due);
        QVERIFY(test::sameCents(account.value(QStringLiteral("total_quotas")).toDouble(), 2 * due));
    }

    void counterStartsAtOneAndNumbersUnionThenInsurance()
    {
        f().member(1, QStringLiteral("1001"), QStringLiteral("A1"), QStringLiteral("TAP"), 1);
        f().member(2, QStringLiteral("1002"));
        run(2003, 1);
        Recordset mv;
        f().movement(mv, 1, 2003, 1, 1);
        QCOMPARE(mv.value(QStringLiteral("quota_no")).toInt(), 1);
        f().movement(mv, 1, 2003, 1, 2);
        QCOMPARE(mv.value(QStringLiteral("quota_no")).toInt(), 2);
        f().movement(mv, 2, 2003, 1, 1);
        QCOMPARE(mv.value(QStringLiteral("quota_no")).toInt(), 3);
        QCOMPARE(f().count(QStringLiteral("tbcontadores")), 1);
        QCOMPARE(f().counter().toInt(), 3);

        c().execute(QStringLiteral("UPDATE tbcontadores SET quotas = 41"));
        run(2003, 2, 2);
        f().movement(mv, 2, 2003, 2, 1);
        QCOMPARE(mv.value(QStringLiteral("quota_no")).toInt(), 42);
    }

    void secondRunChangesNothingButNewMembers()
    {
        f().member(1, QStringLiteral("1001"), QStringLiteral("A1"), QStringLiteral("TAP"), 1);
        f().member(2, QStringLiteral("1002"), QStringLiteral("Z9"), QStringLiteral("PGA"));
        run(2003, 1);
        const QStringList movements = f().movementRows();
        const QVariant counter = f().counter();
        const QVariant totals = c().scalar(QStringLiteral("SELECT SUM(total_quotas) FROM tbQuotas_Socios"));
        const GenerationOutcome again = run(2003, 1);
        QCOMPARE(again.posted, 0);
        QCOMPARE(f().movementRows(), movements);
        QCOMPARE(f().counter(), counter);
        QCOMPARE(c().scalar(QStringLiteral("SELECT SUM(total_quotas) FROM tbQuotas_Socios")), totals);

        f().member(3, QStringLiteral("1003"));
        const GenerationOutcome third = run(2003, 1);
        QCOMPARE(third.posted, 1);
        QCOMPARE(third.accountsCreated, 1);
        QCOMPARE(f().movementRows().mid(0, movements.size()), movements);
        QCOMPARE(f().counter().toInt(), counter.toInt() + 1);
    }

    void chargedWithOneTypeGetsTheOther_data()
    {
        QTest::addColumn<int>("existing");
        QTest::addColumn<int>("posted");
        QTest::newRow("union charged") << 1 << 2;
        QTest::newRow("insurance charged") << 2 << 1;
    }
    void chargedWithOneTypeGetsTheOther()
    {
        QFETCH(int, existing);
        QFETCH(int, posted);
        f().member(1, QStringLiteral("1001"), QStringLiteral("A1"), QStringLiteral("TAP"), 1);
        f().account(1, 1000.0, 0.0);
        c().execute(QStringLiteral("INSERT INTO tbQuotas_Movimentos (socio_id, ano, mes, tipo, quota, pago) "
                                   "VALUES (1, 2003, 1, ?, 99, 0)"),
                    {existing});
        const GenerationOutcome outcome = run(2003, 1);
        QCOMPARE(outcome.posted, 1);
        QCOMPARE(quotaOf(1, 2003, 1, existing), 99.0);
        QCOMPARE(quotaOf(1, 2003, 1, posted), 15.0);
    }

    void oneMemberOnly()
    {
        for (int socio = 1; socio <= 3; ++socio)
            f().member(socio, QStringLiteral("100%1").arg(socio));
        const GenerationOutcome outcome = run(2003, 1, 2);
        QCOMPARE(outcome.members, 1);
        QCOMPARE(f().count(QStringLiteral("tbQuotas_Movimentos")), 1);
        QCOMPARE(quotaOf(2, 2003, 1, 1), 37.5);
        QCOMPARE(f().count(QStringLiteral("tbQuotas_Socios")), 1);
        QCOMPARE(RecordingProgress::log().maximum, 1);
    }

    void emptyMembersSet()
    {
        const GenerationOutcome outcome = run(2003, 1);
        QCOMPARE(outcome.members, 0);
        QCOMPARE(RecordingProgress::log().calls,
                 QStringList({QStringLiteral("Iniciar(0, %1, Processamento de Quotas)").arg(kMessage),
                              QStringLiteral("terminar()")}));
        QCOMPARE(f().count(QStringLiteral("tbQuotas_Socios")), 0);
        QCOMPARE(f().count(QStringLiteral("tbcontadores")), 0);
    }

    void progressAdvancesForEveryMember()
    {
        for (int socio = 1; socio <= 3; ++socio)
            f().member(socio, QStringLiteral("100%1").arg(socio));
        run(2003, 1);
        run(2003, 1);  // nothing left to post: still one step per member
        const QStringList calls = RecordingProgress::log().calls.mid(5);
        QCOMPARE(calls, QStringList({QStringLiteral("Iniciar(3, %1, Processamento de Quotas)").arg(kMessage),
                                     QStringLiteral("setvalor(1)"), QStringLiteral("setvalor(1)"),
                                     QStringLiteral("setvalor(1)"), QStringLiteral("terminar()")}));
        QCOMPARE(RecordingProgress::log().created, 2);
    }

    void insuranceEndMonth_data()
    {
        QTest::addColumn<QVariant>("end");
        QTest::addColumn<bool>("charged");
        // Regression: the year and the month were compared separately.
        QTest::newRow("ends March 2001") << QVariant(QDate(2001, 3, 31)) << true;
        QTest::newRow("ends December 2000") << QVariant(QDate(2000, 12, 31)) << true;
        QTest::newRow("ends November 2000") << QVariant(QDate(2000, 11, 30)) << false;
        QTest::newRow("ended 1999") << QVariant(QDate(1999, 6, 30)) << false;
        QTest::newRow("no end") << kNull << true;
    }
    void insuranceEndMonth()
    {
        QFETCH(QVariant, end);
        QFETCH(bool, charged);
        f().member(1, QStringLiteral("1001"), QStringLiteral("A1"), QStringLiteral("TAP"), 1, end);
        run(2000, 12);
        QVERIFY(quotaOf(1, 2000, 12, 1) > 0);
        QCOMPARE(quotaOf(1, 2000, 12, 2) > 0, charged);
    }

    void emptyValuesAreReportedNotPosted()
    {
        f().employer(QStringLiteral("NUL"), kNull);
        f().category(QStringLiteral("B9"), kNull);
        f().member(1, QStringLiteral("1001"), QStringLiteral("A1"), QStringLiteral("TAP"), 1);
        f().account(1, 1000.0, kNull);
        f().member(2, QStringLiteral("1002"), QStringLiteral("A1"), QStringLiteral("NUL"));
        f().member(3, QStringLiteral("1003"), QStringLiteral("B9"), QStringLiteral("TAP"));
        f().member(4, QStringLiteral("1004"), QStringLiteral("A1"), QStringLiteral("NUL"));
        f().account(4, 1000.0, 0.0, 0.02);  // his own rate needs no employer's
        f().member(5, QStringLiteral("1005"));
        const GenerationOutcome outcome = run(2003, 1);
        QCOMPARE(outcome.missingRemuneration, 3);  // both dues of 1, the union due of 3
        QCOMPARE(outcome.missingRate, 1);
        QCOMPARE(outcome.membersMissingRemuneration, QStringList({QStringLiteral("1001"), QStringLiteral("1003")}));
        QCOMPARE(outcome.membersMissingRate, QStringList({QStringLiteral("1002")}));
        QCOMPARE(outcome.posted, 2);
        QCOMPARE(quotaOf(4, 2003, 1, 1), 20.0);
        QCOMPARE(quotaOf(5, 2003, 1, 1), 37.5);
        for (int socio : {1, 2, 3})
            QCOMPARE(quotaOf(socio, 2003, 1, 1), -1.0);
        // The account of member 3 was created without a remuneration.
        Recordset account;
        f().accountOf(account, 3);
        QVERIFY(account.isNull(QStringLiteral("ult_rend1")));
        const QString summary = outcome.summary();
        QVERIFY2(summary.startsWith(QStringLiteral("Não foram geradas 4 quotas:\n")), qPrintable(summary));
        QVERIFY2(summary.contains(QStringLiteral("3 quotas porque a conta do associado não tem a remuneração 1 ou a "
                                                 "remuneração 2 (Nº Empresa: 1001, 1003)")),
                 qPrintable(summary));
        QVERIFY2(summary.contains(QStringLiteral("1 quota porque a empresa do associado não tem a percentagem de "
                                                 "quotização (Nº Empresa: 1002)")),
                 qPrintable(summary));
    }

    void failureKeepsWhatWasCommitted()
    {
        for (int socio = 1; socio <= 4; ++socio)
            f().member(socio, QStringLiteral("100%1").arg(socio), QStringLiteral("A1"), QStringLiteral("TAP"), 1);
        if (c().engine() == Engine::SQLite) {
            c().execute(QStringLiteral("CREATE TRIGGER refuse_3 BEFORE INSERT ON tbQuotas_Movimentos "
                                       "WHEN NEW.socio_id = 3 AND NEW.tipo = 2 BEGIN SELECT RAISE(ABORT, 'recusado'); END"));
        } else {
            c().execute(QStringLiteral("CREATE OR REPLACE FUNCTION refuse_3() RETURNS trigger AS $$ BEGIN "
                                       "IF NEW.socio_id = 3 AND NEW.tipo = 2 THEN RAISE EXCEPTION 'recusado'; END IF; "
                                       "RETURN NEW; END $$ LANGUAGE plpgsql"));
            c().execute(QStringLiteral("CREATE TRIGGER refuse_3 BEFORE INSERT ON tbQuotas_Movimentos "
                                       "FOR EACH ROW EXECUTE FUNCTION refuse_3()"));
        }
        QString message;
        try {
            run(2003, 1);
        } catch (const QuotasError& e) {
            message = e.message();
        }
        c().execute(c().engine() == Engine::SQLite ? QStringLiteral("DROP TRIGGER refuse_3")
                                                  : QStringLiteral("DROP TRIGGER refuse_3 ON tbQuotas_Movimentos"));
        QVERIFY2(message.startsWith(QStringLiteral("O processamento de quotas parou no associado com o Nº Empresa 1003: ")),
                 qPrintable(message));
        QVERIFY(message.contains(QStringLiteral("recusado")));
        // Members 1 and 2 whole; nothing of member 3, not even his union due,
        // his account or his number; member 4 not reached.
        QCOMPARE(f().count(QStringLiteral("tbQuotas_Movimentos")), 4);
        QCOMPARE(f().count(QStringLiteral("tbQuotas_Socios")), 2);
        QCOMPARE(f().counter().toInt(), 4);
        QVERIFY(!RecordingProgress::log().showing);

        // Run again once the cause is gone: the month is completed.
        run(2003, 1);
        QCOMPARE(f().count(QStringLiteral("tbQuotas_Movimentos")), 8);
        QCOMPARE(c().scalar(QStringLiteral("SELECT COUNT(DISTINCT quota_no) FROM tbQuotas_Movimentos")).toInt(), 8);
        QCOMPARE(f().counter().toInt(), 8);
    }
};

QTEST_GUILESS_MAIN(ProcessarQuotasTest)
#include "tst_processar_quotas.moc"
