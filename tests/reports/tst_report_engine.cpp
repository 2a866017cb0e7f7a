// The report engine without a database: the fixed formats, where the bands
// fall on the pages, the page codes and the functions.

#include "platform/errors.h"
#include "platform/recordset.h"
#include "reports/report_engine.h"
#include "reports/report_format.h"
#include "report_reading.h"

using namespace quotas;
using namespace quotas::test;

namespace {

// Rows of (no_tap, valor); a null QString stands for Null.
Recordset& fill(Recordset& rs, const QList<std::pair<QString, QString>>& rows)
{
    rs.openInMemory({QStringLiteral("no_tap"), QStringLiteral("valor")});
    for (const auto& [noTap, valor] : rows) {
        rs.addNew();
        rs.setValue(0, noTap.isNull() ? QVariant() : QVariant(noTap));
        rs.setValue(1, valor.isNull() ? QVariant() : QVariant(valor));
        rs.update();
    }
    return rs;
}

Recordset& numbered(Recordset& rs, int count)
{
    QList<std::pair<QString, QString>> rows;
    for (int i = 1; i <= count; ++i)
        rows.append({QString::number(i), QStringLiteral("1")});
    return fill(rs, rows);
}

// A layout whose bands carry one recognisable item each.
std::shared_ptr<ReportLayout> bands(int reportHeader, int pageHeader, int detail, int pageFooter, int reportFooter)
{
    auto r = std::make_shared<ReportLayout>();
    r->name = QStringLiteral("prtTeste");
    r->reportHeader = reportBand(QStringLiteral("RH"), reportHeader, {label(QStringLiteral("rh"), QStringLiteral("Título"), 0, 0, 1000, 200)});
    r->pageHeader = reportBand(QStringLiteral("PH"), pageHeader, {label(QStringLiteral("ph"), QStringLiteral("Cabeçalho"), 0, 0, 1000, 200)});
    r->detail = reportBand(QStringLiteral("D"), detail, {field(QStringLiteral("d"), QStringLiteral("no_tap"), 0, 0, 1000, 200)});
    r->pageFooter = reportBand(QStringLiteral("PF"), pageFooter,
                               {label(QStringLiteral("pf"), QStringLiteral("Página: %p / %P"), 0, 0, 3000, 200)});
    r->reportFooter = reportBand(QStringLiteral("RF"), reportFooter,
                                 {countOf(QStringLiteral("count"), QStringLiteral("no_tap"), 0, 0, 1000, 200),
                                  sumOf(QStringLiteral("sum"), QStringLiteral("valor"), QStringLiteral("#,##0.00 Esc"), 0, 0, 1000, 200)});
    return r;
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

    void writesTheLongPortugueseDate()
    {
        QCOMPARE(longPortugueseDate(QDate(2026, 12, 6)), QStringLiteral("6 de dezembro de 2026"));
        QCOMPARE(longPortugueseDate(QDate(2027, 3, 1)), QStringLiteral("1 de março de 2027"));
    }

    void paginates_data()
    {
        QTest::addColumn<int>("rows");
        QTest::addColumn<int>("detail");
        QTest::addColumn<int>("reportFooter");
        QTest::addColumn<bool>("pageBreakAfter");
        QTest::addColumn<QList<int>>("perPage");
        // Four details fill a page exactly: the fourth ends on the footer's edge and stays.
        QTest::newRow("exact fit") << 8 << kUsable / 4 << 0 << false << QList<int>{4, 4};
        QTest::newRow("one too many") << 9 << kUsable / 4 << 0 << false << QList<int>{4, 4, 1};
        QTest::newRow("footer that no longer fits") << 8 << kUsable / 4 << 1 << false << QList<int>{4, 4, 0};
        QTest::newRow("a hair too tall") << 4 << kUsable / 4 + 1 << 0 << false << QList<int>{3, 1};
        QTest::newRow("no rows") << 0 << 500 << 100 << false << QList<int>{0};
        // Taller than a page: printed alone on each page rather than lost.
        QTest::newRow("taller than a page") << 2 << kUsable + 500 << 0 << false << QList<int>{1, 1};
        QTest::newRow("break after each") << 3 << 1000 << 0 << true << QList<int>{1, 1, 1};
        QTest::newRow("break, then the report footer") << 3 << 1000 << 300 << true << QList<int>{1, 1, 1, 0};
    }
    void paginates()
    {
        QFETCH(int, rows);
        QFETCH(int, detail);
        QFETCH(int, reportFooter);
        QFETCH(bool, pageBreakAfter);
        QFETCH(QList<int>, perPage);
        Recordset rs;
        auto layout = bands(0, 0, detail, 0, reportFooter);
        layout->detail.pageBreakAfter = pageBreakAfter;
        const ReportDocument doc = layOutReport(layout, numbered(rs, rows));
        QCOMPARE(countsPerPage(doc, QStringLiteral("d")), perPage);
        QStringList order;
        for (int i = 1; i <= rows; ++i)
            order << QString::number(i);
        QCOMPARE(textsNamed(doc, QStringLiteral("d")), order);
        QCOMPARE(countsPerPage(doc, QStringLiteral("count")).last(), reportFooter ? 1 : 0);
    }

    void placesHeadersAndFootersAndFillsPageCodes()
    {
        Recordset rs;
        const ReportDocument doc = layOutReport(bands(1000, 500, 1000, 500, 2000), numbered(rs, 30));
        // Page 1: 567 + 1000 + 500 = 2067 up to 15771 holds 13 details; then 14, then 3 and the report footer.
        QCOMPARE(countsPerPage(doc, QStringLiteral("d")), (QList<int>{13, 14, 3}));
        QCOMPARE(textsNamed(doc, QStringLiteral("pf")), (QStringList{"Página: 1 / 3", "Página: 2 / 3", "Página: 3 / 3"}));
        QCOMPARE(tops(doc, QStringLiteral("rh")), QList<int>{567});
        QCOMPARE(tops(doc, QStringLiteral("ph")), (QList<int>{1567, 567, 567}));
        QCOMPARE(tops(doc, QStringLiteral("d")).first(), 2067);
        QCOMPARE(tops(doc, QStringLiteral("pf")), QList<int>(3, PaperSetup::kHeight - 567 - 500));
        // The report footer follows the last detail.
        QCOMPARE(tops(doc, QStringLiteral("count")), QList<int>{567 + 500 + 3 * 1000});
        QCOMPARE(placed(doc, QStringLiteral("rh")).front()->rect, QRect(PaperSetup::leftMargin(*doc.layout), 567, 1000, 200));
    }

    void countsValuesAndSumsEveryRowInCents()
    {
        QList<std::pair<QString, QString>> rows = {
            {QStringLiteral("1"), QStringLiteral("1234.56")}, {QString(), QStringLiteral("10.00")},
            {QStringLiteral(""), QStringLiteral("0.1")}, {QStringLiteral("2"), QString()}};
        for (int i = 0; i < 997; ++i)
            rows.append({QStringLiteral("x"), QStringLiteral("0.1")});
        Recordset rs;
        const ReportDocument doc = layOutReport(bands(0, 0, 10, 0, 300), fill(rs, rows));
        // A Null is not counted, an empty text is; 1234.56 + 10.00 + 998 x 0.10, with no drift from adding tenths.
        QCOMPARE(textsNamed(doc, QStringLiteral("count")) + textsNamed(doc, QStringLiteral("sum")),
                 (QStringList{"1000", "1.344,36 Esc"}));
        // An empty set still prints its totals and its one page.
        Recordset none;
        const ReportDocument empty = layOutReport(bands(1000, 500, 300, 500, 2000), fill(none, {}));
        QCOMPARE(textsNamed(empty, QStringLiteral("count")) + textsNamed(empty, QStringLiteral("sum")) + textsNamed(empty, QStringLiteral("pf")),
                 (QStringList{"0", "0,00 Esc", "Página: 1 / 1"}));
    }

    void aMissingColumnIsAClearError()
    {
        Recordset rs;
        auto layout = bands(0, 0, 300, 0, 0);
        layout->detail.items.push_back(field(QStringLiteral("x"), QStringLiteral("morada1"), 0, 0, 10, 10));
        try {
            layOutReport(layout, numbered(rs, 1));
            QFAIL("no error");
        } catch (const QuotasError& e) {
            QVERIFY2(e.message().contains(QStringLiteral("morada1")), qPrintable(e.message()));
        }
    }
};

QTEST_MAIN(ReportEngineTest)
#include "tst_report_engine.moc"
