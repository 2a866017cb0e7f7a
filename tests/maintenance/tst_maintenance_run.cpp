// The maintenance run on both engines, through a recording panel: Null
// repair, the rebuilt totals, new accounts, the progress display, the bars,
// and what a failure leaves behind.

#include "maintenance/maintenance_panel.h"
#include "maintenance/processar_manutencao.h"
#include "maintenance_fixture.h"
#include "platform/errors.h"
#include "support/recording_progress.h"
#include "support/scripted_boxes.h"
#include "support/test_database.h"

#include <QTest>

using namespace quotas;
using namespace quotas::test;

namespace {

const QString kActive = QStringLiteral("tbQuotas_Movimentos");
const QString kInactive = QStringLiteral("tbQuotas_Movimentos_Inactivos");
const QString kHistory = QStringLiteral("tbQuotas_Movimentos_Historico");
const QString kAccounts = QStringLiteral("tbQuotas_Socios");
const QString kInactiveAccounts = QStringLiteral("tbQuotas_Socios_Inactivos");

struct Bar {
    int maximum = 100;
    int value = 0;
};

class RecordedPanel final : public MaintenancePanel {
public:
    Bar bars[6];
    QStringList faults;  // a step past the maximum, a step before the pass started its bar
    QString clip;
    bool playing = false;
    bool finished = false;
    bool started[6] = {};

    QString caption() const override { return maintenanceCaption(); }
    void startBar(int pass, int maximum) override
    {
        bars[pass] = {maximum, 0};
        started[pass] = true;
    }
    void stepBar(int pass) override
    {
        if (!started[pass])
            faults << QStringLiteral("bar %1 moved before it was started").arg(pass);
        if (++bars[pass].value > bars[pass].maximum)
            faults << QStringLiteral("bar %1 past its maximum").arg(pass);
    }
    void playAnimation(const QString& file) override
    {
        clip = file;
        playing = true;
    }
    void stopAnimation() override { playing = false; }
    void showFinished() override { finished = true; }
};

}  // namespace

class MaintenanceRunTest : public QObject {
    Q_OBJECT

    std::unique_ptr<TestDatabase> db;
    Connection& c() { return db->connection(); }

    // A run on a connection of its own, as the dialog's is.
    void run(RecordedPanel& panel)
    {
        auto connection = db->openAnother(QStringLiteral("run"));
        ProcessarManutencao(*connection, panel);
    }

    QVariant amount(const QString& table, int quotaId, const char* column)
    {
        return c().scalar(QStringLiteral("SELECT %1 FROM %2 WHERE quota_id = ?").arg(QLatin1String(column), table), {quotaId});
    }

private slots:
    void initTestCase()
    {
        db = std::make_unique<TestDatabase>();
        noteWrites(c());
    }
    void cleanupTestCase() { db.reset(); }
    void init()
    {
        db->clear();
        stopFailing(c(), kAccounts);
        stopFailing(c(), kActive);
        c().execute(QStringLiteral("DELETE FROM written"));
        RecordingProgress::install();
    }

    void emptyTablesFillTheirBarsAndZeroTheTotals()
    {
        addAccount(c(), kAccounts, 1, 40.5, 12.25);
        addAccount(c(), kInactiveAccounts, 2, 8, 8);
        ScriptedBoxes boxes;
        RecordedPanel panel;
        run(panel);
        for (int pass = 1; pass <= 5; ++pass) {
            QCOMPARE(panel.bars[pass].maximum, 1);
            QCOMPARE(panel.bars[pass].value, 1);
        }
        QCOMPARE(movementWrites(c()), 0);
        const Totals active = totalsOf(c(), kAccounts, 1);
        const Totals inactive = totalsOf(c(), kInactiveAccounts, 2);
        QVERIFY(active.exists && inactive.exists);
        QCOMPARE(active.quotas, 0.0);
        QCOMPARE(active.pago, 0.0);
        QCOMPARE(inactive.quotas, 0.0);
        QCOMPARE(inactive.pago, 0.0);
        QCOMPARE(panel.faults, QStringList());
    }

    void nullAmountsBecomeZero_data()
    {
        QTest::addColumn<QString>("table");
        QTest::addColumn<QVariantList>("before");  // rend1, rend2, quota, pago
        QTest::addColumn<QVariantList>("after");
        QTest::addColumn<bool>("rewritten");
        const struct {
            const char* name;
            QVariantList before;
            QVariantList after;
            bool rewritten;
        } cases[] = {
            {"quota null, pago 5", {1000.0, 0.0, null(), 5.0}, {1000.0, 0.0, 0.0, 5.0}, true},
            {"all null", {null(), null(), null(), null()}, {0.0, 0.0, 0.0, 0.0}, true},
            {"rend2 null", {1000.0, null(), 15.0, 0.0}, {1000.0, 0.0, 15.0, 0.0}, true},
            {"none null", {1000.0, 250.5, 18.76, 18.76}, {1000.0, 250.5, 18.76, 18.76}, false},
            {"zeros are not null", {0.0, 0.0, 0.0, 0.0}, {0.0, 0.0, 0.0, 0.0}, false},
        };
        for (const QString& table : {kActive, kInactive, kHistory})
            for (const auto& k : cases)
                QTest::addRow("%s, %s", qPrintable(table), k.name) << table << k.before << k.after << k.rewritten;
    }

    void nullAmountsBecomeZero()
    {
        QFETCH(QString, table);
        QFETCH(QVariantList, before);
        QFETCH(QVariantList, after);
        QFETCH(bool, rewritten);
        const int id = addMovement(c(), table, 7, {before[0], before[1], before[2], before[3]});
        ScriptedBoxes boxes;
        RecordedPanel panel;
        run(panel);
        const char* columns[] = {"rend1", "rend2", "quota", "pago"};
        for (int i = 0; i < 4; ++i) {
            const QVariant v = amount(table, id, columns[i]);
            QVERIFY2(!v.isNull(), columns[i]);
            QCOMPARE(v.toDouble(), after[i].toDouble());
        }
        QCOMPARE(writesOf(c(), table, id), rewritten ? 1 : 0);
    }

    void nullQuotaWithPagoFiveCountsZeroAndFive()
    {
        addMovement(c(), kActive, 3, {1000.0, 0.0, null(), 5.0});
        addMovement(c(), kActive, 3, 12.5, 0);
        ScriptedBoxes boxes;
        RecordedPanel panel;
        run(panel);
        const Totals t = totalsOf(c(), kAccounts, 3);
        QVERIFY(sameCents(t.quotas, 12.5));
        QVERIFY(sameCents(t.pago, 5));
    }

    void accountWithoutMovementsStaysAtZero()
    {
        addAccount(c(), kAccounts, 2, 7, 3);
        addMovement(c(), kActive, 1, 10, 10);
        ScriptedBoxes boxes;
        RecordedPanel panel;
        run(panel);
        const Totals t = totalsOf(c(), kAccounts, 2);
        QVERIFY(t.exists);
        QCOMPARE(t.quotas, 0.0);
        QCOMPARE(t.pago, 0.0);
        QCOMPARE(c().scalar(QStringLiteral("SELECT COUNT(*) FROM tbQuotas_Socios")).toInt(), 2);
        QCOMPARE(panel.bars[4].maximum, 1);  // one member with movements
    }

    void memberWithoutAccountGetsOne_data()
    {
        QTest::addColumn<bool>("otherAccounts");
        QTest::newRow("beside other accounts") << true;
        QTest::newRow("account table empty") << false;
    }

    void memberWithoutAccountGetsOne()
    {
        QFETCH(bool, otherAccounts);
        if (otherAccounts) {
            addAccount(c(), kAccounts, 1, 0, 0);
            addAccount(c(), kAccounts, 9, 0, 0);
        }
        addMovement(c(), kActive, 5, 10.25, 4);
        addMovement(c(), kActive, 5, 10.25, 0);
        addMovement(c(), kActive, 6, 3, 3);
        ScriptedBoxes boxes;
        RecordedPanel panel;
        run(panel);
        const Totals five = totalsOf(c(), kAccounts, 5);
        const Totals six = totalsOf(c(), kAccounts, 6);
        QVERIFY(five.exists && six.exists);
        QVERIFY(sameCents(five.quotas, 20.5));
        QVERIFY(sameCents(five.pago, 4));
        QVERIFY(sameCents(six.quotas, 3));
        // Only the member and the totals are written: the rest keeps the defaults.
        QVERIFY(c().scalar(QStringLiteral("SELECT ult_ano FROM tbQuotas_Socios WHERE socio_id = 5")).isNull());
        QVERIFY(c().scalar(QStringLiteral("SELECT ult_rend1 FROM tbQuotas_Socios WHERE socio_id = 5")).isNull());
        QCOMPARE(c().scalar(QStringLiteral("SELECT COUNT(*) FROM tbQuotas_Socios")).toInt(), otherAccounts ? 4 : 2);
        QCOMPARE(totalsOf(c(), kInactiveAccounts, 5).exists, false);
    }

    void eachMovementTableFeedsOnlyItsAccounts()
    {
        addAccount(c(), kAccounts, 1, 0, 0);
        addMovement(c(), kActive, 1, 10, 5);
        addMovement(c(), kInactive, 1, 3, 1);
        addMovement(c(), kInactive, 4, 20, 20);
        const int history = addMovement(c(), kHistory, 1, {null(), 0.0, 1000.0, null()});
        addMovement(c(), kHistory, 8, 50, 0);
        ScriptedBoxes boxes;
        RecordedPanel panel;
        run(panel);
        const Totals active = totalsOf(c(), kAccounts, 1);
        QVERIFY(sameCents(active.quotas, 10) && sameCents(active.pago, 5));
        const Totals inactive1 = totalsOf(c(), kInactiveAccounts, 1);
        QVERIFY(inactive1.exists && sameCents(inactive1.quotas, 3) && sameCents(inactive1.pago, 1));
        const Totals inactive4 = totalsOf(c(), kInactiveAccounts, 4);
        QVERIFY(inactive4.exists && sameCents(inactive4.quotas, 20));
        QVERIFY(!totalsOf(c(), kAccounts, 4).exists);
        // The history is repaired but counts nowhere.
        QCOMPARE(amount(kHistory, history, "pago").toDouble(), 0.0);
        QVERIFY(!amount(kHistory, history, "rend1").isNull());
        QVERIFY(!totalsOf(c(), kAccounts, 8).exists);
        QVERIFY(!totalsOf(c(), kInactiveAccounts, 8).exists);
    }

    void sumsAreWholeCents()
    {
        // 0.1 + 0.1 + 0.1 is not 0.3 in binary; a stored total must be.
        for (int i = 0; i < 3; ++i)
            addMovement(c(), kActive, 1, 0.1, 0.1);
        for (int i = 0; i < 10; ++i)
            addMovement(c(), kInactive, 2, 1.01, 0.07);
        ScriptedBoxes boxes;
        RecordedPanel panel;
        run(panel);
        // QCOMPARE forgives the last bits of a double; a stored total may not.
        const double stored[] = {totalsOf(c(), kAccounts, 1).quotas, totalsOf(c(), kAccounts, 1).pago,
                                 totalsOf(c(), kInactiveAccounts, 2).quotas, totalsOf(c(), kInactiveAccounts, 2).pago};
        const double exact[] = {0.3, 0.3, 10.1, 0.7};
        for (int i = 0; i < 4; ++i)
            QVERIFY2(stored[i] == exact[i], qPrintable(QString::number(stored[i], 'g', 17)));
    }

    void secondRunChangesNothing()
    {
        addAccount(c(), kAccounts, 1, 99, 99);
        addMovement(c(), kActive, 1, {null(), 0.0, 15.2, null()});
        addMovement(c(), kActive, 2, 7.35, 7.35);
        addMovement(c(), kInactive, 3, {1.0, null(), null(), 2.0});
        addMovement(c(), kHistory, 3, {null(), null(), null(), null()});
        ScriptedBoxes boxes;
        RecordedPanel first;
        run(first);
        auto snapshot = [&](const QString& table) {
            QStringList rows;
            for (int socio : {1, 2, 3}) {
                const Totals t = totalsOf(c(), table, socio);
                rows << QStringLiteral("%1:%2:%3:%4").arg(socio).arg(t.exists).arg(t.quotas, 0, 'f', 2).arg(t.pago, 0, 'f', 2);
            }
            return rows;
        };
        const QStringList active = snapshot(kAccounts);
        const QStringList inactive = snapshot(kInactiveAccounts);
        QCOMPARE(movementWrites(c()), 3);
        c().execute(QStringLiteral("DELETE FROM written"));

        RecordedPanel second;
        run(second);
        QCOMPARE(snapshot(kAccounts), active);
        QCOMPARE(snapshot(kInactiveAccounts), inactive);
        QCOMPARE(movementWrites(c()), 0);
        QVERIFY(active.contains(QStringLiteral("1:1:15.20:0.00")));
    }

    void progressDisplayAndEndOfRun()
    {
        addMovement(c(), kActive, 1, 10, 5);
        ScriptedBoxes boxes;
        RecordedPanel panel;
        run(panel);
        const QString start = QStringLiteral("Iniciar(2, Recebendo informação do servidor, aguarde alguns momentos . . ., "
                                             "Manutenção da Base de Dados)");
        const QStringList pass = {start, QStringLiteral("setvalor(2)"), QStringLiteral("terminar()")};
        QCOMPARE(RecordingProgress::log().calls, pass + pass);
        QCOMPARE(RecordingProgress::log().created, 1);
        QVERIFY(panel.clip.endsWith(QStringLiteral("/filemove.avi")));
        QVERIFY(panel.finished);
        QVERIFY(!panel.playing);
        QCOMPARE(boxes.shown.size(), 1);
        QCOMPARE(boxes.last().text, QStringLiteral("Manutenção de Dados Concluída."));
        QCOMPARE(boxes.last().title, QStringLiteral("Manutenção"));
        QCOMPARE(boxes.last().icon, Icon::Information);
        QCOMPARE(boxes.last().buttons, Buttons::Ok);
        QCOMPARE(panel.faults, QStringList());
    }

    // Regression: a failure half-way through an accumulation pass used to
    // leave the accounts at 0 (every member paid up) and said nothing.
    void failureInTotalsKeepsThePreviousTotals()
    {
        for (int socio = 1; socio <= 4; ++socio) {
            addAccount(c(), kAccounts, socio, 50, 20);
            addMovement(c(), kActive, socio, 10.0 * socio, 1);
        }
        const int repaired = addMovement(c(), kActive, 2, {null(), 0.0, 1.0, 0.0});
        addAccount(c(), kInactiveAccounts, 1, 30, 30);
        failUpdates(c(), kAccounts, QStringLiteral("NEW.socio_id = 3 AND NEW.total_quotas <> 0"));
        ScriptedBoxes boxes;
        RecordedPanel panel;
        try {
            run(panel);
            QFAIL("the run did not report the failure");
        } catch (const QuotasError& e) {
            QVERIFY2(e.message().startsWith(QStringLiteral("A manutenção de dados foi interrompida em \"Acumulados Activos\"")),
                     qPrintable(e.message()));
            QVERIFY2(e.message().contains(QStringLiteral("falha simulada")), qPrintable(e.message()));
        }
        for (int socio = 1; socio <= 4; ++socio) {
            const Totals t = totalsOf(c(), kAccounts, socio);
            QVERIFY2(sameCents(t.quotas, 50) && sameCents(t.pago, 20), qPrintable(QString::number(socio)));
        }
        QCOMPARE(totalsOf(c(), kInactiveAccounts, 1).quotas, 30.0);  // pass 5 never ran
        QVERIFY(!amount(kActive, repaired, "rend1").isNull());       // pass 1 did
        QVERIFY(!panel.playing);
        QVERIFY(!panel.finished);
        QCOMPARE(panel.bars[4].value, 2);
        QCOMPARE(panel.bars[5].value, 0);
        QVERIFY(!RecordingProgress::log().showing);
        QVERIFY(boxes.shown.isEmpty());
    }

    void failureInRepairKeepsTheRowsRepairedBefore()
    {
        const int first = addMovement(c(), kActive, 1, {null(), 0.0, 1.0, 0.0});
        const int failing = addMovement(c(), kActive, 2, {null(), 0.0, 1.0, 0.0});
        const int after = addMovement(c(), kActive, 3, {null(), 0.0, 1.0, 0.0});
        failUpdates(c(), kActive, QStringLiteral("NEW.quota_id = %1").arg(failing));
        ScriptedBoxes boxes;
        RecordedPanel panel;
        QVERIFY_THROWS_EXCEPTION(QuotasError, run(panel));
        QVERIFY(!amount(kActive, first, "rend1").isNull());
        QVERIFY(amount(kActive, failing, "rend1").isNull());
        QVERIFY(amount(kActive, after, "rend1").isNull());
        QCOMPARE(panel.bars[1].value, 1);
        QVERIFY(!panel.playing);
        QVERIFY(RecordingProgress::log().calls.isEmpty());

        // Once the cause is gone, a new run completes, each bar from 0.
        stopFailing(c(), kActive);
        run(panel);
        QVERIFY(panel.finished);
        QCOMPARE(panel.bars[1].value, 3);
        QCOMPARE(panel.faults, QStringList());
    }
};

QTEST_GUILESS_MAIN(MaintenanceRunTest)
#include "tst_maintenance_run.moc"
