// The record window's texts: dates, plain numbers and the participation.

#include "record/record_text.h"

#include <QTest>

using namespace quotas;

class RecordTextTest : public QObject {
    Q_OBJECT
private slots:
    void plainNumbers_data()
    {
        QTest::addColumn<double>("value");
        QTest::addColumn<QString>("locale");
        QTest::addColumn<QString>("text");
        QTest::newRow("whole") << 10.0 << "C" << "10";
        QTest::newRow("binary residue of a difference") << 10.10 - 4.05 << "C" << "6.05";
        QTest::newRow("user's decimal separator, no grouping") << 1234567.5 << "pt_PT" << "1234567,5";
        QTest::newRow("negative") << -2.5 << "pt_PT" << "-2,5";
        QTest::newRow("small share") << 0.00012 << "C" << "0.00012";
        QTest::newRow("zero") << 0.0 << "C" << "0";
    }
    void plainNumbers()
    {
        QFETCH(double, value);
        QFETCH(QString, locale);
        QFETCH(QString, text);
        QCOMPARE(plainNumber(value, QLocale(locale)), text);
    }

    void participation_data()
    {
        QTest::addColumn<double>("quota");
        QTest::addColumn<double>("remunerations");
        QTest::addColumn<QString>("text");
        QTest::newRow("1.5 %") << 12.0 << 800.0 << "0.015";
        QTest::newRow("no remunerations") << 12.0 << 0.0 << "0";
        QTest::newRow("five places") << 18.52 << 1234.56 << "0.015";
        QTest::newRow("tie to even, down") << 0.05 << 400.0 << "0.00012";
        QTest::newRow("tie to even, up") << 0.15 << 400.0 << "0.00038";
    }
    void participation()
    {
        QFETCH(double, quota);
        QFETCH(double, remunerations);
        QFETCH(QString, text);
        QCOMPARE(participationText(quota, remunerations, QLocale::c()), text);
    }

    void dates_data()
    {
        QTest::addColumn<QVariant>("date");
        QTest::addColumn<QString>("text");
        QTest::newRow("january") << QVariant(QDate(2003, 1, 15)) << "15-jan-2003";
        QTest::newRow("february") << QVariant(QDate(2003, 2, 5)) << "05-fev-2003";
        QTest::newRow("may") << QVariant(QDate(1999, 5, 31)) << "31-mai-1999";
        QTest::newRow("text from the database") << QVariant(QStringLiteral("2004-12-01")) << "01-dez-2004";
        QTest::newRow("null") << QVariant(QMetaType::fromType<QDate>()) << "";
    }
    void dates()
    {
        QFETCH(QVariant, date);
        QFETCH(QString, text);
        QCOMPARE(formatDataQuota(date), text);
    }
};

QTEST_GUILESS_MAIN(RecordTextTest)
#include "tst_record_text.moc"
