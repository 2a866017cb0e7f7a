// The stand-in host: a member's movements, one opened in the record window by
// a double click, and the key handed back.

#include "host/main_window.h"
#include "record_fixture.h"

#include <QTableWidget>

using namespace quotas;
using namespace quotas::test;

class HostTest : public RecordTest {
    Q_OBJECT
private slots:
    void listsTheMovementsAndTakesBackTheOneThatClosed()
    {
        const QVariant january = addMovement({1000.0, 0.0, 10.0, 0.0, u"Sindicato"_s, 2003, 1});
        const QVariant february = addMovement({1000.0, 250.0, 12.5, 0.0, u"Sindicato"_s, 2003, 2});
        db->connection().execute(u"UPDATE tbQuotas_Movimentos SET socio_id = 2 WHERE quota_id = ?"_s, {addMovement({})});
        General general;
        host::MainWindow window(general);
        window.refreshMembers();
        window.show();
        QVERIFY(QTest::qWaitForWindowExposed(&window));
        QTableWidget* movements = window.movements();
        window.members()->setCurrentCell(1, 1);  // T2
        QCOMPARE(movements->rowCount(), 1);
        window.members()->setCurrentCell(0, 1);  // T1, its latest movement first
        QStringList latest;
        for (int column = 0; column < movements->columnCount(); ++column)
            latest << movements->item(0, column)->text();
        QCOMPARE(latest, (QStringList{"05-fev-2003", "2003", "2", "702", "Sindicato", "€ 1,000.00", "€ 250.00", "€ 12.50", "€ 0.00"}));

        // The older one double-clicked (a click, then the double-click event), paid 4 and closed.
        ScriptedBoxes boxes;
        boxes.answerInput(u"4"_s);
        boxes.answerInput(u"R1"_s);
        const QPoint older = movements->visualItemRect(movements->item(1, 0)).center();
        QVERIFY(drive([&] {
            QTest::mouseClick(movements->viewport(), Qt::LeftButton, {}, older);
            QTest::mouseDClick(movements->viewport(), Qt::LeftButton, {}, older);
        }, [&](FrmQuota& frm) { click(frm.Command2); }));
        QCOMPARE(read(u"pago"_s, january), u"pago=4"_s);
        QCOMPARE(window.currentMovement(), january);  // selected again, both lists refreshed
        QCOMPARE(movements->item(movements->currentRow(), 8)->text() + window.members()->item(window.members()->currentRow(), 3)->text(),
                 u"€ 4.00€ 4.00"_s);

        // A key handed back is selected; a cancelled movement is gone from the list, with nothing selected.
        window.RemoteKey(february);
        QCOMPARE(window.currentMovement(), february);
        db->connection().execute(u"DELETE FROM tbQuotas_Movimentos WHERE quota_id = ?"_s, {february});
        window.RemoteKey(february);
        QCOMPARE(movements->rowCount(), 1);
        QVERIFY(!window.currentMovement().isValid());
    }
};

QTEST_MAIN(HostTest)
#include "tst_host.moc"
