// Every window a clerk sees, opened from the register: no English word in
// any (Qt's own dialogs and boxes included), every caption of ours fits its
// box at the dialogs' 8-point font, and Enter on a destructive question
// answers No. With QUOTAS_SCREENSHOTS=DIR each window is saved there as a
// PNG, for the README.

#include "component/general.h"
#include "component/shared_objects.h"
#include "host/main_window.h"
#include "platform/message_boxes.h"
#include "platform/portuguese.h"
#include "schema/demo_data.h"
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
        // Demo members with three months of union dues, two paid; every seventh account's totals not yet rebuilt.
        Connection& c = db->connection();
        addDemoMembers(c, 30);
        c.execute(u"WITH RECURSIVE m(mes) AS (SELECT 1 UNION ALL SELECT mes + 1 FROM m WHERE mes < 3) "
                  "INSERT INTO tbQuotas_Movimentos (socio_id, data, ano, mes, tipo, ref, quota_no, rend1, rend2, quota, pago) "
                  "SELECT s.socio_id, '2003-03-05', 2003, m.mes, 1, 'Sindicato', s.socio_id * 3 + m.mes, 1000, 0, 15, "
                  "CASE WHEN m.mes < 3 THEN 15 ELSE 0 END FROM tbSocios s, m"_s);
        c.execute(u"INSERT INTO tbQuotas_Socios (socio_id, total_quotas, total_pago) "
                  "SELECT socio_id, CASE WHEN socio_id % 7 = 0 THEN 60 ELSE 45 END, 30 FROM tbSocios"_s);
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

    // Each window as the register opens it, each kind of box, and the file chooser; "" is the register itself.
    void everyWindowSpeaksPortugueseAndFits_data()
    {
        QTest::addColumn<QString>("opens");
        QTest::addColumn<int>("buttons");  // of a message box
        QTest::addColumn<QString>("enter");
        const std::pair<const char*, const char*> windows[] = {{"registo", ""}, {"gerar-quotas", "GerarQuotas"}, {"importar-quotas", "ImportarQuotas"}, {"quota", "Registo"}, {"manutencao", "CallManutencaoDados"}, {"pre-visualizacao", "ListagemDividas"}, {"anular-geracao", "AnularGeracao"}, {"resumo-mes", "ResumoMes"}, {"extrato-quotas", "ExtratoQuotas"}};
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
        QVERIFY2(cut.isEmpty() || opens == "chooser"_L1 || opens == "ListagemDividas"_L1, qPrintable(cut.join(u" | "_s)));
        if (!enter.isNull())
            QCOMPARE(enterPresses, enter);
    }
};

QTEST_MAIN(WindowsTest)
#include "tst_windows.moc"
