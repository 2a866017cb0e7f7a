// The import dialog driven as a user would: its lists, the check box, the
// tab order, Executar with what is selected, Cancelar and closing.

#include "component/general.h"
#include "import/frm_importar_quotas.h"
#include "import/processar_importacao.h"
#include "import_fixture.h"
#include "support/recording_progress.h"
#include "support/scripted_boxes.h"

#include <QCheckBox>
#include <QListWidget>
#include <QPushButton>
#include <QTest>

using namespace quotas;
using namespace quotas::test;

class FrmImportarQuotasTest : public QObject {
    Q_OBJECT

    std::unique_ptr<TestDatabase> db;
    std::unique_ptr<ImportFixture> f;

    static QWidget* open()
    {
        General().ImportarQuotas();  // returns at once, the dialog stays
        QWidget* dialog = shared().frmImportarQuotas;
        if (dialog && !QTest::qWaitForWindowActive(dialog))
            qWarning("the dialog did not become active");
        return dialog;
    }
    template <typename T = QListWidget>
    static T* child(const char* name)
    {
        return shared().frmImportarQuotas->findChild<T*>(QLatin1String(name));
    }
    static QStringList items(const char* list)
    {
        QStringList out;
        for (int i = 0; i < child(list)->count(); ++i)
            out << child(list)->item(i)->text();
        return out;
    }
    static QString selected(const char* list) { return child(list)->currentItem()->text(); }
    static void select(const char* list, const QString& text)
    {
        QListWidget* w = child(list);
        QTest::mouseClick(w->viewport(), Qt::LeftButton, {}, w->visualItemRect(w->findItems(text, Qt::MatchExactly).front()).center());
    }
    static void click(const char* button)
    {
        QTest::mouseClick(child<QAbstractButton>(button), Qt::LeftButton);
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
        QVERIFY(dialog && dialog->isVisible() && !dialog->isModal());
        QCOMPARE(dialog->windowTitle(), QStringLiteral("Importar Registos de Quotas"));
        QCOMPARE(dialog->size(), QSize(463, 253));  // 6945 x 3795 twips
        QCOMPARE(items("List1"), (QStringList{"1999", "2000", "2001", "2002", "2003", "2004", "2005"}));
        QCOMPARE(selected("List1"), QStringLiteral("2004"));
        QCOMPARE(items("List2"), (QStringList{"Janeiro", "Fevereiro", "Março", "Abril", "Maio", "Junho", "Julho", "Agosto",
                                              "Setembro", "Outubro", "Novembro", "Dezembro"}));
        QCOMPARE(selected("List2"), QStringLiteral("Março"));
        QCOMPARE(items("List3"), (QStringList{"Sindicato", "Plano de Saúde"}));
        QCOMPARE(selected("List3"), QStringLiteral("Sindicato"));
        QVERIFY(child<QCheckBox>("Check1")->isChecked());
        General().ImportarQuotas();
        QCOMPARE(shared().frmImportarQuotas.data(), dialog);  // one dialog at a time
    }

    void tabFollowsTheLaidOutOrder()
    {
        open();
        const QStringList order = {"List2", "List1", "Command2", "Command1", "List3", "Check1", "List2"};
        QCOMPARE(QApplication::focusWidget()->objectName(), order.front());
        for (int i = 1; i < order.size(); ++i) {
            QTest::keyClick(QApplication::focusWidget(), Qt::Key_Tab);
            QCOMPARE(QApplication::focusWidget()->objectName(), order[i]);
        }
        QTest::keyClick(QApplication::focusWidget(), Qt::Key_Escape);  // no cancel key
        QVERIFY(shared().frmImportarQuotas);
    }

    void theCheckBoxSetsTheAmountNotationUntilClosed()
    {
        open();
        click("Check1");
        QVERIFY(shared().SemSeparadorDecimal);
        click("Check1");
        QVERIFY(!shared().SemSeparadorDecimal);
        click("Check1");
        shared().frmImportarQuotas->close();
        QTRY_VERIFY(!shared().frmImportarQuotas);  // unloaded
        open();
        QVERIFY(child<QCheckBox>("Check1")->isChecked());
        QVERIFY(!shared().SemSeparadorDecimal);
    }

    void executarRunsOnTheSelectionAndCloses_data()
    {
        QTest::addColumn<QString>("year");
        QTest::addColumn<QString>("month");
        QTest::addColumn<QString>("type");
        QTest::addColumn<QByteArray>("amount");  // with the box cleared when it has no point
        QTest::addColumn<QString>("message");
        QTest::addColumn<int>("paid");
        const QString none = QStringLiteral("Não foram processados os registos de quotas referente a %1.");
        QTest::newRow("February 2003") << "2003" << "Fevereiro" << "Plano de Saúde" << QByteArray("5.00") << none.arg("2 / 2003") << 0;
        QTest::newRow("a month name in other case") << "2004" << "março" << "Plano de Saúde" << QByteArray("5.00")
                                                    << none.arg("0 / 2004") << 0;
        QTest::newRow("union due, March 2004") << "2004" << "Março" << "Sindicato" << QByteArray("5.00") << none.arg("3 / 2004") << 0;
        QTest::newRow("health plan, March 2004") << "2004" << "Março" << "Plano de Saúde" << QByteArray("5.00") << QString() << 500;
        QTest::newRow("whole cents") << "2004" << "Março" << "Plano de Saúde" << QByteArray("500") << QString() << 500;
    }
    void executarRunsOnTheSelectionAndCloses()
    {
        QFETCH(QString, year);
        QFETCH(QString, month);
        QFETCH(QString, type);
        QFETCH(QByteArray, amount);
        QFETCH(QString, message);
        QFETCH(int, paid);
        f->charged(1, QStringLiteral("100"), 20.0, 0.0, 2);  // a health-plan due only
        f->useFile("no_tap;quota\n100;" + amount + "\n");
        open();
        if (month == QStringLiteral("março"))
            child("List2")->currentItem()->setText(month);
        else
            select("List2", month);
        select("List1", year);
        select("List3", type);
        if (!amount.contains('.'))
            click("Check1");
        ScriptedBoxes boxes;
        click("Command1");
        QTRY_VERIFY(!shared().frmImportarQuotas);  // closed after the run
        QCOMPARE(boxes.texts(), message.isEmpty() ? QStringList() : QStringList{message});
        QCOMPARE(f->movementCents(1, "pago", 2), paid);
    }

    void aFileThatCannotBeReadIsToldAndImportsNothing()
    {
        f->charged(1, QStringLiteral("100"), 20.0);
        const QString path = f->useFile("no_tap;quota\n100;\"5\n");
        open();
        ScriptedBoxes boxes;
        click("Command1");
        QTRY_VERIFY(!shared().frmImportarQuotas);
        QCOMPARE(boxes.texts(), QStringList{QStringLiteral("O ficheiro \"%1\" não é um ficheiro CSV válido: um valor entre "
                                                           "aspas começado na linha 2 não foi fechado.").arg(path)});
        QCOMPARE(boxes.last().icon, Icon::Critical);
        QCOMPARE(f->movementCents(1, "pago"), 0);
    }

    void cancelarClosesWithoutImporting()
    {
        int built = 0;
        registerComponent(QStringLiteral("Dorvanta.General"), [&] {
            ++built;
            return std::make_unique<CsvImportSource>([] { return QString(); });
        });
        open();
        click("Command2");
        QTRY_VERIFY(!shared().frmImportarQuotas);
        QCOMPARE(built, 0);
    }
};

QTEST_MAIN(FrmImportarQuotasTest)
#include "tst_frm_importar_quotas.moc"
