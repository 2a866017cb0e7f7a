// The debt listing and the debt letters on both engines, read from the pages
// that the previews General shows: layout, who is listed and in what order,
// the totals, the pages, the letters, and the reports' connection.

#include "component/general.h"
#include "component/shared_objects.h"
#include "platform/errors.h"
#include "reports/entry.h"
#include "reports/report.h"
#include "reports/report_format.h"
#include "preview_closer.h"
#include "report_reading.h"
#include "support/test_database.h"

#include <QFile>
#include <QTest>

using namespace quotas;
using namespace quotas::test;

namespace {

QVariant null()
{
    return QVariant(QMetaType::fromType<QString>());
}

struct Expected {
    QString text;
    QRect rect;  // within the band
    ReportFont font;
    Align align;
};

}  // namespace

Q_DECLARE_METATYPE(Expected)

class DebtReportsTest : public QObject {
    Q_OBJECT

    std::unique_ptr<TestDatabase> db;
    std::vector<ReportDocument> shown;
    Connection& c() { return db->connection(); }

    void addMember(int id, const QVariant& noTap, const QVariant& nome, const QVariant& morada = null(),
                   const QVariant& postcode = null(), const QVariant& town = null())
    {
        c().execute(QStringLiteral("INSERT INTO tbSocios (socio_id, no_tap, nome, morada1, code_postal1, localidade1) "
                                   "VALUES (?, ?, ?, ?, ?, ?)"),
                    {id, noTap, nome, morada, postcode, town});
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

    // Shows a report through General, closing its preview as a user would,
    // and returns the pages it showed.
    const ReportDocument& show(void (General::*method)())
    {
        shown.clear();
        PreviewCloser closer;
        General general;
        (general.*method)();
        if (shown.size() != 1 || closer.titles.size() != 1)
            qFatal("expected one preview, got %d documents and %d dialogs", int(shown.size()), int(closer.titles.size()));
        if (closer.pageCounts.front() != shown.front().pageCount())
            qFatal("the preview shows %d pages, the document has %d", closer.pageCounts.front(), shown.front().pageCount());
        return shown.front();
    }
    const ReportDocument& listing() { return show(&General::ListagemDividas); }
    const ReportDocument& letters() { return show(&General::CartasDividas); }

    bool printsKeptItsSession()
    {
        try {
            Data().SqlServer_Prints.scalar(QStringLiteral("SELECT COUNT(*) FROM marca"));
            return true;
        } catch (const DbError&) {
            return false;
        }
    }

private slots:
    void initTestCase()
    {
        db = std::make_unique<TestDatabase>();
        Report::setObserver([this](const ReportDocument& doc) { shown.push_back(doc); });
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
        qputenv("QUOTAS_DATA_DIR", db->scratch(QStringLiteral("data")).toUtf8());
        QFile::remove(db->scratch(QStringLiteral("data/letterhead.txt")));
    }

    void listingShowsItsTextsInTheirFontsAndPlaces_data()
    {
        QTest::addColumn<QString>("name");
        QTest::addColumn<int>("bandTop");
        QTest::addColumn<Expected>("expected");
        const int rh = PaperSetup::kTopMargin;
        const int ph = rh + 990;
        const int detail = ph + 428;
        const int rf = detail + 322;
        const int pf = PaperSetup::kHeight - PaperSetup::kBottomMargin - 390;
        const QString date = longPortugueseDate(QDate::currentDate());
        const auto row = [](const char* name, int bandTop, Expected e) { QTest::newRow(name) << QString::fromLatin1(name) << bandTop << e; };
        row("lblTitulo", rh, {QStringLiteral("Listagem de Quotas em Dívida por Associado"), {90, 135, 10470, 255}, timesNewRoman(12, true), Align::Center});
        row("lblData", rh, {date, {5880, 540, 4665, 240}, arial(8.25, false, true), Align::Right});
        row("lblNoTap", ph, {QStringLiteral("Nº TAP"), {210, 75, 1425, 240}, arial(8.25, true), Align::Left});
        row("txtDivida", detail, {QStringLiteral("1.234,56 Esc"), {7800, 45, 2250, 270}, arial(), Align::Right});
        row("lblProcessado", pf, {QStringLiteral("Processado por Computador"), {60, 105, 2130, 225}, arial(6.75), Align::Left});
        row("lblPaginaNo", pf, {QStringLiteral("1"), {9090, 105, 585, 240}, arial(8.25, false, true), Align::Right});
        row("lblTotalRegistos", rf, {QStringLiteral("Total de registos listados:"), {5505, 165, 2310, 195}, arial(8.25, true), Align::Left});
        row("fnDividas", rf, {QStringLiteral("1.234,56 Esc"), {7860, 555, 1635, 225}, arial(), Align::Right});
    }
    void listingShowsItsTextsInTheirFontsAndPlaces()
    {
        QFETCH(QString, name);
        QFETCH(int, bandTop);
        QFETCH(Expected, expected);
        addMember(1, QStringLiteral("101"), QStringLiteral("Ana Silva"));
        addAccount(1, 1334.56, 100);
        const ReportDocument& doc = listing();
        QCOMPARE(doc.pageCount(), 1);
        const PlacedItem& item = onlyItem(doc.pages[0], name);
        QCOMPARE(item.text, expected.text);
        const int left = PaperSetup::leftMargin(*doc.layout);
        QCOMPARE(item.rect, expected.rect.translated(left, bandTop));
        QCOMPARE(item.item->font.family, expected.font.family);
        QCOMPARE(item.item->font.pointSize, expected.font.pointSize);
        QCOMPARE(item.item->font.bold, expected.font.bold);
        QCOMPARE(item.item->font.italic, expected.font.italic);
        QCOMPARE(item.item->align, expected.align);
    }

    void listsDebtsAboveOneEuroAtCentPrecision_data()
    {
        QTest::addColumn<double>("charged");
        QTest::addColumn<double>("paid");
        QTest::addColumn<bool>("listed");
        QTest::newRow("exactly 1.00") << 1.00 << 0.0 << false;
        // Stored as REAL on SQLite, 0.1 + 0.2 + 0.8 - 0.1 is a hair above 1.
        QTest::newRow("1.00 of inexact sums") << 0.1 + 0.2 + 0.8 << 0.1 << false;
        QTest::newRow("1.01") << 1.01 << 0.0 << true;
        QTest::newRow("1.01 of inexact sums") << 0.7 + 0.41 << 0.1 << true;
        QTest::newRow("below one") << 10.99 << 10.0 << false;
        QTest::newRow("paid in advance") << 10.0 << 30.0 << false;
        QTest::newRow("nothing charged") << 0.0 << 0.0 << false;
        QTest::newRow("large") << 12345.67 << 0.67 << true;
    }
    void listsDebtsAboveOneEuroAtCentPrecision()
    {
        QFETCH(double, charged);
        QFETCH(double, paid);
        QFETCH(bool, listed);
        addMember(1, QStringLiteral("101"), QStringLiteral("Ana"));
        addAccount(1, charged, paid);
        QCOMPARE(textsNamed(listing(), QStringLiteral("txtNome")).size(), listed ? 1 : 0);
        QCOMPARE(letters().rows, listed ? 1 : 0);
    }

    void ordersByNameKeepingTheAccountsOrderForEqualNames()
    {
        addMember(1, QStringLiteral("101"), QStringLiteral("Rui Costa"));
        addMember(2, QStringLiteral("102"), QStringLiteral("Ana Silva"));
        addMember(3, QStringLiteral("103"), QStringLiteral("Maria Sousa"));
        addMember(4, QStringLiteral("104"), QStringLiteral("Ana Silva"));
        for (const int socio : {4, 1, 3, 2})
            addAccount(socio, 50, 0);
        const QStringList expected = {QStringLiteral("104"), QStringLiteral("102"), QStringLiteral("103"), QStringLiteral("101")};
        QCOMPARE(textsNamed(listing(), QStringLiteral("txtNoTap")), expected);
        // The letters go to the same members in the same order.
        QCOMPARE(textsNamed(letters(), QStringLiteral("txtNoTap")), expected);
    }

    void countsStaffNumbersButTotalsEveryDebt()
    {
        addMember(1, QStringLiteral("101"), QStringLiteral("Ana"));
        addMember(2, null(), QStringLiteral("Bruno"));
        addMember(3, QStringLiteral(""), QStringLiteral("Carla"));
        addAccount(1, 10, 0);
        addAccount(2, 20, 0);
        addAccount(3, 30, 0);
        addAccount(99, 40.5, 0);  // its member row is missing
        const ReportDocument& doc = listing();
        QCOMPARE(doc.rows, 4);
        QCOMPARE(textsNamed(doc, QStringLiteral("fnRegistos")), QStringList{QStringLiteral("2")});
        QCOMPARE(textsNamed(doc, QStringLiteral("fnDividas")), QStringList{QStringLiteral("100,50 Esc")});
        const QStringList numbers = textsNamed(doc, QStringLiteral("txtNoTap"));
        const QStringList names = textsNamed(doc, QStringLiteral("txtNome"));
        const QStringList debts = textsNamed(doc, QStringLiteral("txtDivida"));
        const qsizetype orphan = debts.indexOf(QStringLiteral("40,50 Esc"));
        QVERIFY(orphan >= 0);
        QCOMPARE(numbers[orphan], QString());
        QCOMPARE(names[orphan], QString());
    }

    void numbersAndCountsPagesOverSeveralPages()
    {
        for (int i = 1; i <= 100; ++i)
            addDebtor(i, QStringLiteral("Associado %1").arg(i, 3, 10, QLatin1Char('0')), 2 + i);
        const ReportDocument& doc = listing();
        // 43 rows under the title on page 1, 46 on page 2, 11 and the totals on page 3.
        QCOMPARE(doc.pageCount(), 3);
        QList<int> perPage;
        for (const ReportPage& page : doc.pages)
            perPage << int(itemsNamed(page, QStringLiteral("txtNome")).size());
        QCOMPARE(perPage, (QList<int>{43, 46, 11}));
        QCOMPARE(textsNamed(doc, QStringLiteral("lblPaginaNo")), (QStringList{"1", "2", "3"}));
        QCOMPARE(textsNamed(doc, QStringLiteral("lblPaginas")), (QStringList{"3", "3", "3"}));
        QCOMPARE(textsNamed(doc, QStringLiteral("lblNoTap")).size(), 3);
        QCOMPARE(int(itemsNamed(doc.pages[2], QStringLiteral("fnRegistos")).size()), 1);
        // 100 x 2 + (1 + ... + 100)
        QCOMPARE(textsNamed(doc, QStringLiteral("fnDividas")), QStringList{QStringLiteral("5.250,00 Esc")});
    }

    void writesOneLetterPerPageWithTheMembersAddress()
    {
        QDir().mkpath(db->scratch(QStringLiteral("data")));
        QFile head(db->scratch(QStringLiteral("data/letterhead.txt")));
        QVERIFY(head.open(QIODevice::WriteOnly));
        head.write("# timbre\nnome = Sindicato de Teste\nmorada = Rua do Teste, 1, 1000-001 Lisboa\n");
        head.close();
        addMember(1, QStringLiteral("101"), QStringLiteral("Ana Silva"), QStringLiteral("Rua Augusta, 10"),
                   QStringLiteral("1100-053"), QStringLiteral("Lisboa"));
        addMember(2, QStringLiteral("102"), QStringLiteral("Bruno Costa"), QStringLiteral("Rua do Ouro, 5"), null(),
                   QStringLiteral("Porto"));
        addMember(3, QStringLiteral("103"), QStringLiteral("Carla Dias"), null(), QStringLiteral("8000-164"), null());
        addAccount(1, 1334.56, 100);
        addAccount(2, 20, 0);
        addAccount(3, 30, 0);
        const ReportDocument& doc = letters();
        QCOMPARE(doc.pageCount(), 3);
        for (const ReportPage& page : doc.pages) {
            QCOMPARE(int(itemsNamed(page, QStringLiteral("txtNome")).size()), 1);
            QCOMPARE(onlyItem(page, QStringLiteral("lblSindicato")).text, QStringLiteral("Sindicato de Teste"));
            QCOMPARE(onlyItem(page, QStringLiteral("lblMoradaSindicato")).text, QStringLiteral("Rua do Teste, 1, 1000-001 Lisboa"));
            QCOMPARE(onlyItem(page, QStringLiteral("lblData")).text, longPortugueseDate(QDate::currentDate()));
            QCOMPARE(onlyItem(page, QStringLiteral("lblProcessado")).text, QStringLiteral("Processado por Computador"));
        }
        const QStringList first = pageTexts(doc.pages[0]);
        const QStringList block = {QStringLiteral("Nº Empresa:"), QStringLiteral("101"), QStringLiteral("Associado:"),
                                   QStringLiteral("Ana Silva"), QStringLiteral("Morada:"), QStringLiteral("Rua Augusta, 10"),
                                   QStringLiteral("Localidade:"), QStringLiteral("1100-053 Lisboa")};
        QCOMPARE(first.mid(first.indexOf(QStringLiteral("Nº Empresa:")), block.size()), block);
        QVERIFY(first.contains(QStringLiteral(" na presente data, de ESC:")));
        QCOMPARE(onlyItem(doc.pages[0], QStringLiteral("txtDivida")).text, QStringLiteral("1.234,56 Esc"));
        const int left = PaperSetup::leftMargin(*doc.layout);
        QCOMPARE(onlyItem(doc.pages[0], QStringLiteral("txtNoTap")).rect, QRect(left + 4470, 567 + 1935, 1650, 225));
        QCOMPARE(onlyItem(doc.pages[0], QStringLiteral("lblRegularizacao")).item->font.bold, true);
        // A Null postcode or town empties the whole line; a Null address its own.
        QCOMPARE(onlyItem(doc.pages[1], QStringLiteral("txtCodigoPostal")).text, QString());
        QCOMPARE(onlyItem(doc.pages[1], QStringLiteral("txtMorada")).text, QStringLiteral("Rua do Ouro, 5"));
        QCOMPARE(onlyItem(doc.pages[2], QStringLiteral("txtMorada")).text, QString());
        QCOMPARE(onlyItem(doc.pages[2], QStringLiteral("txtCodigoPostal")).text, QString());
    }

    void lettersFallBackToTheDefaultLetterheadButNotPastAnUnreadableOne()
    {
        addDebtor(1, QStringLiteral("Ana"), 5);
        const ReportDocument& doc = letters();
        QCOMPARE(onlyItem(doc.pages[0], QStringLiteral("lblSindicato")).text, QStringLiteral("Orbela"));
        QCOMPARE(onlyItem(doc.pages[0], QStringLiteral("lblMoradaSindicato")).text, QString());
        // A letterhead that is there but cannot be read stops the letters.
        QVERIFY(QDir().mkpath(db->scratch(QStringLiteral("data/letterhead.txt"))));
        General general;
        QVERIFY_THROWS_EXCEPTION(QuotasError, general.CartasDividas());
        QDir(db->scratch(QStringLiteral("data/letterhead.txt"))).removeRecursively();
    }

    void showsAPaymentMadeBetweenTwoShowings()
    {
        addDebtor(1, QStringLiteral("Ana"), 100);
        addDebtor(2, QStringLiteral("Bruno"), 30);
        QCOMPARE(textsNamed(listing(), QStringLiteral("txtDivida")), (QStringList{"100,00 Esc", "30,00 Esc"}));
        QVERIFY(!Data().Dividas.recordset().isOpen());
        QCOMPARE(textsNamed(letters(), QStringLiteral("txtDivida")), (QStringList{"100,00 Esc", "30,00 Esc"}));
        QVERIFY(!Data().Dividas.recordset().isOpen());

        auto elsewhere = db->openAnother();
        elsewhere->execute(QStringLiteral("UPDATE tbQuotas_Socios SET total_pago = total_pago + 40 WHERE socio_id = 1"));
        elsewhere->execute(QStringLiteral("UPDATE tbQuotas_Socios SET total_pago = 30 WHERE socio_id = 2"));
        const ReportDocument& after = listing();
        QCOMPARE(textsNamed(after, QStringLiteral("txtDivida")), QStringList{"60,00 Esc"});
        QCOMPARE(textsNamed(after, QStringLiteral("fnDividas")), QStringList{"60,00 Esc"});
        QCOMPARE(textsNamed(letters(), QStringLiteral("txtDivida")), QStringList{"60,00 Esc"});
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
        if (open)
            prints.execute(QStringLiteral("CREATE TEMPORARY TABLE marca (x INTEGER)"));
        else
            prints.close();

        QCOMPARE(textsNamed(listing(), QStringLiteral("txtNome")), QStringList{QStringLiteral("Principal")});
        QCOMPARE(prints.connectionString(), Data().SqlServer.connectionString());
        QVERIFY(prints.isOpen());
        QCOMPARE(printsKeptItsSession(), keepsSession);
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
        QCOMPARE(textsNamed(listing(), QStringLiteral("txtNome")), QStringList{QStringLiteral("Nova")});
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
};

QTEST_MAIN(DebtReportsTest)
#include "tst_debt_reports.moc"
