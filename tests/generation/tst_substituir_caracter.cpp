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
        const auto row = [](const char* tag, const QVariant& value, const char* find, const char* replacement, const char* result) {
            QTest::newRow(tag) << value << find << replacement << result;
        };
        row("number to SQL", 12.5, ",", ".", "12.5");
        row("no grouping in numbers", 1234567.25, ",", ".", "1234567.25");
        row("whole number", 100000, ",", ".", "100000");
        // Regression: doubles of 100000 and above came out as "1E+05".
        row("large double", 100000.0, ",", ".", "100000");
        row("large double, local text", 1234567.5, ".", ",", "1234567,5");
        row("small double", 0.000001, ",", ".", "0.000001");
        row("text with points", QStringLiteral("1.234.5"), ".", ",", "1,234,5");
        row("nothing to replace", QStringLiteral("abc"), ".", ",", "abc");
        row("case matters", QStringLiteral("aAa"), "A", "x", "axa");
        row("empty find", QStringLiteral("a.b"), "", ",", "");
        row("two-character find", QStringLiteral("abc"), "ab", "x", "");
        row("empty replacement", QStringLiteral("a.b"), ".", "", "");
        row("two-character replacement", QStringLiteral("zzz"), ".", ",,", "");
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
