// Every window a clerk sees, opened as the register opens it: no English
// word in any of them (Qt's own dialogs included), every caption fits its
// box at the dialogs' 8-point font, and a destructive question answers No
// to Enter. With QUOTAS_SCREENSHOTS=DIR each window is also saved there as
// a PNG, for the README.

#include "component/general.h"
#include "component/shared_objects.h"
#include "host/main_window.h"
#include "platform/message_boxes.h"
#include "platform/portuguese.h"
#include "schema/demo_data.h"
#include "support/test_database.h"

#include <QAbstractButton>
#include <QAbstractItemView>
#include <QApplication>
#include <QComboBox>
#include <QDir>
#include <QFileDialog>
#include <QGroupBox>
#include <QHeaderView>
#include <QLabel>
#include <QLineEdit>
#include <QMenu>
#include <QMessageBox>
#include <QPushButton>
#include <QRegularExpression>
#include <QTableView>
#include <QTest>
#include <QTimer>

using namespace quotas;
using namespace quotas::test;
using namespace Qt::StringLiterals;

namespace {

// Words of Qt's own dialogs that show when no translation is loaded ("No"
// only as a whole caption: "No Empresa:" is Portuguese).
const QRegularExpression kEnglish(
    u"^No$|\\b(Yes|Cancel|Open|Save|File|Files|Look in|Name|Size|Type|Date Modified|Back|Forward|Parent|Directory|Folder|"
    "Print|Preview|Close|Page|Zoom|Fit|Setup|Export|Options|Help|Apply|Detail|View|Create|New|Delete|Rename|Show|Hidden|"
    "Portrait|Landscape|First|Last|Previous|Next|Single|Facing|Overview|width)\\b"_s);

QString plain(QString text)
{
    return text.remove(QRegularExpression(u"&(?!&)"_s));
}

// Every text a widget tree shows: captions, titles, tooltips, headers, menu entries.
QStringList textsOf(QWidget* top)
{
    QStringList texts{top->windowTitle()};
    const auto actions = [&](QWidget* w) {
        for (QAction* a : w->actions())
            texts << plain(a->text()) << a->toolTip();
    };
    QList<QWidget*> widgets = top->findChildren<QWidget*>();
    widgets << top;
    for (QWidget* w : widgets) {
        if (!w->isVisibleTo(top) && !qobject_cast<QMenu*>(w))
            continue;
        texts << w->toolTip();
        actions(w);
        if (auto* l = qobject_cast<QLabel*>(w))
            texts << plain(l->text());
        else if (auto* b = qobject_cast<QAbstractButton*>(w))
            texts << plain(b->text());
        else if (auto* g = qobject_cast<QGroupBox*>(w))
            texts << g->title();
        else if (auto* e = qobject_cast<QLineEdit*>(w))
            texts << e->placeholderText();
        else if (auto* c = qobject_cast<QComboBox*>(w)) {
            for (int i = 0; i < c->count(); ++i)
                texts << c->itemText(i);
        } else if (auto* h = qobject_cast<QHeaderView*>(w); h && h->model()) {
            for (int i = 0; i < h->count(); ++i)
                texts << h->model()->headerData(i, h->orientation()).toString();
        }
    }
    texts.removeAll(QString());
    return texts;
}

// Captions cut off by their box: label and check box texts wider than the room they have.
QStringList clipped(QWidget* top)
{
    QStringList out;
    for (QWidget* w : top->findChildren<QWidget*>()) {
        QString text;
        int room = 0;
        if (auto* l = qobject_cast<QLabel*>(w); l && !l->wordWrap() && l->textFormat() != Qt::RichText) {
            text = plain(l->text());
            room = l->contentsRect().width() - 2 * l->margin() - l->indent() * 0;
        } else if (auto* b = qobject_cast<QAbstractButton*>(w)) {
            text = plain(b->text());
            room = b->width() - (b->sizeHint().width() - b->fontMetrics().horizontalAdvance(text));
        }
        if (w->isVisibleTo(top) && !text.isEmpty() && w->fontMetrics().horizontalAdvance(text) > room)
            out << u"%1 (%2 > %3)"_s.arg(text).arg(w->fontMetrics().horizontalAdvance(text)).arg(room);
    }
    return out;
}

}  // namespace

class WindowsTest : public QObject {
    Q_OBJECT
    std::unique_ptr<TestDatabase> db;
    std::unique_ptr<General> general;
    std::unique_ptr<host::MainWindow> window;

    // Runs open; the first window it shows is looked at, saved when asked, and closed.
    QWidget* seen = nullptr;
    QStringList english, cut;
    QString defaultButton;  // the text of the button Enter presses
    void look(const QString& name, const std::function<void()>& open, bool ours)
    {
        english.clear();
        cut.clear();
        seen = nullptr;
        QTimer inspector;
        connect(&inspector, &QTimer::timeout, this, [&] {
            QWidget* w = QApplication::activeModalWidget();
            if (!w && shared().frmImportarQuotas && shared().frmImportarQuotas->isVisible())
                w = shared().frmImportarQuotas;
            if (!w || seen == w || !w->isVisible())
                return;
            seen = w;
            inspect(name, w, ours);
            w->close();
        });
        inspector.start(50);
        open();
        QTRY_VERIFY(seen);
    }
    void inspect(const QString& name, QWidget* w, bool ours)
    {
        QTest::qWait(100);  // laid out and painted
        for (const QString& text : textsOf(w)) {
            if (kEnglish.match(text).hasMatch())
                english << text;
        }
        if (ours)
            cut = clipped(w);
        defaultButton.clear();
        for (auto* b : w->findChildren<QPushButton*>()) {  // the default one, else the one with the focus
            if (b->isDefault() || (b->hasFocus() && b->autoDefault() && defaultButton.isEmpty()))
                defaultButton = b->text();
        }
        if (const QString dir = qEnvironmentVariable("QUOTAS_SCREENSHOTS"); !dir.isEmpty())
            w->grab().save(QDir(dir).filePath(name + u".png"_s));
    }

private slots:
    void initTestCase()
    {
        installPortugueseTranslation(*qApp);
        db = std::make_unique<TestDatabase>();
        db->login();
        // A few demo members with three months of union dues, two paid; every seventh account's totals not yet rebuilt.
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

    void theRegisterSpeaksPortuguese()
    {
        inspect(u"registo"_s, window.get(), true);
        QVERIFY2(english.isEmpty(), qPrintable(english.join(u" | "_s)));
        QVERIFY2(cut.isEmpty(), qPrintable(cut.join(u" | "_s)));
    }

    void everyWindowSpeaksPortugueseAndFits_data()
    {
        QTest::addColumn<QString>("name");
        QTest::addColumn<QString>("action");
        QTest::addColumn<bool>("ours");  // laid out by us: every caption must fit
        QTest::newRow("generation") << "gerar-quotas"
                                    << "GerarQuotas" << true;
        QTest::newRow("import") << "importar-quotas"
                                << "ImportarQuotas" << true;
        QTest::newRow("record window") << "quota"
                                       << "Registo" << true;
        QTest::newRow("maintenance") << "manutencao"
                                     << "CallManutencaoDados" << true;
        QTest::newRow("print preview") << "pre-visualizacao"
                                       << "ListagemDividas" << false;
    }
    void everyWindowSpeaksPortugueseAndFits()
    {
        QFETCH(QString, name);
        QFETCH(QString, action);
        QFETCH(bool, ours);
        window->members()->selectRow(0);
        look(
            name, [&] { window->findChild<QAction*>(action)->trigger(); }, ours);
        QVERIFY2(english.isEmpty(), qPrintable(english.join(u" | "_s)));
        QVERIFY2(cut.isEmpty(), qPrintable(cut.join(u" | "_s)));
    }

    // Qt's own boxes and the file chooser, with the Portuguese of our buttons; Enter on a
    // destructive question answers No.
    void boxesSpeakPortuguese_data()
    {
        QTest::addColumn<QString>("name");
        QTest::addColumn<int>("buttons");
        QTest::addColumn<QString>("pressedByEnter");
        QTest::newRow("delete") << "eliminar" << int(Buttons::YesNoDefaultNo) << "&Não";
        QTest::newRow("question") << "pergunta" << int(Buttons::YesNo) << "&Sim";
        QTest::newRow("ok, cancel") << "aviso" << int(Buttons::OkCancel) << "OK";
        QTest::newRow("input") << "pagamento" << -1 << "OK";
        QTest::newRow("file chooser") << "escolher-ficheiro" << -2 << "";
    }
    void boxesSpeakPortuguese()
    {
        QFETCH(QString, name);
        QFETCH(int, buttons);
        QFETCH(QString, pressedByEnter);
        look(
            name, [&] {
                if (buttons >= 0) {
                    msgBox(u"Quer eliminar este registo?\nSindicato, Março de 2003, € 15.00"_s, Buttons(buttons), Icon::Question);
                } else if (buttons == -1) {
                    inputBox(u"Digite a importância a liquidar."_s, u"Pagamento"_s, u"15"_s);
                } else {
                    QFileDialog chooser(window.get(), u"Lista de quotas a importar"_s, QString(), u"Ficheiros CSV (*.csv *.txt)"_s);
                    chooser.setOption(QFileDialog::DontUseNativeDialog);
                    chooser.exec();
                }
            },
            false);
        QVERIFY2(english.isEmpty(), qPrintable(english.join(u" | "_s)));
        if (buttons != -2)
            QCOMPARE(defaultButton, pressedByEnter);
    }
};

QTEST_MAIN(WindowsTest)
#include "tst_windows.moc"
