// The CSV import source: encodings, delimiters, quoting, malformed files,
// and the result set that build() hands to the run.

#include "import/csv_import_source.h"
#include "import/csv_reader.h"
#include "import/import_recordset.h"
#include "import/text_encoding.h"
#include "platform/errors.h"
#include "platform/late_binding.h"

#include <QTemporaryDir>
#include <QTest>

using namespace quotas;

class CsvReaderTest : public QObject {
    Q_OBJECT

    QTemporaryDir dir;

    QString write(const QByteArray& bytes, const QString& name = QStringLiteral("lista.csv"))
    {
        QFile file(dir.filePath(name));
        file.open(QIODevice::WriteOnly | QIODevice::Truncate);
        file.write(bytes);
        return file.fileName();
    }
    static QString failure(const std::function<void()>& f)
    {
        try {
            f();
        } catch (const QuotasError& e) {
            return e.message();
        }
        return QStringLiteral("accepted");
    }

private slots:
    void decodesTheEncodingsOfTheOffice_data()
    {
        QTest::addColumn<QByteArray>("bytes");
        QTest::newRow("UTF-8") << QByteArray("Jo\xC3\xA3o \xE2\x82\xAC \xE2\x80\x9C");
        QTest::newRow("UTF-8 with BOM") << QByteArray("\xEF\xBB\xBFJo\xC3\xA3o \xE2\x82\xAC \xE2\x80\x9C");
        QTest::newRow("Windows-1252") << QByteArray("Jo\xE3o \x80 \x93");
        QTest::newRow("UTF-16LE with BOM") << QByteArray("\xFF\xFEJ\0o\0\xE3\0o\0 \0\xAC\x20 \0\x1C\x20", 18);
    }
    void decodesTheEncodingsOfTheOffice()
    {
        QFETCH(QByteArray, bytes);
        QCOMPARE(decodeImportText(bytes), QStringLiteral("João € “"));
    }

    void readsDelimitersAndQuotes_data()
    {
        QTest::addColumn<QString>("text");
        QTest::addColumn<QList<QStringList>>("records");  // the header first
        QTest::newRow("semicolon, CRLF, case kept") << QStringLiteral("no_tap;Quota\r\n1;2,5\r\n")
                                                    << QList<QStringList>{{"no_tap", "Quota"}, {"1", "2,5"}};
        QTest::newRow("comma, quoted delimiter, quotes and break")
            << QStringLiteral("no_tap,quota,nome\n7,\"12,50\",\"Silva, \"\"Zé\"\"\nda Ponte\"\n")
            << QList<QStringList>{{"no_tap", "quota", "nome"}, {"7", "12,50", "Silva, \"Zé\"\nda Ponte"}};
        QTest::newRow("tab, empty value kept") << QStringLiteral("a\tb\tc\n1\t\t3\n")
                                               << QList<QStringList>{{"a", "b", "c"}, {"1", "", "3"}};
        QTest::newRow("semicolon wins a tie, comma inside quotes") << QStringLiteral("\"x,y\";b,c\n1;2,3\n")
                                                                   << QList<QStringList>{{"x,y", "b,c"}, {"1", "2,3"}};
        QTest::newRow("spaces, short line, blank lines, trailing delimiter, no final break")
            << QStringLiteral(" a ; b ;c\n\n 1 ;\" 2 \"\n\n3;4;5;") << QList<QStringList>{{"a", "b", "c"}, {"1", " 2 "}, {"3", "4", "5"}};
        QTest::newRow("nothing") << QString() << QList<QStringList>{};
    }
    void readsDelimitersAndQuotes()
    {
        QFETCH(QString, text);
        QFETCH(QList<QStringList>, records);
        const CsvTable table = parseCsv(text, QStringLiteral("f.csv"));
        QCOMPARE(QList<QStringList>{table.header} + table.rows, records.isEmpty() ? QList<QStringList>{{}} : records);
    }

    void refusesMalformedText_data()
    {
        QTest::addColumn<QString>("text");
        QTest::addColumn<QString>("reason");
        QTest::newRow("quote inside a value") << QStringLiteral("a;b\n1;2\n3;x\"y\n") << QStringLiteral("há aspas fora do lugar na linha 3.");
        QTest::newRow("text after a closing quote") << QStringLiteral("a;b\n\"1\"x;2\n") << QStringLiteral("há aspas fora do lugar na linha 2.");
        QTest::newRow("quote left open") << QStringLiteral("a;b\n1;2\n3;\"4\n5;6\n")
                                         << QStringLiteral("um valor entre aspas começado na linha 3 não foi fechado.");
        QTest::newRow("more values than names") << QStringLiteral("a;b\n1;2\n1;2;3\n")
                                                << QStringLiteral("a linha 3 tem 3 valores, mais do que os 2 nomes de colunas da primeira linha.");
    }
    void refusesMalformedText()
    {
        QFETCH(QString, text);
        QFETCH(QString, reason);
        QCOMPARE(failure([&] { parseCsv(text, QStringLiteral("f.csv")); }),
                 QStringLiteral("O ficheiro \"f.csv\" não é um ficheiro CSV válido: ") + reason);
    }

    void refusesWhatCannotBeRead()
    {
        const QString missing = dir.filePath(QStringLiteral("nada.csv"));
        QCOMPARE(failure([&] { readCsvFile(missing); }), QStringLiteral("O ficheiro \"%1\" não existe.").arg(missing));
        QCOMPARE(failure([&] { readCsvFile(dir.path()); }), QStringLiteral("\"%1\" é uma pasta e não um ficheiro.").arg(dir.path()));
        const QString zip = write(QByteArray("PK\x03\x04\0\0", 6), QStringLiteral("lista.xlsx"));
        QCOMPARE(failure([&] { readCsvFile(zip); }), QStringLiteral("O ficheiro \"%1\" não é um ficheiro de texto CSV.").arg(zip));
    }

    void buildReturnsTheLinesOnTheFirst()
    {
        const QString path = write("\xEF\xBB\xBFno_tap;quota;nome\n100;8.00;Jo\xC3\xA3o\n300\n");
        CsvImportSource source(CsvImportSource::fixedFile(path));
        // Late bound, as the run calls it.
        auto* set = qobject_cast<ImportRecordset*>(callByName(&source, "build").value<QObject*>());
        QVERIFY(set);
        QCOMPARE(set->parent(), &source);
        Recordset& rows = set->rows();
        QCOMPARE(rows.recordCount(), 2);
        QCOMPARE(rows.fieldName(0), QStringLiteral("no_tap"));  // no BOM left on the first name
        QCOMPARE(rows.value(2).toString(), QStringLiteral("João"));
        rows.moveNext();
        QVERIFY(rows.isNull(QStringLiteral("quota")));  // missing at the end of a short line
    }

    void cancellingTheChoiceBuildsNothing()
    {
        CsvImportSource source([] { return QString(); });
        QCOMPARE(source.build(), nullptr);
    }
};

QTEST_GUILESS_MAIN(CsvReaderTest)
#include "tst_csv_reader.moc"
