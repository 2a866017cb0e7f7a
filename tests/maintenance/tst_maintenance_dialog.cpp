// The maintenance dialog driven through its buttons: the layout it opens
// with, the finished state, a failure, "&Sair", a fresh dialog after closing,
// and the animation while the run works.

#include "component/shared_objects.h"
#include "maintenance/entry.h"
#include "maintenance/frm_manutencao_dados.h"
#include "maintenance_fixture.h"
#include "platform/animation.h"
#include "platform/components.h"
#include "support/recording_progress.h"
#include "support/scripted_boxes.h"
#include "support/test_database.h"

#include <QLabel>
#include <QProgressBar>
#include <QPushButton>
#include <QSignalSpy>
#include <QTemporaryDir>
#include <QTest>
#include <QThread>
#include <QTimer>

using namespace quotas;
using namespace quotas::test;

namespace {

const QString kAccounts = QStringLiteral("tbQuotas_Socios");
const QString kActive = QStringLiteral("tbQuotas_Movimentos");

// A progress display that takes its time, as a slow server would, and looks
// at the dialog's animation meanwhile.
class SlowProgress : public QObject {
    Q_OBJECT
public:
    static inline Animation* watched = nullptr;
    static inline bool playingDuringRun = false;

    Q_INVOKABLE void Iniciar(int, const QString&, const QString& = QString())
    {
        playingDuringRun = watched && watched->isPlaying();
        QThread::msleep(200);
    }
    Q_INVOKABLE void setvalor(int) {}
    Q_INVOKABLE void terminar() {}
};

QList<QProgressBar*> barsOf(FrmManutencaoDados& d)
{
    return {d.ProgressBar1, d.ProgressBar2, d.ProgressBar3, d.ProgressBar4, d.ProgressBar5};
}

}  // namespace

class MaintenanceDialogTest : public QObject {
    Q_OBJECT

    std::unique_ptr<TestDatabase> db;
    Connection& c() { return db->connection(); }

    void someData()
    {
        addAccount(c(), kAccounts, 1, 99, 99);
        addMovement(c(), kActive, 1, {null(), 0.0, 12.5, null()});
        addMovement(c(), kActive, 2, 3.2, 3.2);
        addMovement(c(), QStringLiteral("tbQuotas_Movimentos_Inactivos"), 3, 4, 0);
    }

    QString snapshot()
    {
        QStringList rows;
        for (const char* table : {"tbQuotas_Socios", "tbQuotas_Socios_Inactivos", "tbQuotas_Movimentos",
                                  "tbQuotas_Movimentos_Inactivos", "tbQuotas_Movimentos_Historico"}) {
            Recordset rs;
            rs.open(QStringLiteral("SELECT * FROM %1 ORDER BY 1").arg(QLatin1String(table)), c());
            for (; !rs.eof(); rs.moveNext()) {
                QStringList cells;
                for (int i = 0; i < rs.fieldCount(); ++i)
                    cells << (rs.value(i).isNull() ? QStringLiteral("NULL") : rs.value(i).toString());
                rows << QLatin1String(table) + u':' + cells.join(u'|');
            }
        }
        return rows.join(u'\n');
    }

    // Runs f on the shown dialog from inside its modal loop, and closes the
    // dialog after a while should f have left it open.
    static void whenShown(std::function<void(FrmManutencaoDados*)> f)
    {
        QTimer::singleShot(0, [f] {
            auto* d = qobject_cast<FrmManutencaoDados*>(shared().frmManutencaoDados.data());
            if (d)
                f(d);
        });
        QTimer::singleShot(5000, [] {
            if (QWidget* w = shared().frmManutencaoDados.data())
                w->close();
        });
    }

private slots:
    void initTestCase()
    {
        db = std::make_unique<TestDatabase>();
        db->login();
    }
    void cleanupTestCase() { db.reset(); }
    void init()
    {
        db->clear();
        stopFailing(c(), kAccounts);
        RecordingProgress::install();
    }
    void cleanup() { qunsetenv("QUOTAS_DATA_DIR"); }

    void opensIdle()
    {
        FrmManutencaoDados d;
        d.show();
        QCOMPARE(d.windowTitle(), QStringLiteral("Manutenção da Base de Dados"));
        QCOMPARE(d.size(), QSize(7725 / 15, 4290 / 15));
        const QList<QLabel*> labels = {d.Label1, d.Label2, d.Label3, d.Label4, d.Label5};
        const QList<QProgressBar*> bars = barsOf(d);
        for (int i = 0; i < 5; ++i) {
            QCOMPARE(bars[i]->minimum(), 0);
            QCOMPARE(bars[i]->maximum(), 100);
            QCOMPARE(bars[i]->value(), 0);
            // Each label stands directly above its bar, and the bars follow the passes down.
            QCOMPARE(labels[i]->x(), bars[i]->x());
            QVERIFY(labels[i]->geometry().bottom() < bars[i]->y());
            QVERIFY(i == 0 || bars[i - 1]->geometry().bottom() < labels[i]->y());
        }
        QCOMPARE(d.Label1->text(), QStringLiteral("Movimentos Activos:"));
        QCOMPARE(d.Label5->text(), QStringLiteral("Acumulados Inactivos:"));
        QVERIFY(d.Command1->isVisible() && d.Command2->isVisible());
        QCOMPARE(d.Command1->text(), QStringLiteral("&Iniciar"));
        QCOMPARE(d.Command2->text(), QStringLiteral("&Sair"));
        QVERIFY(!d.Animation1->isPlaying());
    }

    void completeRunEndsFinished()
    {
        someData();
        FrmManutencaoDados d;
        d.show();
        QVERIFY(QTest::qWaitForWindowExposed(&d));
        ScriptedBoxes boxes;
        bool exitFocused = false;
        bool startHidden = false;
        bool animationStopped = false;
        boxes.onShow = [&](const ShownBox&) {
            exitFocused = d.focusWidget() == d.Command2 && d.Command2->text() == QStringLiteral("&Fechar");
            startHidden = d.Command1->isHidden();
            animationStopped = !d.Animation1->isPlaying();
        };
        QTest::mouseClick(d.Command1, Qt::LeftButton);
        QCOMPARE(boxes.texts(), QStringList{QStringLiteral("Manutenção de Dados Concluída.")});
        QCOMPARE(boxes.last().title, QStringLiteral("Manutenção"));
        QCOMPARE(boxes.last().icon, Icon::Information);
        QVERIFY(exitFocused);
        QVERIFY(startHidden);
        QVERIFY(animationStopped);
        for (QProgressBar* bar : barsOf(d))
            QCOMPARE(bar->value(), bar->maximum());
        QCOMPARE(d.ProgressBar1->maximum(), 2);
        QVERIFY(d.isVisible());
        QVERIFY(sameCents(totalsOf(c(), kAccounts, 1).quotas, 12.5));
    }

    void failureLeavesTheButtonsAndSaysWhy()
    {
        someData();
        addAccount(c(), kAccounts, 2, 50, 20);
        failUpdates(c(), kAccounts, QStringLiteral("NEW.socio_id = 2 AND NEW.total_quotas <> 0"));
        FrmManutencaoDados d;
        d.show();
        ScriptedBoxes boxes;
        QTest::mouseClick(d.Command1, Qt::LeftButton);
        QCOMPARE(boxes.shown.size(), 1);
        QVERIFY2(boxes.last().text.startsWith(QStringLiteral("A manutenção de dados foi interrompida em \"Acumulados Activos\"")),
                 qPrintable(boxes.last().text));
        QCOMPARE(boxes.last().icon, Icon::Critical);
        QCOMPARE(boxes.last().title, QStringLiteral("Manutenção"));
        QVERIFY(d.Command1->isVisible());
        QCOMPARE(d.Command2->text(), QStringLiteral("&Sair"));
        QVERIFY(!d.Animation1->isPlaying());
        QCOMPARE(d.ProgressBar5->value(), 0);
        QVERIFY(sameCents(totalsOf(c(), kAccounts, 2).quotas, 50));

        // "&Iniciar" is still there for another try.
        stopFailing(c(), kAccounts);
        QTest::mouseClick(d.Command1, Qt::LeftButton);
        QCOMPARE(boxes.last().text, QStringLiteral("Manutenção de Dados Concluída."));
        QVERIFY(sameCents(totalsOf(c(), kAccounts, 2).quotas, 3.2));
        for (QProgressBar* bar : barsOf(d))
            QCOMPARE(bar->value(), bar->maximum());
    }

    void sairChangesNothing()
    {
        someData();
        const QString before = snapshot();
        ScriptedBoxes boxes;
        whenShown([](FrmManutencaoDados* d) { QTest::mouseClick(d->Command2, Qt::LeftButton); });
        showMaintenanceDialog();
        QVERIFY(shared().frmManutencaoDados.isNull());
        QCOMPARE(snapshot(), before);
        QCOMPARE(RecordingProgress::log().created, 0);
        QVERIFY(boxes.shown.isEmpty());
    }

    void closingUnloadsSoTheNextCallIsFresh()
    {
        someData();
        ScriptedBoxes boxes;
        whenShown([](FrmManutencaoDados* d) {
            QTest::mouseClick(d->Command1, Qt::LeftButton);
            // The focus is on "&Fechar": the space bar presses it.
            QTest::keyClick(d->focusWidget(), Qt::Key_Space);
        });
        showMaintenanceDialog();
        QCOMPARE(boxes.texts(), QStringList{QStringLiteral("Manutenção de Dados Concluída.")});
        QVERIFY(shared().frmManutencaoDados.isNull());

        bool fresh = false;
        whenShown([&](FrmManutencaoDados* d) {
            fresh = d->Command1->isVisible() && d->Command2->text() == QStringLiteral("&Sair");
            for (QProgressBar* bar : barsOf(*d))
                fresh = fresh && bar->value() == 0 && bar->maximum() == 100;
            QTest::mouseClick(d->Command2, Qt::LeftButton);
        });
        showMaintenanceDialog();
        QVERIFY(fresh);
    }

    void animationMovesWhileTheRunWorks()
    {
        someData();
        registerComponent(QStringLiteral("Velumo.General"), [] { return std::make_unique<SlowProgress>(); });
        FrmManutencaoDados d;
        d.show();
        SlowProgress::watched = d.Animation1;
        QSignalSpy frames(d.Animation1, &Animation::frameChanged);
        ScriptedBoxes boxes;
        QTest::mouseClick(d.Command1, Qt::LeftButton);
        SlowProgress::watched = nullptr;
        QCOMPARE(boxes.texts(), QStringList{QStringLiteral("Manutenção de Dados Concluída.")});
        QVERIFY(SlowProgress::playingDuringRun);
        // The first frame when it starts, then at least one tick in the run.
        QVERIFY2(frames.size() >= 2, qPrintable(QString::number(frames.size())));
        QVERIFY(!d.Animation1->isPlaying());
    }

    void missingClipDoesNotStopTheRun()
    {
        someData();
        QTemporaryDir empty;
        qputenv("QUOTAS_DATA_DIR", empty.path().toLocal8Bit());
        FrmManutencaoDados d;
        d.show();
        ScriptedBoxes boxes;
        QTest::mouseClick(d.Command1, Qt::LeftButton);
        QCOMPARE(boxes.texts(), QStringList{QStringLiteral("Manutenção de Dados Concluída.")});
        QVERIFY(!d.Animation1->isOpen());
        QVERIFY(d.Command1->isHidden());
    }
};

QTEST_MAIN(MaintenanceDialogTest)
#include "tst_maintenance_dialog.moc"
