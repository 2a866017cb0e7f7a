// The record window driven as a user drives it: what it shows, editing the
// due's inputs with each refusal keeping the focus, and the key handed back.

#include "record_fixture.h"

using namespace quotas;
using namespace quotas::test;

namespace {
const QString invalid = u"Quotas (i) Tem de introduzir um valor válido neste campo."_s;
const QString belowPaid = u"Quotas (i) Este valor não é válido porque resultou numa quota inferior à parte já liquidada."_s;
}  // namespace

class RecordWindowTest : public RecordTest {
    Q_OBJECT
private slots:
    void cleanup() { QLocale::setDefault(QLocale::c()); }

    void showsTheMovementAndItsComputedFields_data()
    {
        QTest::addColumn<QString>("locale");
        QTest::addColumn<MovementRow>("row");
        QTest::addColumn<QStringList>("shown");  // date, rend1, participation, unpaid part
        QTest::newRow("part paid") << "C" << MovementRow{600.0, 200.0, 10.0, 4.0} << QStringList{"05-mar-2003", "€ 600.00", "0.0125", "€ 6.00"};
        QTest::newRow("overpaid") << "C" << MovementRow{800.0, 0.0, 10.0, 12.5} << QStringList{"05-mar-2003", "€ 800.00", "0.0125", "(€ 2.50)"};
        QTest::newRow("no remunerations") << "C" << MovementRow{0.0, 0.0, 10.0, 0.0} << QStringList{"05-mar-2003", "€ 0.00", "0", "€ 10.00"};
        QTest::newRow("5 places, tie down") << "C" << MovementRow{400.0, 0.0, 0.05, 0.0} << QStringList{"05-mar-2003", "€ 400.00", "0.00012", "€ 0.05"};
        QTest::newRow("5 places, tie up") << "C" << MovementRow{400.0, 0.0, 0.15, 0.0} << QStringList{"05-mar-2003", "€ 400.00", "0.00038", "€ 0.15"};
        QTest::newRow("grouped") << "C" << MovementRow{1234567.0, 0.0, 1234567.0, 0.01} << QStringList{"05-mar-2003", "€ 1,234,567.00", "1", "€ 1,234,566.99"};
        QTest::newRow("the user's notation") << "pt_PT" << MovementRow{1234.5, 0.0, 18.52, 30.0, u"Seguro"_s, 2004, 12}
                                             << QStringList{"05-dez-2004", "€ 1\u00a0234,50", "0,015", "(€ 11,48)"};
    }
    void showsTheMovementAndItsComputedFields()
    {
        QFETCH(QString, locale);
        QFETCH(MovementRow, row);
        QFETCH(QStringList, shown);
        QLocale::setDefault(QLocale(locale));
        QVERIFY(open(addMovement(1, row), [&](FrmQuota& frm) {
            QCOMPARE((QStringList{frm.Text1->text(), frm.Text5->text(), frm.Text8->text(), frm.Text13->text()}), shown);
            QCOMPARE((QStringList{frm.windowTitle(), frm.Text2->text(), frm.Text3->text(), frm.Text4->text(), frm.Text7->text(),
                                  frm.Text10->text(), frm.Text11->text(), frm.Text12->text()}),
                     (QStringList{"Quota", QString::number(row.ano), QString::number(row.mes), QString::number(700 + row.mes),
                                  row.ref, "T1", "Maria João Conceição 1", "Mimi"}));
        }));
    }

    void editingTheInputsOfTheDue_data()
    {
        QTest::addColumn<QString>("locale");
        QTest::addColumn<QString>("field");
        QTest::addColumn<QString>("typed");
        QTest::addColumn<MovementRow>("row");
        QTest::addColumn<QString>("message");
        QTest::addColumn<double>("quota");
        QTest::addColumn<QString>("porLiquidar");
        const auto row = [](const char* tag, const char* field, const char* typed, const MovementRow& r, const QString& message,
                            double quota, const char* unpaid, const char* locale = "C") {
            QTest::newRow(tag) << QString::fromUtf8(locale) << QString::fromUtf8(field) << QString::fromUtf8(typed) << r << message
                               << quota << QString::fromUtf8(unpaid);
        };
        const MovementRow base{100.0, 200.0, 3.0, 0.0};  // participation 0.01
        const MovementRow paid15{100.0, 200.0, 3.0, 15.0};
        const MovementRow quarter{40.0, 0.0, 10.0, 12.0};  // participation 0.25
        row("empty", "Text5", "", base, invalid, 3.0, "€ 3.00");
        row("not a number", "Text5", "12x", base, invalid, 3.0, "€ 3.00");
        row("recomputed", "Text5", "1000", base, {}, 12.0, "€ 12.00");
        row("below the paid part", "Text5", "1000", paid15, belowPaid, 3.0, "(€ 12.00)");
        row("second remuneration", "Text6", "900", base, {}, 10.0, "€ 10.00");
        row("equal to the paid part", "Text5", "48", quarter, {}, 12.0, "€ 0.00");
        row("unrounded product compared", "Text5", "47.99", quarter, belowPaid, 10.0, "(€ 2.00)");
        row("tie to even cent, down", "Text5", "0.50", {1.0, 0.0, 0.25, 0.0}, {}, 0.12, "€ 0.12");
        row("tie to even cent, up", "Text5", "1.50", {1.0, 0.0, 0.25, 0.0}, {}, 0.38, "€ 0.38");
        // Single precision would make this 1234567.88.
        row("large amount keeps its cents", "Text5", "1234567.89", {1.0, 0.0, 1.0, 0.0}, {}, 1234567.89, "€ 1,234,567.89");
        row("participation", "Text8", "0.02", base, {}, 6.0, "€ 6.00");
        row("participation below paid", "Text8", "0.02", paid15, {}, 6.0, "(€ 9.00)");
        row("participation not a number", "Text8", "1%", base, invalid, 3.0, "€ 3.00");
        row("participation empty", "Text8", "", base, invalid, 3.0, "€ 3.00");
        row("the user's notation", "Text5", "2000,5", {1234.5, 0.0, 18.52, 30.0}, {}, 30.01, "€ 0,01", "pt_PT");
    }
    void editingTheInputsOfTheDue()
    {
        QFETCH(QString, locale);
        QFETCH(QString, field);
        QFETCH(QString, typed);
        QFETCH(MovementRow, row);
        QFETCH(QString, message);
        QFETCH(double, quota);
        QFETCH(QString, porLiquidar);
        QLocale::setDefault(QLocale(locale));
        const QVariant id = addMovement(1, row);
        ScriptedBoxes boxes;
        QWidget* focusAtMessage = nullptr;
        boxes.onShow = [&](const ShownBox&) { focusAtMessage = QApplication::focusWidget(); };
        QVERIFY(open(id, [&](FrmQuota& frm) {
            auto* edit = frm.findChild<QLineEdit*>(field);
            const QString participation = frm.Text8->text();
            type(edit, typed);
            tabOut(edit);
            QCOMPARE(frm.Adodc1->value(u"quota"_s).toDouble(), quota);
            QCOMPARE(frm.Text13->text(), porLiquidar);
            QCOMPARE(described(boxes), message.isEmpty() ? QStringList() : QStringList{message});
            // A refusal keeps the focus and the text typed; the participation follows only its own field.
            QCOMPARE(QApplication::focusWidget() == edit, !message.isEmpty());
            QCOMPARE(focusAtMessage, message.isEmpty() ? nullptr : edit);
            if (!message.isEmpty())
                QCOMPARE(edit->text(), typed);
            else if (edit != frm.Text8)
                QCOMPARE(frm.Text8->text(), participation);
        }));
        QCOMPARE(movement(id, u"quota"_s), u"quota=%1"_s.arg(row.quota.toDouble()));  // nothing saved
    }

    void passingThroughTheFieldsChangesNothing()
    {
        // An imported due that the shown participation (0.01235) does not give back.
        ScriptedBoxes boxes;
        QVERIFY(open(addMovement(1, {100000.5, 0.0, 1234.57, 0.0}), [&](FrmQuota& frm) {
            frm.Text5->setFocus(Qt::TabFocusReason);
            QCOMPARE(frm.Text5->text(), u"100000.5"_s);  // entering shows the number itself, all of it selected
            QCOMPARE(frm.Text5->selectedText(), frm.Text5->text());
            for (QWidget* field : {frm.Text5, frm.Text6, frm.Text8})
                tabOut(field);
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
        QTest::newRow("unknown key: first row") << "recording" << false;
        QTest::newRow("no caller") << "none" << true;
        QTest::newRow("caller without RemoteKey") << "silent" << true;
        QTest::newRow("RemoteKey fails") << "failing" << true;
    }
    void closingHandsTheKeyToTheCaller()
    {
        QFETCH(QString, caller);
        QFETCH(bool, known);
        const QVariant first = addMovement(1, {100.0, 0.0, 1.0, 0.0, u"Sindicato"_s, 2003, 1});
        const QVariant second = addMovement(1, {100.0, 0.0, 2.0, 0.0, u"Sindicato"_s, 2003, 2});
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
