// The stand-in host's member register: the order of each column, the
// search, the open amount taken from the movements with stale stored totals
// marked, the selection kept, and one reading of the register per action.

#include "component/general.h"
#include "component/shared_objects.h"
#include "host/main_window.h"
#include "host/member_register.h"
#include "support/scripted_boxes.h"
#include "support/test_database.h"

#include <QAction>
#include <QApplication>
#include <QLineEdit>
#include <QTableView>
#include <QTest>
#include <QTimer>

using namespace quotas;
using namespace quotas::test;
using namespace Qt::StringLiterals;

class RegisterTest : public QObject {
    Q_OBJECT
    std::unique_ptr<TestDatabase> db;
    std::unique_ptr<General> general;
    std::unique_ptr<host::MainWindow> window;

    // The staff numbers listed, top to bottom.
    QStringList listed() const
    {
        QStringList out;
        const QAbstractItemModel* m = window->members()->model();
        for (int row = 0; row < m->rowCount(); ++row)
            out << m->index(row, 0).data().toString();
        return out;
    }

private slots:
    void initTestCase()
    {
        db = std::make_unique<TestDatabase>();
        db->login();
        Connection& c = db->connection();
        c.execute(u"INSERT INTO tbSocios (socio_id, no_tap, nome) VALUES (1, '10', 'Zé Álvaro'), (2, '9', 'álvaro Costa'), "
                  "(3, '100', 'Maria João Conceição'), (4, 'X1', 'Luís')"_s);
        // 1's totals agree with its movements; 2's were not rebuilt after a cancellation; 4 has no account yet.
        c.execute(u"INSERT INTO tbQuotas_Socios (socio_id, total_quotas, total_pago) VALUES (1, 30, 10), (2, 50, 0)"_s);
        c.execute(u"INSERT INTO tbQuotas_Movimentos (socio_id, ano, mes, tipo, ref, quota, pago) VALUES "
                  "(1, 2003, 1, 1, 'Sindicato', 15, 10), (1, 2003, 2, 1, 'Sindicato', 15, 0), "
                  "(2, 2003, 1, 1, 'Sindicato', 15, 0), (4, 2003, 1, 1, 'Sindicato', 12, 0)"_s);
        general = std::make_unique<General>();
        window = std::make_unique<host::MainWindow>(*general);
        window->refreshMembers();
        window->show();
        QVERIFY(QTest::qWaitForWindowExposed(window.get()));
    }
    void cleanupTestCase()
    {
        window.reset();
        general.reset();
        releaseShared();
    }
    void init() { window->search()->clear(); }

    // Sorted by any column, narrowed by the search.
    void listsInOrder_data()
    {
        QTest::addColumn<int>("column");
        QTest::addColumn<int>("order");
        QTest::addColumn<QString>("search");
        QTest::addColumn<QStringList>("numbers");
        const auto row = [](const char* tag, int column, Qt::SortOrder order, const char* search, const QStringList& numbers) {
            QTest::newRow(tag) << column << int(order) << QString::fromUtf8(search) << numbers;
        };
        row("name, accents and case aside", 1, Qt::AscendingOrder, "", {"9", "X1", "100", "10"});
        row("staff number, numbers first", 0, Qt::AscendingOrder, "", {"9", "10", "100", "X1"});
        row("stored total", 2, Qt::DescendingOrder, "", {"9", "10", "100", "X1"});
        row("open amount", 4, Qt::DescendingOrder, "", {"10", "9", "X1", "100"});
        row("search, accents and case aside", 0, Qt::AscendingOrder, "ALVARO", {"9", "10"});
        row("accented search text", 0, Qt::AscendingOrder, "joão", {"100"});
        row("part of a staff number", 0, Qt::AscendingOrder, "10", {"10", "100"});
        row("nobody", 0, Qt::AscendingOrder, "zzz", {});
    }
    void listsInOrder()
    {
        QFETCH(int, column);
        QFETCH(int, order);
        QFETCH(QString, search);
        QFETCH(QStringList, numbers);
        window->members()->sortByColumn(column, Qt::SortOrder(order));
        window->search()->setText(search);
        QCOMPARE(listed(), numbers);
    }

    // Stored totals that disagree with the movements are marked; the open amount is the movements'.
    void showsTheOpenAmountOfTheMovements()
    {
        window->members()->sortByColumn(0, Qt::AscendingOrder);
        QStringList rows;
        const QAbstractItemModel* m = window->members()->model();
        for (int row = 0; row < m->rowCount(); ++row) {
            QStringList cells;
            for (int column = 0; column < m->columnCount(); ++column)
                cells << m->index(row, column).data().toString();
            rows << cells.join(u" | "_s) + (m->index(row, 2).data(Qt::ToolTipRole).isNull() ? ""_L1 : " (hint)"_L1);
        }
        QCOMPARE(rows, (QStringList{"9 | álvaro Costa | € 50.00 * | € 0.00 * | € 15.00 (hint)",
                                    "10 | Zé Álvaro | € 30.00 | € 10.00 | € 20.00", "100 | Maria João Conceição |  |  | ",
                                    "X1 | Luís | * | * | € 12.00 (hint)"}));
    }

    // The chosen member stays chosen through a search that keeps him and through a refresh.
    void keepsTheSelection()
    {
        window->selectMember(3);
        window->search()->setText(u"Maria"_s);
        QCOMPARE(window->currentMember().toInt(), 3);
        window->search()->clear();
        window->refreshMembers();
        QCOMPARE(window->currentMember().toInt(), 3);
    }

    // Each entry of the menu, its window closed as soon as it shows, reads the register once.
    void readsTheRegisterOncePerAction_data()
    {
        QTest::addColumn<QString>("action");
        for (const char* a : {"GerarQuotas", "ImportarQuotas", "Registo", "CallManutencaoDados", "ListagemDividas", "CartasDividas"})
            QTest::newRow(a) << QString::fromLatin1(a);
    }
    void readsTheRegisterOncePerAction()
    {
        QFETCH(QString, action);
        ScriptedBoxes boxes;
        window->selectMember(1);
        QTimer closer;
        connect(&closer, &QTimer::timeout, this, [] {
            if (QWidget* modal = QApplication::activeModalWidget())
                modal->close();
        });
        closer.start(20);
        const int before = window->refreshes();
        window->findChild<QAction*>(action)->trigger();
        if (QWidget* dialog = shared().frmImportarQuotas)  // not modal: closed by the user later
            dialog->close();
        QTest::qWait(50);
        QCOMPARE(window->refreshes() - before, 1);
    }
};

QTEST_MAIN(RegisterTest)
#include "tst_register.moc"
