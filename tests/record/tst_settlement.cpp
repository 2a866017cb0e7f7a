// How the work on a movement ends: Sair's save step, the close control, a
// payment and a cancellation, then the same with a second user working on the
// same rows and with a database that fails.

#include "platform/recordset.h"
#include "record/movement_saving.h"
#include "record_fixture.h"

#include <thread>

using namespace quotas;
using namespace quotas::test;

namespace {
const QString amountBox = u"Pagamento [10] Digite a importância a liquidar."_s;
const QString documentBox = u"Tipo de Documento [] Indique o documento comprovativo de pagamento da quota:"_s;
const QString overBox = u"Pagamento (? yes/no) A importância de € %1 é superior ao valor por liquidar (€ 10.00)."_s;
// Every value of the member's account.
const QString accountColumns = u"ult_ano=%1; ult_mes=%2; ult_rend1=%3; ult_rend2=%4; ult_quota_sindicato=%5; ult_perc_sindicato=%6; "
                                "ult_quota_seguro=%7; ult_perc_seguro=%8; total_quotas=%9; total_pago=%10"_s;
}  // namespace

class SettlementTest : public RecordTest {
    Q_OBJECT

    // Another user paying through the same code on a connection of their own.
    static void pay(Connection& connection, const QVariant& quotaId, double amount)
    {
        Recordset rows;
        rows.open(movementsOf(1), connection, Cursor::Dynamic, Lock::Optimistic);
        if (!rows.find(u"quota_id"_s, quotaId))
            throw QuotasError(u"no such movement"_s);
        liquidarQuota(rows, amount, u"B"_s);
    }

private slots:
    void endsTheWorkOnAMovement_data()
    {
        QTest::addColumn<QString>("button");        // or "close", the close control
        QTest::addColumn<MovementRow>("row");
        QTest::addColumn<bool>("hasAccount");       // total 50 charged, 20 paid
        QTest::addColumn<QString>("rend1");         // typed first, when given
        QTest::addColumn<QStringList>("inputs");    // a null text cancels the box
        QTest::addColumn<Answer>("answer");         // to the one Yes/No question
        QTest::addColumn<QStringList>("boxes");
        QTest::addColumn<bool>("closes");
        QTest::addColumn<QString>("movement");
        QTest::addColumn<QString>("account");
        const auto row = [](const char* tag, const char* button, const MovementRow& r, bool hasAccount, const char* rend1,
                            const QStringList& inputs, Answer answer, const QStringList& boxes, bool closes, const QString& movement,
                            const QString& account) {
            QTest::newRow(tag) << QString::fromUtf8(button) << r << hasAccount << QString::fromUtf8(rend1) << inputs << answer << boxes
                               << closes << movement << account;
        };
        const QString rate = u"0.01499850015"_s;  // 15 / 1000.1
        // An older movement than the member's last: Sair carries its values all the same.
        const MovementRow older{500.0, 300.1, 12.0, 0.1, u"Sindicato"_s, 2002, 7};
        MovementRow insurance = older, otherCase = older;
        insurance.ref = u"Seguro"_s;
        otherCase.ref = u"sindicato"_s;
        const QString saved = u"rend1=700; quota=15"_s;  // (700 + 300.1) x 0.015
        row("Sair, new account", "Command3", older, false, "700", {}, Answer::No, {}, true, saved,
            accountColumns.arg(2002).arg(7).arg(700).arg(300.1).arg(15).arg(rate, u"null"_s, u"null"_s).arg(0).arg(0));
        row("Sair, existing account", "Command3", older, true, "700", {}, Answer::No, {}, true, saved,
            accountColumns.arg(2001).arg(11).arg(700).arg(300.1).arg(15).arg(rate).arg(4).arg(0.25).arg(50).arg(20));
        row("Sair, insurance", "Command3", insurance, true, "700", {}, Answer::No, {}, true, saved,
            accountColumns.arg(2001).arg(11).arg(700).arg(300.1).arg(3).arg(0.5).arg(15).arg(rate).arg(50).arg(20));
        row("Sair, another letter case is insurance", "Command3", otherCase, true, "700", {}, Answer::No, {}, true, saved,
            accountColumns.arg(2001).arg(11).arg(700).arg(300.1).arg(3).arg(0.5).arg(15).arg(rate).arg(50).arg(20));
        row("Sair without remunerations writes rate 0", "Command3", {0.0, 0.0, 7.5, 0.0}, false, "", {}, Answer::No, {}, true,
            u"quota=7.5"_s, u"ult_quota_sindicato=7.5; ult_perc_sindicato=0"_s);
        row("Sair first validates the field", "Command3", {}, false, "abc", {}, Answer::No,
            {u"Quotas (i) Tem de introduzir um valor válido neste campo."_s}, false, u"rend1=1000"_s, u"none"_s);
        row("the close control saves nothing", "close", {100.0, 200.0, 3.0, 0.0}, false, "1000", {}, Answer::No, {}, true,
            u"rend1=100; quota=3"_s, u"none"_s);

        const MovementRow due{1000.0, 0.0, 10.0, 0.0};
        row("a settled due takes no payment", "Command2", {1000.0, 0.0, 10.0, 10.0}, true, "", {}, Answer::No, {}, false,
            u"pago=10"_s, u"total_pago=20"_s);
        row("4 of 10", "Command2", due, true, "", {"4", "Recibo 17/2003"}, Answer::No, {amountBox, documentBox}, true,
            u"quota=10; pago=4; doc_no=Recibo 17/2003"_s, u"ult_rend1=1000; total_quotas=50; total_pago=24"_s);
        row("document box cancelled", "Command2", due, true, "", {"4", QString()}, Answer::No, {amountBox, documentBox}, true,
            u"pago=4; doc_no="_s, u"total_pago=24"_s);
        row("member without an account", "Command2", due, false, "", {"4", "R"}, Answer::No, {amountBox, documentBox}, true,
            u"pago=4; doc_no=R"_s, u"total_quotas=0; total_pago=4"_s);
        row("0.10 above, as typed", "Command2", due, true, "", {"10.10", "R"}, Answer::No, {amountBox, documentBox}, true,
            u"pago=10.1"_s, u"total_pago=30.1"_s);
        row("more above, confirmed", "Command2", due, true, "", {"10.11", "R"}, Answer::Yes,
            {amountBox, overBox.arg(u"10.11"_s), documentBox}, true, u"pago=10.11"_s, u"total_pago=30.11"_s);
        row("large amount keeps its cents", "Command2", due, true, "", {"1234567.89", "R"}, Answer::Yes,
            {amountBox, overBox.arg(u"1,234,567.89"_s), documentBox}, true, u"pago=1234567.89"_s, u"total_pago=1234587.89"_s);
        // The save step runs once the amount is a number, before it is refused.
        for (const char* amount : {"", "quatro"})
            row(amount, "Command2", due, false, "", {amount}, Answer::No, {amountBox}, false, u"pago=0"_s, u"none"_s);
        row("amount box cancelled", "Command2", due, false, "", {QString()}, Answer::No, {amountBox}, false, u"pago=0"_s, u"none"_s);
        for (const char* amount : {"0", "-4"})
            row(amount, "Command2", due, false, "", {amount}, Answer::No, {amountBox}, false, u"pago=0"_s, u"total_pago=0"_s);
        row("more above, not confirmed", "Command2", due, false, "", {"10.11"}, Answer::No, {amountBox, overBox.arg(u"10.11"_s)},
            false, u"pago=0"_s, u"total_pago=0"_s);

        const QString question = u"Quotizações (? yes/no) Quer eliminar este registo?"_s;
        row("cancellation, yes", "Command1", {1000.0, 0.0, 10.0, 4.0}, true, "2000", {}, Answer::Yes, {question}, true, u"none"_s,
            u"ult_rend1=1; total_quotas=50; total_pago=20"_s);
        row("cancellation, no", "Command1", {1000.0, 0.0, 10.0, 4.0}, true, "2000", {}, Answer::No, {question}, false,
            u"rend1=1000; pago=4"_s, u"ult_rend1=1; total_quotas=50; total_pago=20"_s);
    }
    void endsTheWorkOnAMovement()
    {
        QFETCH(QString, button);
        QFETCH(MovementRow, row);
        QFETCH(bool, hasAccount);
        QFETCH(QString, rend1);
        QFETCH(QStringList, inputs);
        QFETCH(Answer, answer);
        QFETCH(QStringList, boxes);
        QFETCH(bool, closes);
        QFETCH(QString, movement);
        QFETCH(QString, account);
        const QVariant id = addMovement(1, row);
        addMovement(1, {900.0, 0.0, 13.5, 0.0, u"Sindicato"_s, 2003, 1});
        if (hasAccount)
            addAccount(1, 50.0, 20.0);
        ScriptedBoxes scripted;
        for (const QString& text : inputs)
            scripted.answerInput(text.isNull() ? std::nullopt : std::optional(text));
        scripted.answer(answer);
        RecordingCaller caller;
        QVERIFY(open(id, [&](FrmQuota& frm) {
            if (!rend1.isEmpty())
                type(frm.Text5, rend1);
            if (button == "close"_L1)
                frm.close();
            else
                click(frm.findChild<QPushButton*>(button));
            QCOMPARE(frm.isVisible(), !closes);
        }, &caller));
        QCOMPARE(described(scripted), boxes);
        QCOMPARE(this->movement(id, movement), movement);
        QCOMPARE(this->account(1, account), account);
        QCOMPARE(caller.keys, QVariantList{id});  // however it closed
        QTRY_VERIFY(shared().frmQuota.isNull());  // unloaded: the next Registo builds a fresh one
    }

    void aPaymentWithoutAnAccountRowCreatesNone()
    {
        const QVariant id = addMovement(1, {1000.0, 0.0, 10.0, 2.0});
        pay(db->connection(), id, 3.0);
        QCOMPARE(movement(id, u"pago=5"_s) + u", "_s + account(1, u"none"_s), u"pago=5, none"_s);
    }

    void anotherUsersWorkIsNeverOverwrittenNorAFailureHidden_data()
    {
        QTest::addColumn<QString>("button");
        QTest::addColumn<bool>("otherUser");  // else the database fails
        QTest::addColumn<QString>("movement");
        QTest::addColumn<QString>("account");
        // A refused save step leaves the account as it was; the payment's own save step, before its refusal, is final.
        QTest::newRow("Sair after another user's payment") << "Command3" << true << "rend1=1000; pago=6; doc_no=B" << "ult_rend1=1; total_pago=6";
        QTest::newRow("payment after another user's") << "Command2" << true << "rend1=1000; pago=6; doc_no=B" << "ult_rend1=1000; total_pago=6";
        QTest::newRow("cancellation after another user's payment") << "Command1" << true << "rend1=1000; pago=6; doc_no=B" << "ult_rend1=1; total_pago=6";
        // Once the database is back, Sair in the same window saves.
        QTest::newRow("Sair, database down") << "Command3" << false << "rend1=1200; pago=0" << "ult_rend1=1200; total_pago=0";
        QTest::newRow("payment, database down") << "Command2" << false << "rend1=1000; pago=0" << "ult_rend1=1000; total_pago=0";
        QTest::newRow("cancellation, database down") << "Command1" << false << "rend1=1000; pago=0" << "ult_rend1=1000; total_pago=0";
    }
    void anotherUsersWorkIsNeverOverwrittenNorAFailureHidden()
    {
        QFETCH(QString, button);
        QFETCH(bool, otherUser);
        QFETCH(QString, movement);
        QFETCH(QString, account);
        const QVariant id = addMovement(1, {1000.0, 0.0, 10.0, 0.0});
        addAccount(1, 10.0, 0.0);
        std::unique_ptr<Connection> other = db->openAnother();
        Connection& connection = Data().SqlServer;
        ScriptedBoxes boxes;
        boxes.answerInput(u"4"_s);
        boxes.answerInput(u"A"_s);
        boxes.answer(Answer::Yes);
        boxes.onShow = [&](const ShownBox& box) {  // the connection drops as the user answers the last box
            if (!otherUser && (box.title == "Tipo de Documento"_L1 || box.buttons == Buttons::YesNo))
                connection.close();
        };
        QVERIFY(open(id, [&](FrmQuota& frm) {
            if (otherUser)
                pay(*other, id, 6.0);  // once the movement is on this user's screen
            if (button == "Command3"_L1) {
                type(frm.Text5, u"1200"_s);
                if (!otherUser)
                    connection.close();
            }
            click(frm.findChild<QPushButton*>(button));
            QVERIFY(frm.isVisible());
            QCOMPARE(boxes.last().icon, Icon::Critical);
            QVERIFY2(!otherUser || boxes.last().text.contains(u"outro utilizador"_s), qPrintable(boxes.last().text));
            if (!otherUser) {
                connection.open();
                click(frm.Command3);
            }
        }));
        if (!connection.isOpen())
            connection.open();
        QCOMPARE(this->movement(id, movement), movement);
        QCOMPARE(this->account(1, account), account);
    }

    void paymentsRecordedAtTheSameMomentAreAllKept()
    {
        // Two users, each paying a due of their own of one account, at once.
        constexpr int payments = 30;
        const QVariant dues[] = {addMovement(1, {1000.0, 0.0, 50.0, 0.0, u"Sindicato"_s, 2003, 1}),
                                 addMovement(1, {1000.0, 0.0, 50.0, 0.0, u"Sindicato"_s, 2003, 2})};
        addAccount(1, 100.0, 0.0);
        QStringList failures[2];
        auto user = [&, connectionString = db->connectionString()](int n) {
            try {
                Connection own(u"user%1"_s.arg(n));
                own.setConnectionString(connectionString);
                own.open();
                Recordset rows;
                rows.open(movementsOf(1), own, Cursor::Dynamic, Lock::Optimistic);
                rows.find(u"quota_id"_s, dues[n]);
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
        QCOMPARE(movement(dues[0], u"pago"_s) + u"; "_s + movement(dues[1], u"pago"_s) + u"; "_s + account(1, u"total_pago"_s),
                 u"pago=30; pago=30; total_pago=60"_s);
    }
};

QTEST_MAIN(SettlementTest)
#include "tst_settlement.moc"
