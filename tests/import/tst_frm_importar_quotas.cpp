// The import dialog driven as a user would: its lists, the check box, the
// tab order, Executar with what is selected, Cancelar and closing.

#include "component/general.h"
#include "import/frm_importar_quotas.h"
#include "import/processar_importacao.h"
#include "import_fixture.h"
#include "support/recording_progress.h"
#include "support/scripted_boxes.h"

#include <QCheckBox>
#include <QLabel>
#include <QListWidget>
#include <QPushButton>
#include <QTest>

using namespace quotas;
using namespace quotas::test;

class FrmImportarQuotasTest : public QObject {
    Q_OBJECT

    std::unique_ptr<TestDatabase> db;
    std::unique_ptr<ImportFixture> f;

    QWidget* open()
    {
        General general;
        general.ImportarQuotas();  // returns at once, the dialog stays
        QWidget* dialog = shared().frmImportarQuotas;
        if (dialog) {
            dialog->activateWindow();
            if (!QTest::qWaitForWindowActive(dialog))
                qWarning("the dialog did not become active");
        }
        return dialog;
    }
    template <typename T>
    static T* child(const char* name)
    {
        return shared().frmImportarQuotas->findChild<T*>(QLatin1String(name));
    }
    static QStringList texts(QListWidget* list)
    {
        QStringList out;
        for (int i = 0; i < list->count(); ++i)
            out << list->item(i)->text();
        return out;
    }
    static void select(const char* list, const QString& text)
    {
        QListWidget* w = child<QListWidget>(list);
        const auto items = w->findItems(text, Qt::MatchExactly);
        QVERIFY(!items.isEmpty());
        QTest::mouseClick(w->viewport(), Qt::LeftButton, {}, w->visualItemRect(items.front()).center());
        QCOMPARE(w->currentItem()->text(), text);
    }
    static void executar()
    {
        QTest::mouseClick(child<QPushButton>("Command1"), Qt::LeftButton);
        QTRY_VERIFY(!shared().frmImportarQuotas);  // closed and unloaded after the run
    }

private slots:
    void initTestCase()
    {
        db = std::make_unique<TestDatabase>();
        db->login();
        f = std::make_unique<ImportFixture>(ImportFixture{*db});
        FrmImportarQuotas::pinToday(QDate(2004, 3, 15));
    }
    void cleanupTestCase()
    {
        FrmImportarQuotas::pinToday(QDate());
        f.reset();
        db.reset();
    }
    void init()
    {
        db->clear();
        RecordingProgress::install();
        setRejectsListing([] {});
    }
    void cleanup()
    {
        delete shared().frmImportarQuotas.data();
        setRejectsListing({});
        RecordingProgress::uninstall();
    }

    void opensWithoutBlockingOnTodaysChoices()
    {
        QWidget* dialog = open();
        QVERIFY(dialog);
        QVERIFY(dialog->isVisible());
        QVERIFY(!dialog->isModal());
        QCOMPARE(dialog->windowTitle(), QStringLiteral("Importar Registos de Quotas"));
        QCOMPARE(dialog->size(), QSize(463, 253));
        QCOMPARE(texts(child<QListWidget>("List1")),
                 (QStringList{"1999", "2000", "2001", "2002", "2003", "2004", "2005"}));
        QCOMPARE(child<QListWidget>("List1")->currentItem()->text(), QStringLiteral("2004"));
        QCOMPARE(texts(child<QListWidget>("List2")),
                 (QStringList{"Janeiro", "Fevereiro", "Março", "Abril", "Maio", "Junho", "Julho", "Agosto", "Setembro",
                              "Outubro", "Novembro", "Dezembro"}));
        QCOMPARE(child<QListWidget>("List2")->currentItem()->text(), QStringLiteral("Março"));
        QCOMPARE(texts(child<QListWidget>("List3")), (QStringList{"Sindicato", "Plano de Saúde"}));
        QCOMPARE(child<QListWidget>("List3")->currentItem()->text(), QStringLiteral("Sindicato"));
        QVERIFY(child<QCheckBox>("Check1")->isChecked());
        QCOMPARE(child<QCheckBox>("Check1")->text(), QStringLiteral("Os registos estão separados com um ponto (.)"));
        // A second call shows the same dialog.
        General().ImportarQuotas();
        QCOMPARE(shared().frmImportarQuotas.data(), dialog);
    }

    void controlsSitWhereTheyWereLaidOut_data()
    {
        QTest::addColumn<QString>("name");
        QTest::addColumn<QRect>("twips");
        QTest::newRow("Label3") << "Label3" << QRect(180, 180, 1755, 255);
        QTest::newRow("List1") << "List1" << QRect(180, 480, 1815, 2595);
        QTest::newRow("Label2") << "Label2" << QRect(2580, 180, 1755, 255);
        QTest::newRow("List2") << "List2" << QRect(2580, 480, 1815, 2595);
        QTest::newRow("Command1") << "Command1" << QRect(5160, 180, 1575, 375);
        QTest::newRow("Command2") << "Command2" << QRect(5160, 600, 1575, 375);
        QTest::newRow("Label1") << "Label1" << QRect(4920, 1440, 1755, 255);
        QTest::newRow("List3") << "List3" << QRect(4920, 1680, 1815, 1425);
        QTest::newRow("Check1") << "Check1" << QRect(180, 3330, 6585, 285);
    }
    void controlsSitWhereTheyWereLaidOut()
    {
        QFETCH(QString, name);
        QFETCH(QRect, twips);
        open();
        QWidget* w = shared().frmImportarQuotas->findChild<QWidget*>(name);
        QVERIFY(w);
        QCOMPARE(w->geometry(), QRect(twips.x() / 15, twips.y() / 15, twips.width() / 15, twips.height() / 15));
    }

    void tabFollowsTheLaidOutOrder()
    {
        open();
        const QStringList expected = {"List2", "List1", "Command2", "Command1", "List3", "Check1", "List2"};
        QCOMPARE(QApplication::focusWidget()->objectName(), expected.front());
        for (int i = 1; i < expected.size(); ++i) {
            QTest::keyClick(QApplication::focusWidget(), Qt::Key_Tab);
            QCOMPARE(QApplication::focusWidget()->objectName(), expected[i]);
        }
        // Escape is no cancel key here.
        QTest::keyClick(QApplication::focusWidget(), Qt::Key_Escape);
        QVERIFY(shared().frmImportarQuotas && shared().frmImportarQuotas->isVisible());
    }

    void theCheckBoxSetsTheAmountNotation()
    {
        open();
        QCheckBox* box = child<QCheckBox>("Check1");
        QTest::mouseClick(box, Qt::LeftButton);
        QVERIFY(shared().SemSeparadorDecimal);
        QTest::mouseClick(box, Qt::LeftButton);
        QVERIFY(!shared().SemSeparadorDecimal);
        QTest::mouseClick(box, Qt::LeftButton);
        QVERIFY(shared().SemSeparadorDecimal);
        // Closing and opening again starts checked.
        shared().frmImportarQuotas->close();
        QTRY_VERIFY(!shared().frmImportarQuotas);
        open();
        QVERIFY(child<QCheckBox>("Check1")->isChecked());
        QVERIFY(!shared().SemSeparadorDecimal);
    }

    void monthNamesMapExactly_data()
    {
        QTest::addColumn<QString>("name");
        QTest::addColumn<int>("month");
        QTest::newRow("Janeiro") << "Janeiro" << 1;
        QTest::newRow("Março") << "Março" << 3;
        QTest::newRow("Dezembro") << "Dezembro" << 12;
        QTest::newRow("março") << "março" << 0;
        QTest::newRow("Marco") << "Marco" << 0;
        QTest::newRow("empty") << "" << 0;
    }
    void monthNamesMapExactly()
    {
        QFETCH(QString, name);
        QFETCH(int, month);
        QCOMPARE(FrmImportarQuotas::monthFromName(name), month);
    }

    void executarRunsOnTheSelectionAndCloses_data()
    {
        QTest::addColumn<QString>("year");
        QTest::addColumn<QString>("month");
        QTest::addColumn<QString>("type");
        QTest::addColumn<QString>("message");
        QTest::newRow("February 2003") << "2003" << "Fevereiro" << "Sindicato"
                                       << "Não foram processados os registos de quotas referente a 2 / 2003.";
        QTest::newRow("a month name in other case") << "2004" << "março" << "Sindicato"
                                                    << "Não foram processados os registos de quotas referente a 0 / 2004.";
        QTest::newRow("health plan, March 2004") << "2004" << "Março" << "Plano de Saúde" << "";
    }
    void executarRunsOnTheSelectionAndCloses()
    {
        QFETCH(QString, year);
        QFETCH(QString, month);
        QFETCH(QString, type);
        QFETCH(QString, message);
        f->charged(1, QStringLiteral("100"), 20.0, 0.0, 2);  // a health-plan due only
        f->useFile("no_tap;quota\n100;5.00\n");
        open();
        if (month == QStringLiteral("março"))
            child<QListWidget>("List2")->currentItem()->setText(month);
        else
            select("List2", month);
        select("List1", year);
        select("List3", type);
        ScriptedBoxes boxes;
        executar();
        QCOMPARE(boxes.texts(), message.isEmpty() ? QStringList() : QStringList{message});
        QCOMPARE(f->cents(f->movementValue(1, QStringLiteral("pago"), 2)), message.isEmpty() ? 500 : 0);
    }

    void theNextOpeningReadsDecimalPointsAgain()
    {
        f->charged(1, QStringLiteral("100"), 20.0);
        f->charged(2, QStringLiteral("200"), 20.0);
        f->useFile("no_tap;quota\n100;1250\n");
        open();
        QTest::mouseClick(child<QCheckBox>("Check1"), Qt::LeftButton);
        ScriptedBoxes boxes;
        executar();
        QCOMPARE(f->cents(f->movementValue(1, QStringLiteral("pago"))), 1250);
        f->useFile("no_tap;quota\n200;12.50\n");
        open();
        executar();
        QCOMPARE(f->cents(f->movementValue(2, QStringLiteral("pago"))), 1250);
        QVERIFY(boxes.shown.isEmpty());
    }

    void aFileThatCannotBeReadIsToldAndImportsNothing()
    {
        f->charged(1, QStringLiteral("100"), 20.0);
        const QString path = f->useFile("no_tap;quota\n100;\"5\n");
        open();
        ScriptedBoxes boxes;
        executar();
        QCOMPARE(boxes.shown.size(), 1);
        QCOMPARE(boxes.last().icon, Icon::Critical);
        QCOMPARE(boxes.last().text, QStringLiteral("O ficheiro \"%1\" não é um ficheiro CSV válido: um valor entre aspas "
                                                   "começado na linha 2 não foi fechado.").arg(path));
        QCOMPARE(f->cents(f->movementValue(1, QStringLiteral("pago"))), 0);
    }

    void cancelarClosesWithoutImporting()
    {
        int built = 0;
        registerComponent(QStringLiteral("Dorvanta.General"), [&] {
            ++built;
            return std::make_unique<CsvImportSource>([] { return QString(); });
        });
        open();
        ScriptedBoxes boxes;
        QTest::mouseClick(child<QPushButton>("Command2"), Qt::LeftButton);
        QTRY_VERIFY(!shared().frmImportarQuotas);
        QCOMPARE(built, 0);
        QVERIFY(boxes.shown.isEmpty());
    }
};

QTEST_MAIN(FrmImportarQuotasTest)
#include "tst_frm_importar_quotas.moc"
