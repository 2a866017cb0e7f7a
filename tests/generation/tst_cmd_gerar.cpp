// "quotas gerar" as a process: the closing message, the exit statuses, the
// staff number, a failed run, and two runs of one month at the same time.

#include "schema/demo_data.h"
#include "schema/schema.h"
#include "support/test_database.h"
#include "generation_fixture.h"

#include <QProcess>
#include <QTest>

using namespace quotas;
using quotas::test::GenerationFixture;
using quotas::test::TestDatabase;

namespace {

struct Outcome {
    int status = -1;
    QString out;
    QString err;
};

}  // namespace

class CmdGerarTest : public QObject {
    Q_OBJECT

    std::unique_ptr<TestDatabase> db;
    QString registry;
    Connection& c() { return db->connection(); }
    GenerationFixture f() { return GenerationFixture{c()}; }

    QProcess* start(const QStringList& args)
    {
        auto* p = new QProcess(this);
        p->start(QStringLiteral(QUOTAS_CLI_BINARY), QStringList{QStringLiteral("--registry"), registry} + args);
        return p;
    }
    Outcome finish(QProcess* p)
    {
        Outcome o;
        if (!p->waitForFinished(240000))
            qWarning("quotas did not finish");
        o.status = p->exitStatus() == QProcess::NormalExit ? p->exitCode() : -1;
        o.out = QString::fromUtf8(p->readAllStandardOutput());
        o.err = QString::fromUtf8(p->readAllStandardError());
        p->deleteLater();
        return o;
    }
    Outcome gerar(const QStringList& args) { return finish(start(QStringList{QStringLiteral("gerar")} + args)); }

private slots:
    void initTestCase()
    {
        db = std::make_unique<TestDatabase>();
        registry = db->useAsSettings();
    }
    void cleanupTestCase() { db.reset(); }
    void init()
    {
        db->clear();
        for (int socio = 1; socio <= 3; ++socio)
            f().member(socio, QStringLiteral("100%1").arg(socio));
    }

    void runsTheMonthAndSaysSo()
    {
        const Outcome o = gerar({"--ano", "2003", "--mes", "1"});
        QCOMPARE(o.status, 0);
        QCOMPARE(o.out, QStringLiteral("Fim do processamento de quotizações\n"));
        QCOMPARE(f().count(QStringLiteral("tbQuotas_Movimentos")), 3);
    }

    void oneMemberByStaffNumber()
    {
        const Outcome o = gerar({"--ano", "2003", "--mes", "1", "--no-tap", "1002"});
        QCOMPARE(o.status, 0);
        QCOMPARE(c().scalar(QStringLiteral("SELECT socio_id FROM tbQuotas_Movimentos")).toInt(), 2);
        QCOMPARE(f().count(QStringLiteral("tbQuotas_Movimentos")), 1);
    }

    void refusedArguments_data()
    {
        QTest::addColumn<QStringList>("args");
        QTest::addColumn<QString>("error");
        QTest::newRow("month 13") << QStringList{"--ano", "2003", "--mes", "13"} << "--mes deve ser um número entre 1 e 12";
        QTest::newRow("month 0") << QStringList{"--ano", "2003", "--mes", "0"} << "--mes deve ser um número entre 1 e 12";
        QTest::newRow("year 1899") << QStringList{"--ano", "1899", "--mes", "1"} << "--ano deve ser um número entre 1900 e 9999";
        QTest::newRow("no month") << QStringList{"--ano", "2003"} << "falta --mes";
        QTest::newRow("unknown staff number") << QStringList{"--ano", "2003", "--mes", "1", "--no-tap", "999"}
                                              << "Número de Empresa não existe!";
        QTest::newRow("quote trick") << QStringList{"--ano", "2003", "--mes", "1", "--no-tap", "x' OR '1'='1"}
                                     << "Número de Empresa não existe!";
    }
    void refusedArguments()
    {
        QFETCH(QStringList, args);
        QFETCH(QString, error);
        const Outcome o = gerar(args);
        QCOMPARE(o.status, 2);
        QVERIFY2(o.err.contains(error), qPrintable(o.err));
        QCOMPARE(f().count(QStringLiteral("tbQuotas_Movimentos")), 0);
        QCOMPARE(f().count(QStringLiteral("tbQuotas_Socios")), 0);
    }

    void duesNotGeneratedFollowTheClosingMessage()
    {
        f().account(3, test::kNull, 0.0);
        const Outcome o = gerar({"--ano", "2003", "--mes", "1"});
        QCOMPARE(o.status, 0);
        const QStringList lines = o.out.split(u'\n', Qt::SkipEmptyParts);
        QCOMPARE(lines.size(), 2);
        QCOMPARE(lines[0], QStringLiteral("Fim do processamento de quotizações"));
        QVERIFY2(lines[1].startsWith(QStringLiteral("Não foi gerada 1 quota: - 1 quota porque a conta do associado")),
                 qPrintable(lines[1]));
    }

    void failedRunExitsOneWithTheMessage()
    {
        c().execute(QStringLiteral("DROP TABLE tbcontadores"));
        const Outcome o = gerar({"--ano", "2003", "--mes", "1"});
        createSchema(c());
        QCOMPARE(o.status, 1);
        QVERIFY2(o.err.contains(QStringLiteral("O processamento de quotas parou no associado com o Nº Empresa 1001")),
                 qPrintable(o.err));
        QVERIFY(!o.out.contains(QStringLiteral("Fim do processamento")));
        QCOMPARE(f().count(QStringLiteral("tbQuotas_Movimentos")), 0);
    }

    // The first month creates the accounts, the second finds them: each
    // pair of runs must meet in the same members and still agree.
    void twoRunsAtOnceChargeEachDueOnce_data()
    {
        QTest::addColumn<int>("mes");
        QTest::newRow("new accounts") << 1;
        QTest::newRow("existing accounts") << 2;
    }
    void twoRunsAtOnceChargeEachDueOnce()
    {
        QFETCH(int, mes);
        constexpr int kMembers = 1500;
        db->clear();
        addDemoMembers(c(), kMembers);
        for (int m = 1; m <= mes; ++m) {
            const QStringList args = {"gerar", "--ano", "2003", "--mes", QString::number(m)};
            QProcess* first = start(args);
            QProcess* second = start(args);
            const Outcome a = finish(first);
            const Outcome b = finish(second);
            QVERIFY2(a.status == 0, qPrintable(a.err));
            QVERIFY2(b.status == 0, qPrintable(b.err));
        }

        const int dues = f().count(QStringLiteral("tbQuotas_Movimentos"));
        const int insured = c().scalar(QStringLiteral("SELECT COUNT(*) FROM tbSocios WHERE seguro <> 0")).toInt();
        QCOMPARE(dues, mes * (kMembers + insured));  // the demo's insurances all run past 2003
        QCOMPARE(c().scalar(QStringLiteral("SELECT COUNT(*) FROM (SELECT DISTINCT socio_id, mes, tipo FROM "
                                           "tbQuotas_Movimentos) d")).toInt(),
                 dues);
        QCOMPARE(c().scalar(QStringLiteral("SELECT COUNT(DISTINCT quota_no) FROM tbQuotas_Movimentos")).toInt(), dues);
        QCOMPARE(c().scalar(QStringLiteral("SELECT MAX(quota_no) FROM tbQuotas_Movimentos")).toInt(), dues);
        QCOMPARE(f().counter().toInt(), dues);
        QCOMPARE(f().count(QStringLiteral("tbQuotas_Socios")), kMembers);
        // No total counts a due twice.
        QCOMPARE(c().scalar(QStringLiteral("SELECT COUNT(*) FROM tbQuotas_Socios a WHERE ABS(a.total_quotas - "
                                           "(SELECT SUM(m.quota) FROM tbQuotas_Movimentos m WHERE m.socio_id = a.socio_id)) > 0.005"))
                     .toInt(),
                 0);
    }
};

QTEST_GUILESS_MAIN(CmdGerarTest)
#include "tst_cmd_gerar.moc"
