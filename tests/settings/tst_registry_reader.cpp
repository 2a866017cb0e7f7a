// The registry reader over a settings file: roots, key paths, the 255-byte
// buffer, trimming, and the export formats an administrator may bring.

#include "platform/errors.h"
#include "settings/password.h"
#include "settings/registry_file.h"
#include "settings/registry_reader.h"
#include "settings/settings_location.h"
#include "support/scripted_boxes.h"

#include <QElapsedTimer>
#include <QFile>
#include <QFileInfo>
#include <QStringDecoder>
#include <QStringEncoder>
#include <QTemporaryDir>
#include <QTest>
#include <sys/stat.h>

using namespace quotas;
using namespace quotas::registry;
using namespace Qt::StringLiterals;
using quotas::test::ScriptedBoxes;

namespace {

const QString kKey = QStringLiteral("HKEY_LOCAL_MACHINE\\SOFTWARE\\Nortavel\\Sindicato");

QVariant query(QString path, QString value)
{
    return QueryValue(path, value);
}

}  // namespace

class RegistryReaderTest : public QObject {
    Q_OBJECT

    QTemporaryDir dir;

    QString writeFile(const QByteArray& bytes, const QString& name = QStringLiteral("settings.reg"))
    {
        const QString path = dir.filePath(name);
        if (QFile f(path); f.open(QIODevice::WriteOnly | QIODevice::Truncate))
            f.write(bytes);
        setRegistryPath(path);
        return path;
    }

private slots:
    void cleanup() { setRegistryPath(QString()); }

    void keyPaths_data()
    {
        QTest::addColumn<QString>("path");
        QTest::addColumn<quint32>("root");
        QTest::addColumn<QString>("subKey");
        QTest::addColumn<bool>("malformed");
        QTest::newRow("full path") << kKey << 0x80000002u << "SOFTWARE\\Nortavel\\Sindicato" << false;
        QTest::newRow("root alone") << "HKEY_LOCAL_MACHINE" << 0x80000002u << "" << false;
        QTest::newRow("deeper") << "HKEY_USERS\\a\\b\\c" << 0x80000003u << "a\\b\\c" << false;
        QTest::newRow("unknown root") << "HKEY_NOWHERE\\x" << 0u << "x" << false;
        QTest::newRow("lower-case prefix") << "hkey_local_machine\\SOFTWARE" << 0u << "hkey_local_machine\\SOFTWARE" << true;
        QTest::newRow("trailing backslash") << "HKEY_LOCAL_MACHINE\\" << 0u << "HKEY_LOCAL_MACHINE\\" << true;
        QTest::newRow("no prefix") << "SOFTWARE\\Nortavel" << 0u << "SOFTWARE\\Nortavel" << true;
    }
    void keyPaths()
    {
        QFETCH(QString, path);
        QFETCH(quint32, root);
        QFETCH(QString, subKey);
        QFETCH(bool, malformed);
        ScriptedBoxes boxes;
        QString rewritten = path;
        quint32 found = 12345;
        ParseKeyPath(rewritten, found);
        QCOMPARE(found, root);
        QCOMPARE(rewritten, subKey);
        QCOMPARE(boxes.shown.size(), malformed ? 1 : 0);
        if (malformed)
            QVERIFY(boxes.last().text == QStringLiteral("Formato Incorrecto:\n\n") + path && boxes.last().icon == Icon::None
                    && boxes.last().buttons == Buttons::Ok && boxes.last().title == applicationTitle());
    }

    void values_data()
    {
        QTest::addColumn<QString>("name");
        QTest::addColumn<QVariant>("expected");
        const QVariant null = nullMarker();
        QTest::newRow("plain") << "plain" << QVariant(QStringLiteral("abc"));
        QTest::newRow("leading spaces trimmed") << "lead" << QVariant(QStringLiteral("abc"));
        QTest::newRow("trailing spaces kept") << "trail" << QVariant(QStringLiteral("abc  "));
        QTest::newRow("only spaces") << "spaces" << QVariant(QString());
        QTest::newRow("empty is not missing") << "empty" << QVariant(QString());
        QTest::newRow("254 characters whole") << "v254" << QVariant(QString(254, u'a'));
        QTest::newRow("255 characters missing") << "v255" << null;
        QTest::newRow("value names ignore case") << "PLAIN" << QVariant(QStringLiteral("abc"));
        QTest::newRow("escapes") << "escaped" << QVariant(QStringLiteral("say \"hi\" \\ ok"));
        QTest::newRow("accents") << "accent" << QVariant(QStringLiteral("João €"));
        QTest::newRow("outside the code page") << "greek" << QVariant(QStringLiteral("?"));
        QTest::newRow("deleted value") << "gone" << null;
        QTest::newRow("missing value") << "nothing" << null;
    }
    void values()
    {
        QFETCH(QString, name);
        QFETCH(QVariant, expected);
        writeFile(QStringLiteral("Windows Registry Editor Version 5.00\r\n\r\n[%1]\r\n"
                                 "\"plain\"=\"abc\"\r\n\"lead\"=\"  abc\"\r\n\"trail\"=\"abc  \"\r\n\"spaces\"=\"   \"\r\n"
                                 "\"empty\"=\"\"\r\n\"v254\"=\"%2\"\r\n\"v255\"=\"%3\"\r\n"
                                 "\"escaped\"=\"say \\\"hi\\\" \\\\ ok\"\r\n\"accent\"=\"João €\"\r\n\"greek\"=\"Ω\"\r\n"
                                 "\"gone\"=\"x\"\r\n\"gone\"=-\r\n")
                      .arg(kKey, QString(254, u'a'), QString(255, u'a'))
                      .toUtf8());
        const QVariant value = query(kKey, name);
        QCOMPARE(isNullMarker(value), isNullMarker(expected));
        if (!isNullMarker(expected))
            QCOMPARE(value.toString(), expected.toString());
    }

    void missingKeysAndRoots()
    {
        writeFile("Windows Registry Editor Version 5.00\r\n\r\n[HKEY_LOCAL_MACHINE\\SOFTWARE\\Nortavel\\Sindicato]\r\n"
                  "\"dtUser\"=\"sa\"\r\n");
        ScriptedBoxes boxes;
        QCOMPARE(query(QStringLiteral("HKEY_LOCAL_MACHINE\\software\\nortavel\\SINDICATO"), QStringLiteral("dtuser")).toString(),
                 QStringLiteral("sa"));
        QVERIFY(isNullMarker(query(QStringLiteral("HKEY_LOCAL_MACHINE\\SOFTWARE\\Outro"), QStringLiteral("dtUser"))));
        QVERIFY(isNullMarker(query(QStringLiteral("HKEY_CURRENT_USER\\SOFTWARE\\Nortavel\\Sindicato"), QStringLiteral("dtUser"))));
        QVERIFY(isEmptyVariant(query(QStringLiteral("HKEY_NOWHERE\\SOFTWARE"), QStringLiteral("dtUser"))));
        QVERIFY(boxes.shown.isEmpty());
        QVERIFY(isEmptyVariant(query(QStringLiteral("HKEY_LOCAL_MACHINE\\"), QStringLiteral("dtUser"))));
        QCOMPARE(boxes.shown.size(), 1);
        // A key path is rewritten to its sub key: callers pass a copy.
        QString path = kKey;
        QString name = QStringLiteral("dtUser");
        QueryValue(path, name);
        QCOMPARE(path, QStringLiteral("SOFTWARE\\Nortavel\\Sindicato"));
        setRegistryPath(dir.filePath(QStringLiteral("absent.reg")));
        QVERIFY(isNullMarker(query(kKey, QStringLiteral("dtUser"))));
        writeFile("this is not a registry export\n");
        QVERIFY(isNullMarker(query(kKey, QStringLiteral("dtUser"))));
    }

    void exportFormats_data()
    {
        QTest::addColumn<QByteArray>("bytes");
        const QString body = QStringLiteral("\r\n[%1]\r\n\"dtUser\"=\"João\"\r\n").arg(kKey);
        QStringEncoder utf16(QStringEncoder::Utf16LE);
        const QByteArray wide = QByteArray("\xFF\xFE") + QByteArray(utf16(QStringLiteral("Windows Registry Editor Version 5.00") + body));
        QStringEncoder latin1(QStringEncoder::Latin1);
        QTest::newRow("version 5 in UTF-16") << wide;
        QTest::newRow("version 5 in UTF-8 with BOM")
            << QByteArray("\xEF\xBB\xBF") + (QStringLiteral("Windows Registry Editor Version 5.00") + body).toUtf8();
        QTest::newRow("REGEDIT4 in the ANSI code page") << QByteArray(latin1(QStringLiteral("REGEDIT4") + body));
        // An expandable string in a version 5 file is written as UTF-16 bytes.
        QTest::newRow("hex(2) over two lines")
            << QStringLiteral("Windows Registry Editor Version 5.00\r\n\r\n[%1]\r\n\"dtUser\"=hex(2):4a,00,6f,00,\\\r\n  e3,00,6f,00,00,00\r\n")
                   .arg(kKey)
                   .toUtf8();
    }
    void exportFormats()
    {
        QFETCH(QByteArray, bytes);
        writeFile(bytes);
        QCOMPARE(query(kKey, QStringLiteral("dtUser")).toString(), QStringLiteral("João"));
    }

    // Regression: a file from the registry editor (UTF-16 with its mark,
    // CRLF) was written back as UTF-8.
    void writingKeepsTheFileAsItWasAndHidesIt_data()
    {
        QTest::addColumn<QString>("header");
        QTest::addColumn<QString>("encoding");  // UTF-16LE, UTF-8 or Windows-1252
        QTest::addColumn<QString>("end");
        QTest::newRow("registry editor: UTF-16, CRLF") << u"Windows Registry Editor Version 5.00"_s << u"UTF-16LE"_s << u"\r\n"_s;
        QTest::newRow("UTF-8, LF") << u"Windows Registry Editor Version 5.00"_s << u"UTF-8"_s << u"\n"_s;
        QTest::newRow("REGEDIT4, ANSI, CRLF") << u"REGEDIT4"_s << u"Windows-1252"_s << u"\r\n"_s;
    }
    void writingKeepsTheFileAsItWasAndHidesIt()
    {
        QFETCH(QString, header);
        QFETCH(QString, encoding);
        QFETCH(QString, end);
        const QString text = QStringList{header, "", "[HKEY_CURRENT_USER\\Outro]", "\"x\"=dword:0000002a", "@=\"padrão\"",
                                         "\"e\"=hex(2):4a,00,6f,00,\\", "  e3,00,00,00", "[HKEY_CURRENT_USER\\Outro\\Sub]",
                                         "\"s\"=\"ç\"", "", QStringLiteral("[%1]").arg(kKey), "\"dtUser\"=\"old\"", ""}
                                 .join(end);
        const bool wide = encoding == "UTF-16LE";
        QStringEncoder encoder(wide ? QStringEncoder::Utf16LE : QStringEncoder::Latin1);
        const QByteArray bytes = encoding == "UTF-8" ? text.toUtf8() : QByteArray(wide ? "\xFF\xFE" : "") + QByteArray(encoder(text));
        const QString path = writeFile(bytes);
        const RegistryFile before = RegistryFile::load(path);
        RegistryFile file = RegistryFile::load(path);
        file.setString(kKey, QStringLiteral("DTUSER"), QStringLiteral("João \"quoted\" \\ value"));
        file.setString(kKey, QStringLiteral("dtPassword"), encodePassword(QStringLiteral("\uFEFFpá;ss")));
        file.save(path);
        struct stat info {};
        QCOMPARE(::stat(QFile::encodeName(path).constData(), &info), 0);
        QCOMPARE(info.st_mode & 0777, 0600u);
        QFile written(path);
        QVERIFY(written.open(QIODevice::ReadOnly));
        const QByteArray after = written.readAll();
        QStringDecoder decoder(QStringDecoder::Utf16LE);
        const QString afterText = wide ? QString(decoder(after.mid(2))) : QString::fromLatin1(after);
        QVERIFY(after.startsWith(wide ? "\xFF\xFE" : "") && afterText.startsWith(header + end + end + "[HKEY_CURRENT_USER"));
        QCOMPARE(afterText.count(QStringLiteral("\r\n")), end == "\n" ? 0 : afterText.count(u'\n'));
        QCOMPARE(query(kKey, QStringLiteral("dtUser")).toString(), QStringLiteral("João \"quoted\" \\ value"));
        // Regression: a leading U+FEFF of the password was taken for a byte order mark.
        QCOMPARE(decodePassword(query(kKey, QStringLiteral("dtPassword")).toString()), QStringLiteral("\uFEFFpá;ss"));
        QCOMPARE(decodePassword(QStringLiteral("typed by hand")), QStringLiteral("typed by hand"));
        const RegistryFile reread = RegistryFile::load(path);
        const std::pair<const char*, const char*> kept[] = {{"HKEY_CURRENT_USER\\Outro", "x"}, {"HKEY_CURRENT_USER\\Outro", ""}, {"HKEY_CURRENT_USER\\Outro", "e"}, {"HKEY_CURRENT_USER\\Outro\\Sub", "s"}};
        for (const auto& [key, value] : kept)
            QCOMPARE(reread.data(QLatin1String(key), QLatin1String(value)), before.data(QLatin1String(key), QLatin1String(value)));
    }

    // Regression: an ANSI file whose only byte invalid in UTF-8 was in a comment
    // was written back as bytes that read as UTF-8, "Ã©" turned into "é".
    void anAnsiFileReadsBackAsItWas()
    {
        RegistryFile file = RegistryFile::parse("REGEDIT4\n[" + kKey.toLatin1() + "]\n\"s\"=\"\xC3\xA9\"\n; \xFF\n");
        file.setString(kKey, QStringLiteral("dtUser"), QStringLiteral("u"));
        QCOMPARE(RegistryFile::parse(file.serialize()).data(kKey, QStringLiteral("s")), std::optional<QByteArray>(QByteArray("\xC3\xA9", 3)));
    }

    // Regression: 20,000 values took 8.9 s to read (each compared with all before it).
    void readingIsLinear()
    {
        QByteArray bytes = "Windows Registry Editor Version 5.00\r\n\r\n[" + kKey.toLatin1() + "]\r\n";
        for (int i = 0; i < 20000; ++i)
            bytes += "\"v" + QByteArray::number(i) + "\"=\"" + QByteArray::number(i) + "\"\r\n";
        QElapsedTimer timer;
        timer.start();
        const RegistryFile file = RegistryFile::parse(bytes);
        QVERIFY2(timer.elapsed() < 2000, qPrintable(QString::number(timer.elapsed())));  // 0.5 s on an idle machine
        QCOMPARE(file.data(kKey, QStringLiteral("V19999")), std::optional<QByteArray>(QByteArray("19999", 6)));
    }

    // A malformed file is reported with its name and line; a value the reader
    // could not read back is never written.
    void malformedFilesAreNamedAndNeverWritten()
    {
        const QString path = writeFile("Windows Registry Editor Version 5.00\r\n\r\n[HKEY_LOCAL_MACHINE\\X]\r\n\"a\"=\"1\"\r\n\"b\" 2\r\n");
        try {
            RegistryFile::load(path);
            QFAIL("a malformed file was read");
        } catch (const QuotasError& e) {
            QVERIFY2(e.message().contains(path) && e.message().contains(QStringLiteral("linha 5")), qPrintable(e.message()));
        }
        RegistryFile file;
        file.setString(kKey, QStringLiteral("dtUser"), QStringLiteral("a\nb"));
        QVERIFY_THROWS_EXCEPTION(QuotasError, file.save(dir.filePath(QStringLiteral("never.reg"))));
        QVERIFY(!QFileInfo::exists(dir.filePath(QStringLiteral("never.reg"))));
    }
};

QTEST_GUILESS_MAIN(RegistryReaderTest)
#include "tst_registry_reader.moc"
