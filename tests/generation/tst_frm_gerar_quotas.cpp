// The generation dialog driven through its widgets: lists and preselection
// for a pinned date, the staff-number check that keeps the focus, the
// confirmation, the closing message, a failed run, and GerarQuotas.

#include "component/general.h"
#include "component/shared_objects.h"
#include "generation/frm_gerar_quotas.h"
#include "schema/schema.h"
#include "support/recording_progress.h"
#include "support/scripted_boxes.h"
#include "support/test_database.h"
#include "generation_fixture.h"

#include <QApplication>
#include <QLineEdit>
#include <QListWidget>
#include <QMessageBox>
#include <QPushButton>
#include <QTest>
#include <QTimer>

using namespace quotas;
using quotas::test::GenerationFixture;
using quotas::test::RecordingProgress;
using quotas::test::ScriptedBoxes;
using quotas::test::ShownBox;
using quotas::test::TestDatabase;

namespace {

const QString kUnknown = QStringLiteral("Número de Empresa não existe!");
const QString kConfirm = QStringLiteral("Deseja iniciar o processamento de quotas?");
const QString kEnd = QStringLiteral("Fim do processamento de quotizações");

void pick(QListWidget* list, const QString& text)
{
    const auto items = list->findItems(text, Qt::MatchExactly);
    QVERIFY(!items.isEmpty());
    list->scrollToItem(items.front());
    QTest::mouseClick(list->viewport(), Qt::LeftButton, {}, list->visualItemRect(items.front()).center());
    QCOMPARE(list->currentItem(), items.front());
}

}  // namespace

class FrmGerarQuotasTest : public QObject {
    Q_OBJECT

    std::unique_ptr<TestDatabase> db;
    std::unique_ptr<frmGerarQuotas> dlg;
    Connection& c() { return db->connection(); }
    GenerationFixture f() { return GenerationFixture{c()}; }

    // Shown and active, dated January 2003.
    frmGerarQuotas& open()
    {
        dlg = std::make_unique<frmGerarQuotas>(QDate(2003, 1, 15));
        dlg->show();
        QApplication::setActiveWindow(dlg.get());
        if (!QTest::qWaitForWindowActive(dlg.get()))
            qWarning("the dialog did not become active");
        return *dlg;
    }
    void typeStaffNumber(const QString& text)
    {
        dlg->No_Tap->setFocus();
        dlg->No_Tap->selectAll();
        if (text.isEmpty())
            QTest::keyClick(dlg->No_Tap, Qt::Key_Delete);
        else
            QTest::keyClicks(dlg->No_Tap, text);
        QTest::keyClick(dlg->No_Tap, Qt::Key_Tab);
    }
    int movements(int ano, int mes)
    {
        return c().scalar(QStringLiteral("SELECT COUNT(*) FROM tbQuotas_Movimentos WHERE ano = ? AND mes = ?"), {ano, mes}).toInt();
    }

private slots:
    void initTestCase()
    {
        db = std::make_unique<TestDatabase>();
        db->login();
        RecordingProgress::install();
    }
    void cleanupTestCase()
    {
        dlg.reset();
        RecordingProgress::uninstall();
        db.reset();
    }
    void init()
    {
        db->clear();
        for (int socio = 1; socio <= 3; ++socio)
            f().member(socio, QStringLiteral("100%1").arg(socio));
    }
    void cleanup() { dlg.reset(); }

    void listsAndPreselectionForJanuary2003()
    {
        frmGerarQuotas& d = open();
        QStringList years;
        for (int i = 0; i < d.List1->count(); ++i)
            years << d.List1->item(i)->text();
        QCOMPARE(years, QStringList({"1999", "2000", "2001", "2002", "2003", "2004"}));
        QCOMPARE(d.List1->currentItem()->text(), QStringLiteral("2003"));
        QStringList months;
        for (int i = 0; i < d.List2->count(); ++i)
            months << d.List2->item(i)->text();
        QCOMPARE(months, QStringList({"Janeiro", "Fevereiro", "Março", "Abril", "Maio", "Junho", "Julho", "Agosto",
                                      "Setembro", "Outubro", "Novembro", "Dezembro"}));
        QCOMPARE(d.List2->currentRow(), 0);
        QCOMPARE(d.selectedMember(), 0);
        QCOMPARE(d.windowTitle(), QStringLiteral("Gerar Quotas"));
        QCOMPARE(d.size(), QSize(447, 297));
    }

    void chosenYearAndMonthAreRunAndTheDialogCloses()
    {
        ScriptedBoxes boxes;
        boxes.answer(Answer::Yes);
        frmGerarQuotas& d = open();
        pick(d.List1, QStringLiteral("2001"));
        pick(d.List2, QStringLiteral("Março"));
        QTest::mouseClick(d.Command1, Qt::LeftButton);
        QCOMPARE(movements(2001, 3), 3);
        QVERIFY(!d.isVisible());
        QCOMPARE(d.result(), int(QDialog::Accepted));
        QCOMPARE(boxes.shown.size(), 2);
        QCOMPARE(boxes.shown[0].text, kConfirm);
        QCOMPARE(boxes.shown[0].buttons, Buttons::YesNo);
        QCOMPARE(boxes.shown[0].icon, Icon::Question);
        QCOMPARE(boxes.shown[0].title, QStringLiteral("Processar Quotizações"));
        QCOMPARE(boxes.shown[1].text, kEnd);
        QCOMPARE(boxes.shown[1].icon, Icon::Information);
        QCOMPARE(boxes.shown[1].title, QStringLiteral("Gerar Quotas"));
    }

    void unknownStaffNumberKeepsTheFocus_data()
    {
        QTest::addColumn<QString>("typed");
        QTest::newRow("not a member") << QStringLiteral("999");
        QTest::newRow("quote trick") << QStringLiteral("x' OR '1'='1");
    }
    void unknownStaffNumberKeepsTheFocus()
    {
        QFETCH(QString, typed);
        ScriptedBoxes boxes;
        frmGerarQuotas& d = open();
        typeStaffNumber(QStringLiteral("1002"));
        QCOMPARE(d.Text2->text(), QStringLiteral("Associado 2"));
        QCOMPARE(d.selectedMember(), 2);
        typeStaffNumber(typed);
        QCOMPARE(boxes.shown.size(), 1);
        QCOMPARE(boxes.last().text, kUnknown);
        QCOMPARE(boxes.last().buttons, Buttons::Ok);
        QCOMPARE(boxes.last().icon, Icon::Information);
        QCOMPARE(boxes.last().title, applicationTitle());
        QCOMPARE(QApplication::focusWidget(), d.No_Tap);
        QCOMPARE(d.selectedMember(), 0);
        QCOMPARE(d.Text2->text(), QStringLiteral("Associado 2"));

        // Executar with the wrong number still there: leaving the field is
        // refused again, and neither the confirmation nor the run follows.
        boxes.answer(Answer::Yes);
        QTest::mouseClick(d.Command1, Qt::LeftButton);
        QCOMPARE(boxes.texts(), QStringList({kUnknown, kUnknown}));
        QVERIFY(d.isVisible());
        QCOMPARE(QApplication::focusWidget(), d.No_Tap);
        QCOMPARE(f().count(QStringLiteral("tbQuotas_Movimentos")), 0);
    }

    void knownStaffNumberNarrowsTheRunAndClearingWidensIt()
    {
        ScriptedBoxes boxes;
        boxes.answer(Answer::Yes);
        frmGerarQuotas& d = open();
        typeStaffNumber(QStringLiteral("1003"));
        QCOMPARE(d.Text2->text(), QStringLiteral("Associado 3"));
        QTest::mouseClick(d.Command1, Qt::LeftButton);
        QCOMPARE(movements(2003, 1), 1);
        QCOMPARE(c().scalar(QStringLiteral("SELECT socio_id FROM tbQuotas_Movimentos")).toInt(), 3);

        boxes.answer(Answer::Yes);
        frmGerarQuotas& again = open();
        typeStaffNumber(QStringLiteral("1003"));
        typeStaffNumber(QString());
        QCOMPARE(again.Text2->text(), QString());
        QCOMPARE(again.selectedMember(), 0);
        QTest::mouseClick(again.Command1, Qt::LeftButton);
        QCOMPARE(movements(2003, 1), 3);
    }

    void numberTypedThenExecutarIsCheckedFirst()
    {
        ScriptedBoxes boxes;
        frmGerarQuotas& d = open();
        d.No_Tap->setFocus();
        QTest::keyClicks(d.No_Tap, QStringLiteral("999"));
        QTest::keyClick(d.No_Tap, Qt::Key_Return);  // the default button, focus still in the field
        QCOMPARE(boxes.texts(), QStringList({kUnknown}));
        QVERIFY(d.isVisible());
        QCOMPARE(QApplication::focusWidget(), d.No_Tap);
    }

    // With Qt's own box the focus goes to the box and back: one message
    // per attempt to leave, and the dialog's focus stays in the field.
    void qtMessageBoxKeepsTheFocusInTheField()
    {
        frmGerarQuotas& d = open();
        int shown = 0;
        QTimer answerer;
        connect(&answerer, &QTimer::timeout, this, [&] {
            if (auto* box = qobject_cast<QMessageBox*>(QApplication::activeModalWidget())) {
                ++shown;
                QCOMPARE(box->text(), kUnknown);
                QTest::keyClick(box, Qt::Key_Return);
            }
        });
        answerer.start(20);
        typeStaffNumber(QStringLiteral("999"));
        QCOMPARE(shown, 1);
        QApplication::setActiveWindow(&d);  // what the desktop does once the box is gone
        QCOMPARE(QApplication::focusWidget(), d.No_Tap);
        QTest::mouseClick(d.Command1, Qt::LeftButton);
        QCOMPARE(shown, 2);
        QApplication::setActiveWindow(&d);
        QCOMPARE(QApplication::focusWidget(), d.No_Tap);
        QVERIFY(d.isVisible());
    }

    void cancellingNeedsNoValidNumber()
    {
        ScriptedBoxes boxes;
        frmGerarQuotas& d = open();
        d.No_Tap->setFocus();
        QTest::keyClicks(d.No_Tap, QStringLiteral("999"));
        QTest::mouseClick(d.Command2, Qt::LeftButton);
        QVERIFY(boxes.shown.isEmpty());
        QVERIFY(!d.isVisible());
        QCOMPARE(d.result(), int(QDialog::Rejected));
    }

    void answeringNoLeavesEveryChoice()
    {
        ScriptedBoxes boxes;
        boxes.answer(Answer::No);
        frmGerarQuotas& d = open();
        pick(d.List1, QStringLiteral("2001"));
        pick(d.List2, QStringLiteral("Março"));
        typeStaffNumber(QStringLiteral("1002"));
        QTest::mouseClick(d.Command1, Qt::LeftButton);
        QCOMPARE(boxes.texts(), QStringList({kConfirm}));
        QVERIFY(d.isVisible());
        QCOMPARE(d.List1->currentItem()->text(), QStringLiteral("2001"));
        QCOMPARE(d.List2->currentRow(), 2);
        QCOMPARE(d.No_Tap->text(), QStringLiteral("1002"));
        QCOMPARE(d.Text2->text(), QStringLiteral("Associado 2"));
        QCOMPARE(d.selectedMember(), 2);
        QCOMPARE(f().count(QStringLiteral("tbQuotas_Movimentos")), 0);
    }

    void duesNotGeneratedAreToldAfterTheClosingMessage()
    {
        f().account(2, 1000.0, test::kNull);
        ScriptedBoxes boxes;
        boxes.answer(Answer::Yes);
        frmGerarQuotas& d = open();
        QTest::mouseClick(d.Command1, Qt::LeftButton);
        QCOMPARE(boxes.shown.size(), 3);
        QCOMPARE(boxes.shown[1].text, kEnd);
        QVERIFY(boxes.shown[2].text.startsWith(QStringLiteral("Não foi gerada 1 quota:")));
        QCOMPARE(boxes.shown[2].icon, Icon::Exclamation);
    }

    void failedRunIsToldAndTheDialogStays()
    {
        c().execute(QStringLiteral("DROP TABLE tbcontadores"));
        ScriptedBoxes boxes;
        boxes.answer(Answer::Yes);
        frmGerarQuotas& d = open();
        QTest::mouseClick(d.Command1, Qt::LeftButton);
        createSchema(c());
        QCOMPARE(boxes.shown.size(), 2);
        QVERIFY2(boxes.last().text.startsWith(QStringLiteral("O processamento de quotas parou no associado com o Nº Empresa 1001")),
                 qPrintable(boxes.last().text));
        QCOMPARE(boxes.last().icon, Icon::Critical);
        QVERIFY(!boxes.texts().contains(kEnd));
        QVERIFY(d.isVisible());
        QVERIFY(!RecordingProgress::log().showing);
    }

    void gerarQuotasShowsTheDialogModally()
    {
        ScriptedBoxes boxes;
        bool seen = false;
        QTimer::singleShot(0, this, [&] {
            auto* shown = qobject_cast<frmGerarQuotas*>(shared().frmGerarQuotas.data());
            seen = shown && shown->isVisible() && shown->isModal()
                   && shown->List1->currentItem()->text() == QString::number(QDate::currentDate().year());
            if (shown)
                QTest::mouseClick(shown->Command2, Qt::LeftButton);
        });
        General general;
        general.GerarQuotas();
        QVERIFY(seen);
        QVERIFY(shared().frmGerarQuotas.isNull());
        QVERIFY(boxes.shown.isEmpty());
    }
};

QTEST_MAIN(FrmGerarQuotasTest)
#include "tst_frm_gerar_quotas.moc"
