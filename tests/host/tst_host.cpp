// The stand-in host on both engines: a member's movements, a movement opened
// in the record window by a double click, and the key handed back.

#include "component/general.h"
#include "component/shared_objects.h"
#include "host/main_window.h"
#include "record/frm_quota.h"
#include "support/scripted_boxes.h"
#include "support/test_database.h"

#include <QApplication>
#include <QDate>
#include <QLineEdit>
#include <QPointer>
#include <QPushButton>
#include <QTableWidget>
#include <QTest>
#include <QTimer>

using namespace quotas;
using namespace quotas::test;

class HostTest : public QObject {
    Q_OBJECT

    std::unique_ptr<TestDatabase> db;
    std::unique_ptr<General> general;
    QVariant firstDue;
    QVariant secondDue;

    QVariant addMovement(int socio, int mes, double quota)
    {
        db->connection().execute(
            QStringLiteral("INSERT INTO tbQuotas_Movimentos (socio_id, data, ano, mes, tipo, ref, quota_no, rend1, rend2, "
                           "quota, pago) VALUES (?, ?, 2003, ?, 1, 'Sindicato', ?, 1000, 0, ?, 0)"),
            {socio, QDate(2003, mes, 5), mes, 40 + mes, quota});
        return db->connection().scalar(QStringLiteral("SELECT max(quota_id) FROM tbQuotas_Movimentos"));
    }

    static int rowOf(QTableWidget* table, const QString& text)
    {
        const auto found = table->findItems(text, Qt::MatchExactly);
        return found.isEmpty() ? -1 : found.first()->row();
    }

    // Runs script on the record window once it is up, and closes the window
    // if the script leaves it open; the returned timer polls until then.
    static std::unique_ptr<QTimer> whenRecordWindowShows(const std::function<void(FrmQuota&)>& script)
    {
        auto poll = std::make_unique<QTimer>();
        poll->setInterval(2);
        QObject::connect(poll.get(), &QTimer::timeout, [timer = poll.get(), script] {
            QPointer<FrmQuota> frm = qobject_cast<FrmQuota*>(shared().frmQuota.data());
            if (!frm || !frm->isVisible() || frm->Timer1->isActive())
                return;
            timer->stop();
            QApplication::setActiveWindow(frm);
            script(*frm);
            if (frm && frm->isVisible())
                frm->close();
        });
        poll->start();
        return poll;
    }

private slots:
    void initTestCase()
    {
        db = std::make_unique<TestDatabase>();
        db->login();
        general = std::make_unique<General>();
    }
    void cleanupTestCase()
    {
        general.reset();
        releaseShared();
        db.reset();
    }
    void init()
    {
        db->clear();
        db->connection().execute(QStringLiteral("INSERT INTO tbSocios (socio_id, no_tap, nome) VALUES "
                                                "(1, 'T1', 'Ana Sousa'), (2, 'T2', 'Rui Lopes')"));
        firstDue = addMovement(1, 1, 10.0);
        secondDue = addMovement(1, 2, 12.5);
        addMovement(2, 1, 7.0);
    }

    void selectingAMemberListsItsMovements()
    {
        host::MainWindow window(*general);
        window.refreshMembers();
        window.members()->setCurrentCell(rowOf(window.members(), QStringLiteral("Ana Sousa")), 1);
        QTableWidget* movements = window.movements();
        QCOMPARE(movements->rowCount(), 2);
        QStringList latest;
        for (int column = 0; column < movements->columnCount(); ++column)
            latest << movements->item(0, column)->text();
        QCOMPARE(latest, QStringList({"05-fev-2003", "2003", "2", "42", "Sindicato", "€ 1,000.00", "€ 0.00",
                                      "€ 12.50", "€ 0.00"}));
        window.members()->setCurrentCell(rowOf(window.members(), QStringLiteral("Rui Lopes")), 1);
        QCOMPARE(movements->rowCount(), 1);
        QVERIFY(!window.currentMovement().isValid());
    }

    void aDoubleClickedMovementOpensAndComesBackSelected()
    {
        host::MainWindow window(*general);
        window.refreshMembers();
        window.show();
        QVERIFY(QTest::qWaitForWindowExposed(&window));
        window.members()->setCurrentCell(rowOf(window.members(), QStringLiteral("Ana Sousa")), 1);
        QTableWidget* movements = window.movements();
        const int older = 1;  // the list shows the latest first
        ScriptedBoxes boxes;
        boxes.answerInput(QStringLiteral("4"));
        boxes.answerInput(QStringLiteral("R1"));
        QString shownMonth;
        const auto poll = whenRecordWindowShows([&](FrmQuota& frm) {
            shownMonth = frm.Text3->text();
            QTest::mouseClick(frm.Command2, Qt::LeftButton);
        });
        const QRect cell = movements->visualItemRect(movements->item(older, 0));
        // A double click is a click followed by the double-click event.
        QTest::mouseClick(movements->viewport(), Qt::LeftButton, {}, cell.center());
        QTest::mouseDClick(movements->viewport(), Qt::LeftButton, {}, cell.center());
        QCOMPARE(shownMonth, QStringLiteral("1"));
        QCOMPARE(window.currentMovement().toLongLong(), firstDue.toLongLong());
        QCOMPARE(movements->item(movements->currentRow(), 8)->text(), QStringLiteral("€ 4.00"));
        const int member = window.members()->currentRow();
        QCOMPARE(window.members()->item(member, 1)->text(), QStringLiteral("Ana Sousa"));
        QCOMPARE(window.members()->item(member, 3)->text(), QStringLiteral("€ 4.00"));
    }

    void remoteKeySelectsTheMovementHandedBack_data()
    {
        QTest::addColumn<bool>("deleted");
        QTest::newRow("present") << false;
        QTest::newRow("deleted meanwhile") << true;
    }

    void remoteKeySelectsTheMovementHandedBack()
    {
        QFETCH(bool, deleted);
        host::MainWindow window(*general);
        window.refreshMembers();
        window.members()->setCurrentCell(rowOf(window.members(), QStringLiteral("Ana Sousa")), 1);
        if (deleted)
            db->connection().execute(QStringLiteral("DELETE FROM tbQuotas_Movimentos WHERE quota_id = ?"), {secondDue});
        window.RemoteKey(secondDue);
        QCOMPARE(window.movements()->rowCount(), deleted ? 1 : 2);
        QCOMPARE(window.currentMovement().isValid(), !deleted);
        if (!deleted)
            QCOMPARE(window.currentMovement().toLongLong(), secondDue.toLongLong());
    }
};

QTEST_MAIN(HostTest)
#include "tst_host.moc"
