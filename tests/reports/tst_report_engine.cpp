// The report engine without a database: the fixed formats, where the bands
// fall on the pages, the page codes and the functions.

#include "platform/recordset.h"
#include "reports/report_engine.h"
#include "reports/report_format.h"
#include "report_reading.h"

using namespace quotas;
using namespace quotas::test;
using namespace Qt::StringLiterals;

namespace {

// Rows of (no_tap, valor); a null QString stands for Null.
ReportDocument layOut(const std::shared_ptr<ReportLayout>& layout, const QList<std::pair<QString, QString>>& rows)
{
    Recordset rs;
    rs.openInMemory({u"no_tap"_s, u"valor"_s});
    for (const auto& [noTap, valor] : rows) {
        rs.addNew();
        rs.setValue(0, noTap.isNull() ? QVariant() : QVariant(noTap));
        rs.setValue(1, valor.isNull() ? QVariant() : QVariant(valor));
        rs.update();
    }
    return layOutReport(layout, rs);
}

QList<std::pair<QString, QString>> numbered(int count)
{
    QList<std::pair<QString, QString>> rows;
    for (int i = 1; i <= count; ++i)
        rows.append({QString::number(i), u"1"_s});
    return rows;
}

// A layout whose bands carry one recognisable item each.
std::shared_ptr<ReportLayout> bands(int reportHeader, int pageHeader, int detail, int pageFooter, int reportFooter)
{
    auto r = std::make_shared<ReportLayout>();
    r->reportHeader = reportBand(u"RH"_s, reportHeader, {label(u"rh"_s, u"Título"_s, 0, 0, 1000, 200)});
    r->pageHeader = reportBand(u"PH"_s, pageHeader, {label(u"ph"_s, u"Cabeçalho"_s, 0, 0, 1000, 200)});
    r->detail = reportBand(u"D"_s, detail, {field(u"d"_s, u"no_tap"_s, 0, 0, 1000, 200)});
    r->pageFooter = reportBand(u"PF"_s, pageFooter, {label(u"pf"_s, u"Página: %p / %P"_s, 0, 0, 3000, 200)});
    r->reportFooter = reportBand(u"RF"_s, reportFooter, {countOf(u"count"_s, u"no_tap"_s, 0, 0, 1000, 200),
                                                         sumOf(u"sum"_s, u"valor"_s, u"#,##0.00 Esc"_s, 0, 0, 1000, 200)});
    return r;
}

QList<int> tops(const ReportDocument& doc, const QString& name)
{
    QList<int> found;
    for (const PlacedItem* item : placed(doc, name))
        found << item->rect.top();
    return found;
}

constexpr int kUsable = PaperSetup::kHeight - PaperSetup::kTopMargin - PaperSetup::kBottomMargin;

}  // namespace

class ReportEngineTest : public QObject {
    Q_OBJECT

private slots:
    void formatsValues()
    {
        // "#,##0.00 Esc" is the layouts' one format: grouping, two decimals, halves to even, no "-0,00".
        const QVariantList values = {1234.5, 1234567.891, 0.0, 0.125, -1234.5, -0.001, u"12.5"_s, u"abc"_s, QVariant(QMetaType::fromType<double>())};
        QStringList formatted;
        for (const QVariant& value : values)
            formatted << formatReportValue(value, u"#,##0.00 Esc"_s);
        QCOMPARE(formatted, (QStringList{"1.234,50 Esc", "1.234.567,89 Esc", "0,00 Esc", "0,12 Esc", "-1.234,50 Esc", "0,00 Esc", "12,50 Esc", "abc", ""}));
        QCOMPARE(formatReportValue(u"100234"_s, QString()), u"100234"_s);  // digits without a format stay as they are
    }

    void writesTheLongPortugueseDate()
    {
        QCOMPARE(longPortugueseDate(QDate(2026, 12, 6)) + u", "_s + longPortugueseDate(QDate(2027, 3, 1)),
                 u"6 de dezembro de 2026, 1 de março de 2027"_s);
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
        auto layout = bands(0, 0, detail, 0, reportFooter);
        layout->detail.pageBreakAfter = pageBreakAfter;
        const ReportDocument doc = layOut(layout, numbered(rows));
        QCOMPARE(countsPerPage(doc, u"d"_s), perPage);
        QStringList order;
        for (int i = 1; i <= rows; ++i)
            order << QString::number(i);
        QCOMPARE(texts(doc, {u"d"_s}), order);
        QCOMPARE(countsPerPage(doc, u"count"_s).last(), reportFooter ? 1 : 0);
    }

    void placesHeadersAndFootersAndFillsPageCodes()
    {
        const ReportDocument doc = layOut(bands(1000, 500, 1000, 500, 2000), numbered(30));
        // Page 1: 567 + 1000 + 500 = 2067 up to 15771 holds 13 details; then 14, then 3 and the report footer.
        QCOMPARE(countsPerPage(doc, u"d"_s), (QList<int>{13, 14, 3}));
        QCOMPARE(texts(doc, {u"pf"_s}), (QStringList{"Página: 1 / 3", "Página: 2 / 3", "Página: 3 / 3"}));
        QCOMPARE(tops(doc, u"rh"_s) + tops(doc, u"ph"_s) + tops(doc, u"d"_s).mid(0, 1), (QList<int>{567, 1567, 567, 567, 2067}));
        QCOMPARE(tops(doc, u"pf"_s), QList<int>(3, PaperSetup::kHeight - 567 - 500));
        QCOMPARE(tops(doc, u"count"_s), QList<int>{567 + 500 + 3 * 1000});  // the report footer follows the last detail
        QCOMPARE(placed(doc, u"rh"_s).front()->rect.left(), PaperSetup::leftMargin(*doc.layout));
    }

    void countsValuesAndSumsEveryRowInCents()
    {
        QList<std::pair<QString, QString>> rows = {{u"1"_s, u"1234.56"_s}, {QString(), u"10.00"_s}, {u""_s, u"0.1"_s}, {u"2"_s, QString()}};
        for (int i = 0; i < 997; ++i)
            rows.append({u"x"_s, u"0.1"_s});
        const ReportDocument doc = layOut(bands(0, 0, 10, 0, 300), rows);
        // A Null is not counted, an empty text is; 1234.56 + 10.00 + 998 x 0.10, with no drift from adding tenths.
        QCOMPARE(texts(doc, {u"count"_s}) + texts(doc, {u"sum"_s}), (QStringList{"1000", "1.344,36 Esc"}));
        // An empty set still prints its totals and its one page.
        const ReportDocument empty = layOut(bands(1000, 500, 300, 500, 2000), {});
        QCOMPARE(texts(empty, {u"count"_s}) + texts(empty, {u"sum"_s}) + texts(empty, {u"pf"_s}),
                 (QStringList{"0", "0,00 Esc", "Página: 1 / 1"}));
    }
};

QTEST_MAIN(ReportEngineTest)
#include "tst_report_engine.moc"
