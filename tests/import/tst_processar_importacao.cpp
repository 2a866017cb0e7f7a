// The import run on both engines: the checks on the source, the posting
// rules, the rejects and extras, exact matching, and concurrent users.

#include "import/processar_importacao.h"
#include "import_fixture.h"
#include "platform/errors.h"
#include "platform/transaction.h"
#include "support/recording_progress.h"
#include "support/scripted_boxes.h"

#include <QTest>

using namespace quotas;
using namespace quotas::test;

// A progress display that lets a second user act between two lines.
class SteppingProgress : public QObject {
    Q_OBJECT
public:
    static inline std::function<void(int)> afterLine;
    Q_INVOKABLE void Iniciar(int, const QString&, const QString& = QString()) { m_line = 0; }
    Q_INVOKABLE void setvalor(int)
    {
        if (afterLine)
            afterLine(++m_line);
    }
    Q_INVOKABLE void terminar() {}

private:
    int m_line = 0;
};

class ProcessarImportacaoTest : public QObject {
    Q_OBJECT

    std::unique_ptr<TestDatabase> db;
    std::unique_ptr<ImportFixture> f;
    QStringList listingLog;

    ImportSummary run(int month = 3, int year = 2004, int tipo = 1) { return ProcessarImportacao(month, year, tipo); }

private slots:
    void initTestCase()
    {
        db = std::make_unique<TestDatabase>();
        db->login();
        f = std::make_unique<ImportFixture>(ImportFixture{*db});
    }
    void cleanupTestCase()
    {
        f.reset();
        db.reset();
    }
    void init()
    {
        db->clear();
        RecordingProgress::install();
        shared().SemSeparadorDecimal = false;
        listingLog.clear();
        setRejectsListing([this] {
            listingLog << QStringLiteral("rows=%1 prints=%2")
                              .arg(f->c().scalar(QStringLiteral("SELECT COUNT(*) FROM extras")).toInt())
                              .arg(Data().SqlServer_Prints.state());
        });
    }
    void cleanup()
    {
        setRejectsListing({});
        SteppingProgress::afterLine = nullptr;
        RecordingProgress::uninstall();
    }

    void emptySourceSaysSoAndChangesNothing_data()
    {
        QTest::addColumn<QByteArray>("file");
        QTest::newRow("empty file") << QByteArray();
        QTest::newRow("header only") << QByteArray("no_tap;quota\r\n");
        QTest::newRow("header and blank lines") << QByteArray("no_tap;quota\n\n\n");
    }
    void emptySourceSaysSoAndChangesNothing()
    {
        QFETCH(QByteArray, file);
        f->charged(1, QStringLiteral("100"), 10.0);
        const QString before = f->snapshot();
        f->useFile(file);
        ScriptedBoxes boxes;
        run();
        QCOMPARE(boxes.texts(), QStringList{QStringLiteral("Não foram indicados registos para importar.")});
        QCOMPARE(boxes.last().icon, Icon::Information);
        QCOMPARE(RecordingProgress::log().created, 0);
        QCOMPARE(f->snapshot(), before);
    }

    void keyAndAmountColumnsAreNamedExactly_data()
    {
        QTest::addColumn<QByteArray>("header");
        QTest::newRow("No_tap") << QByteArray("No_tap;quota");
        QTest::newRow("QUOTA") << QByteArray("no_tap;QUOTA");
        QTest::newRow("no quota") << QByteArray("no_tap;rend1");
        QTest::newRow("no key") << QByteArray("numero;quota");
    }
    void keyAndAmountColumnsAreNamedExactly()
    {
        QFETCH(QByteArray, header);
        f->charged(1, QStringLiteral("100"), 10.0);
        const QString before = f->snapshot();
        f->useFile(header + "\n100;8.00\n");
        ScriptedBoxes boxes;
        run();
        QCOMPARE(boxes.texts(), QStringList{QStringLiteral("Não foram especificados os campos no_tap ou quota.")});
        QCOMPARE(boxes.last().icon, Icon::Information);
        QCOMPARE(f->snapshot(), before);
    }

    void aMonthWithNothingChargedIsNamed()
    {
        f->charged(1, QStringLiteral("100"), 10.0);
        f->c().execute(QStringLiteral("INSERT INTO extras (Field0) VALUES ('antes')"));
        const QString before = f->snapshot();
        f->useFile("no_tap;quota\n100;8.00\n999;1\n");
        ScriptedBoxes boxes;
        run(5, 2004, 1);
        QCOMPARE(boxes.texts(), QStringList{QStringLiteral("Não foram processados os registos de quotas referente a 5 / 2004.")});
        QCOMPARE(boxes.last().icon, Icon::None);
        QCOMPARE(RecordingProgress::log().calls,
                 (QStringList{QStringLiteral("Iniciar(2, Transferindo dados, aguarde uns momentos . . ., )"),
                              QStringLiteral("terminar()")}));
        QCOMPARE(f->snapshot(), before);
        QCOMPARE(f->extras(1), (QList<QStringList>{{QStringLiteral("antes")}}));
        QVERIFY(listingLog.isEmpty());
    }

    void postsByTheRules_data()
    {
        QTest::addColumn<QVariant>("quota");
        QTest::addColumn<QVariant>("pago");
        QTest::addColumn<QByteArray>("deducted");
        QTest::addColumn<bool>("wholeCents");
        QTest::addColumn<bool>("posted");
        QTest::addColumn<double>("expected");  // quota = pago after posting
        // name, charge, paid, file value, cents option, posted, amount
        QTest::newRow("unpaid 10.00, 8.00") << QVariant(10.0) << QVariant(0.0) << QByteArray("8.00") << false << true << 8.0;
        QTest::newRow("paid 10.00, 8.00 left") << QVariant(10.0) << QVariant(10.0) << QByteArray("8.00") << false << false << 0.0;
        QTest::newRow("paid 10.00, 12.00") << QVariant(10.0) << QVariant(10.0) << QByteArray("12.00") << false << true << 12.0;
        QTest::newRow("paid 10.00, 10.00 left") << QVariant(10.0) << QVariant(10.0) << QByteArray("10") << false << false << 0.0;
        QTest::newRow("0 on unpaid") << QVariant(10.0) << QVariant(0.0) << QByteArray("0") << false << false << 0.0;
        QTest::newRow("0 on unpaid 0") << QVariant(0.0) << QVariant(0.0) << QByteArray("0.00") << false << false << 0.0;
        QTest::newRow("whole cents 1250") << QVariant(10.0) << QVariant(0.0) << QByteArray("1250") << true << true << 12.5;
        QTest::newRow("point 12.50") << QVariant(10.0) << QVariant(0.0) << QByteArray("12.50") << false << true << 12.5;
        QTest::newRow("comma 12,50") << QVariant(10.0) << QVariant(0.0) << QByteArray("\"12,50\"") << false << true << 12.5;
        QTest::newRow("cents of a large amount") << QVariant(10.0) << QVariant(0.0) << QByteArray("123456.78") << false
                                                 << true << 123456.78;
        QTest::newRow("Null charge and payment") << kNull << kNull << QByteArray("8") << false << true << 8.0;
    }
    void postsByTheRules()
    {
        QFETCH(QVariant, quota);
        QFETCH(QVariant, pago);
        QFETCH(QByteArray, deducted);
        QFETCH(bool, wholeCents);
        QFETCH(bool, posted);
        QFETCH(double, expected);
        f->member(1, QStringLiteral("100"));
        f->movement(1, 2004, 3, 1, quota, pago);
        f->account(1, 40.0, 30.0);
        const QString before = f->snapshot();
        f->useFile("no_tap;quota;nome\n100;" + deducted + ";Ana\n");
        shared().SemSeparadorDecimal = wholeCents;
        ScriptedBoxes boxes;
        const ImportSummary summary = run();
        QVERIFY(boxes.shown.isEmpty());
        QCOMPARE(summary.posted, posted ? 1 : 0);
        if (!posted) {
            QCOMPARE(f->snapshot(), before);
            return;
        }
        QCOMPARE(f->cents(f->movementValue(1, QStringLiteral("quota"))), std::llround(expected * 100));
        QCOMPARE(f->cents(f->movementValue(1, QStringLiteral("pago"))), std::llround(expected * 100));
        QCOMPARE(f->cents(f->movementValue(1, QStringLiteral("rend2"))), 0);
        // The old charge leaves the total, the deduction enters it and the payments.
        const double oldCharge = quota.isNull() ? 0.0 : quota.toDouble();
        QCOMPARE(f->cents(f->accountValue(1, QStringLiteral("total_quotas"))), std::llround((40.0 - oldCharge + expected) * 100));
        QCOMPARE(f->cents(f->accountValue(1, QStringLiteral("total_pago"))), std::llround((30.0 + expected) * 100));
        QCOMPARE(f->cents(f->accountValue(1, QStringLiteral("ult_quota_sindicato"))), std::llround(expected * 100));
        QCOMPARE(f->accountValue(1, QStringLiteral("ult_ano")).toInt(), 2004);
        QCOMPARE(f->accountValue(1, QStringLiteral("ult_mes")).toInt(), 3);
        // Without rend1 in the file the movement takes the account's last one.
        QCOMPARE(f->cents(f->movementValue(1, QStringLiteral("rend1"))), 100000);
    }

    void rend1SetsTheRemunerationAndTheRate()
    {
        f->charged(1, QStringLiteral("100"), 10.0);
        f->useFile("no_tap;quota;rend1\n100;30.00;1500.00\n");
        ScriptedBoxes boxes;
        run();
        QCOMPARE(f->cents(f->movementValue(1, QStringLiteral("rend1"))), 150000);
        QCOMPARE(f->cents(f->movementValue(1, QStringLiteral("rend2"))), 0);
        QCOMPARE(f->cents(f->accountValue(1, QStringLiteral("ult_rend1"))), 150000);
        QCOMPARE(f->cents(f->accountValue(1, QStringLiteral("ult_rend2"))), 0);
        QCOMPARE(f->accountValue(1, QStringLiteral("ult_perc_sindicato")).toDouble(), 0.02);
    }

    void theRateStaysWhenTheRemunerationsSumToZero()
    {
        f->member(1, QStringLiteral("100"));
        f->movement(1, 2004, 3, 1, 10.0, 0.0);
        f->account(1, 10.0, 0.0, 0.0, 0.0);
        f->useFile("no_tap;quota\n100;8.00\n");
        ScriptedBoxes boxes;
        run();
        QCOMPARE(f->accountValue(1, QStringLiteral("ult_perc_sindicato")).toDouble(), 0.015);
        QCOMPARE(f->cents(f->accountValue(1, QStringLiteral("ult_quota_sindicato"))), 800);
        QCOMPARE(f->cents(f->accountValue(1, QStringLiteral("total_pago"))), 800);
        QCOMPARE(f->cents(f->movementValue(1, QStringLiteral("pago"))), 800);
    }

    void theTypeChoosesTheColumns_data()
    {
        QTest::addColumn<int>("tipo");
        QTest::newRow("Sindicato") << 1;
        QTest::newRow("Plano de Saúde") << 2;
    }
    void theTypeChoosesTheColumns()
    {
        QFETCH(int, tipo);
        f->member(1, QStringLiteral("100"));
        f->movement(1, 2004, 3, 1, 10.0, 0.0);
        f->movement(1, 2004, 3, 2, 20.0, 0.0);
        f->account(1, 30.0, 0.0, 800.0, 200.0);
        f->useFile("no_tap;quota\n100;5.00\n");
        ScriptedBoxes boxes;
        run(3, 2004, tipo);
        const QString posted = tipo == 1 ? QStringLiteral("sindicato") : QStringLiteral("seguro");
        const QString kept = tipo == 1 ? QStringLiteral("seguro") : QStringLiteral("sindicato");
        QCOMPARE(f->cents(f->accountValue(1, QStringLiteral("ult_quota_") + posted)), 500);
        QCOMPARE(f->accountValue(1, QStringLiteral("ult_perc_") + posted).toDouble(), 0.005);
        QCOMPARE(f->cents(f->accountValue(1, QStringLiteral("ult_quota_") + kept)), tipo == 1 ? 222 : 111);
        QCOMPARE(f->accountValue(1, QStringLiteral("ult_perc_") + kept).toDouble(), tipo == 1 ? 0.02 : 0.015);
        // Only the movement of the chosen type is touched.
        QCOMPARE(f->cents(f->movementValue(1, QStringLiteral("pago"), tipo)), 500);
        QCOMPARE(f->cents(f->movementValue(1, QStringLiteral("pago"), 3 - tipo)), 0);
    }

    void rejectedLinesAreCountedKeptAndListed()
    {
        f->charged(1, QStringLiteral("100"), 10.0);
        f->charged(2, QStringLiteral("200"), 10.0);
        f->member(3, QStringLiteral("300"));  // charged, but without an account
        f->movement(3, 2004, 3, 1, 10.0, 0.0);
        f->charged(4, QStringLiteral("400"), 10.0);
        f->c().execute(QStringLiteral("INSERT INTO extras (Field0) VALUES ('da última vez')"));
        f->useFile("no_tap;quota;nome;obs\n"
                   "100;8.00;Ana;\n"
                   "999;7.00;Desconhecido;x\n"
                   "200;abc;Rui;y\n"   // unreadable: must not take Ana's 8.00
                   "300;6.00;Sem conta;z\n"
                   "400;;Vazio\n");    // an empty amount, and a short line: obs is Null
        ScriptedBoxes boxes;
        const ImportSummary summary = run();
        QCOMPARE(boxes.texts(), QStringList{QStringLiteral(
                                    "Durante o processo de importação de dados não foram registados 4 associados.")});
        QCOMPARE(boxes.last().icon, Icon::Critical);
        QCOMPARE(summary.posted, 1);
        QCOMPARE(summary.rejected, 4);
        const QList<QStringList> expected = {
            {QStringLiteral("999"), QStringLiteral("7.00"), QStringLiteral("Desconhecido"), QStringLiteral("x")},
            {QStringLiteral("200"), QStringLiteral("abc"), QStringLiteral("Rui"), QStringLiteral("y")},
            {QStringLiteral("300"), QStringLiteral("6.00"), QStringLiteral("Sem conta"), QStringLiteral("z")},
            {QStringLiteral("400"), QString(), QStringLiteral("Vazio"), QStringLiteral("<null>")}};
        QCOMPARE(f->extras(), expected);
        QCOMPARE(f->cents(f->movementValue(2, QStringLiteral("pago"))), 0);
        QCOMPARE(f->cents(f->movementValue(3, QStringLiteral("pago"))), 0);
        QCOMPARE(f->cents(f->movementValue(4, QStringLiteral("quota"))), 1000);
        // The listing comes after extras was rewritten, on an open SqlServer_Prints, closed again after.
        QCOMPARE(listingLog, QStringList{QStringLiteral("rows=4 prints=1")});
        QCOMPARE(Data().SqlServer_Prints.state(), 0);
    }

    void onlyTwentyOneValuesOfALineAreKept()
    {
        QByteArray header = "no_tap;quota";
        QByteArray line = "999;1";
        for (int i = 2; i < 25; ++i) {
            header += ";c" + QByteArray::number(i);
            line += ";v" + QByteArray::number(i);
        }
        f->charged(1, QStringLiteral("100"), 10.0);
        f->useFile(header + '\n' + line + '\n');
        ScriptedBoxes boxes;
        run();
        const QList<QStringList> rows = f->extras(21);
        QCOMPARE(rows.size(), 1);
        QCOMPARE(rows[0].front(), QStringLiteral("999"));
        QCOMPARE(rows[0].back(), QStringLiteral("v20"));
    }

    void extrasIsKeptWhenNothingIsRejected()
    {
        f->charged(1, QStringLiteral("100"), 10.0);
        f->c().execute(QStringLiteral("INSERT INTO extras (Field0, Field1) VALUES ('777', '1.00')"));
        f->useFile("no_tap;quota\n100;8.00\n");
        ScriptedBoxes boxes;
        run();
        QVERIFY(boxes.shown.isEmpty());
        QCOMPARE(f->extras(2), (QList<QStringList>{{QStringLiteral("777"), QStringLiteral("1.00")}}));
        QVERIFY(listingLog.isEmpty());
    }

    // Regression: the key went into the search criterion between quotes.
    void aKeyWithAQuoteMatchesOnlyThatStaffNumber()
    {
        f->charged(1, QStringLiteral("x'y"), 10.0);
        f->charged(2, QStringLiteral("200"), 10.0);
        f->useFile("no_tap;quota\n\"x' OR '1'='1\";9.00\nx'y;8.00\n'200';7.00\n");
        ScriptedBoxes boxes;
        const ImportSummary summary = run();
        QCOMPARE(summary.posted, 1);
        QCOMPARE(f->cents(f->movementValue(1, QStringLiteral("pago"))), 800);
        QCOMPARE(f->cents(f->movementValue(2, QStringLiteral("pago"))), 0);
        QCOMPARE(f->extras(1), (QList<QStringList>{{QStringLiteral("x' OR '1'='1")}, {QStringLiteral("'200'")}}));
    }

    // Regression: the account was looked up by staff number, so two members
    // sharing one could see the movement of one posted to the other's account.
    void theAccountIsTheMovementMembers()
    {
        f->member(2, QStringLiteral("555"));  // no movement this month
        f->account(2, 0.0, 0.0);
        f->member(1, QStringLiteral("555"));
        f->movement(1, 2004, 3, 1, 10.0, 0.0);
        f->account(1, 10.0, 0.0);
        f->useFile("no_tap;quota\n555;8.00\n");
        ScriptedBoxes boxes;
        run();
        QCOMPARE(f->cents(f->accountValue(1, QStringLiteral("total_pago"))), 800);
        QCOMPARE(f->cents(f->accountValue(2, QStringLiteral("total_pago"))), 0);
    }

    void reimportingTheSameListChangesNothing()
    {
        f->charged(1, QStringLiteral("100"), 10.0);
        f->charged(2, QStringLiteral("200"), 10.0, 10.0);
        f->useFile("no_tap;quota;rend1\n100;8.00;900\n200;12.00;1100\n999;1;1\n");
        {
            ScriptedBoxes boxes;
            QCOMPARE(run().posted, 2);
        }
        const QString once = f->snapshot();
        const QList<QStringList> extras = f->extras();
        ScriptedBoxes boxes;
        QCOMPARE(run().posted, 0);
        QCOMPARE(f->snapshot(), once);
        QCOMPARE(f->extras(), extras);
    }

    void progressFollowsTheLines()
    {
        f->charged(1, QStringLiteral("100"), 10.0);
        f->useFile("no_tap;quota\n100;8\n999;1\n100;9\n");
        ScriptedBoxes boxes;
        run();
        QCOMPARE(RecordingProgress::log().calls,
                 (QStringList{QStringLiteral("Iniciar(3, Transferindo dados, aguarde uns momentos . . ., )"),
                              QStringLiteral("setvalor(1)"), QStringLiteral("setvalor(1)"), QStringLiteral("setvalor(1)"),
                              QStringLiteral("terminar()")}));
        // The second line of the same member follows the first: 9 exceeds 8.
        QCOMPARE(f->cents(f->movementValue(1, QStringLiteral("pago"))), 900);
        QCOMPARE(f->cents(f->accountValue(1, QStringLiteral("total_quotas"))), 900);
    }

    void aPaymentRecordedMeanwhileIsKept()
    {
        f->charged(1, QStringLiteral("100"), 10.0);
        f->charged(2, QStringLiteral("200"), 10.0);
        auto other = db->openAnother();
        registerComponent(QStringLiteral("Velumo.General"), [] { return std::make_unique<SteppingProgress>(); });
        SteppingProgress::afterLine = [&](int line) {
            if (line == 1)
                other->execute(QStringLiteral("UPDATE tbQuotas_Socios SET total_pago = total_pago + 5 WHERE socio_id = 2"));
        };
        f->useFile("no_tap;quota\n100;8.00\n200;8.00\n");
        ScriptedBoxes boxes;
        QCOMPARE(run().posted, 2);
        QCOMPARE(f->cents(f->accountValue(2, QStringLiteral("total_pago"))), 1300);
        QCOMPARE(f->cents(f->accountValue(2, QStringLiteral("total_quotas"))), 800);
    }

    // Regression: a line whose account could not be saved stayed half posted.
    void aLineWhoseWritesFailIsRolledBackAndListed()
    {
        f->charged(1, QStringLiteral("100"), 10.0);
        f->charged(2, QStringLiteral("200"), 10.0);
        f->charged(3, QStringLiteral("300"), 10.0);
        auto other = db->openAnother();
        registerComponent(QStringLiteral("Velumo.General"), [] { return std::make_unique<SteppingProgress>(); });
        SteppingProgress::afterLine = [&](int line) {
            if (line == 1)  // another user edits member 2's remuneration
                other->execute(QStringLiteral("UPDATE tbQuotas_Socios SET ult_rend1 = 777 WHERE socio_id = 2"));
        };
        f->useFile("no_tap;quota;rend1\n100;8.00;900\n200;8.00;900\n300;8.00;900\n200;9.00;900\n");
        ScriptedBoxes boxes;
        const ImportSummary summary = run();
        QCOMPARE(summary.failed, 1);
        QCOMPARE(summary.posted, 3);
        QCOMPARE(boxes.texts(), QStringList{QStringLiteral(
                                    "Durante o processo de importação de dados não foram registados 1 associados.")});
        QCOMPARE(f->extras(2), (QList<QStringList>{{QStringLiteral("200"), QStringLiteral("8.00")}}));
        // The last line of member 2 is posted on what the database holds.
        QCOMPARE(f->cents(f->movementValue(2, QStringLiteral("pago"))), 900);
        QCOMPARE(f->cents(f->accountValue(2, QStringLiteral("total_quotas"))), 900);
        QCOMPARE(f->cents(f->accountValue(2, QStringLiteral("total_pago"))), 900);
        QCOMPARE(f->cents(f->movementValue(3, QStringLiteral("pago"))), 800);
    }

    // Regression: extras was emptied row by row and refilled outside any
    // transaction, so a failure could leave it half written.
    void extrasIsRewrittenWhollyOrNotAtAll()
    {
        if (engineUnderTest() == Engine::SQLite) {
            f->c().execute(QStringLiteral("CREATE TRIGGER refuse BEFORE INSERT ON extras WHEN NEW.Field0 = 'boom' "
                                          "BEGIN SELECT RAISE(ABORT, 'boom'); END"));
        } else {
            f->c().execute(QStringLiteral("CREATE FUNCTION refuse() RETURNS trigger AS $$ BEGIN IF NEW.field0 = 'boom' "
                                          "THEN RAISE EXCEPTION 'boom'; END IF; RETURN NEW; END $$ LANGUAGE plpgsql"));
            f->c().execute(QStringLiteral("CREATE TRIGGER refuse BEFORE INSERT ON extras FOR EACH ROW EXECUTE FUNCTION refuse()"));
        }
        f->charged(1, QStringLiteral("100"), 10.0);
        f->c().execute(QStringLiteral("INSERT INTO extras (Field0) VALUES ('a'), ('b')"));
        f->useFile("no_tap;quota\n998;1\nboom;1\n100;8\n");
        ScriptedBoxes boxes;
        const ImportSummary summary = run();
        QVERIFY(!summary.extrasSaved);
        QCOMPARE(boxes.shown.size(), 2);
        QCOMPARE(boxes.last().icon, Icon::Critical);
        QVERIFY(boxes.last().text.startsWith(QStringLiteral("Não foi possível gravar os registos não importados")));
        QCOMPARE(f->extras(1), (QList<QStringList>{{QStringLiteral("a")}, {QStringLiteral("b")}}));
        QVERIFY(listingLog.isEmpty());
        QCOMPARE(f->cents(f->movementValue(1, QStringLiteral("pago"))), 800);
    }

    void aListingThatFailsIsReported()
    {
        f->charged(1, QStringLiteral("100"), 10.0);
        f->useFile("no_tap;quota\n999;1\n");
        setRejectsListing([] { throw QuotasError(QStringLiteral("sem impressora")); });
        ScriptedBoxes boxes;
        run();
        QCOMPARE(boxes.shown.size(), 2);
        QCOMPARE(boxes.last().icon, Icon::Exclamation);
        QVERIFY(boxes.last().text.endsWith(QStringLiteral("sem impressora")));
        QCOMPARE(Data().SqlServer_Prints.state(), 0);
        QCOMPARE(f->extras(1), (QList<QStringList>{{QStringLiteral("999")}}));
    }

    void aCancelledChoiceImportsNothingAndSaysNothing()
    {
        f->charged(1, QStringLiteral("100"), 10.0);
        const QString before = f->snapshot();
        registerComponent(QStringLiteral("Dorvanta.General"),
                          [] { return std::make_unique<CsvImportSource>([] { return QString(); }); });
        ScriptedBoxes boxes;
        run();
        QVERIFY(boxes.shown.isEmpty());
        QCOMPARE(RecordingProgress::log().created, 0);
        QCOMPARE(f->snapshot(), before);
    }

    void aMalformedFileImportsNothing()
    {
        f->charged(1, QStringLiteral("100"), 10.0);
        const QString before = f->snapshot();
        f->useFile("no_tap;quota\n100;8.00\n200;\"9\n");
        ScriptedBoxes boxes;
        QVERIFY_THROWS_EXCEPTION(QuotasError, run());
        QVERIFY(boxes.shown.isEmpty());
        QCOMPARE(f->snapshot(), before);
    }
};

QTEST_MAIN(ProcessarImportacaoTest)
#include "tst_processar_importacao.moc"
