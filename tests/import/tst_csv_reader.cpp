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
        const QString path = dir.filePath(name);
        QFile file(path);
        file.open(QIODevice::WriteOnly | QIODevice::Truncate);
        file.write(bytes);
        return path;
    }

private slots:
    void decodesTheEncodingsOfferedByTheOffice_data()
    {
        QTest::addColumn<QByteArray>("bytes");
        QTest::newRow("UTF-8") << QByteArray("Jo\xC3\xA3o \xE2\x82\xAC");
        QTest::newRow("UTF-8 with BOM") << QByteArray("\xEF\xBB\xBFJo\xC3\xA3o \xE2\x82\xAC");
        QTest::newRow("Windows-1252") << QByteArray("Jo\xE3o \x80");
        QTest::newRow("UTF-16LE with BOM") << QByteArray("\xFF\xFEJ\0o\0\xE3\0o\0 \0\xAC\x20", 14);
    }
    void decodesTheEncodingsOfferedByTheOffice()
    {
        QFETCH(QByteArray, bytes);
        QCOMPARE(decodeImportText(bytes), QStringLiteral("João €"));
    }

    void windows1252HasItsOwnHighHalf()
    {
        QCOMPARE(fromWindows1252("\x93\xC7\xE9\x94 \x96 \x9C"), QStringLiteral("“Çé” – œ"));
    }

    void detectsTheDelimiterFromTheHeaderLine_data()
    {
        QTest::addColumn<QString>("header");
        QTest::addColumn<char>("delimiter");
        QTest::newRow("semicolon") << QStringLiteral("no_tap;quota;nome") << ';';
        QTest::newRow("comma") << QStringLiteral("no_tap,quota,nome") << ',';
        QTest::newRow("tab") << QStringLiteral("no_tap\tquota\tnome") << '\t';
        QTest::newRow("comma inside quotes") << QStringLiteral("\"a,b,c\";quota") << ';';
        QTest::newRow("one column") << QStringLiteral("no_tap") << ';';
        QTest::newRow("tie") << QStringLiteral("a;b,c") << ';';
    }
    void detectsTheDelimiterFromTheHeaderLine()
    {
        QFETCH(QString, header);
        QFETCH(char, delimiter);
        QCOMPARE(detectDelimiter(header), delimiter);
    }

    void readsQuotedFields_data()
    {
        QTest::addColumn<QString>("text");
        QTest::addColumn<QStringList>("header");
        QTest::addColumn<QList<QStringList>>("rows");
        QTest::newRow("plain, CRLF") << QStringLiteral("no_tap;Quota\r\n1;2\r\n") << QStringList{"no_tap", "Quota"}
                                     << QList<QStringList>{{"1", "2"}};
        QTest::newRow("delimiter, quote and line break quoted")
            << QStringLiteral("no_tap,quota,nome\n\"7\",\"12,50\",\"Silva, \"\"Zé\"\"\nda Ponte\"\n")
            << QStringList{"no_tap", "quota", "nome"} << QList<QStringList>{{"7", "12,50", "Silva, \"Zé\"\nda Ponte"}};
        QTest::newRow("tab keeps empty values") << QStringLiteral("a\tb\tc\n1\t\t3\n") << QStringList{"a", "b", "c"}
                                                << QList<QStringList>{{"1", "", "3"}};
        QTest::newRow("spaces around unquoted values") << QStringLiteral(" a ; b \n 1 ;\" 2 \"\n")
                                                       << QStringList{"a", "b"} << QList<QStringList>{{"1", " 2 "}};
        QTest::newRow("short line, blank lines, no final break")
            << QStringLiteral("a;b;c\n\n1;2\n\n3;4;5") << QStringList{"a", "b", "c"}
            << QList<QStringList>{{"1", "2"}, {"3", "4", "5"}};
        QTest::newRow("trailing delimiter") << QStringLiteral("a;b\n1;2;\n") << QStringList{"a", "b"}
                                            << QList<QStringList>{{"1", "2"}};
        QTest::newRow("header only") << QStringLiteral("no_tap;quota\n") << QStringList{"no_tap", "quota"}
                                     << QList<QStringList>{};
        QTest::newRow("nothing") << QString() << QStringList{} << QList<QStringList>{};
    }
    void readsQuotedFields()
    {
        QFETCH(QString, text);
        QFETCH(QStringList, header);
        QFETCH(QList<QStringList>, rows);
        const CsvTable table = parseCsv(text, QStringLiteral("f.csv"));
        QCOMPARE(table.header, header);
        QCOMPARE(table.rows, rows);
    }

    void refusesMalformedFiles_data()
    {
        QTest::addColumn<QString>("text");
        QTest::addColumn<QString>("message");
        QTest::newRow("quote inside a value") << QStringLiteral("a;b\n1;2\n3;x\"y\n")
                                              << QStringLiteral("O ficheiro \"f.csv\" não é um ficheiro CSV válido: há "
                                                                "aspas fora do lugar na linha 3.");
        QTest::newRow("text after a closing quote") << QStringLiteral("a;b\n\"1\"x;2\n")
                                                    << QStringLiteral("O ficheiro \"f.csv\" não é um ficheiro CSV válido: "
                                                                      "há aspas fora do lugar na linha 2.");
        QTest::newRow("quote left open") << QStringLiteral("a;b\n1;2\n3;\"4\n5;6\n")
                                         << QStringLiteral("O ficheiro \"f.csv\" não é um ficheiro CSV válido: um valor "
                                                           "entre aspas começado na linha 3 não foi fechado.");
        QTest::newRow("more values than names") << QStringLiteral("a;b\n1;2\n1;2;3\n")
                                                << QStringLiteral("O ficheiro \"f.csv\" não é um ficheiro CSV válido: a "
                                                                  "linha 3 tem 3 valores, mais do que os 2 nomes de "
                                                                  "colunas da primeira linha.");
    }
    void refusesMalformedFiles()
    {
        QFETCH(QString, text);
        QFETCH(QString, message);
        try {
            parseCsv(text, QStringLiteral("f.csv"));
            QFAIL("accepted");
        } catch (const QuotasError& e) {
            QCOMPARE(e.message(), message);
        }
    }

    void refusesWhatCannotBeRead_data()
    {
        QTest::addColumn<QString>("path");
        QTest::addColumn<QString>("message");
        QTest::newRow("missing") << dir.filePath(QStringLiteral("nada.csv"))
                                 << QStringLiteral("O ficheiro \"%1\" não existe.").arg(dir.filePath(QStringLiteral("nada.csv")));
        QTest::newRow("folder") << dir.path() << QStringLiteral("\"%1\" é uma pasta e não um ficheiro.").arg(dir.path());
        const QString binary = write(QByteArray("PK\x03\x04\0\0\0", 7), QStringLiteral("lista.xlsx"));
        QTest::newRow("not text") << binary << QStringLiteral("O ficheiro \"%1\" não é um ficheiro de texto CSV.").arg(binary);
    }
    void refusesWhatCannotBeRead()
    {
        QFETCH(QString, path);
        QFETCH(QString, message);
        try {
            readCsvFile(path);
            QFAIL("accepted");
        } catch (const QuotasError& e) {
            QCOMPARE(e.message(), message);
        }
    }

    void buildReturnsTheLinesPositionedOnTheFirst()
    {
        const QString path = write("\xEF\xBB\xBFno_tap;quota;nome\n100;8.00;Jo\xC3\xA3o\n200;9;\n300\n");
        CsvImportSource source(CsvImportSource::fixedFile(path));
        // Late bound, as the run calls it.
        auto* set = qobject_cast<ImportRecordset*>(callByName(&source, "build").value<QObject*>());
        QVERIFY(set);
        QCOMPARE(set->parent(), &source);
        Recordset& rows = set->rows();
        QCOMPARE(rows.recordCount(), 3);
        QCOMPARE(rows.fieldName(0), QStringLiteral("no_tap"));  // no BOM left in the first name
        QCOMPARE(rows.value(2).toString(), QStringLiteral("João"));
        rows.moveNext();
        QVERIFY(!rows.isNull(QStringLiteral("nome")));
        rows.moveNext();
        QCOMPARE(rows.value(0).toString(), QStringLiteral("300"));
        QVERIFY(rows.isNull(QStringLiteral("quota")));
    }

    void windows1252FileArrivesIntact()
    {
        const QString path = write("no_tap;nome\r\n1;Jo\xE3o Concei\xE7\xE3o\r\n");
        CsvImportSource source(CsvImportSource::fixedFile(path));
        auto* set = qobject_cast<ImportRecordset*>(source.build());
        QCOMPARE(set->rows().value(1).toString(), QStringLiteral("João Conceição"));
    }

    void cancellingTheChoiceBuildsNothing()
    {
        int asked = 0;
        CsvImportSource source([&] {
            ++asked;
            return QString();
        });
        QCOMPARE(source.build(), nullptr);
        QCOMPARE(asked, 1);
    }
};

QTEST_GUILESS_MAIN(CsvReaderTest)
#include "tst_csv_reader.moc"
