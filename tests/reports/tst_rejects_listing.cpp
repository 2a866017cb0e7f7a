// The listing of the import lines that matched no member (prtExtra), read
// from the pages of its preview on both engines.

#include "component/shared_objects.h"
#include "import/rejects_listing.h"
#include "reports/report.h"
#include "preview_closer.h"
#include "report_reading.h"
#include "support/test_database.h"

#include <QTest>

using namespace quotas;
using namespace quotas::test;

namespace {

QVariant null()
{
    return QVariant(QMetaType::fromType<QString>());
}

}  // namespace

class RejectsListingTest : public QObject {
    Q_OBJECT

    std::unique_ptr<TestDatabase> db;
    std::vector<ReportDocument> shown;

    void reject(const QVariantList& fields)
    {
        QStringList columns;
        QStringList marks;
        for (int i = 0; i < fields.size(); ++i) {
            columns << QStringLiteral("Field%1").arg(i);
            marks << QStringLiteral("?");
        }
        db->connection().execute(
            QStringLiteral("INSERT INTO extras (%1) VALUES (%2)").arg(columns.join(u','), marks.join(u',')), fields);
    }

    const ReportDocument& show()
    {
        shown.clear();
        PreviewCloser closer;
        showRejectsListing();
        if (shown.size() != 1 || closer.titles != QStringList{QStringLiteral("Listagem de Dados não Importados para a Base de Dados")})
            qFatal("expected one preview of the rejects listing");
        return shown.front();
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
    }

    void showsItsTextsInTheirFontsAndPlaces_data()
    {
        QTest::addColumn<QString>("name");
        QTest::addColumn<QString>("text");
        QTest::addColumn<QRect>("rect");  // on page 1, from the report's left edge
        QTest::addColumn<QString>("family");
        QTest::addColumn<double>("size");
        QTest::addColumn<bool>("bold");
        QTest::addColumn<bool>("italic");
        const int rh = 567;
        const int ph = rh + 330;
        const int detail = ph + 428;
        const int rf = detail + 337;
        const int pf = 16838 - 567 - 435;
        const QString arial = QStringLiteral("Arial");
        QTest::newRow("title") << "Label8" << "Listagem de Dados não Importados para a Base de Dados"
                               << QRect(75, rh + 30, 10470, 255) << QStringLiteral("Times New Roman") << 12.0 << true << false;
        QTest::newRow("Campo 1") << "Label1" << "Campo 1" << QRect(75, ph + 75, 1005, 240) << arial << 8.25 << true << false;
        QTest::newRow("Field0") << "Text2" << "100234" << QRect(60, detail + 45, 1020, 270) << arial << 8.25 << false << false;
        QTest::newRow("Página:") << "Label18" << "Página:" << QRect(8490, pf + 105, 570, 255) << arial << 8.25 << false << true;
        QTest::newRow("total") << "Function1" << "1" << QRect(9765, rf + 75, 705, 225) << arial << 8.25 << false << false;
    }
    void showsItsTextsInTheirFontsAndPlaces()
    {
        QFETCH(QString, name);
        QFETCH(QString, text);
        QFETCH(QRect, rect);
        QFETCH(QString, family);
        QFETCH(double, size);
        QFETCH(bool, bold);
        QFETCH(bool, italic);
        reject({QStringLiteral("100234"), QStringLiteral("b"), QStringLiteral("c"), QStringLiteral("d")});
        const ReportDocument& doc = show();
        const PlacedItem& item = onlyItem(doc.pages[0], name);
        QCOMPARE(item.text, text);
        QCOMPARE(item.rect, rect.translated(PaperSetup::leftMargin(*doc.layout), 0));
        QCOMPARE(item.item->font.family, family);
        QCOMPARE(item.item->font.pointSize, size);
        QCOMPARE(item.item->font.bold, bold);
        QCOMPARE(item.item->font.italic, italic);
    }

    void listsEveryLineInTheDatabasesOrderAndCountsTheFirstColumn()
    {
        reject({QStringLiteral("300"), QStringLiteral("Rui"), QStringLiteral("12,50")});
        reject({QStringLiteral("100"), QStringLiteral("Ana"), QStringLiteral("3,10")});
        reject({QStringLiteral("200"), QStringLiteral("Eva"), QStringLiteral("7,00")});
        const ReportDocument& doc = show();
        QCOMPARE(textsNamed(doc, QStringLiteral("Text2")), (QStringList{"300", "100", "200"}));
        QCOMPARE(textsNamed(doc, QStringLiteral("Text1")), (QStringList{"Rui", "Ana", "Eva"}));
        QCOMPARE(textsNamed(doc, QStringLiteral("Function1")), QStringList{"3"});
    }

    void countsAnEmptyFirstColumnButNotANullOne()
    {
        reject({null(), QStringLiteral("sem número")});
        reject({QStringLiteral(""), QStringLiteral("vazio")});
        reject({QStringLiteral("100"), QStringLiteral("Ana")});
        const ReportDocument& doc = show();
        QCOMPARE(textsNamed(doc, QStringLiteral("Text2")), (QStringList{"", "", "100"}));
        QCOMPARE(textsNamed(doc, QStringLiteral("Text1")), (QStringList{"sem número", "vazio", "Ana"}));
        QCOMPARE(textsNamed(doc, QStringLiteral("Function1")), QStringList{"2"});
    }

    void printsTheFirstFourColumnsOnly()
    {
        reject({QStringLiteral("100"), QStringLiteral("Ana")});
        reject({QStringLiteral("200"), QStringLiteral("Eva"), QStringLiteral("c"), QStringLiteral("d"),
                QStringLiteral("quinta coluna"), QStringLiteral("sexta coluna")});
        const ReportDocument& doc = show();
        QCOMPARE(textsNamed(doc, QStringLiteral("Text3")), (QStringList{"", "c"}));
        QCOMPARE(textsNamed(doc, QStringLiteral("Text7")), (QStringList{"", "d"}));
        const QStringList texts = pageTexts(doc.pages[0]);
        QVERIFY(!texts.contains(QStringLiteral("quinta coluna")));
        QVERIFY(!texts.contains(QStringLiteral("sexta coluna")));
    }

    void readsExtrasAfreshAtEveryShowing()
    {
        reject({QStringLiteral("100"), QStringLiteral("Ana")});
        QCOMPARE(show().rows, 1);
        QVERIFY(!Data().Extras.recordset().isOpen());
        reject({QStringLiteral("200"), QStringLiteral("Eva")});
        QCOMPARE(textsNamed(show(), QStringLiteral("Text2")), (QStringList{"100", "200"}));
        QVERIFY(!Data().Extras.recordset().isOpen());
    }
};

QTEST_MAIN(RejectsListingTest)
#include "tst_rejects_listing.moc"
