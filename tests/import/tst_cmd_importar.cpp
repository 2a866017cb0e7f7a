// "quotas importar" as a script runs it: options, messages on stdout, exit
// status, and the rejects listing to a PDF.

#include "import_fixture.h"

#include <QProcess>
#include <QTest>

using namespace quotas;
using namespace quotas::test;

class CmdImportarTest : public QObject {
    Q_OBJECT

    std::unique_ptr<TestDatabase> db;
    std::unique_ptr<ImportFixture> f;
    QString registry;

    struct Result {
        int status = -1;
        QString out;
        QString err;
    };
    Result quotas(const QStringList& args)
    {
        QProcess p;
        p.start(QStringLiteral(QUOTAS_CLI_BINARY), QStringList{"--registry", registry, "importar"} + args);
        p.waitForFinished(60000);
        return {p.exitCode(), QString::fromUtf8(p.readAllStandardOutput()), QString::fromUtf8(p.readAllStandardError())};
    }

private slots:
    void initTestCase()
    {
        db = std::make_unique<TestDatabase>();
        registry = db->useAsSettings();
        f = std::make_unique<ImportFixture>(ImportFixture{*db});
    }
    void cleanupTestCase()
    {
        f.reset();
        db.reset();
    }
    void init() { db->clear(); }

    void refusesBadUsage_data()
    {
        QTest::addColumn<QStringList>("args");
        QTest::newRow("month 13") << QStringList{"--ano", "2004", "--mes", "13", "--tipo", "1", "f.csv"};
        QTest::newRow("no file") << QStringList{"--ano", "2004", "--mes", "3", "--tipo", "1"};
    }
    void refusesBadUsage()
    {
        QFETCH(QStringList, args);
        QCOMPARE(quotas(args).status, 2);
    }

    void printsTheRunsMessagesAndPosts()
    {
        f->charged(1, QStringLiteral("100"), 10.0);
        const QString file = f->useFile("no_tap;quota\n100;800\n999;100\n");
        const Result r = quotas({"--ano", "2004", "--mes", "3", "--tipo", "1", "--sem-separador", file});
        QCOMPARE(r.status, 0);
        QCOMPARE(r.out, QStringLiteral("Durante o processo de importação de dados não foram registados 1 associados.\n"));
        QCOMPARE(f->movementCents(1, "pago"), 800);
        QCOMPARE(quotas({"--ano", "2004", "--mes", "7", "--tipo", "2", file}).out,
                 QStringLiteral("Não foram processados os registos de quotas referente a 7 / 2004.\n"));
        const Result missing = quotas({"--ano", "2004", "--mes", "3", "--tipo", "1", file + "x"});
        QCOMPARE(missing.status, 1);
        QVERIFY(missing.err.contains(QStringLiteral("O ficheiro \"%1x\" não existe.").arg(file)));
    }

    void theRejectsListingGoesToThePdf()
    {
        f->charged(1, QStringLiteral("100"), 10.0);
        const QString file = f->useFile("no_tap;quota\n999;1\n");
        const QString pdf = db->scratch(QStringLiteral("rejeitados.pdf"));
        const Result r = quotas({"--ano", "2004", "--mes", "3", "--tipo", "1", "--pdf", pdf, file});
        QVERIFY2(r.status == 0, qPrintable(r.err));
        QVERIFY(QFile::exists(pdf) && r.out.contains(pdf));
        QCOMPARE(f->extras(), QList<QStringList>{{QStringLiteral("999")}});
    }
};

QTEST_GUILESS_MAIN(CmdImportarTest)
#include "tst_cmd_importar.moc"
