// Payment and cancellation in the record window on both engines, with a
// second user working on the same rows and a database that fails.

#include "component/shared_objects.h"
#include "platform/recordset.h"
#include "record/movement_saving.h"
#include "record_fixture.h"

#include <QPushButton>
#include <QTest>
#include <thread>

using namespace quotas;
using namespace quotas::test;

namespace {

const QString amountPrompt = QStringLiteral("Digite a importância a liquidar.");
const QString documentPrompt = QStringLiteral("Indique o documento comprovativo de pagamento da quota:");

}  // namespace

class SettlementTest : public QObject {
    Q_OBJECT

    std::unique_ptr<TestDatabase> db;
    std::unique_ptr<RecordFixture> fx;

    // Another user recording a payment through the same code, on a
    // connection of their own.
    void payAsAnotherUser(Connection& other, const QVariant& quotaId, double amount)
    {
        Recordset rows;
        rows.open(RecordFixture::movementsOf(1), other, Cursor::Dynamic, Lock::Optimistic);
        QVERIFY(rows.find(QStringLiteral("quota_id"), quotaId));
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
        db.reset();
    }
    void init()
    {
        db->clear();
        fx->addMember(1);
    }

    void aSettledDueTakesNoPayment()
    {
        const QVariant id = fx->addMovement(1, {1000.0, 0.0, 10.0, 10.0});
        ScriptedBoxes boxes;
        QVERIFY(fx->open(1, id, [&](FrmQuota& frm) {
            QTest::mouseClick(frm.Command2, Qt::LeftButton);
            QVERIFY(boxes.shown.isEmpty());
            QVERIFY(frm.isVisible());
        }));
    }

    void recordsAPayment_data()
    {
        QTest::addColumn<bool>("hadAccount");
        QTest::addColumn<QString>("amount");
        QTest::addColumn<bool>("asksToConfirm");
        QTest::addColumn<QVariant>("document");  // invalid: the box is cancelled
        QTest::addColumn<double>("pago");
        QTest::newRow("4 of 10") << true << "4" << false << QVariant(QStringLiteral("Recibo 17/2003")) << 4.0;
        QTest::newRow("document box cancelled") << true << "4" << false << QVariant() << 4.0;
        QTest::newRow("member without an account") << false << "4" << false << QVariant(QStringLiteral("R1")) << 4.0;
        QTest::newRow("up to 0.10 above, as typed") << true << "10.10" << false << QVariant(QStringLiteral("R2"))
                                                    << 10.10;
        QTest::newRow("more above, confirmed") << true << "10.11" << true << QVariant(QStringLiteral("R3")) << 10.11;
        QTest::newRow("large amount keeps its cents")
            << true << "1234567.89" << true << QVariant(QStringLiteral("R4")) << 1234567.89;
    }

    void recordsAPayment()
    {
        QFETCH(bool, hadAccount);
        QFETCH(QString, amount);
        QFETCH(bool, asksToConfirm);
        QFETCH(QVariant, document);
        QFETCH(double, pago);
        const QVariant id = fx->addMovement(1, {1000.0, 0.0, 10.0, 0.0});
        if (hadAccount)
            fx->addAccount(1, 50.0, 20.0);
        ScriptedBoxes boxes;
        boxes.answerInput(amount);
        if (asksToConfirm)
            boxes.answer(Answer::Yes);
        boxes.answerInput(document.isValid() ? std::optional<QString>(document.toString()) : std::nullopt);
        RecordingCaller caller;
        QVERIFY(fx->open(
            1, id,
            [&](FrmQuota& frm) {
                QTest::mouseClick(frm.Command2, Qt::LeftButton);
                QVERIFY(!frm.isVisible());
            },
            &caller));
        QCOMPARE(boxes.shown.size(), asksToConfirm ? 3 : 2);
        QCOMPARE(boxes.shown[0].text, amountPrompt);
        QCOMPARE(boxes.shown[0].title, QStringLiteral("Pagamento"));
        QCOMPARE(boxes.shown[0].defaultText, QStringLiteral("10"));
        if (asksToConfirm) {
            QCOMPARE(boxes.shown[1].icon, Icon::Question);
            QCOMPARE(boxes.shown[1].buttons, Buttons::YesNo);
        }
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

    void noPaymentForAnAnswerThatIsNotOne_data()
    {
        QTest::addColumn<QVariant>("amount");  // invalid: the box is cancelled
        QTest::addColumn<bool>("saved");       // the save step ran
        QTest::newRow("cancelled") << QVariant() << false;
        QTest::newRow("empty") << QVariant(QString()) << false;
        QTest::newRow("not a number") << QVariant(QStringLiteral("quatro")) << false;
        QTest::newRow("zero") << QVariant(QStringLiteral("0")) << true;
        QTest::newRow("negative") << QVariant(QStringLiteral("-4")) << true;
        QTest::newRow("above the margin, not confirmed") << QVariant(QStringLiteral("10.11")) << true;
    }

    void noPaymentForAnAnswerThatIsNotOne()
    {
        QFETCH(QVariant, amount);
        QFETCH(bool, saved);
        const QVariant id = fx->addMovement(1, {1000.0, 0.0, 10.0, 0.0});
        ScriptedBoxes boxes;
        boxes.answerInput(amount.isValid() ? std::optional<QString>(amount.toString()) : std::nullopt);
        QVERIFY(fx->open(1, id, [&](FrmQuota& frm) {
            QTest::mouseClick(frm.Command2, Qt::LeftButton);
            QVERIFY(frm.isVisible());
        }));
        QVERIFY(!boxes.texts().contains(documentPrompt));
        QCOMPARE(fx->movement(id, QStringLiteral("pago")).toDouble(), 0.0);
        QCOMPARE(fx->hasAccount(1), saved);
        if (saved)
            QCOMPARE(fx->account(1, QStringLiteral("total_pago")).toDouble(), 0.0);
    }

    void aPaymentWithoutAnAccountRowCreatesNone()
    {
        const QVariant id = fx->addMovement(1, {1000.0, 0.0, 10.0, 2.0});
        Recordset rows;
        rows.open(RecordFixture::movementsOf(1), db->connection(), Cursor::Dynamic, Lock::Optimistic);
        liquidarQuota(rows, 3.0, QStringLiteral("R"));
        QVERIFY(!fx->hasAccount(1));
        QCOMPARE(fx->movement(id, QStringLiteral("pago")).toDouble(), 5.0);
        QCOMPARE(fx->movement(id, QStringLiteral("doc_no")).toString(), QStringLiteral("R"));
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
                // An edit in progress is not saved by the cancellation.
                RecordFixture::type(frm.Text5, QStringLiteral("2000"));
                QTest::mouseClick(frm.Command1, Qt::LeftButton);
                QCOMPARE(frm.isVisible(), answer == Answer::No);
            },
            &caller));
        QCOMPARE(boxes.shown.size(), 1);
        QCOMPARE(boxes.last().text, QStringLiteral("Quer eliminar este registo?"));
        QCOMPARE(boxes.last().title, QStringLiteral("Quotizações"));
        QCOMPARE(boxes.last().icon, Icon::Question);
        QCOMPARE(boxes.last().buttons, Buttons::YesNo);
        const QVariant left = db->connection().scalar(
            QStringLiteral("SELECT count(*) FROM tbQuotas_Movimentos WHERE quota_id = ?"), {id});
        QCOMPARE(left.toInt(), answer == Answer::Yes ? 0 : 1);
        if (answer == Answer::No)
            QCOMPARE(fx->movement(id, QStringLiteral("rend1")).toDouble(), 1000.0);
        QCOMPARE(fx->account(1, QStringLiteral("total_quotas")).toDouble(), 10.0);
        QCOMPARE(fx->account(1, QStringLiteral("total_pago")).toDouble(), 4.0);
        QCOMPARE(fx->account(1, QStringLiteral("ult_rend1")).toDouble(), 1.0);
        // The host hears of the deleted movement too.
        QCOMPARE(caller.keys.size(), 1);
        QCOMPARE(caller.keys[0].toLongLong(), id.toLongLong());
    }

    void aRowChangedByAnotherUserIsNotOverwritten_data()
    {
        QTest::addColumn<QString>("action");
        QTest::newRow("sair") << "sair";
        QTest::newRow("payment") << "payment";
        QTest::newRow("cancellation") << "cancellation";
    }

    void aRowChangedByAnotherUserIsNotOverwritten()
    {
        QFETCH(QString, action);
        const QVariant id = fx->addMovement(1, {1000.0, 0.0, 10.0, 0.0});
        fx->addAccount(1, 10.0, 0.0);
        std::unique_ptr<Connection> other = db->openAnother();
        ScriptedBoxes boxes;
        if (action == QLatin1String("payment")) {
            boxes.answerInput(QStringLiteral("4"));
            boxes.answerInput(QStringLiteral("A"));
        }
        if (action == QLatin1String("cancellation"))
            boxes.answer(Answer::Yes);
        QVERIFY(fx->open(1, id, [&](FrmQuota& frm) {
            // The other user pays 6 on this very movement once it is on screen.
            payAsAnotherUser(*other, id, 6.0);
            QPushButton* button = action == QLatin1String("sair")      ? frm.Command3
                                  : action == QLatin1String("payment") ? frm.Command2
                                                                       : frm.Command1;
            if (button == frm.Command3)
                RecordFixture::type(frm.Text5, QStringLiteral("1200"));
            QTest::mouseClick(button, Qt::LeftButton);
            QVERIFY(frm.isVisible());
            QCOMPARE(boxes.last().icon, Icon::Critical);
            QVERIFY2(boxes.last().text.contains(QStringLiteral("outro utilizador")), qPrintable(boxes.last().text));
        }));
        QCOMPARE(fx->movement(id, QStringLiteral("pago")).toDouble(), 6.0);
        QCOMPARE(fx->movement(id, QStringLiteral("rend1")).toDouble(), 1000.0);
        QCOMPARE(fx->movement(id, QStringLiteral("doc_no")).toString(), QStringLiteral("B"));
        QCOMPARE(fx->account(1, QStringLiteral("total_pago")).toDouble(), 6.0);
        // A refused save step leaves the account's last values as they were
        // (the payment's own save step, before the refusal, is final).
        QCOMPARE(fx->account(1, QStringLiteral("ult_rend1")).toDouble(),
                 action == QLatin1String("payment") ? 1000.0 : 1.0);
    }

    void paymentsOfTwoUsersOnOneAccountAreBothKept()
    {
        const QVariant first = fx->addMovement(1, {1000.0, 0.0, 10.0, 0.0, QStringLiteral("Sindicato"), 2003, 1});
        const QVariant second = fx->addMovement(1, {1000.0, 0.0, 10.0, 0.0, QStringLiteral("Sindicato"), 2003, 2});
        fx->addAccount(1, 20.0, 0.0);
        std::unique_ptr<Connection> other = db->openAnother();
        ScriptedBoxes boxes;
        boxes.answerInput(QStringLiteral("4"));
        boxes.answerInput(QStringLiteral("A"));
        // The other user pays the second due while this one is asked for the
        // document of the first: after this user's save step read the account.
        boxes.onShow = [&](const ShownBox& box) {
            if (box.text == documentPrompt)
                payAsAnotherUser(*other, second, 5.0);
        };
        QVERIFY(fx->open(1, first, [&](FrmQuota& frm) { QTest::mouseClick(frm.Command2, Qt::LeftButton); }));
        QCOMPARE(fx->movement(first, QStringLiteral("pago")).toDouble(), 4.0);
        QCOMPARE(fx->movement(second, QStringLiteral("pago")).toDouble(), 5.0);
        QCOMPARE(fx->account(1, QStringLiteral("total_pago")).toDouble(), 9.0);
    }

    void paymentsRecordedAtTheSameMomentAreAllKept()
    {
        // Two users paying, each on a due of their own, against one account,
        // truly at once: no payment may overwrite the other's total.
        constexpr int payments = 30;
        const QVariant dues[] = {fx->addMovement(1, {1000.0, 0.0, 50.0, 0.0, QStringLiteral("Sindicato"), 2003, 1}),
                                 fx->addMovement(1, {1000.0, 0.0, 50.0, 0.0, QStringLiteral("Sindicato"), 2003, 2})};
        fx->addAccount(1, 100.0, 0.0);
        const QString connectionString = db->connectionString();
        QStringList failures[2];
        auto user = [&](int n) {
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
        std::thread first(user, 0);
        std::thread second(user, 1);
        first.join();
        second.join();
        QCOMPARE(failures[0] + failures[1], QStringList());
        QCOMPARE(fx->movement(dues[0], QStringLiteral("pago")).toDouble(), double(payments));
        QCOMPARE(fx->movement(dues[1], QStringLiteral("pago")).toDouble(), double(payments));
        QCOMPARE(fx->account(1, QStringLiteral("total_pago")).toDouble(), 2.0 * payments);
    }

    void aDatabaseFailureIsShownAndTheWindowStays_data()
    {
        QTest::addColumn<QString>("action");
        QTest::newRow("sair") << "sair";
        QTest::newRow("payment") << "payment";
        QTest::newRow("cancellation") << "cancellation";
    }

    void aDatabaseFailureIsShownAndTheWindowStays()
    {
        QFETCH(QString, action);
        const QVariant id = fx->addMovement(1, {1000.0, 0.0, 10.0, 0.0});
        fx->addAccount(1, 10.0, 0.0);
        Connection& connection = Data().SqlServer;
        ScriptedBoxes boxes;
        boxes.answerInput(QStringLiteral("4"));
        boxes.answer(Answer::Yes);
        boxes.answerInput(QStringLiteral("A"));
        // The connection drops while the user answers the last box.
        boxes.onShow = [&](const ShownBox& box) {
            if (box.text == documentPrompt || box.text.startsWith(QStringLiteral("Quer eliminar")))
                connection.close();
        };
        QVERIFY(fx->open(1, id, [&](FrmQuota& frm) {
            if (action == QLatin1String("sair")) {
                RecordFixture::type(frm.Text5, QStringLiteral("1200"));
                connection.close();
            }
            QTest::mouseClick(action == QLatin1String("sair")      ? frm.Command3
                              : action == QLatin1String("payment") ? frm.Command2
                                                                   : frm.Command1,
                              Qt::LeftButton);
            QVERIFY(frm.isVisible());
            QCOMPARE(boxes.last().icon, Icon::Critical);
            connection.open();
            // Once the database is back, the same window saves.
            if (action != QLatin1String("cancellation"))
                QTest::mouseClick(frm.Command3, Qt::LeftButton);
        }));
        if (!connection.isOpen())
            connection.open();
        QCOMPARE(fx->movement(id, QStringLiteral("pago")).toDouble(), 0.0);
        QCOMPARE(fx->account(1, QStringLiteral("total_pago")).toDouble(), 0.0);
        if (action == QLatin1String("sair"))
            QCOMPARE(fx->movement(id, QStringLiteral("rend1")).toDouble(), 1200.0);
    }
};

QTEST_MAIN(SettlementTest)
#include "tst_settlement.moc"
