// The debt listing, the debt letters and the rejects listing on both engines,
// read from the pages of the previews that General shows: layout, who is
// listed and in what order, the totals, the pages, the letters, and the
// reports' connection.

#include "component/general.h"
#include "component/shared_objects.h"
#include "import/rejects_listing.h"
#include "platform/errors.h"
#include "reports/entry.h"
#include "reports/report.h"
#include "reports/report_format.h"
#include "report_reading.h"
#include "support/test_database.h"

#include <QFile>

using namespace quotas;
using namespace quotas::test;

namespace {
const QVariant null = QVariant(QMetaType::fromType<QString>());
}  // namespace

class ReportsTest : public QObject {
    Q_OBJECT

    std::unique_ptr<TestDatabase> db;
    std::vector<ReportDocument> shown;
    QStringList titles;  // of the previews of the last showing
    Connection& c() { return db->connection(); }

    void addMember(int id, const QVariant& noTap, const QVariant& nome, const QVariantList& address = {null, null, null})
    {
        c().execute(QStringLiteral("INSERT INTO tbSocios (socio_id, no_tap, nome, morada1, code_postal1, localidade1) "
                                   "VALUES (?, ?, ?, ?, ?, ?)"),
                    QVariantList{id, noTap, nome} + address);
    }
    void addAccount(int socio, double charged, double paid, Connection* on = nullptr)
    {
        (on ? *on : c()).execute(QStringLiteral("INSERT INTO tbQuotas_Socios (socio_id, total_quotas, total_pago) VALUES (?, ?, ?)"),
                                 {socio, charged, paid});
    }
    void addDebtor(int id, const QString& name, double debt)
    {
        addMember(id, QString::number(100 + id), name);
        addAccount(id, debt, 0);
    }
    void reject(const QVariantList& fields)
    {
        QStringList columns;
        for (int i = 0; i < fields.size(); ++i)
            columns << QStringLiteral("Field%1").arg(i);
        c().execute(QStringLiteral("INSERT INTO extras (%1) VALUES (?%2)").arg(columns.join(u','), QStringLiteral(", ?").repeated(fields.size() - 1)),
                    fields);
    }

    // Shows "listing", "letters" or "rejects" as the host does, closing the
    // preview as a user would, and returns the pages it showed.
    const ReportDocument& show(const QString& report)
    {
        shown.clear();
        PreviewCloser closer;
        General general;
        if (report == QLatin1String("listing"))
            general.ListagemDividas();
        else if (report == QLatin1String("letters"))
            general.CartasDividas();
        else
            showRejectsListing();
        titles = closer.titles;
        if (shown.size() != 1 || closer.pageCounts != QList<int>{shown.front().pageCount()})
            qFatal("expected one preview of all the pages, got %d documents and %d dialogs", int(shown.size()), int(titles.size()));
        return shown.front();
    }

private slots:
    void initTestCase()
    {
        db = std::make_unique<TestDatabase>();
        Report::setObserver([this](const ReportDocument& doc) { shown.push_back(doc); });
        qputenv("QUOTAS_DATA_DIR", db->scratch(QStringLiteral("data")).toUtf8());
        QDir().mkpath(db->scratch(QStringLiteral("data")));
    }
    void cleanupTestCase()
    {
        Report::setObserver({});
        db.reset();
    }
    void init()
    {
        db->clear();
        db->login();
        QFile::remove(db->scratch(QStringLiteral("data/letterhead.txt")));
    }

    void showsTextsInTheirFontsAndPlaces_data()
    {
        QTest::addColumn<QString>("report");
        QTest::addColumn<QString>("name");
        QTest::addColumn<int>("bandTop");
        QTest::addColumn<QString>("expected");  // text | left,top in the band widthxheight | font | alignment
        const int rh = PaperSetup::kTopMargin, ph = rh + 990, detail = ph + 428, rf = detail + 322;
        const int pf = PaperSetup::kHeight - PaperSetup::kBottomMargin - 390;
        const int xph = rh + 330, xdetail = xph + 428, xrf = xdetail + 337, xpf = pf - 45;
        const QString date = longPortugueseDate(QDate::currentDate());
        const auto row = [](const char* report, const char* name, int top, const QString& expected) {
            QTest::addRow("%s %s", report, name) << QString::fromLatin1(report) << QString::fromLatin1(name) << top << expected;
        };
        row("listing", "lblTitulo", rh, "Listagem de Quotas em Dívida por Associado | 90,135 10470x255 | Times New Roman 12 bold | center");
        row("listing", "lblData", rh, date + " | 5880,540 4665x240 | Arial 8.25 italic | right");
        row("listing", "lblNoTap", ph, "Nº TAP | 210,75 1425x240 | Arial 8.25 bold | left");
        row("listing", "txtDivida", detail, "1.234,56 Esc | 7800,45 2250x270 | Arial 8.25 | right");
        row("listing", "lblProcessado", pf, "Processado por Computador | 60,105 2130x225 | Arial 6.75 | left");
        row("listing", "lblPaginaNo", pf, "1 | 9090,105 585x240 | Arial 8.25 italic | right");
        row("listing", "lblTotalRegistos", rf, "Total de registos listados: | 5505,165 2310x195 | Arial 8.25 bold | left");
        row("listing", "fnDividas", rf, "1.234,56 Esc | 7860,555 1635x225 | Arial 8.25 | right");
        row("letters", "txtNoTap", rh, "101 | 4470,1935 1650x225 | Arial 8.25 | left");
        row("letters", "lblData", rh, date + " | 105,4755 5580x300 | Arial 9 italic | left");
        row("letters", "lblRegularizacao", rh, "Regularização de Débitos | 1065,5235 4065x300 | Arial 11.25 bold | left");
        row("rejects", "Label8", rh, "Listagem de Dados não Importados para a Base de Dados | 75,30 10470x255 | Times New Roman 12 bold | center");
        row("rejects", "Label1", xph, "Campo 1 | 75,75 1005x240 | Arial 8.25 bold | left");
        row("rejects", "Text2", xdetail, "100234 | 60,45 1020x270 | Arial 8.25 | left");
        row("rejects", "Label18", xpf, "Página: | 8490,105 570x255 | Arial 8.25 italic | left");
        row("rejects", "Function1", xrf, "1 | 9765,75 705x225 | Arial 8.25 | right");
    }
    void showsTextsInTheirFontsAndPlaces()
    {
        QFETCH(QString, report);
        QFETCH(QString, name);
        QFETCH(int, bandTop);
        QFETCH(QString, expected);
        addMember(1, QStringLiteral("101"), QStringLiteral("Ana Silva"));
        addAccount(1, 1334.56, 100);
        reject({QStringLiteral("100234"), QStringLiteral("b"), QStringLiteral("c"), QStringLiteral("d")});
        QCOMPARE(describe(show(report), name, bandTop), expected);
    }

    void listsDebtsAboveOneEuroInOrderOfName()
    {
        const struct {
            int id;
            const char* name;
            double charged, paid;
        } accounts[] = {{1, "Rui", 50, 0}, {2, "Nuno", 1.00, 0},
                        {3, "Ivo", 2.2, 1.2},  // 2.20 - 1.20 is a hair above 1 in REAL on SQLite
                        {4, "Maria", 1.01, 0}, {5, "Carla", 0.7 + 0.41, 0.1}, {6, "Bruno", 10, 30}, {7, "Eva", 12345.67, 0.67},
                        {9, "Ana", 5, 0}, {8, "Ana", 5, 0}};  // equal names keep the accounts' order
        for (const auto& a : accounts) {
            addMember(a.id, QString::number(100 + a.id), QString::fromUtf8(a.name));
            addAccount(a.id, a.charged, a.paid);
        }
        const QStringList listed = {"109", "108", "105", "107", "104", "101"};
        QCOMPARE(textsNamed(show(QStringLiteral("listing")), QStringLiteral("txtNoTap")), listed);
        QCOMPARE(textsNamed(show(QStringLiteral("letters")), QStringLiteral("txtNoTap")), listed);
    }

    void countsStaffNumbersButTotalsEveryDebt()
    {
        addMember(1, QStringLiteral("101"), QStringLiteral("Ana"));
        addMember(2, null, QStringLiteral("Bruno"));
        addMember(3, QStringLiteral(""), QStringLiteral("Carla"));
        for (const int socio : {1, 2, 3, 99})  // 99's member row is missing
            addAccount(socio, socio == 99 ? 40.5 : 10 * socio, 0);
        const ReportDocument& doc = show(QStringLiteral("listing"));
        QStringList rows = rowsOf(doc, {QStringLiteral("txtNoTap"), QStringLiteral("txtNome"), QStringLiteral("txtDivida")});
        rows.sort();  // where a Null name sorts depends on the engine
        QCOMPARE(rows, (QStringList{"101|Ana|10,00 Esc", "|Bruno|20,00 Esc", "|Carla|30,00 Esc", "||40,50 Esc"}));
        QCOMPARE(textsNamed(doc, QStringLiteral("fnRegistos")) + textsNamed(doc, QStringLiteral("fnDividas")),
                 (QStringList{"2", "100,50 Esc"}));
    }

    void numbersAndCountsPagesOverSeveralPages()
    {
        for (int i = 1; i <= 100; ++i)
            addDebtor(i, QStringLiteral("Associado %1").arg(i, 3, 10, QLatin1Char('0')), 2 + i);
        const ReportDocument& doc = show(QStringLiteral("listing"));
        // 43 rows under the title on page 1, 46 on page 2, 11 and the totals on page 3.
        QCOMPARE(countsPerPage(doc, QStringLiteral("txtNome")), (QList<int>{43, 46, 11}));
        QCOMPARE(countsPerPage(doc, QStringLiteral("lblNoTap")), (QList<int>{1, 1, 1}));
        QCOMPARE(countsPerPage(doc, QStringLiteral("fnRegistos")), (QList<int>{0, 0, 1}));
        QCOMPARE(textsNamed(doc, QStringLiteral("lblPaginaNo")) + textsNamed(doc, QStringLiteral("lblPaginas")),
                 (QStringList{"1", "2", "3", "3", "3", "3"}));
        QCOMPARE(textsNamed(doc, QStringLiteral("fnDividas")), QStringList{"5.250,00 Esc"});  // 100 x 2 + (1 + ... + 100)
    }

    void writesOneLetterPerPageWithTheMembersAddress()
    {
        QFile head(db->scratch(QStringLiteral("data/letterhead.txt")));
        QVERIFY(head.open(QIODevice::WriteOnly));
        head.write("# timbre\nnome = Sindicato de Teste\nmorada = Rua do Teste, 1, 1000-001 Lisboa\n");
        head.close();
        addMember(1, QStringLiteral("101"), QStringLiteral("Ana Silva"), {QStringLiteral("Rua Augusta, 10"), QStringLiteral("1100-053"), QStringLiteral("Lisboa")});
        addMember(2, QStringLiteral("102"), QStringLiteral("Bruno Costa"), {QStringLiteral("Rua do Ouro, 5"), null, QStringLiteral("Porto")});
        addMember(3, QStringLiteral("103"), QStringLiteral("Carla Dias"), {null, QStringLiteral("8000-164"), null});
        addAccount(1, 1334.56, 100);
        addAccount(2, 20, 0);
        addAccount(3, 30, 0);
        const ReportDocument& doc = show(QStringLiteral("letters"));
        QCOMPARE(countsPerPage(doc, QStringLiteral("txtNome")), (QList<int>{1, 1, 1}));
        QCOMPARE(textsNamed(doc, QStringLiteral("lblSindicato")), QStringList(3, QStringLiteral("Sindicato de Teste")));
        QCOMPARE(textsNamed(doc, QStringLiteral("lblMoradaSindicato")), QStringList(3, QStringLiteral("Rua do Teste, 1, 1000-001 Lisboa")));
        const QStringList first = pageTexts(doc.pages[0]);
        const QStringList block = {"Nº Empresa:", "101", "Associado:", "Ana Silva", "Morada:", "Rua Augusta, 10", "Localidade:", "1100-053 Lisboa"};
        QCOMPARE(first.mid(first.indexOf(QStringLiteral("Nº Empresa:")), block.size()), block);
        QCOMPARE(first.mid(first.indexOf(QStringLiteral(" na presente data, de ESC:")), 2), (QStringList{" na presente data, de ESC:", "1.234,56 Esc"}));
        // A Null postcode or town empties the whole line; a Null address its own.
        QCOMPARE(rowsOf(doc, {QStringLiteral("txtMorada"), QStringLiteral("txtCodigoPostal")}),
                 (QStringList{"Rua Augusta, 10|1100-053 Lisboa", "Rua do Ouro, 5|", "|"}));
    }

    void lettersFallBackToTheDefaultLetterheadButNotPastAnUnreadableOne()
    {
        addDebtor(1, QStringLiteral("Ana"), 5);
        const ReportDocument& doc = show(QStringLiteral("letters"));
        QCOMPARE(textsNamed(doc, QStringLiteral("lblSindicato")) + textsNamed(doc, QStringLiteral("lblMoradaSindicato")),
                 (QStringList{"Orbela", ""}));
        QVERIFY(QDir().mkpath(db->scratch(QStringLiteral("data/letterhead.txt"))));  // there, but not readable as a file
        General general;
        QVERIFY_THROWS_EXCEPTION(QuotasError, general.CartasDividas());
        QDir(db->scratch(QStringLiteral("data/letterhead.txt"))).removeRecursively();
    }

    void showsAPaymentMadeBetweenTwoShowings()
    {
        addDebtor(1, QStringLiteral("Ana"), 100);
        addDebtor(2, QStringLiteral("Bruno"), 30);
        for (const QString report : {"listing", "letters"}) {
            QCOMPARE(textsNamed(show(report), QStringLiteral("txtDivida")), (QStringList{"100,00 Esc", "30,00 Esc"}));
            QVERIFY(!Data().Dividas.recordset().isOpen());
        }
        auto elsewhere = db->openAnother();
        elsewhere->execute(QStringLiteral("UPDATE tbQuotas_Socios SET total_pago = total_pago + 40 WHERE socio_id = 1"));
        elsewhere->execute(QStringLiteral("UPDATE tbQuotas_Socios SET total_pago = 30 WHERE socio_id = 2"));
        const ReportDocument& after = show(QStringLiteral("listing"));
        QCOMPARE(textsNamed(after, QStringLiteral("txtDivida")) + textsNamed(after, QStringLiteral("fnDividas")),
                 (QStringList{"60,00 Esc", "60,00 Esc"}));
        QCOMPARE(textsNamed(show(QStringLiteral("letters")), QStringLiteral("txtDivida")), QStringList{"60,00 Esc"});
    }

    void preparesTheReportsConnection_data()
    {
        QTest::addColumn<bool>("aligned");
        QTest::addColumn<bool>("open");
        QTest::addColumn<bool>("keepsSession");
        QTest::newRow("aligned and open: used as it stands") << true << true << true;
        QTest::newRow("aligned and closed: opened") << true << false << false;
        QTest::newRow("elsewhere and open: closed, aligned, reopened") << false << true << false;
        QTest::newRow("elsewhere and closed: aligned, opened") << false << false << false;
    }
    void preparesTheReportsConnection()
    {
        QFETCH(bool, aligned);
        QFETCH(bool, open);
        QFETCH(bool, keepsSession);
        addDebtor(1, QStringLiteral("Principal"), 10);
        TestDatabase other;
        other.connection().execute(QStringLiteral("INSERT INTO tbSocios (socio_id, no_tap, nome) VALUES (1, '1', 'Outra')"));
        addAccount(1, 10, 0, &other.connection());
        Connection& prints = Data().SqlServer_Prints;
        if (!aligned) {
            prints.close();
            prints.setConnectionString(other.connectionString());
            prints.open();
        }
        if (open)  // a temporary table marks the session
            prints.execute(QStringLiteral("CREATE TEMPORARY TABLE marca (x INTEGER)"));
        else
            prints.close();
        QCOMPARE(textsNamed(show(QStringLiteral("listing")), QStringLiteral("txtNome")), QStringList{"Principal"});
        QCOMPARE(prints.connectionString(), Data().SqlServer.connectionString());
        QVERIFY(prints.isOpen());
        bool kept = true;
        try {
            prints.scalar(QStringLiteral("SELECT COUNT(*) FROM marca"));
        } catch (const DbError&) {
            kept = false;
        }
        QCOMPARE(kept, keepsSession);
    }

    // Rows read through SqlServer_Prints from one database are never shown as
    // the rows of the database it has been moved to.
    void dropsRowsReadFromTheDatabaseItLeft()
    {
        addDebtor(1, QStringLiteral("Antiga"), 10);
        Data().Dividas.execute();
        TestDatabase other;
        other.connection().execute(QStringLiteral("INSERT INTO tbSocios (socio_id, no_tap, nome) VALUES (1, '1', 'Nova')"));
        addAccount(1, 10, 0, &other.connection());
        Connection& main = Data().SqlServer;
        main.close();
        main.setConnectionString(other.connectionString());
        main.open();
        QCOMPARE(textsNamed(show(QStringLiteral("listing")), QStringLiteral("txtNome")), QStringList{"Nova"});
    }

    // A showing that fails once the debts are read still lets them go, so
    // the next showing does not present them again.
    void aFailedShowingStillClosesTheDebts()
    {
        addDebtor(1, QStringLiteral("Ana"), 10);
        shown.clear();
        QVERIFY_THROWS_EXCEPTION(QuotasError, writeDebtListingPdf(db->scratch(QStringLiteral("missing/out.pdf"))));
        QCOMPARE(int(shown.size()), 1);
        QVERIFY(!Data().Dividas.recordset().isOpen());
    }

    void aConnectionFailurePassesToTheHost()
    {
        addDebtor(1, QStringLiteral("Ana"), 10);
        Connection& main = Data().SqlServer;
        main.close();
        main.setConnectionString(QStringLiteral("Provider=MSDataShape.1;Data Source=%1;Data Provider=SQLOLEDB.1")
                                     .arg(db->scratch(QStringLiteral("missing/none.db"))));
        PreviewCloser closer;
        General general;
        QVERIFY_THROWS_EXCEPTION(QuotasError, general.ListagemDividas());
        QVERIFY_THROWS_EXCEPTION(QuotasError, general.CartasDividas());
        QVERIFY(closer.titles.isEmpty());
        QVERIFY(!Data().SqlServer_Prints.isOpen());
    }

    // Table extras as it stands: every line in the database's order, the
    // first four columns, an empty first column counted and a Null one not.
    void listsTheRejectsAfreshAtEveryShowing()
    {
        reject({null, QStringLiteral("sem número")});
        reject({QStringLiteral(""), QStringLiteral("vazio")});
        reject({QStringLiteral("300"), QStringLiteral("Rui"), QStringLiteral("12,50")});
        reject({QStringLiteral("100"), QStringLiteral("Ana"), QStringLiteral("c"), QStringLiteral("d"), QStringLiteral("quinta coluna")});
        const ReportDocument& doc = show(QStringLiteral("rejects"));
        QCOMPARE(titles, QStringList{"Listagem de Dados não Importados para a Base de Dados"});
        QCOMPARE(rowsOf(doc, {QStringLiteral("Text2"), QStringLiteral("Text1"), QStringLiteral("Text3"), QStringLiteral("Text7")}),
                 (QStringList{"|sem número||", "|vazio||", "300|Rui|12,50|", "100|Ana|c|d"}));
        QVERIFY(!pageTexts(doc.pages[0]).contains(QStringLiteral("quinta coluna")));
        QCOMPARE(textsNamed(doc, QStringLiteral("Function1")), QStringList{"3"});
        QVERIFY(!Data().Extras.recordset().isOpen());
        reject({QStringLiteral("200"), QStringLiteral("Eva")});
        QCOMPARE(textsNamed(show(QStringLiteral("rejects")), QStringLiteral("Text2")).last(), QStringLiteral("200"));
    }
};

QTEST_MAIN(ReportsTest)
#include "tst_reports.moc"
