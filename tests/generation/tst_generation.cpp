// The monthly dues generation on both engines: ProcessarQuotas called
// directly, "quotas gerar" as a process (two of them at once, too), and the
// dialog frmGerarQuotas driven through its widgets. Then taking back a
// month's generated dues: which go and which stay, the totals after it,
// "quotas anular-geracao" and its dry run, two undos at once beside
// payments, and the dialog's confirmation.

#include "component/general.h"
#include "component/shared_objects.h"
#include "generation/anular_geracao.h"
#include "generation/frm_anular_geracao.h"
#include "generation/frm_gerar_quotas.h"
#include "generation/processar_quotas.h"
#include "schema/demo_data.h"
#include "schema/schema.h"
#include "support/database_fixture.h"
#include "support/recording_progress.h"
#include "support/scripted_boxes.h"

#include <QApplication>
#include <QProcess>
#include <QPlainTextEdit>
#include <QComboBox>
#include <QLineEdit>
#include <QListWidget>
#include <QLocale>
#include <QMessageBox>
#include <QPushButton>
#include <QTest>
#include <QTimer>

using namespace quotas;
using namespace quotas::test;

namespace {

const QString kConfirm = QStringLiteral("Question YesNo [Processar Quotizações] Deseja iniciar o processamento de quotas?");
// The closing message with the members processed, the dues posted and those left out.
const QString kEnd = QStringLiteral("Information Ok [Gerar Quotas] Fim do processamento de quotizações\n\nAssociados "
                                    "processados: %1\nQuotas lançadas: %2\nQuotas não lançadas: %3");
const QString kProgress = QStringLiteral("Criando registos de quotas, aguarde alguns momentos . . ., Processamento de Quotas)");

// The boxes shown, as "icon buttons [title] text".
QStringList told(const ScriptedBoxes& boxes)
{
    static const char* const icons[] = {"None", "Critical", "Question", "Exclamation", "Information"};
    static const char* const buttons[] = {"Ok", "OkCancel", "YesNo", "YesNoCancel"};
    QStringList out;
    for (const ShownBox& b : boxes.shown)
        out << QStringLiteral("%1 %2 [%3] %4").arg(icons[int(b.icon)], buttons[int(b.buttons)], b.title, b.text);
    return out;
}

void pick(QListWidget* list, int row)
{
    list->scrollToItem(list->item(row));
    QTest::mouseClick(list->viewport(), Qt::LeftButton, {}, list->visualItemRect(list->item(row)).center());
}

// The dues of an undo plan, "socio|tipo".
QStringList keys(const QList<UndoDue>& dues)
{
    QStringList out;
    for (const UndoDue& d : dues)
        out << QStringLiteral("%1|%2").arg(d.socioId.toInt()).arg(d.tipo);
    return out;
}

}  // namespace

// Member 1, insured, on an account holding 10.10 of dues: the dues charged
// for December 2000 ("union|insurance") and total_quotas after them.
struct Due {
    QString empresa = "TAP";
    double rend1 = 1000, rend2 = 0;
    QVariant percSindicato = kNullNumber, percSeguro = kNullNumber, seguro = 1, end = kNullNumber;
    QString dues = "15|15", total = "40.1";
};
Q_DECLARE_METATYPE(Due)

// In the dialog: the year and month picked, the staff numbers typed one
// after the other, the answer to the confirmation, the boxes shown and the
// dues of the month.
struct Choices {
    int ano, mes;
    QStringList typed;
    bool yes;
    QStringList shown, dues;
};
Q_DECLARE_METATYPE(Choices)

class GenerationTest : public QObject, DatabaseFixture {
    Q_OBJECT

    std::unique_ptr<frmGerarQuotas> dlg;

    // Member socio, staff number 1000 + socio, named "Associado socio".
    void member(int socio, const QVariant& fuv = "A1", const QVariant& empresa = "TAP", const QVariant& seguro = 0,
                const QVariant& end = kNullNumber)
    {
        c().execute(QStringLiteral("INSERT INTO tbSocios (socio_id, no_tap, nome, fuv, empresa, seguro, seguro_data_rescisao) "
                                   "VALUES (?, ?, ?, ?, ?, ?, ?)"),
                    {socio, QString::number(1000 + socio), QStringLiteral("Associado %1").arg(socio), fuv, empresa, seguro, end});
    }
    void account(int socio, const QVariant& rend1, const QVariant& rend2, const QVariant& percSindicato = kNullNumber,
                 const QVariant& percSeguro = kNullNumber, double total = 0)
    {
        c().execute(QStringLiteral("INSERT INTO tbQuotas_Socios (socio_id, ult_rend1, ult_rend2, ult_perc_sindicato, "
                                   "ult_perc_seguro, total_quotas, total_pago) VALUES (?, ?, ?, ?, ?, ?, 0)"),
                    {socio, rend1, rend2, percSindicato, percSeguro, total});
    }
    // The dues of a month, "socio|tipo|quota" in number order.
    QStringList dues(int ano, int mes)
    {
        return rows("SELECT socio_id, tipo, quota FROM tbQuotas_Movimentos WHERE ano = ? AND mes = ? ORDER BY quota_no",
                    {ano, mes});
    }
    GenerationOutcome run(int ano, int mes, int socio = 0) { return ProcessarQuotas(c(), ano, mes, socio, QDate(2003, 1, 20)); }
    CliRun gerar(const QStringList& args) { return quotas(QStringList{"gerar"} + args); }

    // The dialog shown and active, dated January 2003.
    frmGerarQuotas& open()
    {
        dlg = std::make_unique<frmGerarQuotas>(QDate(2003, 1, 15));
        dlg->show();
        QApplication::setActiveWindow(dlg.get());
        if (!QTest::qWaitForWindowActive(dlg.get()))
            qWarning("the dialog did not become active");
        return *dlg;
    }
    void typeStaffNumber(const QString& text, Qt::Key leave = Qt::Key_Tab)
    {
        dlg->No_Tap->setFocus();
        dlg->No_Tap->selectAll();
        QTest::keyClick(dlg->No_Tap, Qt::Key_Delete);
        QTest::keyClicks(dlg->No_Tap, text);
        QTest::keyClick(dlg->No_Tap, leave);
    }

    void generate(int mes) { ProcessarQuotas(c(), 2004, mes, 0, QDate(2004, mes, 1)); }

    // Members 1 to 6, insured, charged February and March 2004 (37.50 of
    // each type), then March touched: 2's union due paid by hand, 3's taken
    // from the employer's list, 4's insurance given a document, 5's union
    // due with pago Null, 6's union due paid in full by hand.
    void sixMembersWithMarchTouched()
    {
        for (int socio = 1; socio <= 6; ++socio)
            c().execute(QStringLiteral("INSERT INTO tbSocios (socio_id, no_tap, nome, fuv, empresa, seguro) VALUES (?, ?, ?, "
                                       "'A1', 'TAP', 1)"),
                        {socio, QString::number(1000 + socio), QStringLiteral("Associado %1").arg(socio)});
        generate(2);
        generate(3);
        const QString march = QStringLiteral(" WHERE ano = 2004 AND mes = 3 AND socio_id = ? AND tipo = ?");
        c().execute("UPDATE tbQuotas_Movimentos SET pago = 5, doc_no = 'R1'" + march, {2, 1});
        c().execute("UPDATE tbQuotas_Movimentos SET doc_no = 'R2'" + march, {4, 2});
        c().execute("UPDATE tbQuotas_Movimentos SET pago = NULL" + march, {5, 1});
        c().execute("UPDATE tbQuotas_Movimentos SET pago = quota, rend2 = 0, doc_no = 'R3'" + march, {6, 1});
        const CliRun imported = quotas({"importar", "--ano", "2004", "--mes", "3", "--tipo", "1", writeFile("marco.csv", "no_tap;quota\n1003;30.00\n")});
        QVERIFY2(imported.status == 0, qPrintable(imported.err));
    }

private slots:
    void initTestCase()
    {
        openDatabase();
        RecordingProgress::install();
    }
    void init()
    {
        db->clear();
        RecordingProgress::log() = {};
        c().execute(QStringLiteral("INSERT INTO tbEmpresas (code, nome, percent_sindicato) VALUES ('TAP', 'TAP', 0.015), "
                                   "('PGA', 'PGA', 0.01), ('ZER', 'ZER', 0), ('NUL', 'NUL', NULL)"));
        c().execute(QStringLiteral("INSERT INTO tbfuvs (code, descrit, rend1) VALUES ('A1', 'A1', 2500), ('C2', 'C2', 4100.5), "
                                   "('B9', 'B9', NULL)"));
    }
    void cleanup() { dlg.reset(); }

    void ratesAmountsAndTheInsuranceEnd_data()
    {
        QTest::addColumn<Due>("d");
        QTest::newRow("employer unknown: 1.5%") << Due{.empresa = "XPT"};
        QTest::newRow("personal rate, employer's for the other") << Due{.percSindicato = 0.02, .dues = "20|15", .total = "45.1"};
        QTest::newRow("personal 0 or below: the employer's") << Due{.empresa = "PGA", .rend2 = 200, .percSindicato = 0.0, .percSeguro = -0.5, .dues = "12|12", .total = "34.1"};
        QTest::newRow("the employer's 0 stands") << Due{.empresa = "ZER", .dues = "0|0", .total = "10.1"};
        QTest::newRow("12.5 and 37.5 cents to even")
            << Due{.rend1 = 1, .percSindicato = 0.125, .percSeguro = 0.375, .dues = "0.12|0.38", .total = "10.6"};
        QTest::newRow("beyond single precision")
            << Due{.empresa = "PGA", .rend1 = 16777217, .dues = "167772.17|167772.17", .total = "335554.44"};
        // Regression: the year and the month of the insurance's end were compared separately.
        QTest::newRow("insurance ends March 2001") << Due{.end = QDate(2001, 3, 31)};
        QTest::newRow("insurance ends December 2000") << Due{.end = QDate(2000, 12, 1)};
        QTest::newRow("insurance ended November 2000") << Due{.end = QDate(2000, 11, 30), .dues = "15", .total = "25.1"};
        QTest::newRow("insurance ended December 1999") << Due{.end = QDate(1999, 12, 31), .dues = "15", .total = "25.1"};
        QTest::newRow("insured as -1") << Due{.seguro = -1, .end = QDate(2000, 12, 31)};
        QTest::newRow("not insured") << Due{.seguro = 0, .dues = "15", .total = "25.1"};
    }
    void ratesAmountsAndTheInsuranceEnd()
    {
        QFETCH(Due, d);
        member(1, "A1", d.empresa, d.seguro, d.end);
        account(1, d.rend1, d.rend2, d.percSindicato, d.percSeguro, 10.10);
        run(2000, 12);
        QStringList movements;
        for (const QString& quota : d.dues.split(u'|'))
            movements << QStringLiteral("%1|2003-01-20|%2|%3|%4|0")
                             .arg(movements.isEmpty() ? "Sindicato" : "Seguro")
                             .arg(d.rend1, 0, 'f', 0)
                             .arg(d.rend2)
                             .arg(quota);
        QCOMPARE(rows("SELECT ref, data, rend1, rend2, quota, pago FROM tbQuotas_Movimentos ORDER BY tipo"), movements);
        QCOMPARE(rows("SELECT total_quotas, ult_ano, ult_mes FROM tbQuotas_Socios"), QStringList{d.total + "|2000|12"});
    }

    // New accounts take the category's rend1 (written with a point whatever
    // the locale) or 100000; dues are numbered from 1 on an empty counter
    // table, the union due before the insurance due; a second run posts only
    // what is missing, numbered on from the counter. Without members a run
    // shows 0 and creates nothing.
    void newAccountsNumbersAndASecondRun()
    {
        run(2003, 1);
        QCOMPARE(RecordingProgress::log().calls + rows("SELECT (SELECT COUNT(*) FROM tbQuotas_Socios) + COUNT(*) FROM tbcontadores"),
                 QStringList({"Iniciar(0, " + kProgress, "terminar()", "0"}));
        RecordingProgress::log() = {};
        const QLocale before;
        QLocale::setDefault(QLocale(QLocale::Portuguese, QLocale::Portugal));
        member(1, "C2", "TAP", 1);
        member(2, "Z9", "PGA");
        member(3, kNullNumber, "XPT");
        run(2003, 1);
        QLocale::setDefault(before);
        // The progress display steps once per member.
        QCOMPARE(RecordingProgress::log().calls,
                 QStringList{"Iniciar(3, " + kProgress} << QStringList(3, "setvalor(1)") << "terminar()");
        const auto state = [this] {
            return rows("SELECT socio_id, tipo, quota_no, quota FROM tbQuotas_Movimentos ORDER BY quota_no")
                   + rows("SELECT socio_id, ult_rend1, ult_rend2, ult_perc_sindicato, ult_quota_sindicato, ult_quota_seguro, "
                          "total_quotas, total_pago, ult_ano, ult_mes FROM tbQuotas_Socios ORDER BY socio_id")
                   + rows("SELECT quotas FROM tbcontadores");
        };
        const QStringList once = state();
        QCOMPARE(once, QStringList({"1|1|1|61.51", "1|2|2|61.51", "2|1|3|1000", "3|1|4|1500",
                                    "1|4100.5|0|-|61.51|61.51|123.02|0|2003|1", "2|100000|0|-|1000|0|1000|0|2003|1",
                                    "3|100000|0|-|1500|0|1500|0|2003|1", "4"}));
        QCOMPARE(run(2003, 1).posted, 0);
        QCOMPARE(state(), once);

        c().execute(QStringLiteral("DELETE FROM tbQuotas_Movimentos WHERE socio_id = 1 AND tipo = 1"));
        c().execute(QStringLiteral("UPDATE tbcontadores SET quotas = 41"));
        member(4);
        QCOMPARE(run(2003, 1).posted, 2);
        QCOMPARE(rows("SELECT socio_id, tipo, quota_no FROM tbQuotas_Movimentos WHERE quota_no > 4 ORDER BY quota_no")
                     + rows("SELECT quotas FROM tbcontadores"),
                 QStringList({"1|1|42", "4|1|43", "43"}));
    }

    // A counter row holding Null counts from 1.
    void aNullCounterCountsFromOne()
    {
        c().execute(QStringLiteral("INSERT INTO tbcontadores (quotas) VALUES (NULL)"));
        member(1, "A1", "TAP", 1);
        member(2);
        run(2003, 1);
        QCOMPARE(rows("SELECT quota_no FROM tbQuotas_Movimentos ORDER BY quota_no") + rows("SELECT quotas FROM tbcontadores"),
                 QStringList({"1", "2", "3", "3"}));
    }

    // Regression: a due was computed from an empty remuneration or rate.
    void emptyValuesAreReportedNotPosted()
    {
        member(1, "A1", "TAP", 1);
        account(1, 1000.0, kNullNumber);
        member(2, "A1", "NUL");
        member(3, "B9", "TAP");  // his account is created without a remuneration
        member(4, "A1", "NUL");
        account(4, 1000.0, 0.0, 0.02);  // his own rate needs no employer's
        member(5);
        const GenerationOutcome outcome = run(2003, 1);
        QCOMPARE(dues(2003, 1), QStringList({"4|1|20", "5|1|37.5"}));
        QCOMPARE(outcome.summary(),
                 QStringLiteral("Não foram geradas 4 quotas:\n- 3 quotas porque a conta do associado não tem a remuneração 1 "
                                "ou a remuneração 2 (Nº Empresa: 1001, 1003);\n- 1 quota porque a empresa do associado não "
                                "tem a percentagem de quotização (Nº Empresa: 1002);\nCorrija estes valores e volte a gerar "
                                "o mesmo mês: as quotas já geradas não se repetem."));
    }

    // An unknown staff number is refused (regression: it went into the SQL
    // text); one member, then every member still to charge, is charged, and
    // the closing message and the dues not generated (member 3's account has
    // no remuneration 1) are printed.
    void commandLine()
    {
        for (int socio = 1; socio <= 3; ++socio)
            member(socio);
        account(3, kNullNumber, 0.0);
        const CliRun refused = gerar({"--ano", "2003", "--mes", "1", "--no-tap", "x' OR '1'='1"});
        QVERIFY2(refused.status == 2 && refused.err.contains("Número de Empresa não existe!"), qPrintable(refused.err));
        QCOMPARE(gerar({"--ano", "2003", "--mes", "13"}).status, 2);
        QCOMPARE(dues(2003, 1), QStringList());
        const CliRun one = gerar({"--ano", "2003", "--mes", "1", "--no-tap", "1002"});
        QCOMPARE(one.out + QString::number(one.status),
                 "Fim do processamento de quotizações\nAssociados processados: 1\nQuotas lançadas: 1\nQuotas não lançadas: 0\n0");
        QCOMPARE(dues(2003, 1), QStringList{"2|1|37.5"});
        const CliRun leftOut = gerar({"--ano", "2003", "--mes", "1"});
        QCOMPARE(leftOut.out,
                 "Fim do processamento de quotizações\nAssociados processados: 3\nQuotas lançadas: 1\nQuotas não lançadas: 1\nNão foi gerada 1 quota: - 1 quota porque a conta do associado não tem a "
                 "remuneração 1 ou a remuneração 2 (Nº Empresa: 1003); Corrija estes valores e volte a gerar o mesmo mês: as "
                 "quotas já geradas não se repetem.\n");
        QCOMPARE(leftOut.status, 3);
        QCOMPARE(dues(2003, 1), QStringList({"2|1|37.5", "1|1|37.5"}));
    }

    // Each member's writes commit together: a failure keeps the members
    // before him whole, exits 1 naming him, and a second run completes the month.
    void failureKeepsWhatWasCommitted()
    {
        for (int socio = 1; socio <= 4; ++socio)
            member(socio, "A1", "TAP", 1);
        failWrites(c(), "INSERT", "tbQuotas_Movimentos", "NEW.socio_id = 3 AND NEW.tipo = 2");
        const CliRun failed = gerar({"--ano", "2003", "--mes", "1"});
        failWrites(c(), "INSERT", "tbQuotas_Movimentos");
        QCOMPARE(failed.status, 1);
        QVERIFY2(failed.err.contains(QStringLiteral("O processamento de quotas parou no associado com o Nº Empresa 1003: "))
                     && failed.err.contains(QStringLiteral("falha simulada")) && failed.out.isEmpty(),
                 qPrintable(failed.err));
        // Nothing of member 3, not even his union due, his account or his number.
        QCOMPARE(dues(2003, 1), QStringList({"1|1|37.5", "1|2|37.5", "2|1|37.5", "2|2|37.5"}));
        QCOMPARE(rows("SELECT socio_id, total_quotas FROM tbQuotas_Socios ORDER BY 1") + rows("SELECT quotas FROM tbcontadores"),
                 QStringList({"1|75", "2|75", "4"}));
        QCOMPARE(gerar({"--ano", "2003", "--mes", "1"}).status, 0);
        QCOMPARE(rows("SELECT COUNT(*), COUNT(DISTINCT quota_no), MAX(quota_no) FROM tbQuotas_Movimentos"), QStringList{"8|8|8"});
    }

    // Two processes charge a month at once: in January they create the
    // accounts, in February they find them. No due twice, no number twice,
    // the counter at the last number, no total counting a due twice.
    void twoRunsAtOnceChargeEachDueOnce()
    {
        constexpr int kMembers = 1500;
        db->clear();
        addDemoMembers(c(), kMembers);
        // The demo's insurances all run past 2003.
        const int insured = c().scalar(QStringLiteral("SELECT COUNT(*) FROM tbSocios WHERE seguro <> 0")).toInt();
        for (int mes = 1; mes <= 2; ++mes) {
            const QStringList args = {"gerar", "--ano", "2003", "--mes", QString::number(mes)};
            QProcess* first = startQuotas(this, registry, args);
            QProcess* second = startQuotas(this, registry, args);
            const CliRun a = finishQuotas(first), b = finishQuotas(second);
            QVERIFY2(a.status == 0 && b.status == 0, qPrintable(a.err + b.err));
            QCOMPARE(rows("SELECT COUNT(*), (SELECT COUNT(*) FROM (SELECT DISTINCT socio_id, mes, tipo FROM tbQuotas_Movimentos) "
                          "d), COUNT(DISTINCT quota_no), MAX(quota_no), (SELECT MAX(quotas) FROM tbcontadores), (SELECT COUNT(*) "
                          "FROM tbQuotas_Socios), (SELECT COUNT(*) FROM tbQuotas_Socios a WHERE ABS(a.total_quotas - (SELECT "
                          "SUM(m.quota) FROM tbQuotas_Movimentos m WHERE m.socio_id = a.socio_id)) > 0.005) FROM tbQuotas_Movimentos"),
                     QStringList{QStringLiteral("%1|%1|%1|%1|%1|%2|0").arg(mes * (kMembers + insured)).arg(kMembers)});
        }
    }

    // Member 2's account has no remuneration 2: the dues not generated are
    // told after the closing message.
    void dialogRunsTheChoices_data()
    {
        QTest::addColumn<Choices>("c");
        const QStringList missing{kConfirm, kEnd.arg(3).arg(2).arg(1),
                                  "Exclamation Ok [Gerar Quotas] Não foi gerada 1 quota:\n- 1 quota porque a conta do "
                                  "associado não tem a remuneração 1 ou a remuneração 2 (Nº Empresa: 1002);\nCorrija estes "
                                  "valores e volte a gerar o mesmo mês: as quotas já geradas não se repetem."};
        QTest::newRow("March 2001, every member") << Choices{2001, 3, {}, true, missing, {"1|1|37.5", "3|1|37.5"}};
        QTest::newRow("one member by staff number") << Choices{2003, 1, {"1003"}, true, {kConfirm, kEnd.arg(1).arg(1).arg(0)}, {"3|1|37.5"}};
        QTest::newRow("a number typed, then cleared") << Choices{2003, 1, {"1003", ""}, true, missing, {"1|1|37.5", "3|1|37.5"}};
        QTest::newRow("No leaves every choice") << Choices{2001, 3, {"1003"}, false, {kConfirm}, {}};
    }
    void dialogRunsTheChoices()
    {
        QFETCH(Choices, c);
        for (int socio = 1; socio <= 3; ++socio)
            member(socio);
        account(2, 1000.0, kNullNumber);
        ScriptedBoxes boxes;
        boxes.answer(c.yes ? Answer::Yes : Answer::No);
        frmGerarQuotas& d = open();
        pick(d.List1, c.ano - 1999);
        pick(d.List2, c.mes - 1);
        for (const QString& number : c.typed)
            typeStaffNumber(number);
        QTest::mouseClick(d.Command1, Qt::LeftButton);
        QCOMPARE(told(boxes), c.shown);
        QCOMPARE(dues(c.ano, c.mes), c.dues);
        QCOMPARE(d.isVisible(), !c.yes);  // closed after a run
        if (!c.yes)                       // left as it was
            QCOMPARE(QStringList({d.List1->currentItem()->text(), d.List2->currentItem()->text(), d.No_Tap->text(),
                                  d.Text2->text(), QString::number(d.selectedMember())}),
                     QStringList({"2001", "Março", "1003", "Associado 3", "3"}));
    }

    // With Qt's own box, whose showing takes the focus away and gives it
    // back: one message per attempt to leave the field, and the focus stays.
    // Cancelar needs no valid number.
    void dialogUnknownStaffNumberKeepsTheFocus_data()
    {
        QTest::addColumn<QString>("typed");
        QTest::addColumn<int>("leave");
        QTest::newRow("not a member, Tab") << "999" << int(Qt::Key_Tab);
        QTest::newRow("not a member, Return runs Executar") << "999" << int(Qt::Key_Return);
        // Regression: the staff number went into the SQL text.
        QTest::newRow("quote trick") << "x' OR '1'='1" << int(Qt::Key_Tab);
    }
    void dialogUnknownStaffNumberKeepsTheFocus()
    {
        QFETCH(QString, typed);
        QFETCH(int, leave);
        frmGerarQuotas& d = open();
        QStringList shown;
        QTimer answerer;
        connect(&answerer, &QTimer::timeout, this, [&] {
            if (auto* box = qobject_cast<QMessageBox*>(QApplication::activeModalWidget())) {
                shown << QStringLiteral("%1 %2 [%3] %4")
                             .arg(box->icon())
                             .arg(box->standardButtons().toInt())
                             .arg(box->windowTitle(), box->text());
                QTest::keyClick(box, Qt::Key_Return);
            }
        });
        answerer.start(20);
        typeStaffNumber(typed, Qt::Key(leave));
        const QString unknown = QStringLiteral("%1 %2 [%3] Número de Empresa não existe!")
                                    .arg(QMessageBox::Information)
                                    .arg(QMessageBox::Ok)
                                    .arg(applicationTitle());
        QCOMPARE(shown, QStringList{unknown});
        QApplication::setActiveWindow(&d);  // what the desktop does once the box is gone
        QCOMPARE(QApplication::focusWidget(), d.No_Tap);
        // Executar with the wrong number still there: refused again, no confirmation, no run.
        QTest::mouseClick(d.Command1, Qt::LeftButton);
        QCOMPARE(shown, QStringList({unknown, unknown}));
        QApplication::setActiveWindow(&d);
        QCOMPARE(QApplication::focusWidget(), d.No_Tap);
        QTest::mouseClick(d.Command2, Qt::LeftButton);
        QVERIFY(shown.size() == 2 && d.result() == QDialog::Rejected);
        QCOMPARE(rows("SELECT COUNT(*) FROM tbQuotas_Movimentos"), QStringList{"0"});
    }

    // A run that fails is told in a box, and the dialog stays open for another try.
    void dialogToldOfAFailedRunStays()
    {
        member(1);
        c().execute(QStringLiteral("DROP TABLE tbcontadores"));
        ScriptedBoxes boxes;
        boxes.answer(Answer::Yes);
        frmGerarQuotas& d = open();
        QTest::mouseClick(d.Command1, Qt::LeftButton);
        createSchema(c());
        QVERIFY2(told(boxes).size() == 2 && told(boxes)[1].startsWith("Critical Ok [Gerar Quotas] O processamento de quotas "
                                                                      "parou no associado com o Nº Empresa 1001"),
                 qPrintable(told(boxes).join(u'\n')));
        QVERIFY(d.isVisible() && !RecordingProgress::log().showing);
    }

    // Regression: a lookup that failed as the user left the staff number
    // escaped the event handler, and closing the dialog crashed the host.
    void dialogLookupFailureIsToldAndTheDialogStays()
    {
        member(1);
        ScriptedBoxes boxes;
        frmGerarQuotas& d = open();
        Data().SqlServer.close();
        typeStaffNumber("1001");
        Data().SqlServer.open();
        QVERIFY2(told(boxes).size() == 1 && told(boxes)[0].startsWith("Critical Ok [Gerar Quotas] "), qPrintable(told(boxes).join(u'\n')));
        QCOMPARE(QApplication::focusWidget(), d.No_Tap);
        // Executar checks the number again and runs for him.
        boxes.answer(Answer::Yes);
        QTest::mouseClick(d.Command1, Qt::LeftButton);
        QCOMPARE(dues(2003, 1), QStringList{"1|1|37.5"});
    }

    void gerarQuotasShowsTheDialogModally()
    {
        bool seen = false;
        QTimer::singleShot(0, this, [&] {
            auto* d = qobject_cast<frmGerarQuotas*>(shared().frmGerarQuotas.data());
            seen = d && d->isModal() && d->List1->currentItem()->text() == QString::number(QDate::currentDate().year());
            if (d)
                QTest::mouseClick(d->Command2, Qt::LeftButton);
        });
        General().GerarQuotas();
        QVERIFY(seen && shared().frmGerarQuotas.isNull());
    }

    // The plan's text, the undo, the totals it leaves (what the maintenance
    // would rebuild, and member 1's as before March), and March again.
    void undoThenMaintenanceThenMarchAgain()
    {
        sixMembersWithMarchTouched();
        const QString accountsKept = "SELECT socio_id, ult_ano, ult_mes, ult_rend1, ult_rend2, ult_quota_sindicato, "
                                     "ult_quota_seguro, total_pago FROM tbQuotas_Socios ORDER BY 1";
        const QStringList lastValues = rows(accountsKept) + rows("SELECT quotas FROM tbcontadores");
        const UndoPlan plan = planUndo(c(), {2004, 3, 0, 0});
        QCOMPARE(plan.text(), QStringLiteral(
                                  "Anular Geração de Março de 2004 (Sindicato e Seguro)\n"
                                  "A eliminar: 7 quotas, € 262,50\n"
                                  "  Sindicato: 2 quotas, € 75,00\n"
                                  "  Seguro: 5 quotas, € 187,50\n"
                                  "Ficam: 5 quotas, € 180,00\n"
                                  "  Sindicato: 4 quotas, € 142,50\n"
                                  "  Seguro: 1 quota, € 37,50\n"
                                  "\n"
                                  "Quotas a eliminar (Nº Empresa, nome, tipo, valor):\n"
                                  "  1001  Associado 1  Sindicato  € 37,50\n"
                                  "  1001  Associado 1  Seguro  € 37,50\n"
                                  "  1002  Associado 2  Seguro  € 37,50\n"
                                  "  1003  Associado 3  Seguro  € 37,50\n"
                                  "  1004  Associado 4  Sindicato  € 37,50\n"
                                  "  1005  Associado 5  Seguro  € 37,50\n"
                                  "  1006  Associado 6  Seguro  € 37,50\n"
                                  "\n"
                                  "Quotas que ficam, e porquê:\n"
                                  "  1002  Associado 2  Sindicato  € 37,50: já tem pagamentos\n"
                                  "  1003  Associado 3  Sindicato  € 30,00: importado da lista da empresa\n"
                                  "  1004  Associado 4  Seguro  € 37,50: já tem pagamentos\n"
                                  "  1005  Associado 5  Sindicato  € 37,50: valores em branco ou ilegíveis (corra a "
                                  "Manutenção de Dados)\n"
                                  "  1006  Associado 6  Sindicato  € 37,50: já tem pagamentos"));
        QCOMPARE(plan.confirmation(), QStringLiteral("Eliminar 7 quotas de Março de 2004, no valor de € 262,50? As contas dos "
                                                     "associados descontam este valor; os números das quotas não voltam a "
                                                     "ser usados."));
        const UndoOutcome done = AnularGeracao(c(), plan);
        QCOMPARE(done.summary(plan.choice), QStringLiteral("Anulação concluída: 7 quotas de Março de 2004 eliminadas, no valor "
                                                           "de € 262,50."));
        QCOMPARE(keys(planUndo(c(), {2004, 3, 0, 0}).kept), keys(plan.kept));
        QCOMPARE(planUndo(c(), {2004, 3, 0, 0}).removed.size(), 0);
        QCOMPARE(rows(accountsKept) + rows("SELECT quotas FROM tbcontadores"), lastValues);
        // February's two dues, as before March was generated.
        QCOMPARE(rows("SELECT total_quotas FROM tbQuotas_Socios WHERE socio_id = 1"), QStringList{"75"});
        const QStringList totals = rows("SELECT socio_id, total_quotas FROM tbQuotas_Socios ORDER BY 1");
        QCOMPARE(quotas({"manutencao"}).status, 0);
        QCOMPARE(rows("SELECT socio_id, total_quotas FROM tbQuotas_Socios ORDER BY 1"), totals);

        generate(3);
        QCOMPARE(rows("SELECT COUNT(*), COUNT(DISTINCT quota_no), MIN(quota_no) FROM tbQuotas_Movimentos WHERE ano = 2004 AND "
                      "mes = 3 AND quota_no > 24"),
                 QStringList{"7|7|25"});
        QCOMPARE(rows("SELECT COUNT(*) FROM tbQuotas_Movimentos WHERE ano = 2004 AND mes = 3"), QStringList{"12"});
    }

    // "quotas anular-geracao": without --confirmar nothing changes; a wrong
    // option changes nothing either.
    void undoCommandLine()
    {
        sixMembersWithMarchTouched();
        const QStringList before = everything();
        const CliRun plan = quotas({"anular-geracao", "--ano", "2004", "--mes", "3", "--tipo", "1", "--no-tap", "1001"});
        QCOMPARE(plan.status, 0);
        QCOMPARE(plan.out, "Anular Geração de Março de 2004 (Sindicato, um associado)\nA eliminar: 1 quota, € 37,50\n  "
                           "Sindicato: 1 quota, € 37,50\nFicam: 0 quotas, € 0,00\n\nQuotas a eliminar (Nº Empresa, nome, "
                           "tipo, valor):\n  1001  Associado 1  Sindicato  € 37,50\nNada foi alterado: para eliminar estas "
                           "quotas repita o comando com --confirmar.\n");
        QCOMPARE(quotas({"anular-geracao", "--ano", "2004", "--mes", "3", "--no-tap", "9999", "--confirmar"}).status, 2);
        QCOMPARE(quotas({"anular-geracao", "--ano", "2004", "--mes", "3", "--tipo", "3", "--confirmar"}).status, 2);
        QCOMPARE(everything(), before);
        const CliRun done = quotas({"anular-geracao", "--ano", "2004", "--mes", "3", "--tipo", "2", "--confirmar"});
        QVERIFY2(done.status == 0 && done.out.endsWith("Anulação concluída: 5 quotas de Março de 2004 eliminadas, no valor de "
                                                       "€ 187,50.\n"),
                 qPrintable(done.out + done.err));
    }

    // Two undos of one month at once while the test pays dues of that
    // month: every payment that was recorded keeps its due, nothing else
    // stays, and no account is decreased twice.
    void twoUndosBesidePayments()
    {
        constexpr int kMembers = 600;
        addDemoMembers(c(), kMembers);
        generate(3);
        const QStringList args = {"anular-geracao", "--ano", "2004", "--mes", "3", "--confirmar"};
        QProcess* first = startQuotas(this, registry, args);
        QProcess* second = startQuotas(this, registry, args);
        // From the last member down, against the undos' order.
        const QStringList due = rows("SELECT quota_id FROM tbQuotas_Movimentos ORDER BY socio_id DESC, tipo");
        auto payer = db->openAnother(QStringLiteral("payer"));
        QStringList paid;
        for (const QString& id : due) {
            if (first->state() == QProcess::NotRunning && second->state() == QProcess::NotRunning)
                break;
            payer->begin();
            // As the import posts a deduction: no document.
            const bool done = payer->execute(QStringLiteral("UPDATE tbQuotas_Movimentos SET pago = quota, rend2 = 0 WHERE "
                                                            "quota_id = ?"),
                                             {id.toInt()})
                              == 1;
            payer->commit();
            if (done)
                paid << id;
        }
        const CliRun a = finishQuotas(first), b = finishQuotas(second);
        QVERIFY2((a.status == 0 || a.status == 3) && (b.status == 0 || b.status == 3), qPrintable(a.err + b.err));
        QVERIFY2(!paid.isEmpty(), "no payment overlapped the undos");
        QCOMPARE(rows("SELECT quota_id FROM tbQuotas_Movimentos ORDER BY socio_id DESC, tipo"), paid);
        QCOMPARE(rows("SELECT COUNT(*) FROM tbQuotas_Socios a WHERE ABS(COALESCE(a.total_quotas, 0) - COALESCE((SELECT "
                      "SUM(m.quota) FROM tbQuotas_Movimentos m WHERE m.socio_id = a.socio_id), 0)) > 0.005"),
                 QStringList{"0"});
    }

    // The dialog asks with No as the default: the unscripted answer removes
    // nothing; Yes removes the plan.
    void dialogAsksBeforeRemoving()
    {
        sixMembersWithMarchTouched();
        ScriptedBoxes boxes;
        frmAnularGeracao dialog(QDate(2004, 3, 10));
        dialog.Tipo->setCurrentIndex(2);
        const QString ask = planUndo(c(), {2004, 3, 2, 0}).confirmation();
        dialog.undo();
        QCOMPARE(boxes.last().buttons, Buttons::YesNoDefaultNo);
        QCOMPARE(boxes.last().text, ask);
        QCOMPARE(rows("SELECT COUNT(*) FROM tbQuotas_Movimentos WHERE mes = 3"), QStringList{"12"});
        QVERIFY(dialog.Plano->toPlainText().startsWith("Anular Geração de Março de 2004 (Seguro)\nA eliminar: 5 quotas"));
        boxes.answer(Answer::Yes);
        dialog.undo();
        QCOMPARE(boxes.texts().mid(1), QStringList({ask,
                                                    "Anulação concluída: 5 quotas de Março de 2004 eliminadas, no valor de € 187,50."}));
        QCOMPARE(rows("SELECT COUNT(*) FROM tbQuotas_Movimentos WHERE mes = 3"), QStringList{"7"});
    }
};

QTEST_MAIN(GenerationTest)
#include "tst_generation.moc"
