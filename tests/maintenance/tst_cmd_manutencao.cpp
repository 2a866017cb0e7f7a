// "quotas manutencao" as a process: the same run as the dialog, its
// completion line on stdout, a failure on stderr with exit status 1.

#include "maintenance_fixture.h"
#include "support/test_database.h"

#include <QProcess>
#include <QTest>

using namespace quotas;
using namespace quotas::test;

class CmdManutencaoTest : public QObject {
    Q_OBJECT

    std::unique_ptr<TestDatabase> db;
    QString registry;
    Connection& c() { return db->connection(); }

private slots:
    void initTestCase()
    {
        db = std::make_unique<TestDatabase>();
        registry = db->useAsSettings();
    }
    void cleanupTestCase() { db.reset(); }

    void runsTheMaintenance_data()
    {
        QTest::addColumn<QStringList>("extra");
        QTest::addColumn<bool>("failing");
        QTest::addColumn<int>("status");
        QTest::addColumn<QString>("out");
        QTest::addColumn<QString>("err");
        QTest::newRow("complete") << QStringList() << false << 0 << "Manutenção de Dados Concluída.\n"
                                  << "Acumulados Inactivos: 1/1";
        QTest::newRow("failure") << QStringList() << true << 1 << ""
                                 << "quotas: A manutenção de dados foi interrompida em \"Acumulados Activos\"";
        QTest::newRow("stray argument") << QStringList{"now"} << false << 2 << "" << "quotas:";
    }

    void runsTheMaintenance()
    {
        QFETCH(QStringList, extra);
        QFETCH(bool, failing);
        QFETCH(int, status);
        QFETCH(QString, out);
        QFETCH(QString, err);
        db->clear();
        stopFailing(c(), QStringLiteral("tbQuotas_Socios"));
        addAccount(c(), QStringLiteral("tbQuotas_Socios"), 1, 80, 10);
        addMovement(c(), QStringLiteral("tbQuotas_Movimentos"), 1, {null(), 0.0, 12.5, null()});
        addMovement(c(), QStringLiteral("tbQuotas_Movimentos_Inactivos"), 2, 4, 4);
        if (failing)
            failUpdates(c(), QStringLiteral("tbQuotas_Socios"), QStringLiteral("NEW.total_quotas <> 0"));

        QProcess quotas;
        quotas.start(QStringLiteral(QUOTAS_CLI_BINARY),
                     QStringList{QStringLiteral("--registry"), registry, QStringLiteral("manutencao")} + extra);
        QVERIFY(quotas.waitForFinished(60000));
        const QString stdoutText = QString::fromUtf8(quotas.readAllStandardOutput());
        const QString stderrText = QString::fromUtf8(quotas.readAllStandardError());
        QCOMPARE(quotas.exitCode(), status);
        QCOMPARE(stdoutText, out);
        QVERIFY2(stderrText.contains(err), qPrintable(stderrText));

        const Totals t = totalsOf(c(), QStringLiteral("tbQuotas_Socios"), 1);
        const bool rebuilt = status == 0;
        QVERIFY(sameCents(t.quotas, rebuilt ? 12.5 : 80));
        QVERIFY(sameCents(t.pago, rebuilt ? 0 : 10));
        QCOMPARE(totalsOf(c(), QStringLiteral("tbQuotas_Socios_Inactivos"), 2).exists, rebuilt);
    }
};

QTEST_GUILESS_MAIN(CmdManutencaoTest)
#include "tst_cmd_manutencao.moc"
