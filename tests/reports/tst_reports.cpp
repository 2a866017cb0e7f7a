// The reports: the banded engine without a database (the fixed formats, the
// date of printing, pagination), then the debt listing, the debt
// letters and the rejects listing on both engines, read from the pages of the
// previews that General shows (layout, who is listed and in what order, the
// totals, the pages, the letters, the reports' connection), and written to
// PDF by the quotas program. Then the member statement and the month's
// summary: the running balance and the totals, the account check, the
// month's sums on a hand-made month, that the summary agrees with the
// statements and the debt listing, and both written by the quotas program
// (PDF read back, CSV bytes).

#include "component/general.h"
#include "component/shared_objects.h"
#include "import/rejects_listing.h"
#include "platform/errors.h"
#include "platform/recordset.h"
#include "reports/entry.h"
#include "reports/member_statement.h"
#include "reports/month_summary.h"
#include "reports/report.h"
#include "reports/report_engine.h"
#include "reports/report_format.h"
#include "support/database_fixture.h"

#include <QFile>
#include <QPrintPreviewDialog>
#include <QPrintPreviewWidget>
#include <QProcess>
#include <QRegularExpression>
#include <QTest>
#include <QTimer>

using namespace quotas;
using namespace quotas::test;
using namespace Qt::StringLiterals;

namespace {

const QVariant null = QVariant(QMetaType::fromType<QString>());

// The items of that layout name, in page order (on one page when page >= 0).
std::vector<const PlacedItem*> placed(const ReportDocument& doc, const QString& name, int page = -1)
{
    std::vector<const PlacedItem*> found;
    for (int p = 0; p < doc.pageCount(); ++p) {
        for (const PlacedItem& item : doc.pages[p].items) {
            if (item.item->name == name && (page < 0 || page == p))
                found.push_back(&item);
        }
    }
    return found;
}

// The texts of the items of those names side by side, "a|b|c", one line per
// item of the first name (per detail, per letter).
QStringList texts(const ReportDocument& doc, const QStringList& names)
{
    QStringList lines;
    for (int n = 0; n < names.size(); ++n) {
        const auto items = placed(doc, names[n]);
        for (int i = 0; i < int(items.size()); ++i) {
            if (n == 0)
                lines << items[i]->text;
            else if (i < lines.size())
                lines[i] += u'|' + items[i]->text;
        }
    }
    return lines;
}

QList<int> countsPerPage(const ReportDocument& doc, const QString& name)
{
    QList<int> counts;
    for (int p = 0; p < doc.pageCount(); ++p)
        counts << int(placed(doc, name, p).size());
    return counts;
}

// A layout of one detail and a report footer with a count, laid out over rows numbered 1 to count.
ReportDocument layOut(int detail, int reportFooter, bool breakAfter, int count)
{
    auto layout = std::make_shared<ReportLayout>();
    layout->detail = reportBand(u"D"_s, detail, {field(u"d"_s, u"no_tap"_s, 0, 0, 1000, 200)}, breakAfter);
    layout->reportFooter = reportBand(u"RF"_s, reportFooter, {countOf(u"count"_s, u"no_tap"_s, 0, 0, 1000, 200)});
    Recordset rs;
    rs.openInMemory({u"no_tap"_s});
    for (int i = 1; i <= count; ++i) {
        rs.addNew();
        rs.setValue(0, QString::number(i));
        rs.update();
    }
    return layOutReport(layout, rs);
}

constexpr int kUsable = PaperSetup::kHeight - PaperSetup::kTopMargin - PaperSetup::kBottomMargin;

struct Pages {
    int rows, detail, reportFooter;
    bool breakAfter;
    QList<int> perPage;
};

struct Movement {
    const char* table;  // "", "Inactivos", "Historico"
    int socio, ano, mes, tipo;
    QVariant quota, pago;
    const char* doc;
};

struct StatementCase {
    StatementRequest request;
    QStringList lines;  // mes/ano|ref|open|balance|origin
    QString totals;     // charged|paid|open
    bool differs;
};

QString cents(qint64 c)
{
    return formatCents(c, u"0.00"_s);
}

}  // namespace
Q_DECLARE_METATYPE(Pages)
Q_DECLARE_METATYPE(StatementCase)

class ReportsTest : public QObject, DatabaseFixture {
    Q_OBJECT

    std::vector<ReportDocument> shown;
    QStringList titles;  // of the previews of the last showing

    void addDebtor(int id, const QVariant& noTap, const QVariant& nome, double charged, double paid = 0,
                   const QVariantList& address = {null, null, null}, Connection* on = nullptr)
    {
        Connection& c = on ? *on : db->connection();
        c.execute(u"INSERT INTO tbSocios (socio_id, no_tap, nome, morada1, code_postal1, localidade1) VALUES (?, ?, ?, ?, ?, ?)"_s,
                  QVariantList{id, noTap, nome} + address);
        c.execute(u"INSERT INTO tbQuotas_Socios (socio_id, total_quotas, total_pago) VALUES (?, ?, ?)"_s, {id, charged, paid});
    }
    void reject(QVariantList fields)
    {
        while (fields.size() < 5)
            fields << null;
        c().execute(u"INSERT INTO extras (Field0, Field1, Field2, Field3, Field4) VALUES (?, ?, ?, ?, ?)"_s, fields);
    }
    void letterhead(const QByteArray& text)
    {
        QFile head(db->scratch(u"data/letterhead.txt"_s));
        QVERIFY(head.open(QIODevice::WriteOnly) && head.write(text) == text.size());
    }

    // Shows "listing", "letters" or "rejects" as the host does, closing the
    // modal preview with Escape as a user would once it is up, and returns
    // the pages it showed.
    ReportDocument show(const QString& report)
    {
        shown.clear();
        titles.clear();
        QList<int> pageCounts;
        QTimer closer;
        QObject::connect(&closer, &QTimer::timeout, [&] {
            if (auto* dialog = qobject_cast<QPrintPreviewDialog*>(QApplication::activeModalWidget()); dialog && dialog->isVisible()) {
                titles << dialog->windowTitle();
                pageCounts << dialog->findChild<QPrintPreviewWidget*>()->pageCount();
                QTest::keyClick(dialog, Qt::Key_Escape);
            }
        });
        closer.start(10);
        General general;
        report == "listing"_L1 ? general.ListagemDividas() : report == "letters"_L1 ? general.CartasDividas()
                                                                                    : showRejectsListing();
        if (shown.size() != 1 || pageCounts != QList<int>{shown.front().pageCount()})
            qFatal("expected one preview of all the pages, got %d documents and %d dialogs", int(shown.size()), int(titles.size()));
        return shown.front();
    }

    void member(int id, const QString& noTap, const QString& nome, const QVariant& totalQuotas = QVariant(),
                const QVariant& totalPago = QVariant(), const QString& empresa = QString(), int seguro = 0)
    {
        c().execute(u"INSERT INTO tbSocios (socio_id, no_tap, nome, nome_guerra, morada1, code_postal1, "
                    "localidade1, empresa, seguro) VALUES (?, ?, ?, ?, 'Rua do Ouro, 5', '1100-053', 'Lisboa', ?, ?)"_s,
                    {id, noTap, nome, nome.section(u' ', 0, 0), empresa, seguro});
        if (totalQuotas.isValid())
            c().execute(u"INSERT INTO tbQuotas_Socios (socio_id, ult_rend1, ult_rend2, total_quotas, total_pago) "
                        "VALUES (?, 1000, 0, ?, ?)"_s,
                        {id, totalQuotas, totalPago});
    }
    void move(const Movement& m)
    {
        const QString table = u"tbQuotas_Movimentos"_s + (*m.table ? u"_"_s + QLatin1String(m.table) : QString());
        c().execute(u"INSERT INTO %1 (socio_id, data, ano, mes, tipo, ref, quota_no, quota, pago, doc_no) "
                    "VALUES (?, ?, ?, ?, ?, ?, ?, ?, ?, ?)"_s.arg(table),
                    {m.socio, QDate(m.ano, m.mes, 1), m.ano, m.mes, m.tipo,
                     m.tipo == 1 ? u"Sindicato"_s : u"Seguro"_s, m.ano * 100 + m.mes, m.quota, m.pago,
                     *m.doc ? QVariant(QString::fromUtf8(m.doc)) : QVariant(QMetaType::fromType<QString>())});
    }
    // Member 1 with active movements over three months, one inactive and one in the history.
    void statementMember(double totalQuotas, double totalPago)
    {
        member(1, u"100200"_s, u"Joaquim Gonçalves"_s, totalQuotas, totalPago);
        for (const Movement& m : {Movement{"", 1, 2004, 2, 2, 5.0, 0.0, ""}, Movement{"", 1, 2004, 1, 1, 30.0, 30.0, ""},
                                  Movement{"", 1, 2004, 2, 1, 30.0, 10.0, "R-17"}, Movement{"", 1, 2004, 3, 1, 30.0, kNullNumber, ""},
                                  Movement{"Inactivos", 1, 2004, 2, 1, 12.0, 0.0, ""},
                                  Movement{"Historico", 1, 2003, 12, 1, 25.0, 25.0, ""}})
            move(m);
    }

private slots:
    void initTestCase()
    {
        openDatabase();
        Report::setObserver([this](const ReportDocument& doc) { shown.push_back(doc); });
        qputenv("QUOTAS_DATA_DIR", db->scratch(u"data"_s).toUtf8());
        QDir().mkpath(db->scratch(u"data"_s));
    }
    void init()
    {
        db->clear();
        db->login();
        shown.clear();
        QFile::remove(db->scratch(u"data/letterhead.txt"_s));
    }

    void formatsValuesAndDates()
    {
        // "#,##0.00 Esc" is the layouts' one format: grouping, two decimals, halves to even, no "-0,00".
        const QVariantList values = {1234.5, 1234567.891, 0.0, 0.125, -1234.5, -0.001, u"12.5"_s, u"abc"_s, QVariant(QMetaType::fromType<double>())};
        QStringList formatted;
        for (const QVariant& value : values)
            formatted << formatReportValue(value, u"#,##0.00 Esc"_s);
        QCOMPARE(formatted, (QStringList{"1.234,50 Esc", "1.234.567,89 Esc", "0,00 Esc", "0,12 Esc", "-1.234,50 Esc", "0,00 Esc", "12,50 Esc", "abc", ""}));
        QCOMPARE(formatReportValue(u"100234"_s, QString()), u"100234"_s);  // digits without a format stay as they are
        // The date of printing, "%D".
        QCOMPARE(longPortugueseDate(QDate(2026, 12, 6)) + u", "_s + longPortugueseDate(QDate(2027, 3, 1)),
                 u"6 de dezembro de 2026, 1 de março de 2027"_s);
    }

    void paginates_data()
    {
        QTest::addColumn<Pages>("p");
        // Four details fill a page exactly: the fourth ends on the footer's edge and stays.
        QTest::newRow("exact fit") << Pages{8, kUsable / 4, 0, false, {4, 4}};
        QTest::newRow("one too many") << Pages{9, kUsable / 4, 0, false, {4, 4, 1}};
        QTest::newRow("footer that no longer fits") << Pages{8, kUsable / 4, 1, false, {4, 4, 0}};
        QTest::newRow("a hair too tall") << Pages{4, kUsable / 4 + 1, 0, false, {3, 1}};
        QTest::newRow("no rows") << Pages{0, 500, 100, false, {0}};
        QTest::newRow("break after each") << Pages{3, 1000, 0, true, {1, 1, 1}};
        QTest::newRow("break, then the report footer") << Pages{3, 1000, 300, true, {1, 1, 1, 0}};
    }
    void paginates()
    {
        QFETCH(Pages, p);
        const ReportDocument doc = layOut(p.detail, p.reportFooter, p.breakAfter, p.rows);
        QCOMPARE(countsPerPage(doc, u"d"_s), p.perPage);
        QStringList order;
        for (int i = 1; i <= p.rows; ++i)
            order << QString::number(i);
        QCOMPARE(texts(doc, {u"d"_s}), order);
        QCOMPARE(countsPerPage(doc, u"count"_s).last(), p.reportFooter ? 1 : 0);
    }

    void listsDebtsAboveOneEuroInOrderOfNameCountingStaffNumbers()
    {
        const struct {
            int id;
            const char* name;
            double charged, paid;
        } accounts[] = {{1, "Rui", 50, 0}, {2, "Nuno", 1.00, 0}, {3, "Ivo", 2.2, 1.2},  // 2.20 - 1.20 is a hair above 1 in REAL
                        {4, "Maria", 1.01, 0},
                        {5, "Carla", 0.7 + 0.41, 0.1},
                        {6, "Bruno", 10, 30},
                        {7, "Eva", 12345.67, 0.67},
                        {9, "Ana", 5, 0},
                        {8, "Ana", 5, 0}};  // equal names keep the accounts' order
        for (const auto& a : accounts)
            addDebtor(a.id, QString::number(100 + a.id), QString::fromUtf8(a.name), a.charged, a.paid);
        addDebtor(10, null, u"Paulo"_s, 20);  // in the total, not in the number of records
        addDebtor(11, u""_s, u"Sara"_s, 30);  // an empty number counts
        c().execute(u"INSERT INTO tbQuotas_Socios (socio_id, total_quotas, total_pago) VALUES (99, 40.5, 0)"_s);
        const ReportDocument doc = show(u"listing"_s);
        QStringList rows = texts(doc, {u"txtNoTap"_s, u"txtNome"_s, u"txtDivida"_s});
        QVERIFY(rows.removeOne(u"||40,50 Esc"_s));  // no member row; where a Null name sorts depends on the engine
        QCOMPARE(rows, (QStringList{"109|Ana|5,00 Esc", "108|Ana|5,00 Esc", "105|Carla|1,01 Esc", "107|Eva|12.345,00 Esc",
                                    "104|Maria|1,01 Esc", "|Paulo|20,00 Esc", "101|Rui|50,00 Esc", "|Sara|30,00 Esc"}));
        QCOMPARE(texts(doc, {u"fnRegistos"_s, u"fnDividas"_s}), QStringList{"7|12.497,52 Esc"});
        QCOMPARE(texts(show(u"letters"_s), {u"txtNoTap"_s}), texts(doc, {u"txtNoTap"_s}));  // the same members in the same order
    }

    void numbersAndCountsPagesOverSeveralPages()
    {
        for (int i = 1; i <= 100; ++i)
            addDebtor(i, QString::number(i), u"Associado %1"_s.arg(i, 3, 10, QLatin1Char('0')), 2 + i);
        const ReportDocument doc = show(u"listing"_s);
        // 43 rows under the title on page 1, 46 on page 2, 11 and the totals on page 3; the column heads on each.
        QCOMPARE(countsPerPage(doc, u"txtNome"_s) + countsPerPage(doc, u"lblNoTap"_s) + countsPerPage(doc, u"fnRegistos"_s),
                 (QList<int>{43, 46, 11, 1, 1, 1, 0, 0, 1}));
        QCOMPARE(texts(doc, {u"lblPaginaNo"_s, u"lblPaginas"_s}) + texts(doc, {u"fnDividas"_s}),
                 (QStringList{"1|3", "2|3", "3|3", "5.250,00 Esc"}));  // 100 x 2 + (1 + ... + 100)
    }

    void writesOneLetterPerPageWithTheMembersAddress()
    {
        letterhead("# timbre\nnome = Sindicato de Teste\nmorada = Rua do Teste, 1, 1000-001 Lisboa\n");
        addDebtor(1, u"101"_s, u"Ana Silva"_s, 1334.56, 100, {u"Rua Augusta, 10"_s, u"1100-053"_s, u"Lisboa"_s});
        addDebtor(2, u"102"_s, u"Bruno Costa"_s, 20, 0, {u"Rua do Ouro, 5"_s, null, u"Porto"_s});
        addDebtor(3, u"103"_s, u"Carla Dias"_s, 30, 0, {null, u"8000-164"_s, null});
        const ReportDocument doc = show(u"letters"_s);
        QCOMPARE(countsPerPage(doc, u"txtNome"_s), (QList<int>{1, 1, 1}));
        QCOMPARE(texts(doc, {u"lblSindicato"_s, u"lblMoradaSindicato"_s}), QStringList(3, u"Sindicato de Teste|Rua do Teste, 1, 1000-001 Lisboa"_s));
        // A Null postcode or town empties the whole line; a Null address its own.
        QCOMPARE(texts(doc, {u"lblNoEmpresa"_s, u"txtNoTap"_s, u"lblAssociado"_s, u"txtNome"_s, u"lblMorada"_s, u"txtMorada"_s,
                             u"lblLocalidade"_s, u"txtCodigoPostal"_s, u"lblTexto2"_s, u"txtDivida"_s}),
                 (QStringList{"Nº Empresa:|101|Associado:|Ana Silva|Morada:|Rua Augusta, 10|Localidade:|1100-053 Lisboa| na presente data, de ESC:|1.234,56 Esc",
                              "Nº Empresa:|102|Associado:|Bruno Costa|Morada:|Rua do Ouro, 5|Localidade:|| na presente data, de ESC:|20,00 Esc",
                              "Nº Empresa:|103|Associado:|Carla Dias|Morada:||Localidade:|| na presente data, de ESC:|30,00 Esc"}));
    }

    void lettersFallBackToTheDefaultLetterheadButNotPastAnUnreadableOne()
    {
        addDebtor(1, u"101"_s, u"Ana"_s, 5);
        QCOMPARE(texts(show(u"letters"_s), {u"lblSindicato"_s, u"lblMoradaSindicato"_s}), QStringList{"Orbela|"});
        QVERIFY(QDir().mkpath(db->scratch(u"data/letterhead.txt"_s)));  // there, but not readable as a file
        QVERIFY_THROWS_EXCEPTION(QuotasError, General().CartasDividas());
        QDir(db->scratch(u"data/letterhead.txt"_s)).removeRecursively();
    }

    void showsAPaymentMadeBetweenTwoShowings()
    {
        QCOMPARE(texts(show(u"listing"_s), {u"fnRegistos"_s, u"fnDividas"_s, u"lblPaginaNo"_s, u"lblPaginas"_s}), QStringList{"0|0,00 Esc|1|1"});
        addDebtor(1, u"101"_s, u"Ana"_s, 100);
        addDebtor(2, u"102"_s, u"Bruno"_s, 30);
        for (const QString report : {"listing", "letters"}) {
            QCOMPARE(texts(show(report), {u"txtDivida"_s}), (QStringList{"100,00 Esc", "30,00 Esc"}));
            QVERIFY(!Data().Dividas.recordset().isOpen());
        }
        const auto elsewhere = db->openAnother();
        elsewhere->execute(u"UPDATE tbQuotas_Socios SET total_pago = total_pago + 40 WHERE socio_id = 1"_s);
        elsewhere->execute(u"UPDATE tbQuotas_Socios SET total_pago = 30 WHERE socio_id = 2"_s);
        const ReportDocument after = show(u"listing"_s);
        QCOMPARE(texts(after, {u"txtDivida"_s}) + texts(after, {u"fnDividas"_s}), (QStringList{"60,00 Esc", "60,00 Esc"}));
        QCOMPARE(texts(show(u"letters"_s), {u"txtDivida"_s}), QStringList{"60,00 Esc"});
    }

    void preparesTheReportsConnection_data()
    {
        QTest::addColumn<bool>("aligned");
        QTest::addColumn<bool>("open");
        QTest::newRow("aligned and open: used as it stands") << true << true;
        QTest::newRow("aligned and closed: opened") << true << false;
        QTest::newRow("elsewhere and open: closed, aligned, reopened") << false << true;
        QTest::newRow("elsewhere and closed: aligned, opened") << false << false;
    }
    void preparesTheReportsConnection()
    {
        QFETCH(bool, aligned);
        QFETCH(bool, open);
        addDebtor(1, u"1"_s, u"Principal"_s, 10);
        TestDatabase other;
        addDebtor(1, u"1"_s, u"Outra"_s, 10, 0, {null, null, null}, &other.connection());
        Connection& prints = Data().SqlServer_Prints;
        prints.close();
        prints.setConnectionString(aligned ? Data().SqlServer.connectionString() : other.connectionString());
        prints.open();
        prints.execute(u"CREATE TEMPORARY TABLE marca (x INTEGER)"_s);  // marks the session
        if (open)
            Data().Dividas.execute();  // rows read there are never shown as those of the database it moves to
        else
            prints.close();
        QCOMPARE(texts(show(u"listing"_s), {u"txtNome"_s}), QStringList{"Principal"});
        QCOMPARE(prints.connectionString(), Data().SqlServer.connectionString());
        if (aligned && open)
            prints.scalar(u"SELECT COUNT(*) FROM marca"_s);
        else
            QVERIFY_THROWS_EXCEPTION(DbError, prints.scalar(u"SELECT COUNT(*) FROM marca"_s));
    }

    // A showing that fails once the debts are read still lets them go, so the
    // next showing does not present them again.
    void aFailedShowingStillClosesTheDebts()
    {
        addDebtor(1, u"101"_s, u"Ana"_s, 10);
        QVERIFY_THROWS_EXCEPTION(QuotasError, writeDebtListingPdf(db->scratch(u"missing/out.pdf"_s)));
        QCOMPARE(int(shown.size()), 1);
        QVERIFY(!Data().Dividas.recordset().isOpen());
    }

    // Table extras as it stands: every line in the database's order, the
    // first four columns and the reasons the last import kept beside them,
    // an empty first column counted and a Null one not.
    void listsTheRejectsAfreshAtEveryShowing()
    {
        reject({null, u"sem número"_s});
        reject({u""_s, u"vazio"_s});
        reject({u"300"_s, u"Rui"_s, u"12,50"_s});
        reject({u"100"_s, u"Ana"_s, u"c"_s, u"d"_s, u"quinta coluna"_s});
        shared().rejectReasons = {u"sem conta"_s, u"valor ilegível"_s};  // known for the first two only
        const ReportDocument doc = show(u"rejects"_s);
        shared().rejectReasons.clear();
        QCOMPARE(titles, QStringList{"Listagem de Dados não Importados para a Base de Dados"});
        QCOMPARE(texts(doc, {u"Text2"_s, u"Text1"_s, u"Text8"_s, u"Text3"_s, u"Text7"_s}) + texts(doc, {u"Function1"_s}),
                 (QStringList{"|sem número|sem conta||", "|vazio|valor ilegível||", "300|Rui||12,50|", "100|Ana||c|d", "3"}));
        QVERIFY(!Data().Extras.recordset().isOpen());
        reject({u"200"_s, u"Eva"_s});
        QCOMPARE(texts(show(u"rejects"_s), {u"Text2"_s}).last(), u"200"_s);
    }

    // The quotas program writes the same pages to PDF: read back with
    // poppler's pdftotext (spaces squeezed) and pdffonts.
    void theCommandsWriteThePagesToPdf_data()
    {
        QTest::addColumn<QString>("command");
        QTest::addColumn<QStringList>("pages");  // lines that each page holds
        QTest::newRow("listagem") << "listagem" << QStringList{"Listagem de Quotas em Dívida por Associado\nNº TAP Nome Dívida\n100300 Ana "
                                                               "Conceição 12,50 Esc\n100200 Joaquim Gonçalves 1.300,25 Esc\nTotal de registos "
                                                               "listados: 2\nTotal de Dívidas: 1.312,75 Esc\nProcessado por Computador Página: 1 / 1"};
        const QString letter = u"Sindicato de Ensaio\nRua Direita, 7, 3000-001 Coimbra\nAssociado: %1\nLocalidade: %2\n"
                               "Assunto: Regularização de Débitos\nna presente data, de ESC: %3\nA Direcção"_s;
        QTest::newRow("cartas") << "cartas" << QStringList{letter.arg("Ana Conceição", "4000-322 Porto", "12,50 Esc"), letter.arg("Joaquim Gonçalves", "1100-053 Lisboa", "1.300,25 Esc")};
        QTest::newRow("rejeitados") << "rejeitados" << QStringList{"Listagem de Dados não Importados para a Base de Dados\n"
                                                                   "Campo 1 Campo 2 Motivo Campo 3 Campo 4\n999001 Linha Rejeitada 12,50 TAP"};
    }
    void theCommandsWriteThePagesToPdf()
    {
        QFETCH(QString, command);
        QFETCH(QStringList, pages);
        letterhead("nome = Sindicato de Ensaio\nmorada = Rua Direita, 7, 3000-001 Coimbra\n");
        addDebtor(1, u"100200"_s, u"Joaquim Gonçalves"_s, 1500.25, 200, {u"Rua Augusta, 10"_s, u"1100-053"_s, u"Lisboa"_s});
        addDebtor(2, u"100300"_s, u"Ana Conceição"_s, 12.5, 0, {u"Rua do Ouro, 5"_s, u"4000-322"_s, u"Porto"_s});
        reject({u"999001"_s, u"Linha Rejeitada"_s, u"12,50"_s, u"TAP"_s});
        const QString pdf = db->scratch(command + u".pdf"_s);
        const CliRun r = quotas({command, u"--pdf"_s, pdf});
        QVERIFY2(r.status == 0, qPrintable(r.err));
        QProcess fonts;
        fonts.start(u"pdffonts"_s, {pdf});
        QVERIFY(fonts.waitForFinished());
        QStringList printed = pdfText(pdf).replace(QRegularExpression(u" ?/ ?"_s), u" / "_s).split(u'\f');
        printed.removeIf([](const QString& page) { return page.trimmed().isEmpty(); });
        QCOMPARE(printed.size(), pages.size());
        for (int i = 0; i < pages.size(); ++i) {
            for (const QString& line : pages[i].split(u'\n'))
                QVERIFY2(printed[i].contains(line), qPrintable(line + u"\n--- not on this page:\n"_s + printed[i]));
        }
        // Arial and Times New Roman are printed in their metric twins.
        const QString used = QString::fromUtf8(fonts.readAllStandardOutput());
        QVERIFY2(used.contains(u"LiberationSans"_s) && (command == "cartas"_L1 || used.contains(u"LiberationSerif-Bold"_s)), qPrintable(used));
        // A usage problem exits with 2, a file that cannot be written with 1, each with a message.
        const CliRun noPdf = quotas({command}), unwritable = quotas({command, u"--pdf"_s, u"/nonexistent/out.pdf"_s});
        QCOMPARE((QList<int>{noPdf.status, unwritable.status}), (QList<int>{2, 1}));
        QVERIFY(!noPdf.err.isEmpty() && !unwritable.err.isEmpty());
    }

    void statementRunsTheBalanceInOrder_data()
    {
        QTest::addColumn<StatementCase>("k");
        const QStringList active = {"01/2004|Sindicato|0,00|0,00|", "02/2004|Sindicato|20,00|20,00|",
                                    "02/2004|Seguro|5,00|25,00|", "03/2004|Sindicato|30,00|55,00|"};
        QTest::newRow("active, every month") << StatementCase{{1, 0, 0, false}, active, "95,00|40,00|55,00", false};
        QTest::newRow("from February") << StatementCase{{1, 200402, 0, false}, {"02/2004|Sindicato|20,00|20,00|", "02/2004|Seguro|5,00|25,00|", "03/2004|Sindicato|30,00|55,00|"}, "65,00|10,00|55,00", false};
        QTest::newRow("every table, to February")
            << StatementCase{{1, 0, 200402, true},
                             {"12/2003|Sindicato|0,00|0,00|Histórico", "01/2004|Sindicato|0,00|0,00|",
                              "02/2004|Sindicato|20,00|20,00|", "02/2004|Sindicato|12,00|32,00|Inactivo",
                              "02/2004|Seguro|5,00|37,00|"},
                             "102,00|65,00|37,00",
                             false};
    }
    void statementRunsTheBalanceInOrder()
    {
        QFETCH(StatementCase, k);
        statementMember(95, 40);
        const MemberStatement s = readMemberStatement(c(), k.request);
        QStringList lines;
        for (const StatementLine& l : s.lines)
            lines << u"%1/%2|%3|%4|%5|%6"_s.arg(l.mes, 2, 10, QLatin1Char('0')).arg(l.ano).arg(l.ref, cents(l.open()), cents(l.balance), l.origin);
        QCOMPARE(lines, k.lines);
        QCOMPARE(u"%1|%2|%3"_s.arg(cents(s.charged), cents(s.paid), cents(s.open())), k.totals);
        QCOMPARE(s.accountDiffers, k.differs);
    }

    // The account is compared with every active movement, whatever the statement shows.
    void statementTellsWhenTheAccountDiffers_data()
    {
        QTest::addColumn<QVariant>("totalQuotas");
        QTest::addColumn<QVariant>("totalPago");
        QTest::addColumn<bool>("differs");
        QTest::newRow("agrees") << QVariant(95.0) << QVariant(40.0) << false;
        QTest::newRow("a cent more charged") << QVariant(95.01) << QVariant(40.0) << true;
        QTest::newRow("paid differs") << QVariant(95.0) << QVariant(30.0) << true;
        QTest::newRow("Null totals") << kNullNumber << kNullNumber << true;
        QTest::newRow("no account") << QVariant() << QVariant() << true;
    }
    void statementTellsWhenTheAccountDiffers()
    {
        QFETCH(QVariant, totalQuotas);
        QFETCH(QVariant, totalPago);
        QFETCH(bool, differs);
        member(1, u"100200"_s, u"Joaquim Gonçalves"_s, totalQuotas, totalPago);
        for (const Movement& m : {Movement{"", 1, 2004, 1, 1, 65.0, 40.0, ""}, Movement{"", 1, 2004, 2, 1, 30.0, kNullNumber, ""},
                                  Movement{"Inactivos", 1, 2004, 2, 1, 12.0, 0.0, ""}})
            move(m);
        const MemberStatement s = readMemberStatement(c(), {1, 200402, 200402, true});
        QCOMPARE(s.accountDiffers, differs);
        const ReportDocument doc = layOutMemberStatement(s, Letterhead{});
        bool shown = false;
        for (const PlacedItem& item : doc.pages.back().items)
            shown = shown || item.text.endsWith(u"os acumulados da conta diferem: corra a Manutenção de Dados."_s);
        QCOMPARE(shown, differs);
    }

    // A hand-made month: the sums per type, what needs attention, and the
    // agreement with the statements and with the debt listing.
    void summaryAddsUpTheMonthAndAgrees()
    {
        c().execute(u"INSERT INTO tbEmpresas (code, percent_sindicato) VALUES ('TAP', 0.015), ('SEM', NULL)"_s);
        member(1, u"101"_s, u"Ana Silva"_s, 40.0, 0.0, u"TAP"_s, 1);
        member(2, u"102"_s, u"Bruno Costa"_s, 33.33, 0.0, u"TAP"_s);
        member(3, u"103"_s, u"Carla Dias"_s, 25.1, 0.0, u"SEM"_s, 1);             // insured; her insurance cannot be computed
        member(4, u"104"_s, u"Duarte Reis"_s);                                    // no account
        for (const Movement& m : {Movement{"", 1, 2004, 3, 1, 30.0, 30.0, ""},    // deducted by the list
                                  Movement{"", 1, 2004, 3, 2, 10.0, 4.0, "R-1"},  // paid at the desk
                                  Movement{"", 2, 2004, 3, 1, 33.33, 0.01, ""},
                                  Movement{"", 2, 2004, 2, 1, 99.0, 0.0, ""},           // another month
                                  Movement{"", 3, 2004, 3, 1, 25.1, kNullNumber, ""}})  // unpaid, before maintenance
            move(m);
        c().execute(u"INSERT INTO extras (Field0) VALUES ('999'), ('998')"_s);
        c().execute(u"UPDATE tbQuotas_Socios SET total_quotas = 10 WHERE socio_id = 1"_s);
        // Member 3's account lost its remunerations after this month was charged.
        c().execute(u"UPDATE tbQuotas_Socios SET ult_rend1 = NULL WHERE socio_id = 3"_s);

        const MonthSummary s = readMonthSummary(c(), 2004, 3);
        QStringList figures;
        for (const MonthTypeFigures& f : {s.types[0], s.types[1], s.total()})
            figures << u"%1|%2|%3|%4|%5|%6|%7"_s.arg(f.ref).arg(f.members).arg(f.dues).arg(
                cents(f.charged), cents(f.deducted), cents(f.paidOtherwise), cents(f.open));
        QCOMPARE(figures, (QStringList{"Sindicato|3|3|88,43|30,01|0,00|58,42", "Seguro|1|1|10,00|0,00|4,00|6,00",
                                       "Total|4|4|98,43|30,01|4,00|64,42"}));
        // Member 3's insurance (no remunerations), and nobody else's.
        QCOMPARE(u"%1|%2|%3"_s.arg(s.rejectedLines).arg(s.membersWithoutAccount).arg(s.duesNotComputed), u"2|1|1"_s);

        qint64 statementsOpen = 0;
        for (int socio : {1, 2, 3})
            statementsOpen += readMemberStatement(c(), {socio, 200403, 200403, false}).open();
        QCOMPARE(statementsOpen, s.total().open);

        // Once the accounts hold this month only, the debt listing totals the same open amount.
        c().execute(u"DELETE FROM tbQuotas_Movimentos WHERE mes = 2"_s);
        c().execute(u"UPDATE tbQuotas_Socios SET total_quotas = (SELECT SUM(quota) FROM tbQuotas_Movimentos m "
                    "WHERE m.socio_id = tbQuotas_Socios.socio_id), total_pago = (SELECT SUM(COALESCE(pago, 0)) "
                    "FROM tbQuotas_Movimentos m WHERE m.socio_id = tbQuotas_Socios.socio_id)"_s);
        shown.clear();
        writeDebtListingPdf(db->scratch(u"listagem.pdf"_s));
        QCOMPARE(texts(shown.back(), {u"fnDividas"_s}), QStringList{formatCents(readMonthSummary(c(), 2004, 3).total().open, kMoneyEsc)});
    }

    // The quotas program: PDF pages read back, the CSV's bytes, the exit statuses.
    void theCommandsWriteTheReports()
    {
        statementMember(95, 40);
        member(2, u"100300"_s, u"Rita Sá"_s, 0.0, 0.0);
        member(3, u"100300"_s, u"Rui Sá"_s, 0.0, 0.0);
        const QString pdf = db->scratch(u"extrato.pdf"_s), resumo = db->scratch(u"resumo.pdf"_s), csv = db->scratch(u"resumo.csv"_s);
        const CliRun statement = quotas({u"extrato"_s, u"--no-tap"_s, u"100200"_s, u"--ate"_s, u"2004-02"_s, u"--pdf"_s, pdf});
        QVERIFY2(statement.status == 0, qPrintable(statement.err));
        const CliRun summary = quotas({u"resumo"_s, u"--ano"_s, u"2004"_s, u"--mes"_s, u"2"_s, u"--pdf"_s, resumo, u"--csv"_s, csv});
        QVERIFY2(summary.status == 0, qPrintable(summary.err));
        const QString s = pdfText(pdf);
        for (const QString& line : {u"Extrato de Quotas"_s, u"Nº Empresa: 100200"_s, u"Nome: Joaquim Gonçalves"_s,
                                    u"Localidade: 1100-053 Lisboa"_s, u"Movimentos: activos, até 02/2004"_s,
                                    u"Data Mês/Ano Tipo Nº Quota Quota Pago Em Aberto Documento Saldo Origem"_s,
                                    u"01-02-2004 02/2004 Sindicato 200402 30,00 10,00 20,00 R-17 20,00"_s,
                                    u"Total em aberto: 25,00 Esc"_s, u"Página: 1"_s})
            QVERIFY2(s.contains(line), qPrintable(line + u"\n--- not in:\n"_s + s));
        const QString r = pdfText(resumo);
        for (const QString& line : {u"Resumo do Mês"_s, u"Fevereiro de 2004"_s, u"Sindicato 1 1 30,00 Esc 0,00 Esc 10,00 Esc 20,00 Esc"_s,
                                    u"Total 2 2 35,00 Esc 0,00 Esc 10,00 Esc 25,00 Esc"_s, u"Associados sem conta de quotas: 0"_s})
            QVERIFY2(r.contains(line), qPrintable(line + u"\n--- not in:\n"_s + r));
        QFile file(csv);
        QVERIFY(file.open(QIODevice::ReadOnly));
        QCOMPARE(file.readAll(), QByteArray("\xEF\xBB\xBFResumo do Mês;Fevereiro de 2004\r\n"
                                            "Tipo;Sócios cobrados;Nº de quotas;Valor das quotas;Descontado na lista;Pago de outra forma;Em aberto\r\n"
                                            "Sindicato;1;1;30,00;0,00;10,00;20,00\r\nSeguro;1;1;5,00;0,00;0,00;5,00\r\n"
                                            "Total;2;2;35,00;0,00;10,00;25,00\r\n\r\n"
                                            "Linhas rejeitadas na última importação;0\r\nAssociados sem conta de quotas;0\r\n"
                                            "Quotas do mês que a geração não pôde calcular;0\r\n"));
        // An unknown or shared staff number, a bad month: usage, with a message.
        for (const QStringList& args : {QStringList{u"--no-tap"_s, u"999"_s}, QStringList{u"--no-tap"_s, u"100300"_s},
                                        QStringList{u"--no-tap"_s, u"100200"_s, u"--desde"_s, u"2004-13"_s}}) {
            const CliRun bad = quotas(QStringList{u"extrato"_s} + args + QStringList{u"--pdf"_s, pdf});
            QVERIFY2(bad.status == 2 && !bad.err.isEmpty(), qPrintable(args.join(u' ') + u": "_s + bad.err));
        }
    }
};

QTEST_MAIN(ReportsTest)
#include "tst_reports.moc"
