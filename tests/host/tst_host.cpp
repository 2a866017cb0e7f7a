// The stand-in host: a member's movements, one opened in the record window by
// a double click, and the key handed back.

#include "component/shared_objects.h"
#include "host/main_window.h"
#include "record_fixture.h"

#include <QPointer>
#include <QTableWidget>
#include <QTest>
#include <QTimer>

using namespace quotas;
using namespace quotas::test;

class HostTest : public QObject {
    Q_OBJECT
    std::unique_ptr<TestDatabase> db;
    std::unique_ptr<RecordFixture> fx;
    QVariant january, february;

    static void select(host::MainWindow& window, int socio)
    {
        const auto found = window.members()->findItems(QStringLiteral("T%1").arg(socio), Qt::MatchExactly);
        window.members()->setCurrentCell(found.first()->row(), 1);
    }

private slots:
    void initTestCase()
    {
        db = std::make_unique<TestDatabase>();
        db->login();
        fx = std::make_unique<RecordFixture>(*db);
    }
    void cleanupTestCase()
    {
        fx.reset();
        releaseShared();
    }
    void init()
    {
        db->clear();
        fx->addMember(1);
        fx->addMember(2);
        january = fx->addMovement(1, {1000.0, 0.0, 10.0, 0.0, QStringLiteral("Sindicato"), 2003, 1});
        february = fx->addMovement(1, {1000.0, 250.0, 12.5, 0.0, QStringLiteral("Sindicato"), 2003, 2});
        fx->addMovement(2, {});
    }

    void selectingAMemberListsItsMovements()
    {
        host::MainWindow window(fx->general);
        window.refreshMembers();
        select(window, 1);
        QTableWidget* movements = window.movements();
        QCOMPARE(movements->rowCount(), 2);
        QStringList latest;
        for (int column = 0; column < movements->columnCount(); ++column)
            latest << movements->item(0, column)->text();
        QCOMPARE(latest, QStringList({"05-fev-2003", "2003", "2", "702", "Sindicato", "€ 1,000.00", "€ 250.00",
                                      "€ 12.50", "€ 0.00"}));
        select(window, 2);
        QCOMPARE(movements->rowCount(), 1);
    }

    void aDoubleClickedMovementOpensAndComesBackSelected()
    {
        host::MainWindow window(fx->general);
        window.refreshMembers();
        window.show();
        QVERIFY(QTest::qWaitForWindowExposed(&window));
        select(window, 1);
        ScriptedBoxes boxes;
        boxes.answerInput(QStringLiteral("4"));
        boxes.answerInput(QStringLiteral("R1"));
        QString shownMonth;
        QTimer poll;  // drives the record window once it is up
        connect(&poll, &QTimer::timeout, [&] {
            QPointer<FrmQuota> frm = qobject_cast<FrmQuota*>(shared().frmQuota.data());
            if (!frm || !frm->isVisible() || frm->Timer1->isActive())
                return;
            poll.stop();
            shownMonth = frm->Text3->text();
            RecordFixture::click(frm->Command2);
        });
        poll.start(2);
        QTableWidget* movements = window.movements();
        const QPoint older = movements->visualItemRect(movements->item(1, 0)).center();
        // A double click is a click followed by the double-click event.
        QTest::mouseClick(movements->viewport(), Qt::LeftButton, {}, older);
        QTest::mouseDClick(movements->viewport(), Qt::LeftButton, {}, older);
        QCOMPARE(shownMonth, QStringLiteral("1"));
        QCOMPARE(window.currentMovement().toLongLong(), january.toLongLong());
        QCOMPARE(movements->item(movements->currentRow(), 8)->text(), QStringLiteral("€ 4.00"));
        QCOMPARE(window.members()->item(window.members()->currentRow(), 3)->text(), QStringLiteral("€ 4.00"));
    }

    void remoteKeySelectsTheMovementHandedBack()
    {
        host::MainWindow window(fx->general);
        window.refreshMembers();
        select(window, 1);
        window.RemoteKey(february);
        QCOMPARE(window.currentMovement().toLongLong(), february.toLongLong());
        // A cancelled movement is gone from the list, with nothing selected.
        db->connection().execute(QStringLiteral("DELETE FROM tbQuotas_Movimentos WHERE quota_id = ?"), {february});
        window.RemoteKey(february);
        QCOMPARE(window.movements()->rowCount(), 1);
        QVERIFY(!window.currentMovement().isValid());
    }
};

QTEST_MAIN(HostTest)
#include "tst_host.moc"
