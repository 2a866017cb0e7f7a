// The import run on both engines: the checks on the source, the posting
// rules, the rejects and extras, exact matching, and concurrent users.

#include "import/processar_importacao.h"
#include "import_fixture.h"
#include "platform/errors.h"
#include "support/recording_progress.h"
#include "support/scripted_boxes.h"

#include <QTest>

using namespace quotas;
using namespace quotas::test;

// A progress display that lets a second user act after a given line.
class SteppingProgress : public QObject {
    Q_OBJECT
public:
    static inline std::function<void()> afterFirstLine;
    static void install(std::function<void()> action)
    {
        afterFirstLine = std::move(action);
        registerComponent(QStringLiteral("Velumo.General"), [] { return std::make_unique<SteppingProgress>(); });
    }
    Q_INVOKABLE void Iniciar(int, const QString&) {}
    Q_INVOKABLE void setvalor(int)
    {
        if (++m_lines == 1 && afterFirstLine)
            afterFirstLine();
    }
    Q_INVOKABLE void terminar() {}

private:
    int m_lines = 0;
};

class ProcessarImportacaoTest : public QObject {
    Q_OBJECT

    std::unique_ptr<TestDatabase> db;
    std::unique_ptr<ImportFixture> f;
    QStringList listings;

    static ImportSummary run(int month = 3, int year = 2004, int tipo = 1) { return ProcessarImportacao(month, year, tipo); }
    static QString rejectedMessage(int n)
    {
        return QStringLiteral("Durante o processo de importação de dados não foram registados %1 associados.").arg(n);
    }

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
        listings.clear();
        setRejectsListing([this] {
            listings << QStringLiteral("rows=%1 prints=%2")
                            .arg(f->c().scalar(QStringLiteral("SELECT COUNT(*) FROM extras")).toInt())
                            .arg(Data().SqlServer_Prints.state());
        });
    }
    void cleanup()
    {
        setRejectsListing({});
        SteppingProgress::afterFirstLine = nullptr;
        RecordingProgress::uninstall();
    }

    void refusesASourceWithoutLinesOrColumns_data()
    {
        QTest::addColumn<QByteArray>("file");
        QTest::addColumn<QString>("message");
        const QString noLines = QStringLiteral("Não foram indicados registos para importar.");
        const QString noColumns = QStringLiteral("Não foram especificados os campos no_tap ou quota.");
        QTest::newRow("empty file") << QByteArray() << noLines;
        QTest::newRow("header only") << QByteArray("no_tap;quota\r\n\r\n") << noLines;
        QTest::newRow("No_tap") << QByteArray("No_tap;quota\n100;8\n") << noColumns;
        QTest::newRow("QUOTA") << QByteArray("no_tap;QUOTA\n100;8\n") << noColumns;
        QTest::newRow("no quota") << QByteArray("no_tap;rend1\n100;8\n") << noColumns;
    }
    void refusesASourceWithoutLinesOrColumns()
    {
        QFETCH(QByteArray, file);
        QFETCH(QString, message);
        f->charged(1, QStringLiteral("100"), 10.0);
        const QString before = f->snapshot();
        f->useFile(file);
        ScriptedBoxes boxes;
        run();
        QCOMPARE(boxes.texts(), QStringList{message});
        QCOMPARE(boxes.last().icon, Icon::Information);
        QCOMPARE(RecordingProgress::log().created, 0);
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
        QCOMPARE(RecordingProgress::log().calls, (QStringList{QStringLiteral("Iniciar(2, Transferindo dados, aguarde uns momentos . . ., )"),
                                                              QStringLiteral("terminar()")}));
        QCOMPARE(f->snapshot(), before);
        QCOMPARE(f->extras(), QList<QStringList>{{QStringLiteral("antes")}});
        QVERIFY(listings.isEmpty());
    }

    void postsByTheRules_data()
    {
        QTest::addColumn<QVariant>("quota");
        QTest::addColumn<QVariant>("pago");
        QTest::addColumn<QByteArray>("deducted");
        QTest::addColumn<bool>("wholeCents");
        QTest::addColumn<int>("posted");  // quota = pago afterwards, in cents; -1 left alone
        QTest::newRow("unpaid 10.00, 8.00") << QVariant(10.0) << QVariant(0.0) << QByteArray("8.00") << false << 800;
        QTest::newRow("paid 10.00, 8.00") << QVariant(10.0) << QVariant(10.0) << QByteArray("8.00") << false << -1;
        QTest::newRow("paid 10.00, 12.00") << QVariant(10.0) << QVariant(10.0) << QByteArray("12.00") << false << 1200;
        QTest::newRow("0 on unpaid") << QVariant(10.0) << QVariant(0.0) << QByteArray("0") << false << -1;
        QTest::newRow("whole cents 1250") << QVariant(10.0) << QVariant(0.0) << QByteArray("1250") << true << 1250;
        QTest::newRow("comma 12,50") << QVariant(10.0) << QVariant(0.0) << QByteArray("\"12,50\"") << false << 1250;
        QTest::newRow("beyond single precision") << QVariant(10.0) << QVariant(0.0) << QByteArray("123456.78") << false
                                                 << 12345678;
        QTest::newRow("Null charge and payment") << kNull << kNull << QByteArray("8") << false << 800;
    }
    void postsByTheRules()
    {
        QFETCH(QVariant, quota);
        QFETCH(QVariant, pago);
        QFETCH(QByteArray, deducted);
        QFETCH(bool, wholeCents);
        QFETCH(int, posted);
        f->member(1, QStringLiteral("100"));
        f->movement(1, 1, quota, pago);
        f->account(1, 40.0, 30.0);
        const QString before = f->snapshot();
        f->useFile("no_tap;quota;nome\n100;" + deducted + ";Ana\n");
        shared().SemSeparadorDecimal = wholeCents;
        ScriptedBoxes boxes;
        QCOMPARE(run().posted, posted < 0 ? 0 : 1);
        QVERIFY(boxes.shown.isEmpty());
        if (posted < 0) {
            QCOMPARE(f->snapshot(), before);
            return;
        }
        QCOMPARE(f->movementCents(1, "quota"), posted);
        QCOMPARE(f->movementCents(1, "pago"), posted);
        QCOMPARE(f->movementCents(1, "rend2"), 0);
        QCOMPARE(f->movementCents(1, "rend1"), 100000);  // the account's, without rend1 in the file
        // The old charge leaves the total, the deduction enters it and the payments.
        QCOMPARE(f->accountCents(1, "total_quotas"), 4000 - std::llround(quota.toDouble() * 100) + posted);
        QCOMPARE(f->accountCents(1, "total_pago"), 3000 + posted);
        QCOMPARE(f->accountCents(1, "ult_quota_sindicato"), posted);
        QCOMPARE(f->accountValue(1, "ult_ano").toInt(), 2004);
        QCOMPARE(f->accountValue(1, "ult_mes").toInt(), 3);
    }

    void theRateFollowsTheRemunerations_data()
    {
        QTest::addColumn<QByteArray>("file");
        QTest::addColumn<double>("rend1");  // the account's before
        QTest::addColumn<int>("remuneration");  // rend1 afterwards, in cents
        QTest::addColumn<double>("rate");
        QTest::newRow("rend1 in the file") << QByteArray("no_tap;quota;rend1\n100;30.00;1500.00\n") << 1000.0 << 150000 << 0.02;
        QTest::newRow("remunerations 0: the rate stays") << QByteArray("no_tap;quota\n100;8\n") << 0.0 << 0 << 0.015;
    }
    void theRateFollowsTheRemunerations()
    {
        QFETCH(QByteArray, file);
        QFETCH(double, rend1);
        QFETCH(int, remuneration);
        QFETCH(double, rate);
        f->member(1, QStringLiteral("100"));
        f->movement(1, 1, 10.0, 0.0);
        f->account(1, 10.0, 0.0, rend1, 0.0);
        f->useFile(file);
        ScriptedBoxes boxes;
        QCOMPARE(run().posted, 1);
        QCOMPARE(f->movementCents(1, "rend1"), remuneration);
        QCOMPARE(f->accountCents(1, "ult_rend1"), remuneration);
        QCOMPARE(f->accountCents(1, "ult_rend2"), 0);
        QCOMPARE(f->accountValue(1, "ult_perc_sindicato").toDouble(), rate);
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
        f->movement(1, 1, 10.0, 0.0);
        f->movement(1, 2, 20.0, 0.0);
        f->account(1, 30.0, 0.0, 800.0, 200.0);
        f->useFile("no_tap;quota\n100;5.00\n");
        ScriptedBoxes boxes;
        run(3, 2004, tipo);
        const bool union_ = tipo == 1;
        QCOMPARE(f->accountCents(1, union_ ? "ult_quota_sindicato" : "ult_quota_seguro"), 500);
        QCOMPARE(f->accountValue(1, union_ ? "ult_perc_sindicato" : "ult_perc_seguro").toDouble(), 0.005);
        QCOMPARE(f->accountCents(1, union_ ? "ult_quota_seguro" : "ult_quota_sindicato"), union_ ? 222 : 111);
        QCOMPARE(f->accountValue(1, union_ ? "ult_perc_seguro" : "ult_perc_sindicato").toDouble(), union_ ? 0.02 : 0.015);
        QCOMPARE(f->movementCents(1, "pago", tipo), 500);
        QCOMPARE(f->movementCents(1, "pago", 3 - tipo), 0);
    }

    void rejectedLinesAreCountedKeptAndListed()
    {
        f->charged(1, QStringLiteral("100"), 10.0);
        f->charged(2, QStringLiteral("200"), 10.0);
        f->member(3, QStringLiteral("300"));  // charged, but without an account
        f->movement(3, 1, 10.0, 0.0);
        f->charged(4, QStringLiteral("400"), 10.0);
        f->c().execute(QStringLiteral("INSERT INTO extras (Field0) VALUES ('da última vez')"));
        f->useFile("no_tap;quota;nome;obs\n"
                   "100;8.00;Ana;\n"
                   "999;7.00;Desconhecido;x\n"
                   "200;abc;Rui;y\n"  // unreadable: must not take Ana's 8.00
                   "300;6.00;Sem conta;z\n"
                   "400;;Vazio\n");  // an empty amount; the short line leaves obs Null
        ScriptedBoxes boxes;
        const ImportSummary summary = run();
        QCOMPARE(boxes.texts(), QStringList{rejectedMessage(4)});
        QCOMPARE(boxes.last().icon, Icon::Critical);
        QCOMPARE(summary.posted, 1);
        QCOMPARE(RecordingProgress::log().calls,
                 (QStringList{QStringLiteral("Iniciar(5, Transferindo dados, aguarde uns momentos . . ., )"), "setvalor(1)",
                              "setvalor(1)", "setvalor(1)", "setvalor(1)", "setvalor(1)", "terminar()"}));
        QCOMPARE(f->extras(4), (QList<QStringList>{{"999", "7.00", "Desconhecido", "x"},
                                                   {"200", "abc", "Rui", "y"},
                                                   {"300", "6.00", "Sem conta", "z"},
                                                   {"400", "", "Vazio", "<null>"}}));
        QCOMPARE(f->movementCents(2, "pago") + f->movementCents(3, "pago") + f->movementCents(4, "pago"), 0);
        // The listing comes after extras was rewritten, on an open SqlServer_Prints, closed after.
        QCOMPARE(listings, QStringList{QStringLiteral("rows=4 prints=1")});
        QCOMPARE(Data().SqlServer_Prints.state(), 0);
    }

    void onlyTwentyOneValuesOfALineAreKept()
    {
        QByteArray header = "no_tap;quota", line = "999;1";
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
        QCOMPARE(rows[0].back(), QStringLiteral("v20"));
    }

    // Regression: the key went into the search criterion between quotes.
    void aKeyWithAQuoteMatchesOnlyThatStaffNumber()
    {
        f->charged(1, QStringLiteral("x'y"), 10.0);
        f->charged(2, QStringLiteral("200"), 10.0);
        f->useFile("no_tap;quota\n\"x' OR '1'='1\";9.00\nx'y;8.00\n'200';7.00\n");
        ScriptedBoxes boxes;
        QCOMPARE(run().posted, 1);
        QCOMPARE(f->movementCents(1, "pago"), 800);
        QCOMPARE(f->movementCents(2, "pago"), 0);
        QCOMPARE(f->extras(), (QList<QStringList>{{"x' OR '1'='1"}, {"'200'"}}));
    }

    // Regression: the account was looked up by staff number, so a number two
    // members share could post one member's movement to the other's account.
    void theAccountIsTheMovementMembers()
    {
        f->member(2, QStringLiteral("555"));  // no movement this month
        f->account(2, 0.0, 0.0);
        f->charged(1, QStringLiteral("555"), 10.0);
        f->c().execute(QStringLiteral("INSERT INTO extras (Field0) VALUES ('777')"));
        f->useFile("no_tap;quota\n555;8.00\n");
        ScriptedBoxes boxes;
        run();
        QCOMPARE(f->accountCents(1, "total_pago"), 800);
        QCOMPARE(f->accountCents(2, "total_pago"), 0);
        // Nothing rejected: no message, extras as it was, no listing.
        QVERIFY(boxes.shown.isEmpty());
        QCOMPARE(f->extras(), QList<QStringList>{{QStringLiteral("777")}});
        QVERIFY(listings.isEmpty());
    }

    void reimportingTheSameListChangesNothing()
    {
        f->charged(1, QStringLiteral("100"), 10.0);
        f->charged(2, QStringLiteral("200"), 10.0, 10.0);
        f->useFile("no_tap;quota;rend1\n100;8.00;900\n200;12.00;1100\n999;1;1\n");
        ScriptedBoxes boxes;
        QCOMPARE(run().posted, 2);
        const QString once = f->snapshot();
        QCOMPARE(run().posted, 0);
        QCOMPARE(f->snapshot(), once);
        QCOMPARE(f->extras(), QList<QStringList>{{QStringLiteral("999")}});
    }

    void aPaymentRecordedMeanwhileIsKept()
    {
        f->charged(1, QStringLiteral("100"), 10.0);
        f->charged(2, QStringLiteral("200"), 10.0);
        auto other = db->openAnother();
        SteppingProgress::install([&] {
            other->execute(QStringLiteral("UPDATE tbQuotas_Socios SET total_pago = total_pago + 5 WHERE socio_id = 2"));
        });
        f->useFile("no_tap;quota\n100;8.00\n200;8.00\n");
        ScriptedBoxes boxes;
        QCOMPARE(run().posted, 2);
        QCOMPARE(f->accountCents(2, "total_pago"), 1300);
        QCOMPARE(f->accountCents(2, "total_quotas"), 800);
    }

    // Regression: a line whose account could not be saved stayed half posted.
    void aLineWhoseWritesFailIsRolledBackAndListed()
    {
        f->charged(1, QStringLiteral("100"), 10.0);
        f->charged(2, QStringLiteral("200"), 10.0);
        f->charged(3, QStringLiteral("300"), 10.0);
        auto other = db->openAnother();
        SteppingProgress::install([&] {  // another user edits member 2's remuneration
            other->execute(QStringLiteral("UPDATE tbQuotas_Socios SET ult_rend1 = 777 WHERE socio_id = 2"));
        });
        f->useFile("no_tap;quota;rend1\n100;8.00;900\n200;8.00;900\n300;8.00;900\n200;9.00;900\n");
        ScriptedBoxes boxes;
        const ImportSummary summary = run();
        QCOMPARE(summary.failed, 1);
        QCOMPARE(summary.posted, 3);
        QCOMPARE(boxes.texts(), QStringList{rejectedMessage(1)});
        QCOMPARE(f->extras(2), (QList<QStringList>{{"200", "8.00"}}));
        // Member 2's later line is posted on what the database holds.
        QCOMPARE(f->movementCents(2, "pago"), 900);
        QCOMPARE(f->accountCents(2, "total_quotas"), 900);
        QCOMPARE(f->accountCents(2, "total_pago"), 900);
        QCOMPARE(f->movementCents(3, "pago"), 800);
    }

    // Regression: extras was emptied and refilled row by row outside any
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
        QVERIFY(!run().extrasSaved);
        QCOMPARE(boxes.shown.size(), 2);
        QCOMPARE(boxes.last().icon, Icon::Critical);
        QVERIFY(boxes.last().text.startsWith(QStringLiteral("Não foi possível gravar os registos não importados")));
        QCOMPARE(f->extras(), (QList<QStringList>{{"a"}, {"b"}}));
        QVERIFY(listings.isEmpty());
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
};

QTEST_MAIN(ProcessarImportacaoTest)
#include "tst_processar_importacao.moc"
