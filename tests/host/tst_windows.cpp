// The stand-in host's member register and every window a clerk opens from
// it. The register: the order of each column, the search, the open amount
// taken from the movements with stale stored totals marked, the selection
// kept, and one reading of the register per action. Every window: no English
// word in any (Qt's own dialogs and boxes included), every caption of ours
// fits its box at the dialogs' 8-point font, and Enter on a destructive
// question answers No. With QUOTAS_SCREENSHOTS=DIR each window is saved
// there as a PNG, for the README.

#include "component/general.h"
#include "component/shared_objects.h"
#include "host/main_window.h"
#include "platform/message_boxes.h"
#include "platform/portuguese.h"
#include "support/test_database.h"

#include <QAbstractButton>
#include <QApplication>
#include <QDir>
#include <QFileDialog>
#include <QGroupBox>
#include <QHeaderView>
#include <QLabel>
#include <QLineEdit>
#include <QPushButton>
#include <QRegularExpression>
#include <QTableView>
#include <QTest>
#include <QTimer>

using namespace quotas;
using namespace quotas::test;
using namespace Qt::StringLiterals;

namespace {

// Words of Qt's dialogs without a translation ("No" only as a whole caption: "No Empresa:" is Portuguese).
const QRegularExpression kEnglish(u"^No$|\\b(Yes|Cancel|Open|Save|File|Look in|Name|Size|Type|Back|Forward|Directory|Folder|"
                                  "Print|Close|Page|Zoom|Fit|Setup|Options|Help|Detail|View|New|Show|Portrait|Landscape|"
                                  "First|Last|Previous|Next)\\b"_s);

// The English texts of a widget tree, and the captions of ours wider than their box.
QStringList english(QWidget* top)
{
    QStringList texts{top->windowTitle()}, out;
    QList<QWidget*> widgets = top->findChildren<QWidget*>();
    for (QWidget* w : widgets << top) {
        texts << w->toolTip();
        for (const QAction* a : w->actions())
            texts << a->text() << a->toolTip();
        if (auto* l = qobject_cast<QLabel*>(w))
            texts << l->text();
        else if (auto* b = qobject_cast<QAbstractButton*>(w))
            texts << b->text();
        else if (auto* g = qobject_cast<QGroupBox*>(w))
            texts << g->title();
        else if (auto* h = qobject_cast<QHeaderView*>(w); h && h->model()) {
            for (int i = 0; i < h->count(); ++i)
                texts << h->model()->headerData(i, h->orientation()).toString();
        }
    }
    for (const QString& t : texts) {
        if (kEnglish.match(QString(t).remove(u'&')).hasMatch())
            out << t;
    }
    return out;
}

QStringList clipped(QWidget* top)
{
    QStringList out;
    for (const QLabel* l : top->findChildren<QLabel*>()) {
        int needed = 0;
        for (const QString& line : QString(l->text()).remove(u'&').split(u'\n'))
            needed = std::max(needed, l->fontMetrics().horizontalAdvance(line));
        if (l->isVisibleTo(top) && !l->wordWrap() && needed > l->contentsRect().width())
            out << u"%1 (%2 > %3)"_s.arg(l->text()).arg(needed).arg(l->contentsRect().width());
    }
    return out;
}

}  // namespace

class WindowsTest : public QObject {
    Q_OBJECT
    std::unique_ptr<TestDatabase> db;
    std::unique_ptr<General> general;
    std::unique_ptr<host::MainWindow> window;
    QStringList foreign, cut;
    QString enterPresses;  // the default button, else the focused one

    // The staff numbers listed, top to bottom.
    QStringList listed() const
    {
        QStringList out;
        const QAbstractItemModel* m = window->members()->model();
        for (int row = 0; row < m->rowCount(); ++row)
            out << m->index(row, 0).data().toString();
        return out;
    }

    void inspect(const QString& name, QWidget* w)
    {
        QTest::qWait(100);  // laid out and painted
        foreign = english(w);
        cut = clipped(w);
        enterPresses.clear();
        for (const QPushButton* b : w->findChildren<QPushButton*>()) {
            if (b->isDefault() || (b->hasFocus() && b->autoDefault() && enterPresses.isEmpty()))
                enterPresses = b->text();
        }
        if (const QString dir = qEnvironmentVariable("QUOTAS_SCREENSHOTS"); !dir.isEmpty())
            w->grab().save(QDir(dir).filePath(name + u".png"_s));
    }
    // Runs open; the first window it shows is inspected and closed.
    void look(const QString& name, const std::function<void()>& open)
    {
        bool seen = false;
        QTimer inspector;
        connect(&inspector, &QTimer::timeout, this, [&] {
            QWidget* w = QApplication::activeModalWidget();
            if (!w && shared().frmImportarQuotas && shared().frmImportarQuotas->isVisible())
                w = shared().frmImportarQuotas;
            if (!w || seen || !w->isVisible())
                return;
            seen = true;
            inspect(name, w);
            w->close();
        });
        inspector.start(50);
        open();
        QTRY_VERIFY(seen);
    }

private slots:
    void initTestCase()
    {
        installPortugueseTranslation(*qApp);
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

    // Each window as the register opens it, each kind of box, and the file
    // chooser; "" is the register itself. Each window the menu opens reads the
    // register once, after it closes.
    void everyWindowSpeaksPortugueseAndFits_data()
    {
        QTest::addColumn<QString>("opens");
        QTest::addColumn<int>("buttons");  // of a message box
        QTest::addColumn<QString>("enter");
        const std::pair<const char*, const char*> windows[] = {{"registo", ""}, {"gerar-quotas", "GerarQuotas"}, {"importar-quotas", "ImportarQuotas"}, {"quota", "Registo"}, {"manutencao", "CallManutencaoDados"}, {"pre-visualizacao", "ListagemDividas"}, {"cartas-dividas", "CartasDividas"}, {"anular-geracao", "AnularGeracao"}, {"resumo-mes", "ResumoMes"}, {"extrato-quotas", "ExtratoQuotas"}};
        for (const auto& [name, action] : windows)
            QTest::newRow(name) << QString::fromLatin1(action) << -1 << QString();
        QTest::newRow("eliminar") << "box" << int(Buttons::YesNoDefaultNo) << "&Não";
        QTest::newRow("pergunta") << "box" << int(Buttons::YesNo) << "&Sim";
        QTest::newRow("aviso") << "box" << int(Buttons::OkCancel) << "OK";
        QTest::newRow("pagamento") << "input" << -1 << "OK";
        QTest::newRow("escolher-ficheiro") << "chooser" << -1 << QString();
    }
    void everyWindowSpeaksPortugueseAndFits()
    {
        QFETCH(QString, opens);
        QFETCH(int, buttons);
        QFETCH(QString, enter);
        window->members()->selectRow(0);
        const QString name = QString::fromLatin1(QTest::currentDataTag());
        const int before = window->refreshes();
        if (opens.isEmpty())
            inspect(name, window.get());
        else
            look(name, [&] {
                if (opens == "box"_L1)
                    msgBox(u"Quer eliminar este registo?\nSindicato, Março de 2003, € 15.00"_s, Buttons(buttons), Icon::Question);
                else if (opens == "input"_L1)
                    inputBox(u"Digite a importância a liquidar."_s, u"Pagamento"_s, u"15"_s);
                else if (opens == "chooser"_L1) {
                    QFileDialog chooser(window.get(), u"Lista de quotas a importar"_s);
                    chooser.setOption(QFileDialog::DontUseNativeDialog);
                    chooser.exec();
                } else
                    window->findChild<QAction*>(opens)->trigger();
            });
        QVERIFY2(foreign.isEmpty(), qPrintable(foreign.join(u" | "_s)));
        QVERIFY2(cut.isEmpty() || opens == "chooser"_L1 || opens.endsWith("Dividas"_L1), qPrintable(cut.join(u" | "_s)));
        if (!opens.isEmpty() && opens.at(0).isUpper())
            QTRY_COMPARE(window->refreshes() - before, 1);
        if (!enter.isNull())
            QCOMPARE(enterPresses, enter);
    }
};

QTEST_MAIN(WindowsTest)
#include "tst_windows.moc"
