// Rounding, reading typed and stored amounts, and the dialogs' money format.

#include "component/money.h"
#include "component/stored_value.h"

#include <limits>

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
        QTest::newRow("too large to scale stays itself") << 1e308 << 2 << 1e308;
    }
    void roundsHalfToEven()
    {
        QFETCH(double, value);
        QFETCH(int, decimals);
        QFETCH(double, rounded);
        QCOMPARE(roundHalfEven(value, decimals), rounded);
    }

    void readsAmountsEitherWay_data()
    {
        QTest::addColumn<QString>("text");
        QTest::addColumn<bool>("ok");
        QTest::addColumn<double>("value");
        QTest::newRow("comma decimal") << "2800,50" << true << 2800.5;
        QTest::newRow("point decimal") << "2800.50" << true << 2800.5;
        QTest::newRow("grouped by points") << "2.800,50" << true << 2800.5;
        QTest::newRow("grouped by commas") << "1,234,567.89" << true << 1234567.89;
        QTest::newRow("grouped by spaces") << "2\u00a0800 000,5" << true << 2800000.5;
        QTest::newRow("one separator is the decimal") << "1.234" << true << 1.234;
        QTest::newRow("large keeps cents") << "99999999.99" << true << 99999999.99;
        QTest::newRow("sign and spaces") << " -3 " << true << -3.0;
        QTest::newRow("no whole part") << ",5" << true << 0.5;
        QTest::newRow("repeated decimal separator") << "1.234.567" << false << 0.0;
        QTest::newRow("group of two") << "2.80,50" << false << 0.0;
        QTest::newRow("group at the start") << ".800,50" << false << 0.0;
        QTest::newRow("separator after the decimal") << "2,800.5,0" << false << 0.0;
        QTest::newRow("letters") << "12a" << false << 0.0;
        QTest::newRow("sign alone") << "-" << false << 0.0;
        QTest::newRow("blank") << "   " << false << 0.0;
    }
    void readsAmountsEitherWay()
    {
        QFETCH(QString, text);
        QFETCH(bool, ok);
        QFETCH(double, value);
        // The desktop's language makes no difference.
        for (const char* locale : {"C", "pt_PT", "de_DE", "en_US"}) {
            QLocale::setDefault(QLocale(QString::fromLatin1(locale)));
            const auto parsed = parseDecimal(text);
            QCOMPARE(parsed.has_value(), ok);
            if (ok)
                QCOMPARE(*parsed, value);
        }
        QLocale::setDefault(QLocale::c());
    }

    // What a column gave back, as every run reads it: "n" and the number,
    // "-" for Null, else the problem the runs report.
    void readsStoredValues_data()
    {
        QTest::addColumn<QVariant>("stored");
        QTest::addColumn<QString>("read");
        const double inf = std::numeric_limits<double>::infinity();
        QTest::newRow("Null") << QVariant(QMetaType::fromType<double>()) << "-";
        QTest::newRow("number") << QVariant(12.5) << "n 12.5";
        QTest::newRow("integer") << QVariant(7) << "n 7";
        QTest::newRow("text with a comma") << QVariant("1000,50") << "n 1000.5";
        QTest::newRow("text with a point, spaces") << QVariant(" -1000.50 ") << "n -1000.5";
        QTest::newRow("grouped text is not read") << QVariant("1.000,50") << "valor ilegível (1.000,50)";
        QTest::newRow("exponent is not read") << QVariant("1e3") << "valor ilegível (1e3)";
        QTest::newRow("letters") << QVariant("abc") << "valor ilegível (abc)";
        QTest::newRow("empty text") << QVariant("") << "valor ilegível ()";
        QTest::newRow("infinity") << QVariant(inf) << "valor não finito (inf)";
        QTest::newRow("NaN as text") << QVariant("NaN") << "valor não finito (NaN)";
        QTest::newRow("largest amount") << QVariant(9999999999.99) << "n 9999999999.99";
        QTest::newRow("beyond it") << QVariant(-10000000000.0) << "valor fora dos limites de ±9.999.999.999,99 (-10000000000.00)";
        QTest::newRow("2e23 as text") << QVariant("200000000000000000000000") << "valor fora dos limites de "
                                                                                 "±9.999.999.999,99 (200000000000000000000000)";
    }
    void readsStoredValues()
    {
        QFETCH(QVariant, stored);
        QFETCH(QString, read);
        const StoredNumber n = readStoredAmount(stored);
        QCOMPARE(n.isNull() ? "-" : n.isNumber() ? "n " + QString::number(n.value, 'g', 15)
                                                 : n.problem(),
                 read);
    }

    void readsStoredDates_data()
    {
        QTest::addColumn<QVariant>("stored");
        QTest::addColumn<QString>("read");
        QTest::newRow("Null") << QVariant(QMetaType::fromType<QDate>()) << "-";
        QTest::newRow("date") << QVariant(QDate(2001, 3, 31)) << "2001-03-31";
        QTest::newRow("ISO text") << QVariant("2001-03-31") << "2001-03-31";
        QTest::newRow("ISO with a time") << QVariant("2001-03-31 00:00:00") << "2001-03-31";
        QTest::newRow("day first") << QVariant("31/03/2001") << "2001-03-31";
        QTest::newRow("number") << QVariant(20010331) << "data ilegível (20010331)";
        QTest::newRow("no such day") << QVariant("31/02/2001") << "data ilegível (31/02/2001)";
    }
    void readsStoredDates()
    {
        QFETCH(QVariant, stored);
        QFETCH(QString, read);
        const StoredDate d = readStoredDate(stored);
        QCOMPARE(d.isNull() ? "-" : d.ok ? d.date.toString(Qt::ISODate)
                                         : d.problem(),
                 read);
    }

    void formatsMoney_data()
    {
        QTest::addColumn<double>("amount");
        QTest::addColumn<QString>("locale");
        QTest::addColumn<QString>("text");
        const auto row = [](const char* tag, double amount, const char* locale, const char* text) { QTest::newRow(tag) << amount << locale << text; };
        row("plain", 6.0, "C", "€ 6.00");
        row("grouping", 1234567.891, "C", "€ 1,234,567.89");
        row("negative in parentheses", -2.5, "C", "(€ 2.50)");
        row("user's separators", 1234.5, "de_DE", "€ 1.234,50");
        row("tiny negative is zero", -0.004, "C", "€ 0.00");
        row("beyond 64 bits of cents", -1e20, "C", "(€ 100,000,000,000,000,000,000.00)");
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
