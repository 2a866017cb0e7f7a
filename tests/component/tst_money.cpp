// Rounding, reading typed amounts, and the dialogs' money format.

#include "component/money.h"

#include <QTest>

using namespace quotas;

class MoneyTest : public QObject {
    Q_OBJECT
private slots:
    void roundsHalfToEven_data()
    {
        QTest::addColumn<double>("value");
        QTest::addColumn<int>("decimals");
        QTest::addColumn<double>("rounded");
        QTest::newRow("12.5 to 12") << 12.5 << 0 << 12.0;
        QTest::newRow("37.5 to 38") << 37.5 << 0 << 38.0;
        QTest::newRow("negative tie") << -2.5 << 0 << -2.0;
        QTest::newRow("cents tie down") << 0.125 << 2 << 0.12;
        QTest::newRow("cents tie up") << 0.375 << 2 << 0.38;
        QTest::newRow("not a tie") << 0.126 << 2 << 0.13;
        QTest::newRow("large amount keeps cents") << 123456789.125 << 2 << 123456789.12;
        QTest::newRow("participation") << 0.0123456 << 5 << 0.01235;
    }
    void roundsHalfToEven()
    {
        QFETCH(double, value);
        QFETCH(int, decimals);
        QFETCH(double, rounded);
        QCOMPARE(roundHalfEven(value, decimals), rounded);
    }

    void readsTypedAmounts_data()
    {
        QTest::addColumn<QString>("text");
        QTest::addColumn<QString>("locale");
        QTest::addColumn<bool>("ok");
        QTest::addColumn<double>("value");
        QTest::newRow("comma decimal") << "1234,56"
                                       << "pt_PT" << true << 1234.56;
        QTest::newRow("grouped") << "1.234,56"
                                 << "de_DE" << true << 1234.56;
        QTest::newRow("point decimal") << "99999999.99"
                                       << "C" << true << 99999999.99;
        QTest::newRow("sign and spaces") << " -3 "
                                         << "C" << true << -3.0;
        QTest::newRow("wrong separator is refused") << "12,50"
                                                    << "C" << false << 0.0;
        QTest::newRow("letters") << "12a"
                                 << "C" << false << 0.0;
        QTest::newRow("empty") << ""
                               << "C" << false << 0.0;
        QTest::newRow("blank") << "   "
                               << "pt_PT" << false << 0.0;
    }
    void readsTypedAmounts()
    {
        QFETCH(QString, text);
        QFETCH(QString, locale);
        QFETCH(bool, ok);
        QFETCH(double, value);
        const auto parsed = parseDecimal(text, QLocale(locale));
        QCOMPARE(parsed.has_value(), ok);
        if (ok)
            QCOMPARE(*parsed, value);
    }

    void formatsMoney_data()
    {
        QTest::addColumn<double>("amount");
        QTest::addColumn<QString>("locale");
        QTest::addColumn<QString>("text");
        QTest::newRow("plain") << 6.0 << "C"
                               << "€ 6.00";
        QTest::newRow("grouping") << 1234567.891 << "C"
                                  << "€ 1,234,567.89";
        QTest::newRow("negative in parentheses") << -2.5 << "C"
                                                 << "(€ 2.50)";
        QTest::newRow("user's separators") << 1234.5 << "de_DE"
                                           << "€ 1.234,50";
        QTest::newRow("tiny negative is zero") << -0.004 << "C"
                                               << "€ 0.00";
    }
    void formatsMoney()
    {
        QFETCH(double, amount);
        QFETCH(QString, locale);
        QFETCH(QString, text);
        QCOMPARE(formatMoney(amount, QLocale(locale)), text);
    }
};

QTEST_GUILESS_MAIN(MoneyTest)
#include "tst_money.moc"
