// The dues import on both engines: the CSV reader, ProcessarImportacao on
// members charged for March 2004, its dry run, "quotas importar" (and
// "--simular") as a process, and the dialog frmImportarQuotas driven as a
// user would.

#include "component/general.h"
#include "component/shared_objects.h"
#include "import/csv_reader.h"
#include "import/frm_importar_quotas.h"
#include "import/import_verdict.h"
#include "import/processar_importacao.h"
#include "import/csv_import_source.h"
#include "platform/components.h"
#include "platform/errors.h"
#include "support/database_fixture.h"
#include "support/recording_progress.h"
#include "support/scripted_boxes.h"

#include <QCheckBox>
#include <QFile>
#include <QListWidget>
#include <QTest>

using namespace quotas;
using namespace quotas::test;
using namespace Qt::StringLiterals;

namespace {

// The boxes shown, as "icon: text".
QStringList told(const ScriptedBoxes& boxes)
{
    static const char* const icons[] = {"None", "Critical", "Question", "Exclamation", "Information"};
    QStringList out;
    for (const ShownBox& b : boxes.shown)
        out << QStringLiteral("%1: %2").arg(QLatin1String(icons[int(b.icon)]), b.text);
    return out;
}

const QString kRejected = QStringLiteral("Critical: Durante o processo de importação de dados não foram registados %1 associados.");

QListWidget* list(const char* name)
{
    return shared().frmImportarQuotas->findChild<QListWidget*>(QLatin1String(name));
}
// The items of a list of the dialog, the current one in brackets.
QStringList items(const char* name)
{
    QStringList out;
    for (int i = 0; i < list(name)->count(); ++i)
        out << (i == list(name)->currentRow() ? "[" + list(name)->item(i)->text() + "]" : list(name)->item(i)->text());
    return out;
}
void pick(const char* name, const QString& text)
{
    QTest::mouseClick(list(name)->viewport(), Qt::LeftButton, {},
                      list(name)->visualItemRect(list(name)->findItems(text, Qt::MatchExactly).value(0)).center());
}
void click(const char* name)
{
    QTest::mouseClick(shared().frmImportarQuotas->findChild<QAbstractButton*>(QLatin1String(name)), Qt::LeftButton);
}

// Each line's verdict as "line|no_tap|verdict|quota before|pago before|quota after|pago after|reason".
QStringList described(const ImportVerdicts& verdicts)
{
    QStringList out;
    const auto amount = [](qint64 cents) { return QString::number(double(cents) / 100.0, 'f', 2); };
    for (const ImportVerdict& v : verdicts.lines) {
        const bool posted = v.kind == ImportVerdict::Kind::Post;
        out << u"%1|%2|%3|%4|%5|%6"_s.arg(v.line).arg(v.noTap, v.kindText(),
                                                      v.matched ? amount(v.quotaBefore) + u'|' + amount(v.pagoBefore) : u"|"_s,
                                                      posted ? amount(v.quotaAfter) + u'|' + amount(v.pagoAfter) : u"|"_s, v.reason);
    }
    return out;
}

}  // namespace

// Member 1's movement as charged and paid, a line deducting an amount, and
// what is posted: "quota = pago|total_quotas|total_pago" of an account that
// held 40.00 of dues and 30.00 paid; nothing when the line leaves it alone.
struct Posting {
    QVariant quota, pago;
    QByteArray deducted;
    bool wholeCents;
    QString posted;
};
Q_DECLARE_METATYPE(Posting)

// Member 1, charged 10.00 of union due and 20.00 of insurance, on an account
// of rend1 and 0: the type run, the file, the account's last values
// afterwards (ult_rend1, _rend2, _quota_sindicato, _perc_sindicato,
// _quota_seguro, _perc_seguro) and the union and insurance dues paid.
struct LastValues {
    int tipo;
    QByteArray file;
    double rend1;
    QString account, paid;
};
Q_DECLARE_METATYPE(LastValues)

// In the dialog, with member 1 charged 20.00 of insurance for March 2004:
// the year, month and type picked, the amount of the file's one line (the
// check box cleared when it has no point), the box shown ("<file>" for the
// file's path), what was paid, and whether Cancelar is clicked, not Executar.
struct Selection {
    QString year, month, type;
    QByteArray amount;
    QString message, paid = "0";
    bool cancel = false;
};
Q_DECLARE_METATYPE(Selection)

class ImportTest : public QObject, DatabaseFixture {
    Q_OBJECT

    QStringList listings;

    void member(int id, const QString& noTap)
    {
        c().execute(QStringLiteral("INSERT INTO tbSocios (socio_id, no_tap, nome) VALUES (?, ?, 'Associado')"), {id, noTap});
    }
    // The due of type tipo for March 2004, on remunerations 1000 and 250.
    void movement(int socio, int tipo, const QVariant& quota, const QVariant& pago)
    {
        c().execute(QStringLiteral("INSERT INTO tbQuotas_Movimentos (socio_id, data, ano, mes, tipo, ref, quota_no, rend1, "
                                   "rend2, quota, pago) VALUES (?, '2004-03-01', 2004, 3, ?, 'Sindicato', 1, 1000, 250, ?, ?)"),
                    {socio, tipo, quota, pago});
    }
    // Rates 0.015 (union) and 0.02 (insurance), last dues 1.11 and 2.22.
    void account(int socio, double totalQuotas, double totalPago, double rend1 = 1000.0)
    {
        c().execute(QStringLiteral("INSERT INTO tbQuotas_Socios (socio_id, ult_ano, ult_mes, ult_rend1, ult_rend2, "
                                   "ult_quota_sindicato, ult_perc_sindicato, ult_quota_seguro, ult_perc_seguro, "
                                   "total_quotas, total_pago) VALUES (?, 2003, 12, ?, 0, 1.11, 0.015, 2.22, 0.02, ?, ?)"),
                    {socio, rend1, totalQuotas, totalPago});
    }
    void charged(int id, const QString& noTap, double quota, double pago = 0.0, int tipo = 1)
    {
        member(id, noTap);
        movement(id, tipo, quota, pago);
        account(id, quota, pago);
    }
    // Every value of the movements and the accounts.
    QStringList snapshot()
    {
        return rows("SELECT * FROM tbQuotas_Movimentos ORDER BY 1") + rows("SELECT * FROM tbQuotas_Socios ORDER BY 1");
    }
    // A month with one case of each verdict of the dry run.
    QString dryRunMonth()
    {
        charged(1, "101", 10.0);        // unpaid: posted
        charged(2, "102", 12.0, 12.0);  // paid as deducted: left alone
        charged(3, "103", 5.0, 5.0);    // paid, deduction above the charge: posted
        member(4, "104");
        movement(4, 1, 10.0, 0.0);
        charged(5, "105", 10.0);
        charged(6, "106", 10.0);
        c().execute(QStringLiteral("INSERT INTO extras (Field0) VALUES ('antes')"));
        return useImportFile("no_tap;quota\n101;8.00\n102;12.00\n103;7.50\n999;1.00\n104;9.00\n105;abc\n101;8.00\n106;0\n");
    }
    static ImportSummary run(int month = 3, int tipo = 1) { return ProcessarImportacao(month, 2004, tipo); }
    // General::ImportarQuotas returns at once, the dialog stays.
    static QWidget* open() { return General().ImportarQuotas(), shared().frmImportarQuotas.data(); }

private slots:
    void initTestCase()
    {
        openDatabase();
        FrmImportarQuotas::pinToday(QDate(2004, 3, 15));
    }
    void init()
    {
        db->clear();
        RecordingProgress::install();
        shared().SemSeparadorDecimal = false;
        listings.clear();
        setRejectsListing([this] {
            listings << rows("SELECT COUNT(*) FROM extras")[0] + u'|' + QString::number(Data().SqlServer_Prints.state());
        });
    }
    void cleanup() { delete shared().frmImportarQuotas.data(); }

    // What is read, "header/line/...", values split by "|"; or what is wrong with the file.
    void readsTheFilesOfTheOffice_data()
    {
        QTest::addColumn<QByteArray>("bytes");
        QTest::addColumn<QString>("read");
        const QString joao = "João € “", invalid = "não é um ficheiro CSV válido: ";
        QTest::newRow("UTF-8") << QByteArray("Jo\xC3\xA3o \xE2\x82\xAC \xE2\x80\x9C") << joao;
        QTest::newRow("Windows-1252") << QByteArray("Jo\xE3o \x80 \x93") << joao;
        QTest::newRow("UTF-16LE with BOM") << QByteArray("\xFF\xFEJ\0o\0\xE3\0o\0 \0\xAC\x20 \0\x1C\x20", 18) << joao;
        QTest::newRow("semicolon, CRLF, case kept") << QByteArray("no_tap;Quota\r\n1;2,5\r\n") << "no_tap|Quota/1|2,5";
        QTest::newRow("comma, quoted delimiter, quotes and break")
            << QByteArray("no_tap,quota,nome\n7,\"12,50\",\"Silva, \"\"Zé\"\"\nda Ponte\"\n")
            << "no_tap|quota|nome/7|12,50|Silva, \"Zé\"\nda Ponte";
        QTest::newRow("tab, empty value kept") << QByteArray("a\tb\tc\n1\t\t3\n") << "a|b|c/1||3";
        QTest::newRow("semicolon wins a tie, comma inside quotes") << QByteArray("\"x,y\";b,c\n1;2,3\n") << "x,y|b,c/1|2,3";
        QTest::newRow("spaces, short line, blank lines, trailing delimiter, no final break")
            << QByteArray(" a ; b ;c\n\n 1 ;\" 2 \"\n\n3;4;5;") << "a|b|c/1| 2 /3|4|5";
        QTest::newRow("a mark opening a value is kept") << QByteArray("\xEF\xBB\xBF"
                                                                      "a;b\n\xEF\xBB\xBF"
                                                                      "1;2\n")
                                                        << QString::fromUtf8("a|b/\xEF\xBB\xBF"
                                                                             "1|2");
        QTest::newRow("spreadsheet blank rows") << QByteArray("a;b\n;\n1;2\n;;\n\"\";\n") << "a|b/1|2";
        QTest::newRow("quote inside a value") << QByteArray("a;b\n1;2\n3;x\"y\n") << invalid + "há aspas fora do lugar na linha 3.";
        QTest::newRow("quote left open") << QByteArray("a;b\n1;2\n3;\"4\n5;6\n")
                                         << invalid + "um valor entre aspas começado na linha 3 não foi fechado.";
        QTest::newRow("more values than names")
            << QByteArray("a;b\n1;2\n1;2;3\n")
            << invalid + "a linha 3 tem 3 valores, mais do que os 2 nomes de colunas da primeira linha.";
        QTest::newRow("not text") << QByteArray("PK\x03\x04\0\0", 6) << "não é um ficheiro de texto CSV.";
        // Read a block at a time: what decides the encoding, or refuses the file, may come late.
        const QByteArray lines = "a;b\n" + QByteArray("1;2\n").repeated(30000);
        const QString read = "a|b" + QString("/1|2").repeated(30000) + "/João|€";
        QTest::newRow("Windows-1252 known at the end") << lines + "Jo\xE3o;\x80\n"
                                                       << read;
        QString utf16 = QString::fromLatin1(lines) + "João;€\n";
        utf16.prepend(QChar::ByteOrderMark);
        QTest::newRow("UTF-16 in many blocks") << QByteArray(reinterpret_cast<const char*>(utf16.utf16()), utf16.size() * 2) << read;
        QTest::newRow("not text at the end") << lines + QByteArray("\0", 1) << "não é um ficheiro de texto CSV.";
    }
    void readsTheFilesOfTheOffice()
    {
        QFETCH(QByteArray, bytes);
        QFETCH(QString, read);
        const QString path = useImportFile(bytes);
        QStringList got;
        try {
            const CsvTable table = readCsvFile(path);
            for (const QStringList& record : QList<QStringList>{table.header} + table.rows)
                got << record.join(u'|');
        } catch (const QuotasError& e) {
            got << QString(e.message()).remove(QStringLiteral("O ficheiro \"%1\" ").arg(path));
        }
        QCOMPARE(got.join(u'/'), read);
    }

    // Nothing changes, extras included, and no listing follows.
    void refusesWhatCannotBeImported_data()
    {
        QTest::addColumn<QByteArray>("file");  // "cancelled": the user cancelled the choice of a file
        QTest::addColumn<int>("month");
        QTest::addColumn<QStringList>("shown");
        const QStringList noLines{"Information: Não foram indicados registos para importar."};
        const QStringList noColumns{"Information: Não foram especificados os campos no_tap ou quota."};
        QTest::newRow("empty file") << QByteArray() << 3 << noLines;
        QTest::newRow("header only") << QByteArray("no_tap;quota\r\n\r\n") << 3 << noLines;
        QTest::newRow("No_tap") << QByteArray("No_tap;quota\n100;8\n") << 3 << noColumns;
        QTest::newRow("QUOTA") << QByteArray("no_tap;QUOTA\n100;8\n") << 3 << noColumns;
        QTest::newRow("no quota") << QByteArray("no_tap;rend1\n100;8\n") << 3 << noColumns;
        QTest::newRow("cancelled") << QByteArray("cancelled") << 3 << QStringList{};
        QTest::newRow("nothing charged in May")
            << QByteArray("no_tap;quota\n100;8.00\n999;1\n") << 5
            << QStringList{"None: Não foram processados os registos de quotas referente a 5 / 2004.\n\n"
                           "Gere primeiro as quotas de Maio de 2004 (\"Gerar Quotas\")."};
    }
    void refusesWhatCannotBeImported()
    {
        QFETCH(QByteArray, file);
        QFETCH(int, month);
        QFETCH(QStringList, shown);
        charged(1, "100", 10.0);
        c().execute(QStringLiteral("INSERT INTO extras (Field0) VALUES ('antes')"));
        const QStringList before = snapshot();
        if (file == "cancelled")
            registerComponent("Dorvanta.General", [] { return std::make_unique<CsvImportSource>([] { return QString(); }); });
        else
            useImportFile(file);
        ScriptedBoxes boxes;
        run(month);
        QCOMPARE(told(boxes), shown);
        QCOMPARE(snapshot() + rows("SELECT Field0 FROM extras"), before + QStringList{"antes"});
        QVERIFY(listings.isEmpty());
    }

    void postsByTheRules_data()
    {
        QTest::addColumn<Posting>("p");
        QTest::newRow("unpaid 10.00, 8.00") << Posting{10.0, 0.0, "8.00", false, "8|38|38"};
        QTest::newRow("paid 10.00, 8.00") << Posting{10.0, 10.0, "8.00", false, ""};
        QTest::newRow("paid 10.00, 12.00") << Posting{10.0, 10.0, "12.00", false, "12|42|42"};
        QTest::newRow("0 on unpaid") << Posting{10.0, 0.0, "0", false, ""};
        QTest::newRow("whole cents 1250") << Posting{10.0, 0.0, "1250", true, "12.5|42.5|42.5"};
        QTest::newRow("comma 12,50") << Posting{10.0, 0.0, "\"12,50\"", false, "12.5|42.5|42.5"};
        QTest::newRow("beyond single precision") << Posting{10.0, 0.0, "123456.78", false, "123456.78|123486.78|123486.78"};
        // Compared with Null, neither "equals 0" nor "greater than" holds.
        QTest::newRow("Null payment: left alone") << Posting{10.0, kNullNumber, "8", false, ""};
        QTest::newRow("Null charge, nothing paid") << Posting{kNullNumber, 0.0, "8", false, "8|48|38"};
        QTest::newRow("Null charge, paid") << Posting{kNullNumber, 5.0, "8", false, ""};
    }
    void postsByTheRules()
    {
        QFETCH(Posting, p);
        member(1, "100");
        movement(1, 1, p.quota, p.pago);
        account(1, 40.0, 30.0);
        c().execute(QStringLiteral("INSERT INTO extras (Field0) VALUES ('antes')"));
        const QStringList before = snapshot();
        useImportFile("no_tap;quota;nome\n100;" + p.deducted + ";Ana\n");
        shared().SemSeparadorDecimal = p.wholeCents;
        ScriptedBoxes boxes;
        QCOMPARE(run().posted, p.posted.isEmpty() ? 0 : 1);
        // Nothing rejected: no message, no listing, extras as it was.
        QVERIFY(boxes.shown.isEmpty() && listings.isEmpty());
        QCOMPARE(rows("SELECT Field0 FROM extras"), QStringList{"antes"});
        QCOMPARE(snapshot() == before, p.posted.isEmpty());
        if (p.posted.isEmpty())
            return;
        const QStringList v = p.posted.split(u'|');
        // The movement takes the account's remunerations; the old charge leaves the total, the deduction enters it.
        QCOMPARE(rows("SELECT quota, pago, rend1, rend2 FROM tbQuotas_Movimentos"), QStringList{v[0] + u'|' + v[0] + "|1000|0"});
        QCOMPARE(rows("SELECT total_quotas, total_pago, ult_quota_sindicato, ult_ano, ult_mes FROM tbQuotas_Socios"),
                 QStringList{v[1] + u'|' + v[2] + u'|' + v[0] + "|2004|3"});
    }

    void theAccountsLastValues_data()
    {
        QTest::addColumn<LastValues>("l");
        QTest::newRow("Sindicato: the insurance's left alone")
            << LastValues{1, "no_tap;quota\n100;5.00\n", 800, "800|0|5|0.00625|2.22|0.02", "5|0"};
        QTest::newRow("Plano de Saúde: the union's left alone")
            << LastValues{2, "no_tap;quota\n100;5.00\n", 800, "800|0|1.11|0.015|5|0.00625", "0|5"};
        QTest::newRow("rend1 in the file")
            << LastValues{1, "no_tap;quota;rend1\n100;30.00;1500.00\n", 1000, "1500|0|30|0.02|2.22|0.02", "30|0"};
        QTest::newRow("remunerations 0: the rate stays")
            << LastValues{1, "no_tap;quota\n100;8\n", 0, "0|0|8|0.015|2.22|0.02", "8|0"};
    }
    void theAccountsLastValues()
    {
        QFETCH(LastValues, l);
        member(1, "100");
        movement(1, 1, 10.0, 0.0);
        movement(1, 2, 20.0, 0.0);
        account(1, 30.0, 0.0, l.rend1);
        useImportFile(l.file);
        ScriptedBoxes boxes;
        QCOMPARE(run(3, l.tipo).posted, 1);
        QCOMPARE(rows("SELECT ult_rend1, ult_rend2, ult_quota_sindicato, ult_perc_sindicato, ult_quota_seguro, ult_perc_seguro "
                      "FROM tbQuotas_Socios"),
                 QStringList{l.account});
        QCOMPARE(rows("SELECT pago FROM tbQuotas_Movimentos ORDER BY tipo"), l.paid.split(u'|'));
    }

    // Regression: a line whose amount could not be read took the amount of
    // the line before. The file is UTF-8 with a byte order mark.
    void rejectedLinesAreCountedKeptAndListed()
    {
        charged(1, "100", 10.0);
        charged(2, "200", 10.0);
        member(3, "300");  // charged, but without an account
        movement(3, 1, 10.0, 0.0);
        charged(4, "400", 10.0);
        c().execute(QStringLiteral("INSERT INTO extras (Field0) VALUES ('da última vez')"));
        useImportFile("\xEF\xBB\xBFno_tap;quota;nome;obs;c4;c5;c6;c7;c8;c9;c10;c11;c12;c13;c14;c15;c16;c17;c18;c19;c20;c21;c22\n"
                      "100;8.00;Ana;\n"
                      "999;7.00;Jo\xC3\xA3o;x\n"
                      "200;abc;Rui;y\n"
                      "300;6.00;Sem conta;z\n"
                      "400;;Vazio\n"                                                      // an empty amount; the short line leaves obs Null
                      "998;1;a;b;4;5;6;7;8;9;10;11;12;13;14;15;16;17;18;19;20;21;22\n");  // only 21 values are kept
        ScriptedBoxes boxes;
        QCOMPARE(run().posted, 1);
        QCOMPARE(told(boxes), QStringList{kRejected.arg(5)});
        QCOMPARE(RecordingProgress::log().calls, QStringList{"Iniciar(6, Transferindo dados, aguarde uns momentos . . ., )"}
                                                     << QStringList(6, "setvalor(1)") << "terminar()");
        QCOMPARE(rows("SELECT Field0, Field1, Field2, Field3, Field20 FROM extras ORDER BY extra_id"),
                 QStringList({"999|7.00|João|x|-", "200|abc|Rui|y|-", "300|6.00|Sem conta|z|-",
                              "400||Vazio|-|-", "998|1|a|b|20"}));
        // Each line's reason, beside extras, for the listing.
        QCOMPARE(shared().rejectReasons, QStringList({"sem quota gerada", "valor ilegível", "sem conta", "valor ilegível",
                                                      "sem quota gerada"}));
        QCOMPARE(rows("SELECT socio_id, pago FROM tbQuotas_Movimentos ORDER BY 1"), QStringList({"1|8", "2|0", "3|0", "4|0"}));
        // The listing comes after extras was rewritten, on an open SqlServer_Prints, closed after.
        QCOMPARE(listings, QStringList{"5|1"});
        QCOMPARE(Data().SqlServer_Prints.state(), 0);
    }

    // Regression: the key went into the search criterion between quotes.
    // A quoted key keeps its spaces and matches nobody.
    // Regression: the account was looked up by staff number, so a number two
    // members share could post one member's movement to the other's account.
    // Importing the same list again changes nothing.
    void matchingIsExactAndOnce()
    {
        charged(1, "x'y", 10.0);
        charged(2, "200", 10.0, 10.0);
        member(3, "555");  // no movement this month
        account(3, 0.0, 0.0);
        charged(4, "555", 10.0);
        useImportFile("no_tap;quota\n\"x' OR '1'='1\";9.00\nx'y;8.00\n'200';7.00\n\" 200\";7.00\n200;12.00\n555;8.00\n");
        ScriptedBoxes boxes;
        QCOMPARE(run().posted, 3);
        QCOMPARE(rows("SELECT a.socio_id, m.pago, a.total_pago FROM tbQuotas_Socios a LEFT JOIN tbQuotas_Movimentos m "
                      "ON m.socio_id = a.socio_id ORDER BY a.socio_id"),
                 QStringList({"1|8|8", "2|12|22", "3|-|0", "4|8|8"}));
        QCOMPARE(rows("SELECT Field0 FROM extras ORDER BY extra_id"), QStringList({"x' OR '1'='1", "'200'", " 200"}));
        const QStringList once = snapshot();
        QCOMPARE(run().posted, 0);
        QCOMPARE(snapshot() + rows("SELECT Field0 FROM extras ORDER BY extra_id"), once + QStringList({"x' OR '1'='1", "'200'", " 200"}));
    }

    // Another user at work meanwhile: a payment he records on an account is
    // kept (the totals are added to); a line whose account he changed is
    // rolled back, counted and listed (regression: it stayed half posted),
    // and a later line of that member is posted on what the database holds.
    void anotherUserMeanwhile()
    {
        for (int socio = 1; socio <= 3; ++socio)
            charged(socio, QString::number(100 * socio), 10.0);
        auto other = db->openAnother();
        RecordingProgress::log().afterStep = [&] {
            if (RecordingProgress::log().value != 1)
                return;
            other->execute(QStringLiteral("UPDATE tbQuotas_Socios SET total_pago = total_pago + 5 WHERE socio_id = 1"));
            other->execute(QStringLiteral("UPDATE tbQuotas_Socios SET ult_rend1 = 777 WHERE socio_id = 2"));
        };
        useImportFile("no_tap;quota;rend1\n300;7.00;900\n100;8.00;900\n200;8.00;900\n200;9.00;900\n");
        ScriptedBoxes boxes;
        const ImportSummary summary = run();
        QCOMPARE(QList<int>({summary.posted, summary.failed}), QList<int>({3, 1}));
        QCOMPARE(told(boxes), QStringList{kRejected.arg(1)});
        QCOMPARE(rows("SELECT Field0, Field1 FROM extras"), QStringList{"200|8.00"});
        QCOMPARE(shared().rejectReasons, QStringList{"alterado por outro utilizador"});
        QCOMPARE(rows("SELECT m.socio_id, m.pago, a.total_quotas, a.total_pago FROM tbQuotas_Movimentos m JOIN tbQuotas_Socios a "
                      "ON a.socio_id = m.socio_id ORDER BY m.socio_id"),
                 QStringList({"1|8|8|13", "2|9|9|9", "3|7|7|7"}));
    }

    // Regression: a server gone in the middle of the run ended it with the
    // driver's English text. The posted lines stay; a rerun completes it.
    void aLostServerStopsTheRunAndARerunCompletes()
    {
        if (c().engine() == Engine::SQLite)
            QSKIP("an embedded database has no server to lose");
        for (int socio = 1; socio <= 3; ++socio)
            charged(socio, QString::number(100 * socio), 10.0);
        auto other = db->openAnother();
        const QVariant pid = Data().SqlServer.scalar(QStringLiteral("SELECT pg_backend_pid()"));
        RecordingProgress::log().afterStep = [&] {
            if (RecordingProgress::log().value == 1)
                other->execute(QStringLiteral("SELECT pg_terminate_backend(?)"), {pid});
        };
        useImportFile("no_tap;quota\n100;8.00\n200;8.00\n300;8.00\n");
        ScriptedBoxes boxes;
        try {
            run();
            QFAIL("the run went on without its server");
        } catch (const QuotasError& e) {
            QVERIFY2(e.message().contains("parou na linha 3 do ficheiro: perdeu-se a ligação à base de dados")
                         && e.message().contains("As 1 linhas lançadas até aí ficam gravadas. Volte a importar"),
                     qPrintable(e.message()));
        }
        RecordingProgress::log().afterStep = {};
        db->login();
        QCOMPARE(run().posted, 2);
        QCOMPARE(rows("SELECT pago FROM tbQuotas_Movimentos ORDER BY socio_id") + rows("SELECT total_pago FROM tbQuotas_Socios ORDER BY socio_id"),
                 QStringList(6, "8"));
    }

    // Regression: extras was emptied and refilled row by row outside any
    // transaction, so a failure could leave it half written.
    void extrasIsRewrittenWhollyOrNotAtAll()
    {
        c().execute(QStringLiteral("CREATE UNIQUE INDEX refuse ON extras (Field0)"));  // the second 998 fails
        charged(1, "100", 10.0);
        c().execute(QStringLiteral("INSERT INTO extras (Field0) VALUES ('a'), ('b')"));
        useImportFile("no_tap;quota\n998;1\n998;2\n100;8\n");
        ScriptedBoxes boxes;
        QVERIFY(!run().extrasSaved);
        c().execute(QStringLiteral("DROP INDEX refuse"));
        QCOMPARE(told(boxes).size(), 2);
        QVERIFY(told(boxes)[1].startsWith("Critical: Não foi possível gravar os registos não importados"));
        QCOMPARE(rows("SELECT Field0 FROM extras ORDER BY extra_id"), QStringList({"a", "b"}));
        QVERIFY(listings.isEmpty());
    }

    // The run's messages on stdout, the rejects listing to the PDF, and the
    // exit status: 3 with lines left out, 0 with none (a stale listing
    // removed), 1 with nothing imported or no file.
    void quotasImportar()
    {
        charged(1, "100", 10.0);
        const QString file = useImportFile("no_tap;quota\n100;800\n999;100\n");
        const QString pdf = db->scratch(QStringLiteral("rejeitados.pdf"));
        const auto importar = [&](const QStringList& args, const QString& on = QString()) {
            return quotas(QStringList{"importar"} + args + QStringList{on.isEmpty() ? file : on});
        };
        const QStringList march = {"--ano", "2004", "--mes", "3", "--tipo", "1", "--sem-separador", "--pdf", pdf};
        const CliRun done = importar(march);
        QVERIFY2(done.status == 3 && QFile::exists(pdf) && done.out.contains(pdf)
                     && done.out.startsWith("Durante o processo de importação de dados não foram registados 1 associados.\nLinhas lançadas: 1\n"
                                            "Linhas deixadas como estavam (já lançadas): 0\nLinhas rejeitadas: 1\n"),
                 qPrintable(done.out + done.err));
        QCOMPARE(rows("SELECT pago FROM tbQuotas_Movimentos"), QStringList{"8"});
        const CliRun none = importar(march, useImportFile("no_tap;quota\n100;800\n"));
        QVERIFY2(none.status == 0 && !QFile::exists(pdf) && none.out.contains(pdf), qPrintable(none.out + none.err));
        const CliRun notCharged = importar({"--ano", "2004", "--mes", "7", "--tipo", "2"});
        QCOMPARE(notCharged.out, QStringLiteral("Não foram processados os registos de quotas referente a 7 / 2004. "
                                                "Gere primeiro as quotas de Julho de 2004 (\"Gerar Quotas\").\n"));
        const std::pair<CliRun, QString> refusals[] = {{notCharged, "referente a 7 / 2004"},
                                                       {importar(march, useImportFile("no_tap;valor\n100;800\n")), "campos no_tap ou quota"},
                                                       {importar(march, useImportFile("no_tap;quota\n")), "registos para importar"},
                                                       {importar(march, file + "x"), "não existe"}};
        for (const auto& [refused, reason] : refusals)
            QVERIFY2(refused.status == 1 && refused.err.contains(reason), qPrintable(refused.err));
    }

    // The dry run: each verdict on a hand-made month, the import that follows
    // agreeing line by line, and not a row of the database changed by it.
    void dryRunTellsEachVerdictWritesNothingAndAgreesWithTheImport()
    {
        dryRunMonth();
        const QStringList before = everything();
        ScriptedBoxes boxes;
        ImportVerdicts dry;
        SimularImportacao(3, 2004, 1, dry);
        QCOMPARE(described(dry), (QStringList{"1|101|registar|10.00|0.00|8.00|8.00|",
                                              "2|102|deixar|12.00|12.00|||já registada",
                                              "3|103|registar|5.00|5.00|7.50|7.50|",
                                              "4|999|rejeitar|||||sem quota gerada",
                                              "5|104|rejeitar|10.00|0.00|||sem conta",
                                              "6|105|rejeitar|10.00|0.00|||valor ilegível",
                                              "7|101|deixar|8.00|8.00|||já registada",
                                              "8|106|deixar|10.00|0.00|||desconto de 0,00"}));
        QCOMPARE(everything(), before);
        QVERIFY(boxes.shown.isEmpty());
        // The import that follows does line for line what the dry run said.
        ImportVerdicts done;
        const ImportSummary summary = ProcessarImportacao(3, 2004, 1, &done);
        QCOMPARE(described(done), described(dry));
        QCOMPARE(summary.posted, dry.count(ImportVerdict::Kind::Post));
        QCOMPARE(rows(u"SELECT pago FROM tbQuotas_Movimentos ORDER BY socio_id"_s),
                 (QStringList{"8", "12", "7.5", "0", "0", "0"}));
    }

    // stdout one line per line of the file, then the totals; the exit status the import would have.
    void quotasImportarSimular()
    {
        const QString file = dryRunMonth();
        const QStringList before = everything();
        const CliRun r = quotas({u"importar"_s, u"--simular"_s, u"--ano"_s, u"2004"_s, u"--mes"_s, u"3"_s, u"--tipo"_s, u"1"_s, file});
        QCOMPARE(r.status, 3);
        const QStringList out = r.out.split(u'\n', Qt::SkipEmptyParts);
        QCOMPARE(out.size(), 9);
        QCOMPARE(out[0], u"1\t101\tregistar\t10,00\t0,00\t8,00\t8,00\t"_s);
        QCOMPARE(out[5], u"6\t105\trejeitar\t10,00\t0,00\t\t\tvalor ilegível"_s);
        QCOMPARE(out[8], u"A registar: 2 linha(s), 15,50 Esc; a deixar (já registadas): 3; a rejeitar: 3."_s);
        QCOMPARE(everything(), before);
        const CliRun clean = quotas({u"importar"_s, u"--simular"_s, u"--ano"_s, u"2004"_s, u"--mes"_s, u"3"_s, u"--tipo"_s, u"1"_s,
                                     useImportFile("no_tap;quota\n101;8.00\n")});
        QCOMPARE(clean.status, 0);
    }

    // Not modal, one at a time, on today's choices; the check box sets the
    // amounts' notation and is checked again on every opening.
    void dialogOpensOnTodaysChoices()
    {
        QWidget* dialog = open();
        QVERIFY(dialog->isVisible() && !dialog->isModal());
        QCOMPARE(items("List1"), QStringList({"1999", "2000", "2001", "2002", "2003", "[2004]", "2005"}));
        QCOMPARE(items("List2"), QStringList({"Janeiro", "Fevereiro", "[Março]", "Abril", "Maio", "Junho", "Julho", "Agosto",
                                              "Setembro", "Outubro", "Novembro", "Dezembro"}));
        QCOMPARE(items("List3"), QStringList({"[Sindicato]", "Plano de Saúde"}));
        QCOMPARE(open(), dialog);
        QVERIFY(dialog->findChild<QCheckBox*>("Check1")->isChecked());
        click("Check1");
        QVERIFY(shared().SemSeparadorDecimal);
        dialog->close();
        QTRY_VERIFY(!shared().frmImportarQuotas);  // unloaded
        QVERIFY(open()->findChild<QCheckBox*>("Check1")->isChecked() && !shared().SemSeparadorDecimal);
    }

    void dialogRunsOnTheSelectionAndCloses_data()
    {
        QTest::addColumn<Selection>("s");
        const QString none = QStringLiteral("None: Não foram processados os registos de quotas referente a %1 / %3.\n\n"
                                            "Gere primeiro as quotas de %2 de %3 (\"Gerar Quotas\").");
        QTest::newRow("February 2003") << Selection{"2003", "Fevereiro", "Plano de Saúde", "5.00", none.arg("2", "Fevereiro", "2003")};
        QTest::newRow("month name in other case: 0") << Selection{"2004", "março", "Plano de Saúde", "5.00", none.arg("0", "0", "2004")};
        QTest::newRow("union due, March 2004") << Selection{"2004", "Março", "Sindicato", "5.00", none.arg("3", "Março", "2004")};
        const QString posted = QStringLiteral("Information: Fim da importação de quotas.\n\nLinhas lançadas: 1\n"
                                              "Linhas deixadas como estavam (já lançadas): 0\nLinhas rejeitadas: 0");
        QTest::newRow("health plan, March 2004") << Selection{"2004", "Março", "Plano de Saúde", "5.00", posted, "5"};
        QTest::newRow("whole cents") << Selection{"2004", "Março", "Plano de Saúde", "500", posted, "5"};
        QTest::newRow("a file that cannot be read")
            << Selection{"2004", "Março", "Plano de Saúde", "\"5.00",
                         "Critical: O ficheiro \"<file>\" não é um ficheiro CSV válido: um valor entre aspas começado na linha 2 "
                         "não foi fechado."};
        QTest::newRow("Cancelar") << Selection{"2004", "Março", "Plano de Saúde", "5.00", "", "0", true};
    }
    void dialogRunsOnTheSelectionAndCloses()
    {
        QFETCH(Selection, s);
        charged(1, "100", 20.0, 0.0, 2);
        const QString path = useImportFile("no_tap;quota\n100;" + s.amount + "\n");
        open();
        if (s.month == "março")
            list("List2")->currentItem()->setText(s.month);
        pick("List1", s.year);
        pick("List2", s.month);
        pick("List3", s.type);
        if (!s.amount.contains('.'))
            click("Check1");
        ScriptedBoxes boxes;
        click(s.cancel ? "Command2" : "Command1");
        QTRY_VERIFY(!shared().frmImportarQuotas);  // closed after the run
        QCOMPARE(told(boxes), s.message.isEmpty() ? QStringList() : QStringList{s.message.replace("<file>", path)});
        QCOMPARE(rows("SELECT pago FROM tbQuotas_Movimentos"), QStringList{s.paid});
    }
};

QTEST_MAIN(ImportTest)
#include "tst_import.moc"
