// The record window on both engines, driven as a user drives it: what it
// shows, the editing of the due's inputs, the save step on Sair, closing
// without saving, and the key handed back to the host.

#include "component/shared_objects.h"
#include "record_fixture.h"

#include <QLineEdit>
#include <QPushButton>
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
        db.reset();
    }
    void init()
    {
        db->clear();
        fx->addMember(1);
    }
    void cleanup() { QLocale::setDefault(QLocale::c()); }

    void showsTheMovementAndItsComputedFields_data()
    {
        QTest::addColumn<QVariant>("rend1");
        QTest::addColumn<QVariant>("rend2");
        QTest::addColumn<QVariant>("quota");
        QTest::addColumn<QVariant>("pago");
        QTest::addColumn<QString>("participacao");
        QTest::addColumn<QString>("porLiquidar");
        QTest::newRow("part paid") << QVariant(600.0) << QVariant(200.0) << QVariant(10.0) << QVariant(4.0)
                                   << "0.0125" << "€ 6.00";
        QTest::newRow("overpaid") << QVariant(800.0) << QVariant(0.0) << QVariant(10.0) << QVariant(12.5) << "0.0125"
                                  << "(€ 2.50)";
        QTest::newRow("no remunerations") << QVariant(0.0) << QVariant(0.0) << QVariant(10.0) << QVariant(0.0) << "0"
                                          << "€ 10.00";
        QTest::newRow("5 places, tie to even down") << QVariant(400.0) << QVariant(0.0) << QVariant(0.05)
                                                    << QVariant(0.0) << "0.00012" << "€ 0.05";
        QTest::newRow("5 places, tie to even up") << QVariant(400.0) << QVariant(0.0) << QVariant(0.15)
                                                  << QVariant(0.0) << "0.00038" << "€ 0.15";
        QTest::newRow("large, grouped") << QVariant(1234567.0) << QVariant(0.0) << QVariant(1234567.0)
                                        << QVariant(0.01) << "1" << "€ 1,234,566.99";
    }

    void showsTheMovementAndItsComputedFields()
    {
        QFETCH(QVariant, rend1);
        QFETCH(QVariant, rend2);
        QFETCH(QVariant, quota);
        QFETCH(QVariant, pago);
        QFETCH(QString, participacao);
        QFETCH(QString, porLiquidar);
        const QVariant id = fx->addMovement(1, {rend1, rend2, quota, pago});
        QVERIFY(fx->open(1, id, [&](FrmQuota& frm) {
            QCOMPARE(frm.windowTitle(), QStringLiteral("Quota"));
            QCOMPARE(frm.Text1->text(), QStringLiteral("05-mar-2003"));
            QCOMPARE(frm.Text2->text(), QStringLiteral("2003"));
            QCOMPARE(frm.Text3->text(), QStringLiteral("3"));
            QCOMPARE(frm.Text4->text(), QStringLiteral("703"));
            QCOMPARE(frm.Text7->text(), QStringLiteral("Sindicato"));
            QCOMPARE(frm.Text10->text(), QStringLiteral("T1"));
            QCOMPARE(frm.Text11->text(), QStringLiteral("Maria João Conceição 1"));
            QCOMPARE(frm.Text12->text(), QStringLiteral("Mimi"));
            QCOMPARE(frm.Text8->text(), participacao);
            QCOMPARE(frm.Text13->text(), porLiquidar);
            QVERIFY(frm.Text9->isReadOnly() && frm.Text13->isReadOnly() && !frm.Text5->isReadOnly());
        }));
    }

    void usesTheUsersSeparators()
    {
        QLocale::setDefault(QLocale(QLocale::Portuguese, QLocale::Portugal));
        const QVariant id = fx->addMovement(1, {1234.5, 0.0, 18.52, 30.0, QStringLiteral("Seguro"), 2004, 12});
        QVERIFY(fx->open(1, id, [&](FrmQuota& frm) {
            const QString group = QLocale().groupSeparator();
            QCOMPARE(frm.Text1->text(), QStringLiteral("05-dez-2004"));
            QCOMPARE(frm.Text5->text(), QStringLiteral("€ 1") + group + QStringLiteral("234,50"));
            QCOMPARE(frm.Text8->text(), QStringLiteral("0,015"));
            QCOMPARE(frm.Text13->text(), QStringLiteral("(€ 11,48)"));
            // Entering shows the number itself, all of it selected.
            frm.Text5->setFocus(Qt::TabFocusReason);
            QCOMPARE(frm.Text5->text(), QStringLiteral("1234,5"));
            QCOMPARE(frm.Text5->selectedText(), frm.Text5->text());
            // A typed decimal in the user's notation.
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
        // rend2 200 and a participation of 0.01 throughout the first rows.
        const MovementRow base{100.0, 200.0, 3.0, 0.0};
        MovementRow paid15 = base;
        paid15.pago = 15.0;
        QTest::newRow("empty") << "Text5" << "" << base << invalidValue << 3.0 << "€ 3.00";
        QTest::newRow("not a number") << "Text5" << "12x" << base << invalidValue << 3.0 << "€ 3.00";
        QTest::newRow("recomputed") << "Text5" << "1000" << base << QString() << 12.0 << "€ 12.00";
        QTest::newRow("below the paid part") << "Text5" << "1000" << paid15 << belowPaid << 3.0 << "(€ 12.00)";
        QTest::newRow("second remuneration") << "Text6" << "900" << base << QString() << 10.0 << "€ 10.00";
        QTest::newRow("equal to the paid part passes")
            << "Text5" << "48" << MovementRow{40.0, 0.0, 10.0, 12.0} << QString() << 12.0 << "€ 0.00";
        QTest::newRow("unrounded product compared")
            << "Text5" << "47.99" << MovementRow{40.0, 0.0, 10.0, 12.0} << belowPaid << 10.0 << "(€ 2.00)";
        QTest::newRow("tie to the even cent, down")
            << "Text5" << "0.50" << MovementRow{1.0, 0.0, 0.25, 0.0} << QString() << 0.12 << "€ 0.12";
        QTest::newRow("tie to the even cent, up")
            << "Text5" << "1.50" << MovementRow{1.0, 0.0, 0.25, 0.0} << QString() << 0.38 << "€ 0.38";
        QTest::newRow("large amounts keep their cents")
            << "Text5" << "1234567.89" << MovementRow{1.0, 0.0, 1.0, 0.0} << QString() << 1234567.89
            << "€ 1,234,567.89";
        QTest::newRow("participation") << "Text8" << "0.02" << base << QString() << 6.0 << "€ 6.00";
        QTest::newRow("participation below the paid part")
            << "Text8" << "0.02" << paid15 << QString() << 6.0 << "(€ 9.00)";
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
                QVERIFY(boxes.shown.isEmpty());
                QVERIFY(QApplication::focusWidget() != edit);
                // The due follows the remunerations; the participation stays.
                if (edit != frm.Text8)
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
        // Nothing reaches the database before the save step.
        QCOMPARE(fx->movement(id, QStringLiteral("quota")).toDouble(), row.quota.toDouble());
    }

    void passingThroughAFieldChangesNothing()
    {
        // An imported due that the remunerations and the participation as
        // shown (0.01500) do not reproduce: 1234.56 x 0.015 = 18.5184.
        const QVariant id = fx->addMovement(1, {1234.56, 0.0, 18.52, 18.52});
        ScriptedBoxes boxes;
        QVERIFY(fx->open(1, id, [&](FrmQuota& frm) {
            frm.Text5->setFocus(Qt::TabFocusReason);
            RecordFixture::tabOut(frm.Text5);
            RecordFixture::tabOut(frm.Text6);
            RecordFixture::tabOut(frm.Text8);
            QVERIFY(boxes.shown.isEmpty());
            QCOMPARE(QApplication::focusWidget(), frm.Text9);
            QCOMPARE(frm.Adodc1->value(QStringLiteral("quota")).toDouble(), 18.52);
            QCOMPARE(frm.Text5->text(), QStringLiteral("€ 1,234.56"));
        }));
    }

    void aButtonFirstValidatesTheFieldBeingEdited()
    {
        const QVariant id = fx->addMovement(1, {100.0, 200.0, 3.0, 0.0});
        ScriptedBoxes boxes;
        QVERIFY(fx->open(1, id, [&](FrmQuota& frm) {
            RecordFixture::type(frm.Text6, QStringLiteral("abc"));
            QTest::mouseClick(frm.Command3, Qt::LeftButton);
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
        QTest::addColumn<QString>("otherType");
        QTest::newRow("new account") << "Sindicato" << false << "sindicato" << "seguro";
        QTest::newRow("existing account") << "Sindicato" << true << "sindicato" << "seguro";
        QTest::newRow("insurance") << "Seguro" << true << "seguro" << "sindicato";
        QTest::newRow("other letter case is not the union due") << "sindicato" << true << "seguro" << "sindicato";
    }

    void sairSavesTheMovementAndTheAccountsLastValues()
    {
        QFETCH(QString, ref);
        QFETCH(bool, hadAccount);
        QFETCH(QString, type);
        QFETCH(QString, otherType);
        // An older movement than the last: Sair carries its values all the same.
        const QVariant id = fx->addMovement(1, {500.0, 300.0, 12.0, 1.0, ref, 2002, 7});
        fx->addMovement(1, {900.0, 0.0, 13.5, 0.0, QStringLiteral("Sindicato"), 2003, 1});
        if (hadAccount)
            fx->addAccount(1, 100.0, 40.0);
        QVERIFY(fx->open(1, id, [&](FrmQuota& frm) {
            RecordFixture::type(frm.Text5, QStringLiteral("700"));
            QTest::mouseClick(frm.Command3, Qt::LeftButton);
            QVERIFY(!frm.isVisible());
        }));
        // (700 + 300) x 0.015
        QCOMPARE(fx->movement(id, QStringLiteral("rend1")).toDouble(), 700.0);
        QCOMPARE(fx->movement(id, QStringLiteral("quota")).toDouble(), 15.0);
        QCOMPARE(fx->account(1, QStringLiteral("ult_rend1")).toDouble(), 700.0);
        QCOMPARE(fx->account(1, QStringLiteral("ult_rend2")).toDouble(), 300.0);
        QCOMPARE(fx->account(1, QStringLiteral("ult_quota_") + type).toDouble(), 15.0);
        QCOMPARE(fx->account(1, QStringLiteral("ult_perc_") + type).toDouble(), 0.015);
        QCOMPARE(fx->account(1, QStringLiteral("ult_ano")).toInt(), hadAccount ? 2001 : 2002);
        QCOMPARE(fx->account(1, QStringLiteral("ult_mes")).toInt(), hadAccount ? 11 : 7);
        QCOMPARE(fx->account(1, QStringLiteral("total_quotas")).toDouble(), hadAccount ? 100.0 : 0.0);
        QCOMPARE(fx->account(1, QStringLiteral("total_pago")).toDouble(), hadAccount ? 40.0 : 0.0);
        if (hadAccount) {
            QCOMPARE(fx->account(1, QStringLiteral("ult_quota_") + otherType).toDouble(),
                     otherType == QLatin1String("sindicato") ? 3.0 : 4.0);
        } else {
            QVERIFY(fx->account(1, QStringLiteral("ult_quota_") + otherType).isNull());
        }
    }

    void sairWithoutRemunerationsWritesRateZero()
    {
        const QVariant id = fx->addMovement(1, {0.0, 0.0, 7.5, 0.0});
        QVERIFY(fx->open(1, id, [&](FrmQuota& frm) { QTest::mouseClick(frm.Command3, Qt::LeftButton); }));
        QCOMPARE(fx->account(1, QStringLiteral("ult_quota_sindicato")).toDouble(), 7.5);
        QCOMPARE(fx->account(1, QStringLiteral("ult_perc_sindicato")).toDouble(), 0.0);
    }

    void theCloseControlSavesNothing()
    {
        const QVariant id = fx->addMovement(1, {100.0, 200.0, 3.0, 0.0});
        RecordingCaller caller;
        QVERIFY(fx->open(
            1, id,
            [&](FrmQuota& frm) {
                RecordFixture::type(frm.Text5, QStringLiteral("1000"));
                RecordFixture::tabOut(frm.Text5);
                QCOMPARE(frm.Text9->text(), QStringLiteral("€ 12.00"));
                frm.close();
                QVERIFY(!frm.isVisible());
            },
            &caller));
        QCOMPARE(fx->movement(id, QStringLiteral("quota")).toDouble(), 3.0);
        QCOMPARE(fx->movement(id, QStringLiteral("rend1")).toDouble(), 100.0);
        QVERIFY(!fx->hasAccount(1));
        QCOMPARE(caller.keys.size(), 1);
        QCOMPARE(caller.keys[0].toLongLong(), id.toLongLong());
        // The window unloaded: the next Registo builds a fresh one.
        QTRY_VERIFY(shared().frmQuota.isNull());
    }

    void opensOnTheHostsMovementOrTheFirst_data()
    {
        QTest::addColumn<bool>("known");
        QTest::newRow("known key") << true;
        QTest::newRow("unknown key") << false;
    }

    void opensOnTheHostsMovementOrTheFirst()
    {
        QFETCH(bool, known);
        const QVariant first = fx->addMovement(1, {100.0, 0.0, 1.0, 0.0, QStringLiteral("Sindicato"), 2003, 1});
        const QVariant second = fx->addMovement(1, {100.0, 0.0, 2.0, 0.0, QStringLiteral("Sindicato"), 2003, 2});
        RecordingCaller caller;
        QVERIFY(fx->open(
            1, known ? second : QVariant(second.toLongLong() + 100),
            [&](FrmQuota& frm) {
                QVERIFY(frm.GravarPendente);
                QCOMPARE(frm.Text3->text(), known ? QStringLiteral("2") : QStringLiteral("1"));
            },
            &caller));
        QCOMPARE(caller.keys.size(), 1);
        QCOMPARE(caller.keys[0].toLongLong(), (known ? second : first).toLongLong());
    }

    void remoteKeyFailuresAreIgnored_data()
    {
        QTest::addColumn<QString>("kind");
        QTest::newRow("no caller") << "none";
        QTest::newRow("no RemoteKey") << "silent";
        QTest::newRow("RemoteKey fails") << "failing";
    }

    void remoteKeyFailuresAreIgnored()
    {
        QFETCH(QString, kind);
        const QVariant id = fx->addMovement(1, {100.0, 0.0, 1.0, 0.0});
        SilentCaller silent;
        FailingCaller failing;
        QObject* caller = kind == QLatin1String("silent") ? static_cast<QObject*>(&silent)
                          : kind == QLatin1String("failing") ? static_cast<QObject*>(&failing)
                                                               : nullptr;
        ScriptedBoxes boxes;
        QVERIFY(fx->open(
            1, id, [&](FrmQuota& frm) { QTest::mouseClick(frm.Command3, Qt::LeftButton); }, caller));
        QVERIFY(boxes.shown.isEmpty());
        QCOMPARE(failing.calls, kind == QLatin1String("failing") ? 1 : 0);
        QVERIFY(fx->hasAccount(1));
    }
};

QTEST_MAIN(RecordWindowTest)
#include "tst_record_window.moc"
