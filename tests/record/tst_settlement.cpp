// Payment and cancellation in the record window, with a second user working
// on the same rows and a database that fails.

#include "component/shared_objects.h"
#include "platform/recordset.h"
#include "record/movement_saving.h"
#include "record_fixture.h"

#include <QTest>
#include <thread>

using namespace quotas;
using namespace quotas::test;

namespace {
const QString amountPrompt = QStringLiteral("Digite a importância a liquidar.");
const QString documentPrompt = QStringLiteral("Indique o documento comprovativo de pagamento da quota:");
std::optional<QString> typed(const QVariant& v)  // invalid: the box is cancelled
{
    return v.isValid() ? std::optional<QString>(v.toString()) : std::nullopt;
}
}  // namespace

class SettlementTest : public QObject {
    Q_OBJECT
    std::unique_ptr<TestDatabase> db;
    std::unique_ptr<RecordFixture> fx;

    // Another user paying through the same code on a connection of their own.
    static void pay(Connection& connection, const QVariant& quotaId, double amount)
    {
        Recordset rows;
        rows.open(RecordFixture::movementsOf(1), connection, Cursor::Dynamic, Lock::Optimistic);
        if (!rows.find(QStringLiteral("quota_id"), quotaId))
            throw QuotasError(QStringLiteral("no such movement"));
        liquidarQuota(rows, amount, QStringLiteral("B"));
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
    }

    void aSettledDueTakesNoPayment()
    {
        ScriptedBoxes boxes;
        QVERIFY(fx->open(1, fx->addMovement(1, {1000.0, 0.0, 10.0, 10.0}), [&](FrmQuota& frm) {
            RecordFixture::click(frm.Command2);
            QCOMPARE(boxes.texts(), QStringList());
            QVERIFY(frm.isVisible());
        }));
    }

    void recordsAPayment_data()
    {
        QTest::addColumn<bool>("hadAccount");
        QTest::addColumn<QString>("amount");
        QTest::addColumn<bool>("confirm");
        QTest::addColumn<QVariant>("document");
        QTest::addColumn<double>("pago");
        QTest::newRow("4 of 10") << true << "4" << false << QVariant(QStringLiteral("Recibo 17/2003")) << 4.0;
        QTest::newRow("document box cancelled") << true << "4" << false << QVariant() << 4.0;
        QTest::newRow("member without an account") << false << "4" << false << QVariant(QStringLiteral("R")) << 4.0;
        QTest::newRow("0.10 above, as typed") << true << "10.10" << false << QVariant(QStringLiteral("R")) << 10.10;
        QTest::newRow("more above, confirmed") << true << "10.11" << true << QVariant(QStringLiteral("R")) << 10.11;
        QTest::newRow("large amount keeps its cents") << true << "1234567.89" << true << QVariant(QStringLiteral("R"))
                                                      << 1234567.89;
    }
    void recordsAPayment()
    {
        QFETCH(bool, hadAccount);
        QFETCH(QString, amount);
        QFETCH(bool, confirm);
        QFETCH(QVariant, document);
        QFETCH(double, pago);
        const QVariant id = fx->addMovement(1, {1000.0, 0.0, 10.0, 0.0});
        if (hadAccount)
            fx->addAccount(1, 50.0, 20.0);
        ScriptedBoxes boxes;
        boxes.answerInput(amount);
        if (confirm)
            boxes.answer(Answer::Yes);
        boxes.answerInput(typed(document));
        RecordingCaller caller;
        QVERIFY(fx->open(
            1, id,
            [&](FrmQuota& frm) {
                RecordFixture::click(frm.Command2);
                QVERIFY(!frm.isVisible());
            },
            &caller));
        QCOMPARE(boxes.shown.size(), confirm ? 3 : 2);
        QCOMPARE(boxes.shown[0].text, amountPrompt);
        QCOMPARE(boxes.shown[0].title, QStringLiteral("Pagamento"));
        QCOMPARE(boxes.shown[0].defaultText, QStringLiteral("10"));
        if (confirm)
            QCOMPARE(boxes.shown[1].icon, Icon::Question);
        QCOMPARE(boxes.last().text, documentPrompt);
        QCOMPARE(boxes.last().title, QStringLiteral("Tipo de Documento"));
        QCOMPARE(fx->movement(id, QStringLiteral("pago")).toDouble(), pago);
        QCOMPARE(fx->movement(id, QStringLiteral("quota")).toDouble(), 10.0);
        const QVariant docNo = fx->movement(id, QStringLiteral("doc_no"));
        QVERIFY(!docNo.isNull());
        QCOMPARE(docNo.toString(), document.toString());
        QCOMPARE(fx->account(1, QStringLiteral("total_pago")).toDouble(), (hadAccount ? 20.0 : 0.0) + pago);
        QCOMPARE(fx->account(1, QStringLiteral("total_quotas")).toDouble(), hadAccount ? 50.0 : 0.0);
        QCOMPARE(caller.keys.size(), 1);
        QCOMPARE(caller.keys[0].toLongLong(), id.toLongLong());
    }

    void noPaymentWithoutAPositiveAmount_data()
    {
        QTest::addColumn<QVariant>("amount");
        QTest::addColumn<bool>("saved");  // the save step ran before the amount was refused
        QTest::newRow("cancelled") << QVariant() << false;
        QTest::newRow("empty") << QVariant(QString()) << false;
        QTest::newRow("not a number") << QVariant(QStringLiteral("quatro")) << false;
        QTest::newRow("zero") << QVariant(QStringLiteral("0")) << true;
        QTest::newRow("negative") << QVariant(QStringLiteral("-4")) << true;
        QTest::newRow("overpayment not confirmed") << QVariant(QStringLiteral("10.11")) << true;
    }
    void noPaymentWithoutAPositiveAmount()
    {
        QFETCH(QVariant, amount);
        QFETCH(bool, saved);
        const QVariant id = fx->addMovement(1, {1000.0, 0.0, 10.0, 0.0});
        ScriptedBoxes boxes;
        boxes.answerInput(typed(amount));
        QVERIFY(fx->open(1, id, [&](FrmQuota& frm) {
            RecordFixture::click(frm.Command2);
            QVERIFY(frm.isVisible());
        }));
        QVERIFY(!boxes.texts().contains(documentPrompt));
        QCOMPARE(fx->movement(id, QStringLiteral("pago")).toDouble(), 0.0);
        QCOMPARE(fx->hasAccount(1), saved);
        QCOMPARE(fx->account(1, QStringLiteral("total_pago")).toDouble(), 0.0);
    }

    void aPaymentWithoutAnAccountRowCreatesNone()
    {
        const QVariant id = fx->addMovement(1, {1000.0, 0.0, 10.0, 2.0});
        pay(db->connection(), id, 3.0);
        QVERIFY(!fx->hasAccount(1));
        QCOMPARE(fx->movement(id, QStringLiteral("pago")).toDouble(), 5.0);
    }

    void cancellation_data()
    {
        QTest::addColumn<Answer>("answer");
        QTest::newRow("yes") << Answer::Yes;
        QTest::newRow("no") << Answer::No;
    }
    void cancellation()
    {
        QFETCH(Answer, answer);
        const QVariant id = fx->addMovement(1, {1000.0, 0.0, 10.0, 4.0});
        fx->addAccount(1, 10.0, 4.0);
        ScriptedBoxes boxes;
        boxes.answer(answer);
        RecordingCaller caller;
        QVERIFY(fx->open(
            1, id,
            [&](FrmQuota& frm) {
                RecordFixture::type(frm.Text5, QStringLiteral("2000"));  // an edit that must not be saved
                RecordFixture::click(frm.Command1);
                QCOMPARE(frm.isVisible(), answer == Answer::No);
            },
            &caller));
        QCOMPARE(boxes.shown.size(), 1);
        QCOMPARE(boxes.last().text, QStringLiteral("Quer eliminar este registo?"));
        QCOMPARE(boxes.last().title, QStringLiteral("Quotizações"));
        QCOMPARE(boxes.last().icon, Icon::Question);
        QCOMPARE(boxes.last().buttons, Buttons::YesNo);
        QCOMPARE(fx->movement(id, QStringLiteral("rend1")).isValid(), answer == Answer::No);
        QCOMPARE(fx->movement(id, QStringLiteral("rend1")).toDouble(), answer == Answer::No ? 1000.0 : 0.0);
        QCOMPARE(fx->account(1, QStringLiteral("total_quotas")).toDouble(), 10.0);
        QCOMPARE(fx->account(1, QStringLiteral("total_pago")).toDouble(), 4.0);
        QCOMPARE(caller.keys.size(), 1);  // the host hears of the deleted movement too
        QCOMPARE(caller.keys[0].toLongLong(), id.toLongLong());
    }

    void aRowChangedByAnotherUserIsNotOverwritten_data()
    {
        QTest::addColumn<QString>("button");
        QTest::newRow("sair") << "Command3";
        QTest::newRow("payment") << "Command2";
        QTest::newRow("cancellation") << "Command1";
    }
    void aRowChangedByAnotherUserIsNotOverwritten()
    {
        QFETCH(QString, button);
        const QVariant id = fx->addMovement(1, {1000.0, 0.0, 10.0, 0.0});
        fx->addAccount(1, 10.0, 0.0);
        std::unique_ptr<Connection> other = db->openAnother();
        ScriptedBoxes boxes;
        boxes.answerInput(QStringLiteral("4"));
        boxes.answerInput(QStringLiteral("A"));
        boxes.answer(Answer::Yes);
        QVERIFY(fx->open(1, id, [&](FrmQuota& frm) {
            pay(*other, id, 6.0);  // once the movement is on this user's screen
            if (button == QLatin1String("Command3"))
                RecordFixture::type(frm.Text5, QStringLiteral("1200"));
            RecordFixture::click(frm.findChild<QPushButton*>(button));
            QVERIFY(frm.isVisible());
            QCOMPARE(boxes.last().icon, Icon::Critical);
            QVERIFY2(boxes.last().text.contains(QStringLiteral("outro utilizador")), qPrintable(boxes.last().text));
        }));
        QCOMPARE(fx->movement(id, QStringLiteral("pago")).toDouble(), 6.0);
        QCOMPARE(fx->movement(id, QStringLiteral("rend1")).toDouble(), 1000.0);
        QCOMPARE(fx->movement(id, QStringLiteral("doc_no")).toString(), QStringLiteral("B"));
        QCOMPARE(fx->account(1, QStringLiteral("total_pago")).toDouble(), 6.0);
        // A refused save step leaves the account as it was; the payment's own
        // save step, before its refusal, is final.
        QCOMPARE(fx->account(1, QStringLiteral("ult_rend1")).toDouble(), button == QLatin1String("Command2") ? 1000.0 : 1.0);
    }

    void paymentsRecordedAtTheSameMomentAreAllKept()
    {
        // Two users, each paying a due of their own of one account, at once.
        constexpr int payments = 30;
        const QVariant dues[] = {fx->addMovement(1, {1000.0, 0.0, 50.0, 0.0, QStringLiteral("Sindicato"), 2003, 1}),
                                 fx->addMovement(1, {1000.0, 0.0, 50.0, 0.0, QStringLiteral("Sindicato"), 2003, 2})};
        fx->addAccount(1, 100.0, 0.0);
        QStringList failures[2];
        auto user = [&, connectionString = db->connectionString()](int n) {
            try {
                Connection own(QStringLiteral("user%1").arg(n));
                own.setConnectionString(connectionString);
                own.open();
                Recordset rows;
                rows.open(RecordFixture::movementsOf(1), own, Cursor::Dynamic, Lock::Optimistic);
                rows.find(QStringLiteral("quota_id"), dues[n]);
                for (int i = 0; i < payments; ++i)
                    liquidarQuota(rows, 1.0, QString::number(i));
            } catch (const QuotasError& e) {
                failures[n] << e.message();
            }
        };
        std::thread first(user, 0), second(user, 1);
        first.join();
        second.join();
        QCOMPARE(failures[0] + failures[1], QStringList());
        QCOMPARE(fx->movement(dues[0], QStringLiteral("pago")).toDouble(), double(payments));
        QCOMPARE(fx->movement(dues[1], QStringLiteral("pago")).toDouble(), double(payments));
        QCOMPARE(fx->account(1, QStringLiteral("total_pago")).toDouble(), 2.0 * payments);
    }

    void aDatabaseFailureIsShownAndTheWindowStays_data()
    {
        QTest::addColumn<QString>("button");
        QTest::newRow("sair") << "Command3";
        QTest::newRow("payment") << "Command2";
        QTest::newRow("cancellation") << "Command1";
    }
    void aDatabaseFailureIsShownAndTheWindowStays()
    {
        QFETCH(QString, button);
        const QVariant id = fx->addMovement(1, {1000.0, 0.0, 10.0, 0.0});
        fx->addAccount(1, 10.0, 0.0);
        Connection& connection = Data().SqlServer;
        ScriptedBoxes boxes;
        boxes.answerInput(QStringLiteral("4"));
        boxes.answer(Answer::Yes);
        boxes.answerInput(QStringLiteral("A"));
        // The connection drops as the user answers the last box.
        boxes.onShow = [&](const ShownBox& box) {
            if (box.text == documentPrompt || box.buttons == Buttons::YesNo)
                connection.close();
        };
        QVERIFY(fx->open(1, id, [&](FrmQuota& frm) {
            if (button == QLatin1String("Command3")) {
                RecordFixture::type(frm.Text5, QStringLiteral("1200"));
                connection.close();
            }
            RecordFixture::click(frm.findChild<QPushButton*>(button));
            QVERIFY(frm.isVisible());
            QCOMPARE(boxes.last().icon, Icon::Critical);
            connection.open();
            RecordFixture::click(frm.Command3);  // the database is back: the same window saves
        }));
        if (!connection.isOpen())
            connection.open();
        QCOMPARE(fx->movement(id, QStringLiteral("pago")).toDouble(), 0.0);
        QCOMPARE(fx->account(1, QStringLiteral("total_pago")).toDouble(), 0.0);
        QCOMPARE(fx->movement(id, QStringLiteral("rend1")).toDouble(), button == QLatin1String("Command3") ? 1200.0 : 1000.0);
    }
};

QTEST_MAIN(SettlementTest)
#include "tst_settlement.moc"
