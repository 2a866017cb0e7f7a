// The record window driven as a user drives it: what it shows, editing the
// due's inputs with each refusal keeping the focus, and the key handed back.

#include "record_fixture.h"

using namespace quotas;
using namespace quotas::test;

namespace {
const QString invalid = u"Quotas (information) Tem de introduzir um valor válido neste campo."_s;
const QString belowPaid = u"Quotas (information) Este valor não é válido porque resultou numa quota inferior à parte já liquidada."_s;

struct Edit {
    MovementRow row;
    const char* field;  // "" only shows the movement
    const char* typed;
    QString message;               // the refusal, if any
    double quota;                  // the due then
    QStringList shown;             // rend1, participation, unpaid part
    const char* locale = "C";
};
}  // namespace
Q_DECLARE_METATYPE(Edit)

class RecordWindowTest : public RecordTest {
    Q_OBJECT
private slots:
    void cleanup() { QLocale::setDefault(QLocale::c()); }

    void showsAndEditsTheDue_data()
    {
        QTest::addColumn<Edit>("edit");
        const MovementRow base{100.0, 200.0, 3.0, 0.0};  // participation 0.01
        const MovementRow paid15{100.0, 200.0, 3.0, 15.0};
        const MovementRow quarter{40.0, 0.0, 10.0, 12.0};  // participation 0.25
        const MovementRow portuguese{1234.5, 0.0, 18.52, 30.0, u"Seguro"_s, 2004, 12};
        const auto row = [](const char* tag, const Edit& e) { QTest::newRow(tag) << e; };
        row("part paid", {{600.0, 200.0, 10.0, 4.0}, "", "", {}, 10.0, {"€ 600.00", "0.0125", "€ 6.00"}});
        row("overpaid", {{800.0, 0.0, 10.0, 12.5}, "", "", {}, 10.0, {"€ 800.00", "0.0125", "(€ 2.50)"}});
        row("no remunerations", {{0.0, 0.0, 10.0, 0.0}, "", "", {}, 10.0, {"€ 0.00", "0", "€ 10.00"}});
        row("5 places, tie down", {{400.0, 0.0, 0.05, 0.0}, "", "", {}, 0.05, {"€ 400.00", "0.00012", "€ 0.05"}});
        row("5 places, tie up", {{400.0, 0.0, 0.15, 0.0}, "", "", {}, 0.15, {"€ 400.00", "0.00038", "€ 0.15"}});
        row("grouped", {{1234567.0, 0.0, 1234567.0, 0.01}, "", "", {}, 1234567.0, {"€ 1,234,567.00", "1", "€ 1,234,566.99"}});
        row("in the user's notation", {portuguese, "", "", {}, 18.52, {"€ 1\u00a0234,50", "0,015", "(€ 11,48)"}, "pt_PT"});
        row("typed in the user's notation", {portuguese, "Text5", "2000,5", {}, 30.01, {"€ 2\u00a0000,50", "0,015", "€ 0,01"}, "pt_PT"});
        row("empty", {base, "Text5", "", invalid, 3.0, {"", "0.01", "€ 3.00"}});
        row("not a number", {base, "Text5", "12x", invalid, 3.0, {"12x", "0.01", "€ 3.00"}});
        row("recomputed", {base, "Text5", "1000", {}, 12.0, {"€ 1,000.00", "0.01", "€ 12.00"}});
        row("below the paid part", {paid15, "Text5", "1000", belowPaid, 3.0, {"1000", "0.01", "(€ 12.00)"}});
        row("second remuneration", {base, "Text6", "900", {}, 10.0, {"€ 100.00", "0.01", "€ 10.00"}});
        row("equal to the paid part", {quarter, "Text5", "48", {}, 12.0, {"€ 48.00", "0.25", "€ 0.00"}});
        row("unrounded product compared", {quarter, "Text5", "47.99", belowPaid, 10.0, {"47.99", "0.25", "(€ 2.00)"}});
        row("tie to even cent, down", {{1.0, 0.0, 0.25, 0.0}, "Text5", "0.50", {}, 0.12, {"€ 0.50", "0.25", "€ 0.12"}});
        row("tie to even cent, up", {{1.0, 0.0, 0.25, 0.0}, "Text5", "1.50", {}, 0.38, {"€ 1.50", "0.25", "€ 0.38"}});
        // Single precision would make this 1234567.88.
        row("large amount keeps its cents", {{1.0, 0.0, 1.0, 0.0}, "Text5", "1234567.89", {}, 1234567.89, {"€ 1,234,567.89", "1", "€ 1,234,567.89"}});
        row("participation", {base, "Text8", "0.02", {}, 6.0, {"€ 100.00", "0.02", "€ 6.00"}});
        row("participation below paid", {paid15, "Text8", "0.02", {}, 6.0, {"€ 100.00", "0.02", "(€ 9.00)"}});
        row("participation not a number", {base, "Text8", "1%", invalid, 3.0, {"€ 100.00", "1%", "€ 3.00"}});
        row("participation empty", {base, "Text8", "", invalid, 3.0, {"€ 100.00", "", "€ 3.00"}});
    }
    void showsAndEditsTheDue()
    {
        QFETCH(Edit, edit);
        QLocale::setDefault(QLocale(QString::fromLatin1(edit.locale)));
        const QVariant id = addMovement(edit.row);
        ScriptedBoxes boxes;
        QWidget* focusAtMessage = nullptr;
        boxes.onShow = [&](const ShownBox&) { focusAtMessage = QApplication::focusWidget(); };
        QVERIFY(open(id, [&](FrmQuota& frm) {
            const MovementRow& r = edit.row;
            QCOMPARE((QStringList{frm.windowTitle(), frm.Text1->text(), frm.Text2->text(), frm.Text3->text(), frm.Text4->text(),
                                  frm.Text7->text(), frm.Text10->text(), frm.Text11->text(), frm.Text12->text()}),
                     (QStringList{"Quota", r.ano == 2004 ? "05-dez-2004" : "05-mar-2003",
                                  QString::number(r.ano), QString::number(r.mes), QString::number(700 + r.mes), r.ref, "T1",
                                  "Maria João Conceição 1", "Mimi"}));
            auto* field = frm.findChild<QLineEdit*>(QString::fromLatin1(edit.field));
            if (field) {
                type(field, QString::fromUtf8(edit.typed));
                QTest::keyClick(field, Qt::Key_Tab);
                // A refusal keeps the focus, before and after its message.
                QCOMPARE(QApplication::focusWidget() == field, !edit.message.isEmpty());
                QCOMPARE(focusAtMessage, edit.message.isEmpty() ? nullptr : field);
            }
            QCOMPARE(frm.Adodc1->value(u"quota"_s).toDouble(), edit.quota);
            QCOMPARE((QStringList{frm.Text5->text(), frm.Text8->text(), frm.Text13->text()}), edit.shown);
        }));
        QCOMPARE(described(boxes), edit.message.isEmpty() ? QStringList() : QStringList{edit.message});
        QCOMPARE(read(u"quota"_s, id), u"quota="_s + QString::number(edit.row.quota.toDouble(), 'g', 12));  // nothing saved
    }

    void passingThroughTheFieldsChangesNothing()
    {
        // An imported due that the shown participation (0.01235) does not give back.
        ScriptedBoxes boxes;
        QVERIFY(open(addMovement({100000.5, 0.0, 1234.57, 0.0}), [&](FrmQuota& frm) {
            frm.Text5->setFocus(Qt::TabFocusReason);
            QCOMPARE(frm.Text5->text(), u"100000.5"_s);  // entering shows the number itself, all of it selected
            QCOMPARE(frm.Text5->selectedText(), frm.Text5->text());
            for (QWidget* field : {frm.Text5, frm.Text6, frm.Text8})
                QTest::keyClick(field, Qt::Key_Tab);
            QCOMPARE(QApplication::focusWidget(), frm.Text9);
            QCOMPARE(frm.Adodc1->value(u"quota"_s).toDouble(), 1234.57);
            QCOMPARE(frm.Text5->text(), u"€ 100,000.50"_s);
        }));
        QCOMPARE(boxes.shown.size(), 0);
    }

    void closingHandsTheKeyToTheCaller_data()
    {
        QTest::addColumn<QString>("caller");
        QTest::addColumn<bool>("known");  // the host's key is among the rows
        QTest::newRow("on the host's movement") << "recording" << true;
        QTest::newRow("unknown key: first row") << "recording" << false;
        QTest::newRow("no caller") << "none" << true;
        QTest::newRow("caller without RemoteKey") << "silent" << true;
        QTest::newRow("RemoteKey fails") << "failing" << true;
    }
    void closingHandsTheKeyToTheCaller()
    {
        QFETCH(QString, caller);
        QFETCH(bool, known);
        const QVariant first = addMovement({100.0, 0.0, 1.0, 0.0, u"Sindicato"_s, 2003, 1});
        const QVariant second = addMovement({100.0, 0.0, 2.0, 0.0, u"Sindicato"_s, 2003, 2});
        RecordingCaller recording;
        recording.fail = caller == "failing"_L1;
        QObject silent;
        QObject* host = caller == "none"_L1 ? nullptr : caller == "silent"_L1 ? &silent : &recording;
        ScriptedBoxes boxes;
        QVERIFY(open(known ? second : QVariant(second.toLongLong() + 100), [&](FrmQuota& frm) {
            QCOMPARE(frm.Text3->text(), known ? u"2"_s : u"1"_s);
            click(frm.Command3);
            QVERIFY(!frm.isVisible());
        }, host));
        QCOMPARE(boxes.shown.size(), 0);
        QCOMPARE(recording.keys, host == &recording ? QVariantList{known ? second : first} : QVariantList());
    }
};

QTEST_MAIN(RecordWindowTest)
#include "tst_record_window.moc"
