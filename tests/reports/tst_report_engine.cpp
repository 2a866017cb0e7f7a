// The report engine without a database: the fixed formats, where the bands
// fall on the pages, the page codes and the functions.

#include "platform/errors.h"
#include "platform/recordset.h"
#include "reports/report_engine.h"
#include "reports/report_format.h"
#include "report_reading.h"

#include <QTest>

using namespace quotas;
using namespace quotas::test;

namespace {

// Rows of (no_tap, valor); a null QString stands for Null.
void fill(Recordset& rs, const QList<std::pair<QString, QString>>& rows)
{
    rs.openInMemory({QStringLiteral("no_tap"), QStringLiteral("valor")});
    for (const auto& [noTap, valor] : rows) {
        rs.addNew();
        rs.setValue(0, noTap.isNull() ? QVariant() : QVariant(noTap));
        rs.setValue(1, valor.isNull() ? QVariant() : QVariant(valor));
        rs.update();
    }
}

void fillNumbered(Recordset& rs, int count)
{
    QList<std::pair<QString, QString>> rows;
    for (int i = 1; i <= count; ++i)
        rows.append({QString::number(i), QStringLiteral("1")});
    fill(rs, rows);
}

// A layout whose bands carry one recognisable item each.
std::shared_ptr<ReportLayout> bands(int reportHeader, int pageHeader, int detail, int pageFooter, int reportFooter)
{
    auto r = std::make_shared<ReportLayout>();
    r->name = QStringLiteral("prtTeste");
    r->command = QStringLiteral("Teste");
    r->reportHeader = reportBand(QStringLiteral("RH"), reportHeader, {label(QStringLiteral("rh"), QStringLiteral("Título"), 0, 0, 1000, 200)});
    r->pageHeader = reportBand(QStringLiteral("PH"), pageHeader, {label(QStringLiteral("ph"), QStringLiteral("Cabeçalho"), 0, 0, 1000, 200)});
    r->detail = reportBand(QStringLiteral("D"), detail, {field(QStringLiteral("d"), QStringLiteral("no_tap"), 0, 0, 1000, 200)});
    r->pageFooter = reportBand(QStringLiteral("PF"), pageFooter,
                               {label(QStringLiteral("pf"), QStringLiteral("Página: %p / %P"), 0, 0, 3000, 200)});
    r->reportFooter = reportBand(QStringLiteral("RF"), reportFooter,
                                 {countOf(QStringLiteral("count"), QStringLiteral("no_tap"), 0, 0, 1000, 200),
                                  sumOf(QStringLiteral("sum"), QStringLiteral("valor"), QStringLiteral("#,##0.00 Esc"), 0,
                                        0, 1000, 200)});
    return r;
}

QList<int> detailsPerPage(const ReportDocument& doc)
{
    QList<int> counts;
    for (const ReportPage& page : doc.pages)
        counts << int(itemsNamed(page, QStringLiteral("d")).size());
    return counts;
}

constexpr int kUsable = PaperSetup::kHeight - PaperSetup::kTopMargin - PaperSetup::kBottomMargin;

}  // namespace

class ReportEngineTest : public QObject {
    Q_OBJECT

private slots:
    void formatsValues_data()
    {
        QTest::addColumn<QVariant>("value");
        QTest::addColumn<QString>("format");
        QTest::addColumn<QString>("expected");
        const QString esc = QStringLiteral("#,##0.00 Esc");
        QTest::newRow("grouping and decimals") << QVariant(1234.5) << esc << QStringLiteral("1.234,50 Esc");
        QTest::newRow("millions") << QVariant(1234567.891) << esc << QStringLiteral("1.234.567,89 Esc");
        QTest::newRow("below a thousand") << QVariant(999.99) << esc << QStringLiteral("999,99 Esc");
        QTest::newRow("zero keeps one digit") << QVariant(0.0) << esc << QStringLiteral("0,00 Esc");
        QTest::newRow("halves to even") << QVariant(0.125) << esc << QStringLiteral("0,12 Esc");
        QTest::newRow("inexact sum") << QVariant(1.1 - 0.1) << esc << QStringLiteral("1,00 Esc");
        QTest::newRow("negative") << QVariant(-1234.5) << esc << QStringLiteral("-1.234,50 Esc");
        QTest::newRow("negative rounding to zero") << QVariant(-0.001) << esc << QStringLiteral("0,00 Esc");
        QTest::newRow("negative section") << QVariant(-5.0) << QStringLiteral("#,##0.00;(#,##0.00)") << QStringLiteral("(5,00)");
        QTest::newRow("whole numbers") << QVariant(1234567) << QStringLiteral("#,##0") << QStringLiteral("1.234.567");
        QTest::newRow("numeric text") << QVariant(QStringLiteral("12.5")) << esc << QStringLiteral("12,50 Esc");
        QTest::newRow("other text") << QVariant(QStringLiteral("abc")) << esc << QStringLiteral("abc");
        QTest::newRow("null") << QVariant(QMetaType::fromType<double>()) << esc << QString();
        QTest::newRow("text without format") << QVariant(QStringLiteral("100234")) << QString() << QStringLiteral("100234");
        QTest::newRow("number without format") << QVariant(12.5) << QString() << QStringLiteral("12,5");
    }
    void formatsValues()
    {
        QFETCH(QVariant, value);
        QFETCH(QString, format);
        QFETCH(QString, expected);
        QCOMPARE(formatReportValue(value, format), expected);
    }

    void writesTheLongPortugueseDate_data()
    {
        QTest::addColumn<QDate>("date");
        QTest::addColumn<QString>("expected");
        QTest::newRow("december") << QDate(2026, 12, 6) << QStringLiteral("6 de dezembro de 2026");
        QTest::newRow("march, accented") << QDate(2027, 3, 1) << QStringLiteral("1 de março de 2027");
        QTest::newRow("two-digit day") << QDate(2003, 2, 28) << QStringLiteral("28 de fevereiro de 2003");
    }
    void writesTheLongPortugueseDate()
    {
        QFETCH(QDate, date);
        QFETCH(QString, expected);
        QCOMPARE(longPortugueseDate(date), expected);
    }

    void paginates_data()
    {
        QTest::addColumn<int>("rows");
        QTest::addColumn<int>("detail");
        QTest::addColumn<int>("reportFooter");
        QTest::addColumn<QList<int>>("perPage");
        // Four details fill a page exactly: the fourth ends on the footer's edge and stays.
        QTest::newRow("exact fit") << 8 << kUsable / 4 << 0 << QList<int>{4, 4};
        QTest::newRow("one too many") << 9 << kUsable / 4 << 0 << QList<int>{4, 4, 1};
        QTest::newRow("footer that no longer fits") << 8 << kUsable / 4 << 1 << QList<int>{4, 4, 0};
        QTest::newRow("a hair too tall") << 4 << kUsable / 4 + 1 << 0 << QList<int>{3, 1};
        QTest::newRow("no rows") << 0 << 500 << 100 << QList<int>{0};
        // Taller than a page: printed alone on each page rather than lost.
        QTest::newRow("taller than a page") << 2 << kUsable + 500 << 0 << QList<int>{1, 1};
    }
    void paginates()
    {
        QFETCH(int, rows);
        QFETCH(int, detail);
        QFETCH(int, reportFooter);
        QFETCH(QList<int>, perPage);
        Recordset rs;
        fillNumbered(rs, rows);
        const ReportDocument doc = layOutReport(bands(0, 0, detail, 0, reportFooter), rs);
        QCOMPARE(detailsPerPage(doc), perPage);
        QStringList order;
        for (int i = 1; i <= rows; ++i)
            order << QString::number(i);
        QCOMPARE(textsNamed(doc, QStringLiteral("d")), order);
    }

    void placesHeadersAndFootersAndFillsPageCodes()
    {
        Recordset rs;
        fillNumbered(rs, 30);
        const ReportDocument doc = layOutReport(bands(1000, 500, 1000, 500, 2000), rs);
        // Page 1: 567 + 1000 + 500 = 2067 up to 15771 holds 13 details; then 14, then 3 and the report footer.
        QCOMPARE(detailsPerPage(doc), (QList<int>{13, 14, 3}));
        QCOMPARE(textsNamed(doc, QStringLiteral("pf")),
                 (QStringList{QStringLiteral("Página: 1 / 3"), QStringLiteral("Página: 2 / 3"), QStringLiteral("Página: 3 / 3")}));
        QCOMPARE(int(itemsNamed(doc.pages[0], QStringLiteral("rh")).size()), 1);
        QCOMPARE(int(itemsNamed(doc, QStringLiteral("rh")).size()), 1);
        QCOMPARE(int(itemsNamed(doc, QStringLiteral("ph")).size()), 3);
        QCOMPARE(int(itemsNamed(doc.pages[2], QStringLiteral("count")).size()), 1);
        QCOMPARE(int(itemsNamed(doc, QStringLiteral("count")).size()), 1);
        const int left = PaperSetup::leftMargin(*doc.layout);
        QCOMPARE(onlyItem(doc.pages[0], QStringLiteral("rh")).rect, QRect(left, 567, 1000, 200));
        QCOMPARE(onlyItem(doc.pages[0], QStringLiteral("ph")).rect.top(), 1567);
        QCOMPARE(onlyItem(doc.pages[1], QStringLiteral("ph")).rect.top(), 567);
        QCOMPARE(itemsNamed(doc.pages[0], QStringLiteral("d")).front()->rect.top(), 2067);
        for (const ReportPage& page : doc.pages)
            QCOMPARE(onlyItem(page, QStringLiteral("pf")).rect.top(), PaperSetup::kHeight - 567 - 500);
        // The report footer follows the last detail.
        QCOMPARE(onlyItem(doc.pages[2], QStringLiteral("count")).rect.top(), 567 + 500 + 3 * 1000);
    }

    void breaksThePageAfterEachMarkedDetail_data()
    {
        QTest::addColumn<int>("reportFooter");
        QTest::addColumn<QList<int>>("perPage");
        QTest::newRow("nothing after the last") << 0 << QList<int>{1, 1, 1};
        QTest::newRow("report footer on a page of its own") << 300 << QList<int>{1, 1, 1, 0};
    }
    void breaksThePageAfterEachMarkedDetail()
    {
        QFETCH(int, reportFooter);
        QFETCH(QList<int>, perPage);
        Recordset rs;
        fillNumbered(rs, 3);
        auto layout = bands(0, 0, 1000, 390, reportFooter);
        layout->detail.pageBreakAfter = true;
        const ReportDocument doc = layOutReport(layout, rs);
        QCOMPARE(detailsPerPage(doc), perPage);
    }

    void countsValuesAndSumsEveryRowInCents()
    {
        Recordset rs;
        QList<std::pair<QString, QString>> rows = {{QStringLiteral("1"), QStringLiteral("1234.56")},
                                                   {QString(), QStringLiteral("10.00")},
                                                   {QStringLiteral(""), QStringLiteral("0.1")},
                                                   {QStringLiteral("2"), QString()}};
        for (int i = 0; i < 997; ++i)
            rows.append({QStringLiteral("x"), QStringLiteral("0.1")});
        fill(rs, rows);
        const ReportDocument doc = layOutReport(bands(0, 0, 10, 0, 300), rs);
        // A Null is not counted, an empty text is.
        QCOMPARE(textsNamed(doc, QStringLiteral("count")), QStringList{QStringLiteral("1000")});
        // 1234.56 + 10.00 + 998 x 0.10, with no drift from adding tenths.
        QCOMPARE(textsNamed(doc, QStringLiteral("sum")), QStringList{QStringLiteral("1.344,36 Esc")});
    }

    void anEmptySetStillPrintsItsTotals()
    {
        Recordset rs;
        fill(rs, {});
        const ReportDocument doc = layOutReport(bands(1000, 500, 300, 500, 2000), rs);
        QCOMPARE(doc.pageCount(), 1);
        QCOMPARE(textsNamed(doc, QStringLiteral("count")), QStringList{QStringLiteral("0")});
        QCOMPARE(textsNamed(doc, QStringLiteral("sum")), QStringList{QStringLiteral("0,00 Esc")});
        QCOMPARE(textsNamed(doc, QStringLiteral("pf")), QStringList{QStringLiteral("Página: 1 / 1")});
    }

    void aMissingColumnIsAClearError()
    {
        Recordset rs;
        fillNumbered(rs, 1);
        auto layout = bands(0, 0, 300, 0, 0);
        layout->detail.items.push_back(field(QStringLiteral("x"), QStringLiteral("morada1"), 0, 0, 10, 10));
        try {
            layOutReport(layout, rs);
            QFAIL("no error");
        } catch (const QuotasError& e) {
            QVERIFY2(e.message().contains(QStringLiteral("morada1")), qPrintable(e.message()));
        }
    }
};

QTEST_MAIN(ReportEngineTest)
#include "tst_report_engine.moc"
