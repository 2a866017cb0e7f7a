// Moving numbers between the local text form and SQL text.

#include "generation/substituir_caracter.h"
#include "platform/errors.h"

#include <QLocale>
#include <QTest>

using namespace quotas;

class SubstituirCaracterTest : public QObject {
    Q_OBJECT
private slots:
    // A locale whose decimal separator is the comma, as the union's machines use.
    void initTestCase() { QLocale::setDefault(QLocale(QLocale::Portuguese, QLocale::Portugal)); }

    void replaces_data()
    {
        QTest::addColumn<QVariant>("value");
        QTest::addColumn<QString>("find");
        QTest::addColumn<QString>("replacement");
        QTest::addColumn<QString>("result");
        QTest::newRow("number to SQL") << QVariant(12.5) << ","
                                       << "."
                                       << "12.5";
        QTest::newRow("no grouping in numbers") << QVariant(1234567.25) << ","
                                                << "."
                                                << "1234567.25";
        QTest::newRow("whole number") << QVariant(100000) << ","
                                      << "."
                                      << "100000";
        // Regression: doubles of 100000 and above came out as "1E+05".
        QTest::newRow("large double") << QVariant(100000.0) << ","
                                      << "."
                                      << "100000";
        QTest::newRow("large double, local text") << QVariant(1234567.5) << "."
                                                  << ","
                                                  << "1234567,5";
        QTest::newRow("small double") << QVariant(0.000001) << ","
                                      << "."
                                      << "0.000001";
        QTest::newRow("text with points") << QVariant(QStringLiteral("1.234.5")) << "."
                                          << ","
                                          << "1,234,5";
        QTest::newRow("nothing to replace") << QVariant(QStringLiteral("abc")) << "."
                                            << ","
                                            << "abc";
        QTest::newRow("case matters") << QVariant(QStringLiteral("aAa")) << "A"
                                      << "x"
                                      << "axa";
        QTest::newRow("empty find") << QVariant(QStringLiteral("a.b")) << ""
                                    << ","
                                    << "";
        QTest::newRow("two-character find") << QVariant(QStringLiteral("abc")) << "ab"
                                            << "x"
                                            << "";
        QTest::newRow("empty replacement") << QVariant(QStringLiteral("a.b")) << "."
                                           << ""
                                           << "";
        QTest::newRow("two-character replacement") << QVariant(QStringLiteral("zzz")) << "."
                                                   << ",,"
                                                   << "";
    }
    void replaces()
    {
        QFETCH(QVariant, value);
        QFETCH(QString, find);
        QFETCH(QString, replacement);
        QFETCH(QString, result);
        QCOMPARE(SubstituirCaracter(value, find, replacement), result);
    }

    void nullHasNoTextForm()
    {
        QVERIFY_THROWS_EXCEPTION(QuotasError, SubstituirCaracter(QVariant(QMetaType::fromType<double>()), ",", "."));
        // The length rule comes first, as the helper checks its characters before the value.
        QCOMPARE(SubstituirCaracter(QVariant(QMetaType::fromType<double>()), "", "."), QString());
    }
};

QTEST_GUILESS_MAIN(SubstituirCaracterTest)
#include "tst_substituir_caracter.moc"
