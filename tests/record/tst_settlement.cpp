// How the work on a movement ends: Sair's save step, the close control, a
// payment and a cancellation; then with a second user working on the same
// rows, and with a database that fails.

#include "platform/recordset.h"
#include "record/movement_saving.h"
#include "record_fixture.h"

#include <thread>

using namespace quotas;
using namespace quotas::test;

namespace {
const QString amountBox = u"Pagamento [10] Digite a importância a liquidar."_s;
const QString documentBox = u"Tipo de Documento [] Indique o documento comprovativo de pagamento da quota:"_s;
const QString overBox = u"Pagamento (question, yes/no) A importância de € %1 é superior ao valor por liquidar (€ 10.00)."_s;
const QString lastValues = u"ult_ano=%1; ult_mes=%2; ult_rend1=700; ult_rend2=300.1; ult_quota_sindicato=%3; ult_perc_sindicato=%4; "
                            "ult_quota_seguro=%5; ult_perc_seguro=%6; total_quotas=%7; total_pago=%8"_s;

struct Ending {
    const char* button;  // or "close", the close control
    MovementRow row;
    bool hasAccount;  // 50 charged, 20 paid
    const char* rend1;  // typed first when given
    QStringList inputs;  // a null text cancels the box
    Answer answer;  // to the one Yes/No question
    QStringList boxes;
    bool closes;
    QString movement, account;  // as read()
};

// Another user paying through the same code on a connection of their own.
void pay(Connection& connection, const QVariant& quotaId, double amount)
{
    Recordset rows;
    rows.open(movementsOf(1), connection, Cursor::Dynamic, Lock::Optimistic);
    if (!rows.find(u"quota_id"_s, quotaId))
        throw QuotasError(u"no such movement"_s);
    liquidarQuota(rows, amount, u"B"_s);
}
}  // namespace
Q_DECLARE_METATYPE(Ending)

class SettlementTest : public RecordTest {
    Q_OBJECT
private slots:
    void endsTheWorkOnAMovement_data()
    {
        QTest::addColumn<Ending>("e");
        const auto row = [](const char* tag, const Ending& e) { QTest::newRow(tag) << e; };
        // An older movement than the member's last: Sair carries its values all the same.
        MovementRow older{500.0, 300.1, 12.0, 0.1, u"Sindicato"_s, 2002, 7}, insurance = older, otherCase = older;
        insurance.ref = u"Seguro"_s;
        otherCase.ref = u"sindicato"_s;
        const QString saved = u"rend1=700; quota=15"_s, rate = u"0.01499850015"_s;  // (700 + 300.1) x 0.015; 15 / 1000.1
        const QString intoInsurance = lastValues.arg(2001).arg(11).arg(3).arg(0.5).arg(15).arg(rate).arg(50).arg(20);
        row("Sair, new account", {"Command3", older, false, "700", {}, {}, {}, true, saved, lastValues.arg(2002).arg(7).arg(15).arg(rate, u"null"_s, u"null"_s).arg(0).arg(0)});
        row("Sair, existing account", {"Command3", older, true, "700", {}, {}, {}, true, saved, lastValues.arg(2001).arg(11).arg(15).arg(rate).arg(4).arg(0.25).arg(50).arg(20)});
        row("Sair, insurance", {"Command3", insurance, true, "700", {}, {}, {}, true, saved, intoInsurance});
        row("Sair, another letter case is insurance", {"Command3", otherCase, true, "700", {}, {}, {}, true, saved, intoInsurance});
        row("Sair without remunerations writes rate 0", {"Command3", {0.0, 0.0, 7.5, 0.0}, false, "", {}, {}, {}, true, u"quota=7.5"_s, u"ult_quota_sindicato=7.5; ult_perc_sindicato=0"_s});
        row("Sair first validates the field", {"Command3", {}, false, "abc", {}, {}, {u"Quotas (information) Tem de introduzir um valor válido neste campo."_s}, false, u"rend1=1000"_s, u"none"_s});
        row("the close control saves nothing", {"close", {100.0, 200.0, 3.0, 0.0}, false, "1000", {}, {}, {}, true, u"rend1=100; quota=3"_s, u"none"_s});

        const MovementRow due{1000.0, 0.0, 10.0, 0.0};
        const QStringList asked = {amountBox, documentBox};
        row("a settled due takes no payment", {"Command2", {1000.0, 0.0, 10.0, 10.0}, true, "", {}, {}, {}, false, u"pago=10"_s, u"total_pago=20"_s});
        row("4 of 10", {"Command2", due, true, "", {"4", "Recibo 17/2003"}, {}, asked, true, u"quota=10; pago=4; doc_no=Recibo 17/2003"_s, u"ult_rend1=1000; total_quotas=50; total_pago=24"_s});
        row("document box cancelled", {"Command2", due, true, "", {"4", QString()}, {}, asked, true, u"pago=4; doc_no="_s, u"total_pago=24"_s});
        row("member without an account", {"Command2", due, false, "", {"4", "R"}, {}, asked, true, u"pago=4; doc_no=R"_s, u"total_quotas=0; total_pago=4"_s});
        row("0.10 above, as typed", {"Command2", due, true, "", {"10.10", "R"}, {}, asked, true, u"pago=10.1"_s, u"total_pago=30.1"_s});
        row("more above, confirmed", {"Command2", due, true, "", {"10.11", "R"}, Answer::Yes, {amountBox, overBox.arg(u"10.11"_s), documentBox}, true, u"pago=10.11"_s, u"total_pago=30.11"_s});
        row("large amount keeps its cents", {"Command2", due, true, "", {"1234567.89", "R"}, Answer::Yes, {amountBox, overBox.arg(u"1,234,567.89"_s), documentBox}, true, u"pago=1234567.89"_s, u"total_pago=1234587.89"_s});
        // The save step runs once the amount is a number, before a refusal.
        row("amount box cancelled", {"Command2", due, false, "", {QString()}, {}, {amountBox}, false, u"pago=0"_s, u"none"_s});
        row("empty amount", {"Command2", due, false, "", {""}, {}, {amountBox}, false, u"pago=0"_s, u"none"_s});
        row("not a number", {"Command2", due, false, "", {"quatro"}, {}, {amountBox}, false, u"pago=0"_s, u"none"_s});
        row("zero", {"Command2", due, false, "", {"0"}, {}, {amountBox}, false, u"pago=0"_s, u"total_pago=0"_s});
        row("negative", {"Command2", due, false, "", {"-4"}, {}, {amountBox}, false, u"pago=0"_s, u"total_pago=0"_s});
        row("more above, not confirmed", {"Command2", due, false, "", {"10.11"}, Answer::No, {amountBox, overBox.arg(u"10.11"_s)}, false, u"pago=0"_s, u"total_pago=0"_s});

        const QStringList question = {u"Quotizações (question, yes/no) Quer eliminar este registo?"_s};
        const QString untouched = u"ult_rend1=1; total_quotas=50; total_pago=20"_s;
        row("cancellation, yes", {"Command1", {1000.0, 0.0, 10.0, 4.0}, true, "2000", {}, Answer::Yes, question, true, u"none"_s, untouched});
        row("cancellation, no", {"Command1", {1000.0, 0.0, 10.0, 4.0}, true, "2000", {}, Answer::No, question, false, u"rend1=1000; pago=4"_s, untouched});
    }
    void endsTheWorkOnAMovement()
    {
        QFETCH(Ending, e);
        const QVariant id = addMovement(e.row);
        addMovement({900.0, 0.0, 13.5, 0.0, u"Sindicato"_s, 2003, 1});
        if (e.hasAccount)
            addAccount(50.0, 20.0);
        ScriptedBoxes boxes;
        for (const QString& text : e.inputs)
            boxes.answerInput(text.isNull() ? std::nullopt : std::optional(text));
        boxes.answer(e.answer);
        RecordingCaller caller;
        QVERIFY(open(id, [&](FrmQuota& frm) {
            if (*e.rend1)
                type(frm.Text5, QString::fromLatin1(e.rend1));
            if (e.button == "close"_L1)
                frm.close();
            else
                click(frm.findChild<QPushButton*>(QString::fromLatin1(e.button)));
            QCOMPARE(frm.isVisible(), !e.closes);
        }, &caller));
        QCOMPARE(described(boxes), e.boxes);
        QCOMPARE(read(e.movement, id) + u" | "_s + read(e.account), e.movement + u" | "_s + e.account);
        QCOMPARE(caller.keys, QVariantList{id});  // however it closed
        QTRY_VERIFY(shared().frmQuota.isNull());  // unloaded: the next Registo builds a fresh one
    }

    void aPaymentWithoutAnAccountRowCreatesNone()
    {
        const QVariant id = addMovement({1000.0, 0.0, 10.0, 2.0});
        pay(db->connection(), id, 3.0);
        QCOMPARE(read(u"pago"_s, id) + u" | "_s + read(u"none"_s), u"pago=5 | none"_s);
    }

    void anotherUsersWorkIsNeverOverwrittenNorAFailureHidden_data()
    {
        QTest::addColumn<QString>("button");
        QTest::addColumn<bool>("otherUser");  // else the database fails
        QTest::addColumn<QString>("end");
        // A refused save step leaves the account as it was; the payment's own save step, before its refusal, is final.
        QTest::newRow("Sair after another user's payment") << "Command3" << true << "rend1=1000; pago=6; doc_no=B | ult_rend1=1; total_pago=6";
        QTest::newRow("payment after another user's") << "Command2" << true << "rend1=1000; pago=6; doc_no=B | ult_rend1=1000; total_pago=6";
        QTest::newRow("cancellation after another user's payment") << "Command1" << true << "rend1=1000; pago=6; doc_no=B | ult_rend1=1; total_pago=6";
        // Once the database is back, Sair in the same window saves.
        QTest::newRow("Sair, database down") << "Command3" << false << "rend1=1200; pago=0; doc_no=null | ult_rend1=1200; total_pago=0";
        QTest::newRow("payment, database down") << "Command2" << false << "rend1=1000; pago=0; doc_no=null | ult_rend1=1000; total_pago=0";
        QTest::newRow("cancellation, database down") << "Command1" << false << "rend1=1000; pago=0; doc_no=null | ult_rend1=1000; total_pago=0";
    }
    void anotherUsersWorkIsNeverOverwrittenNorAFailureHidden()
    {
        QFETCH(QString, button);
        QFETCH(bool, otherUser);
        QFETCH(QString, end);
        const QVariant id = addMovement({1000.0, 0.0, 10.0, 0.0});
        addAccount(10.0, 0.0);
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
            if (button == "Command3"_L1)
                type(frm.Text5, u"1200"_s);
            if (button == "Command3"_L1 && !otherUser)
                connection.close();
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
        QCOMPARE(read(end.section(u" | "_s, 0, 0), id) + u" | "_s + read(end.section(u" | "_s, 1)), end);
    }

    void paymentsRecordedAtTheSameMomentAreAllKept()
    {
        // Two users, each paying a due of their own of one account, at once.
        const QVariant dues[] = {addMovement({1000.0, 0.0, 50.0, 0.0, u"Sindicato"_s, 2003, 1}),
                                 addMovement({1000.0, 0.0, 50.0, 0.0, u"Sindicato"_s, 2003, 2})};
        addAccount(100.0, 0.0);
        QStringList failures[2];
        auto user = [&, connectionString = db->connectionString()](int n) {
            try {
                Connection own(u"user%1"_s.arg(n));
                own.setConnectionString(connectionString);
                own.open();
                Recordset rows;
                rows.open(movementsOf(1), own, Cursor::Dynamic, Lock::Optimistic);
                rows.find(u"quota_id"_s, dues[n]);
                for (int i = 0; i < 30; ++i)
                    liquidarQuota(rows, 1.0, QString::number(i));
            } catch (const QuotasError& e) {
                failures[n] << e.message();
            }
        };
        std::thread first(user, 0), second(user, 1);
        first.join();
        second.join();
        QCOMPARE(failures[0] + failures[1], QStringList());
        QCOMPARE(read(u"pago"_s, dues[0]) + read(u"pago"_s, dues[1]) + read(u"total_pago"_s), u"pago=30pago=30total_pago=60"_s);
    }
};

QTEST_MAIN(SettlementTest)
#include "tst_settlement.moc"
