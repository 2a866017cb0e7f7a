// The record window driven as a user drives it: what it shows, editing the
// due's inputs, Sair's save step, closing without saving, the key handed back.

#include "component/shared_objects.h"
#include "record_fixture.h"

#include <QTest>

using namespace quotas;
using namespace quotas::test;

namespace {
const QString invalidValue = QStringLiteral("Tem de introduzir um valor válido neste campo.");
const QString belowPaid = QStringLiteral("Este valor não é válido porque resultou numa quota inferior à parte já liquidada.");
}  // namespace

class RecordWindowTest : public QObject {
    Q_OBJECT
    std::unique_ptr<TestDatabase> db;
    std::unique_ptr<RecordFixture> fx;

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
    }
    void cleanup() { QLocale::setDefault(QLocale::c()); }

    void showsTheMovementAndItsComputedFields_data()
    {
        QTest::addColumn<MovementRow>("row");
        QTest::addColumn<QString>("participacao");
        QTest::addColumn<QString>("porLiquidar");
        QTest::newRow("part paid") << MovementRow{600.0, 200.0, 10.0, 4.0} << "0.0125" << "€ 6.00";
        QTest::newRow("overpaid") << MovementRow{800.0, 0.0, 10.0, 12.5} << "0.0125" << "(€ 2.50)";
        QTest::newRow("no remunerations") << MovementRow{0.0, 0.0, 10.0, 0.0} << "0" << "€ 10.00";
        QTest::newRow("5 places, tie down") << MovementRow{400.0, 0.0, 0.05, 0.0} << "0.00012" << "€ 0.05";
        QTest::newRow("5 places, tie up") << MovementRow{400.0, 0.0, 0.15, 0.0} << "0.00038" << "€ 0.15";
        QTest::newRow("grouped") << MovementRow{1234567.0, 0.0, 1234567.0, 0.01} << "1" << "€ 1,234,566.99";
    }
    void showsTheMovementAndItsComputedFields()
    {
        QFETCH(MovementRow, row);
        QFETCH(QString, participacao);
        QFETCH(QString, porLiquidar);
        QVERIFY(fx->open(1, fx->addMovement(1, row), [&](FrmQuota& frm) {
            const QStringList shown{frm.windowTitle(), frm.Text1->text(),  frm.Text2->text(),  frm.Text3->text(),
                                    frm.Text4->text(), frm.Text7->text(),  frm.Text10->text(), frm.Text11->text(),
                                    frm.Text12->text(), frm.Text8->text(), frm.Text13->text()};
            QCOMPARE(shown, QStringList({"Quota", "05-mar-2003", "2003", "3", "703", "Sindicato", "T1",
                                         "Maria João Conceição 1", "Mimi", participacao, porLiquidar}));
        }));
    }

    void usesTheUsersNotation()
    {
        QLocale::setDefault(QLocale(QLocale::Portuguese, QLocale::Portugal));
        const QVariant id = fx->addMovement(1, {1234.5, 0.0, 18.52, 30.0, QStringLiteral("Seguro"), 2004, 12});
        QVERIFY(fx->open(1, id, [&](FrmQuota& frm) {
            QCOMPARE(frm.Text1->text(), QStringLiteral("05-dez-2004"));
            QCOMPARE(frm.Text5->text(), QStringLiteral("€ 1") + QLocale().groupSeparator() + QStringLiteral("234,50"));
            QCOMPARE(frm.Text8->text(), QStringLiteral("0,015"));
            QCOMPARE(frm.Text13->text(), QStringLiteral("(€ 11,48)"));
            // Entering shows the number itself, all of it selected.
            frm.Text5->setFocus(Qt::TabFocusReason);
            QCOMPARE(frm.Text5->text(), QStringLiteral("1234,5"));
            QCOMPARE(frm.Text5->selectedText(), frm.Text5->text());
            QTest::keyClicks(frm.Text5, QStringLiteral("2000,5"));
            RecordFixture::tabOut(frm.Text5);
            QCOMPARE(frm.Adodc1->value(QStringLiteral("quota")).toDouble(), 30.01);
        }));
    }

    void editingTheInputsOfTheDue_data()
    {
        QTest::addColumn<QString>("field");
        QTest::addColumn<QString>("typed");
        QTest::addColumn<MovementRow>("row");
        QTest::addColumn<QString>("message");
        QTest::addColumn<double>("quota");
        QTest::addColumn<QString>("porLiquidar");
        const MovementRow base{100.0, 200.0, 3.0, 0.0};  // participation 0.01
        const MovementRow paid15{100.0, 200.0, 3.0, 15.0};
        const MovementRow quarter{40.0, 0.0, 10.0, 12.0};  // participation 0.25
        QTest::newRow("empty") << "Text5" << "" << base << invalidValue << 3.0 << "€ 3.00";
        QTest::newRow("not a number") << "Text5" << "12x" << base << invalidValue << 3.0 << "€ 3.00";
        QTest::newRow("recomputed") << "Text5" << "1000" << base << QString() << 12.0 << "€ 12.00";
        QTest::newRow("below the paid part") << "Text5" << "1000" << paid15 << belowPaid << 3.0 << "(€ 12.00)";
        QTest::newRow("second remuneration") << "Text6" << "900" << base << QString() << 10.0 << "€ 10.00";
        QTest::newRow("equal to the paid part") << "Text5" << "48" << quarter << QString() << 12.0 << "€ 0.00";
        QTest::newRow("unrounded product compared") << "Text5" << "47.99" << quarter << belowPaid << 10.0 << "(€ 2.00)";
        QTest::newRow("tie to even cent, down") << "Text5" << "0.50" << MovementRow{1.0, 0.0, 0.25, 0.0} << QString()
                                                << 0.12 << "€ 0.12";
        QTest::newRow("tie to even cent, up") << "Text5" << "1.50" << MovementRow{1.0, 0.0, 0.25, 0.0} << QString()
                                              << 0.38 << "€ 0.38";
        // Single precision would make this 1234567.88.
        QTest::newRow("large amount keeps its cents") << "Text5" << "1234567.89" << MovementRow{1.0, 0.0, 1.0, 0.0}
                                                      << QString() << 1234567.89 << "€ 1,234,567.89";
        QTest::newRow("participation") << "Text8" << "0.02" << base << QString() << 6.0 << "€ 6.00";
        QTest::newRow("participation below paid") << "Text8" << "0.02" << paid15 << QString() << 6.0 << "(€ 9.00)";
        QTest::newRow("participation not a number") << "Text8" << "1%" << base << invalidValue << 3.0 << "€ 3.00";
        QTest::newRow("participation empty") << "Text8" << "" << base << invalidValue << 3.0 << "€ 3.00";
    }
    void editingTheInputsOfTheDue()
    {
        QFETCH(QString, field);
        QFETCH(QString, typed);
        QFETCH(MovementRow, row);
        QFETCH(QString, message);
        QFETCH(double, quota);
        QFETCH(QString, porLiquidar);
        const QVariant id = fx->addMovement(1, row);
        ScriptedBoxes boxes;
        QWidget* focusAtMessage = nullptr;
        boxes.onShow = [&](const ShownBox&) { focusAtMessage = QApplication::focusWidget(); };
        QVERIFY(fx->open(1, id, [&](FrmQuota& frm) {
            auto* edit = frm.findChild<QLineEdit*>(field);
            const QString participation = frm.Text8->text();
            RecordFixture::type(edit, typed);
            RecordFixture::tabOut(edit);
            QCOMPARE(frm.Adodc1->value(QStringLiteral("quota")).toDouble(), quota);
            QCOMPARE(frm.Text13->text(), porLiquidar);
            if (message.isEmpty()) {
                QCOMPARE(boxes.texts(), QStringList());
                QVERIFY(QApplication::focusWidget() != edit);
                if (edit != frm.Text8)  // the due follows; the participation stays
                    QCOMPARE(frm.Text8->text(), participation);
                return;
            }
            QCOMPARE(boxes.texts(), QStringList{message});
            QCOMPARE(boxes.last().icon, Icon::Information);
            QCOMPARE(boxes.last().title, QStringLiteral("Quotas"));
            QCOMPARE(focusAtMessage, edit);
            QCOMPARE(QApplication::focusWidget(), edit);
            QCOMPARE(edit->text(), typed);
        }));
        QCOMPARE(fx->movement(id, QStringLiteral("quota")).toDouble(), row.quota.toDouble());
    }

    void passingThroughAFieldChangesNothing()
    {
        // An imported due the shown participation (0.01500) does not give back.
        const QVariant id = fx->addMovement(1, {1234.56, 0.0, 18.52, 18.52});
        ScriptedBoxes boxes;
        QVERIFY(fx->open(1, id, [&](FrmQuota& frm) {
            frm.Text5->setFocus(Qt::TabFocusReason);
            for (QWidget* field : {frm.Text5, frm.Text6, frm.Text8})
                RecordFixture::tabOut(field);
            QCOMPARE(boxes.texts(), QStringList());
            QCOMPARE(QApplication::focusWidget(), frm.Text9);
            QCOMPARE(frm.Adodc1->value(QStringLiteral("quota")).toDouble(), 18.52);
            QCOMPARE(frm.Text5->text(), QStringLiteral("€ 1,234.56"));
        }));
    }

    void aButtonFirstValidatesTheFieldBeingEdited()
    {
        ScriptedBoxes boxes;
        QVERIFY(fx->open(1, fx->addMovement(1, {}), [&](FrmQuota& frm) {
            RecordFixture::type(frm.Text6, QStringLiteral("abc"));
            RecordFixture::click(frm.Command3);
            QCOMPARE(boxes.texts(), QStringList{invalidValue});
            QVERIFY(frm.isVisible());
            QCOMPARE(QApplication::focusWidget(), frm.Text6);
        }));
        QVERIFY(!fx->hasAccount(1));
    }

    void sairSavesTheMovementAndTheAccountsLastValues_data()
    {
        QTest::addColumn<QString>("ref");
        QTest::addColumn<bool>("hadAccount");
        QTest::addColumn<QString>("type");
        QTest::addColumn<QString>("other");
        QTest::newRow("new account") << "Sindicato" << false << "sindicato" << "seguro";
        QTest::newRow("existing account") << "Sindicato" << true << "sindicato" << "seguro";
        QTest::newRow("insurance") << "Seguro" << true << "seguro" << "sindicato";
        QTest::newRow("other letter case is insurance") << "sindicato" << true << "seguro" << "sindicato";
    }
    void sairSavesTheMovementAndTheAccountsLastValues()
    {
        QFETCH(QString, ref);
        QFETCH(bool, hadAccount);
        QFETCH(QString, type);
        QFETCH(QString, other);
        // An older movement than the last: Sair carries its values all the same.
        const QVariant id = fx->addMovement(1, {500.0, 300.1, 12.0, 0.1, ref, 2002, 7});
        fx->addMovement(1, {900.0, 0.0, 13.5, 0.0, QStringLiteral("Sindicato"), 2003, 1});
        if (hadAccount)
            fx->addAccount(1, 100.0, 40.0);
        QVERIFY(fx->open(1, id, [&](FrmQuota& frm) {
            RecordFixture::type(frm.Text5, QStringLiteral("700"));
            RecordFixture::click(frm.Command3);
            QVERIFY(!frm.isVisible());
        }));
        auto account = [&](const QString& column) { return fx->account(1, column).toDouble(); };
        QCOMPARE(fx->movement(id, QStringLiteral("rend1")).toDouble(), 700.0);
        QCOMPARE(fx->movement(id, QStringLiteral("quota")).toDouble(), 15.0);  // (700 + 300.1) x 0.015
        QCOMPARE(account(QStringLiteral("ult_rend1")), 700.0);
        QCOMPARE(account(QStringLiteral("ult_rend2")), 300.1);
        QCOMPARE(account(QStringLiteral("ult_quota_") + type), 15.0);
        QCOMPARE(account(QStringLiteral("ult_perc_") + type), 15.0 / 1000.1);
        QCOMPARE(account(QStringLiteral("ult_ano")), hadAccount ? 2001.0 : 2002.0);
        QCOMPARE(account(QStringLiteral("ult_mes")), hadAccount ? 11.0 : 7.0);
        QCOMPARE(account(QStringLiteral("total_quotas")), hadAccount ? 100.0 : 0.0);
        QCOMPARE(account(QStringLiteral("total_pago")), hadAccount ? 40.0 : 0.0);
        const QVariant otherDue = fx->account(1, QStringLiteral("ult_quota_") + other);
        QCOMPARE(otherDue.isNull(), !hadAccount);
        QCOMPARE(otherDue.toDouble(), hadAccount ? (other == QLatin1String("sindicato") ? 3.0 : 4.0) : 0.0);
    }

    void sairWithoutRemunerationsWritesRateZero()
    {
        QVERIFY(fx->open(1, fx->addMovement(1, {0.0, 0.0, 7.5, 0.0}),
                         [&](FrmQuota& frm) { RecordFixture::click(frm.Command3); }));
        QCOMPARE(fx->account(1, QStringLiteral("ult_quota_sindicato")).toDouble(), 7.5);
        QCOMPARE(fx->account(1, QStringLiteral("ult_perc_sindicato")).toDouble(), 0.0);
    }

    void theCloseControlSavesNothing()
    {
        const QVariant id = fx->addMovement(1, {100.0, 200.0, 3.0, 0.0});
        QVERIFY(fx->open(1, id, [&](FrmQuota& frm) {
            RecordFixture::type(frm.Text5, QStringLiteral("1000"));
            RecordFixture::tabOut(frm.Text5);
            QCOMPARE(frm.Text9->text(), QStringLiteral("€ 12.00"));
            frm.close();
        }));
        QCOMPARE(fx->movement(id, QStringLiteral("quota")).toDouble(), 3.0);
        QCOMPARE(fx->movement(id, QStringLiteral("rend1")).toDouble(), 100.0);
        QVERIFY(!fx->hasAccount(1));
        QTRY_VERIFY(shared().frmQuota.isNull());  // unloaded: the next Registo builds a fresh one
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
        const QVariant first = fx->addMovement(1, {100.0, 0.0, 1.0, 0.0, QStringLiteral("Sindicato"), 2003, 1});
        const QVariant second = fx->addMovement(1, {100.0, 0.0, 2.0, 0.0, QStringLiteral("Sindicato"), 2003, 2});
        RecordingCaller recording;
        recording.fail = caller == QLatin1String("failing");
        QObject silent;
        QObject* host = caller == QLatin1String("none") ? nullptr : caller == QLatin1String("silent") ? &silent : &recording;
        ScriptedBoxes boxes;
        QVERIFY(fx->open(
            1, known ? second : QVariant(second.toLongLong() + 100),
            [&](FrmQuota& frm) {
                QVERIFY(frm.GravarPendente);
                QCOMPARE(frm.Text3->text(), known ? QStringLiteral("2") : QStringLiteral("1"));
                RecordFixture::click(frm.Command3);
                QVERIFY(!frm.isVisible());
            },
            host));
        QCOMPARE(boxes.texts(), QStringList());
        QCOMPARE(recording.keys.size(), host == &recording ? 1 : 0);
        if (host == &recording)
            QCOMPARE(recording.keys[0].toLongLong(), (known ? second : first).toLongLong());
    }
};

QTEST_MAIN(RecordWindowTest)
#include "tst_record_window.moc"
