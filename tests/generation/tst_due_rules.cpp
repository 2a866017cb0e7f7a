// The rules of one due: the insurance end month, the choice of rate and the
// amount in whole cents.

#include "generation/due_rules.h"

#include <QTest>

using namespace quotas;

namespace {

const QVariant kNullDate = QVariant(QMetaType::fromType<QDate>());
const QVariant kNullNumber = QVariant(QMetaType::fromType<double>());

}  // namespace

class DueRulesTest : public QObject {
    Q_OBJECT

private slots:
    void insuranceCharged_data()
    {
        QTest::addColumn<QVariant>("seguro");
        QTest::addColumn<QVariant>("endDate");
        QTest::addColumn<int>("ano");
        QTest::addColumn<int>("mes");
        QTest::addColumn<bool>("charged");
        // Regression: an end in a later year but an earlier month was refused.
        QTest::newRow("ends March 2001, December 2000") << QVariant(1) << QVariant(QDate(2001, 3, 31)) << 2000 << 12 << true;
        QTest::newRow("ends December 2000, December 2000") << QVariant(1) << QVariant(QDate(2000, 12, 1)) << 2000 << 12 << true;
        QTest::newRow("ends November 2000, December 2000") << QVariant(1) << QVariant(QDate(2000, 11, 30)) << 2000 << 12 << false;
        QTest::newRow("ends December 1999, December 2000") << QVariant(1) << QVariant(QDate(1999, 12, 31)) << 2000 << 12 << false;
        QTest::newRow("ends January 1999, December 2000") << QVariant(1) << QVariant(QDate(1999, 1, 31)) << 2000 << 12 << false;
        QTest::newRow("ends January 2001, March 2000") << QVariant(1) << QVariant(QDate(2001, 1, 15)) << 2000 << 3 << true;
        QTest::newRow("no end date") << QVariant(1) << kNullDate << 2000 << 12 << true;
        QTest::newRow("not insured") << QVariant(0) << kNullDate << 2000 << 12 << false;
        QTest::newRow("insurance empty") << QVariant(QMetaType::fromType<int>()) << kNullDate << 2000 << 12 << false;
        QTest::newRow("insured as -1") << QVariant(-1) << QVariant(QDate(2000, 12, 31)) << 2000 << 12 << true;
        QTest::newRow("end date as text") << QVariant(1) << QVariant(QStringLiteral("2001-03-31")) << 2000 << 12 << true;
    }
    void insuranceCharged()
    {
        QFETCH(QVariant, seguro);
        QFETCH(QVariant, endDate);
        QFETCH(int, ano);
        QFETCH(int, mes);
        QFETCH(bool, charged);
        QCOMPARE(quotas::insuranceCharged(seguro, endDate, ano, mes), charged);
    }

    void dueRate_data()
    {
        QTest::addColumn<QVariant>("personal");
        QTest::addColumn<bool>("employerFound");
        QTest::addColumn<QVariant>("employerRate");
        QTest::addColumn<QVariant>("rate");  // Null: no rate
        QTest::newRow("personal rate") << QVariant(0.02) << true << QVariant(0.01) << QVariant(0.02);
        QTest::newRow("personal 0: employer") << QVariant(0.0) << true << QVariant(0.0125) << QVariant(0.0125);
        QTest::newRow("personal empty: employer") << kNullNumber << true << QVariant(0.01) << QVariant(0.01);
        QTest::newRow("negative personal: employer") << QVariant(-0.5) << true << QVariant(0.01) << QVariant(0.01);
        QTest::newRow("no employer: default") << kNullNumber << false << QVariant() << QVariant(0.015);
        QTest::newRow("employer rate 0 stands") << kNullNumber << true << QVariant(0.0) << QVariant(0.0);
        QTest::newRow("employer rate empty") << kNullNumber << true << kNullNumber << QVariant();
        QTest::newRow("personal wins over empty employer") << QVariant(0.03) << true << kNullNumber << QVariant(0.03);
    }
    void dueRate()
    {
        QFETCH(QVariant, personal);
        QFETCH(bool, employerFound);
        QFETCH(QVariant, employerRate);
        QFETCH(QVariant, rate);
        const std::optional<double> got = quotas::dueRate(personal, employerFound, employerRate);
        QCOMPARE(got.has_value(), rate.isValid());
        if (got)
            QCOMPARE(*got, rate.toDouble());
    }

    void dueAmount_data()
    {
        QTest::addColumn<double>("rend1");
        QTest::addColumn<double>("rend2");
        QTest::addColumn<double>("rate");
        QTest::addColumn<double>("amount");
        QTest::newRow("1000 at the default") << 1000.0 << 0.0 << kDefaultRate << 15.0;
        QTest::newRow("12.5 cents to 12") << 1.0 << 0.0 << 0.125 << 0.12;
        QTest::newRow("37.5 cents to 38") << 1.0 << 0.0 << 0.375 << 0.38;
        QTest::newRow("both remunerations") << 1200.0 << 300.0 << 0.01 << 15.0;
        QTest::newRow("4100.50 at 1%") << 4100.50 << 0.0 << 0.01 << 41.0;
        QTest::newRow("above single precision") << 16777217.0 << 0.0 << 0.01 << 167772.17;
        QTest::newRow("nothing earned") << 0.0 << 0.0 << 0.015 << 0.0;
    }
    void dueAmount()
    {
        QFETCH(double, rend1);
        QFETCH(double, rend2);
        QFETCH(double, rate);
        QFETCH(double, amount);
        QCOMPARE(quotas::dueAmount(rend1, rend2, rate), amount);
    }
};

QTEST_GUILESS_MAIN(DueRulesTest)
#include "tst_due_rules.moc"
