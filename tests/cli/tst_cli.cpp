// The command line as scripts use it: settings, schema, login, exit statuses.

#include "cli/commands.h"
#include "support/cli_process.h"
#include "support/test_database.h"

#include <QFile>
#include <QTest>
#include <sys/stat.h>

using namespace quotas;
using namespace quotas::test;
using Run = CliRun;

class CliTest : public QObject {
    Q_OBJECT

    std::unique_ptr<TestDatabase> db;
    QString registry;

    Run quotas(const QStringList& args) { return runQuotas(registry, args); }

    Run configure()
    {
        return quotas({"config", "--data-source", db->dataSource(), "--catalog", db->catalog(), "--user", db->user(), "--password", db->password()});
    }

private slots:
    void init()
    {
        db = std::make_unique<TestDatabase>(false);
        registry = db->scratch(QStringLiteral("etc/quotas.reg"));
    }
    void cleanup() { db.reset(); }

    void configWritesAHiddenFileThatLoginReads()
    {
        QCOMPARE(configure().status, 0);
        struct stat info {};
        QCOMPARE(::stat(QFile::encodeName(registry).constData(), &info), 0);
        QCOMPARE(info.st_mode & 0777, 0600u);
        QFile file(registry);
        QVERIFY(file.open(QIODevice::ReadOnly));
        const QByteArray text = file.readAll();
        QVERIFY(text.startsWith("Windows Registry Editor Version 5.00"));
        QVERIFY(text.contains("\"dtPassword\"=\"b64:"));
        if (!db->password().isEmpty())
            QVERIFY(!text.contains(db->password().toUtf8()));
        const Run login = quotas({"login", "--print-connection-string"});
        QCOMPARE(login.out.trimmed() + QString::number(login.status), db->connectionString() + u'0');
    }

    void missingSettingsAreNamed()
    {
        const Run login = quotas({"login"});
        QVERIFY2(login.status == 2 && login.err.contains("dtSecurityInfo") && login.err.contains(registry), qPrintable(login.err));
        QCOMPARE(quotas({"init-db"}).status, 2);
    }

    void initDbCreatesOnceAndAddsDemoMembers()
    {
        QCOMPARE(configure().status, 0);
        const Run first = quotas({"init-db", "--demo", "25"}), second = quotas({"init-db"});
        QVERIFY2(first.status == 0 && first.out.contains("tbQuotas_Movimentos"), qPrintable(first.err));
        QVERIFY2(second.status == 0 && second.out.contains("já tinha todas as tabelas"), qPrintable(second.err));
        QCOMPARE(db->connection().scalar(QStringLiteral("SELECT COUNT(*) FROM tbSocios")).toInt(), 25);
    }

    // Exit 2 with a message on stderr that names what is wrong; config
    // writes nothing then.
    void usageProblemsExitWithTwo_data()
    {
        QTest::addColumn<QStringList>("args");
        QTest::addColumn<QString>("named");
        QTest::newRow("no command") << QStringList{} << "quotas --help";
        QTest::newRow("unknown command") << QStringList{"voar"} << "voar";
        QTest::newRow("unknown option") << QStringList{"login", "--depressa"} << "depressa";
        QTest::newRow("config without source") << QStringList{"config", "--user", "x"} << "--data-source";
        QTest::newRow("demo not a number") << QStringList{"init-db", "--demo", "muitos"} << "--demo";
        // Regression: these were written into a file that no later run could read.
        QTest::newRow("line break") << QStringList{"config", "--data-source", "q.db", "--user", "a\nb"} << "--user";
        QTest::newRow("control character") << QStringList{"config", "--data-source", "q.db", "--catalog", "a\x01"} << "--catalog";
        QTest::newRow("tab") << QStringList{"config", "--data-source", "q.db", "--security-info", "a\tb"} << "--security-info";
        // Regression: read back as "dados/?ód?/q.db".
        QTest::newRow("outside Windows-1252") << QStringList{"config", "--data-source", "dados/Łódź/q.db"} << "--data-source";
    }
    void usageProblemsExitWithTwo()
    {
        QFETCH(QStringList, args);
        QFETCH(QString, named);
        const Run run = quotas(args);
        QCOMPARE(run.status, 2);
        QVERIFY2(run.err.contains(named), qPrintable(run.err));
        QVERIFY(!QFile::exists(registry));
    }

    // Regression: a malformed file was reported as a missing dtSecurityInfo.
    void aMalformedSettingsFileIsNamedWithItsLine()
    {
        QCOMPARE(configure().status, 0);
        QFile file(registry);
        QVERIFY(file.open(QIODevice::Append));
        file.write("\"dtUser\" sa\r\n");
        file.close();
        for (const QStringList& args : {QStringList{"login"}, QStringList{"init-db"}, QStringList{"config", "--data-source", "q.db"}}) {
            const Run run = quotas(args);
            QVERIFY2(run.status == 2 && run.err.contains(registry) && run.err.contains("linha 9"), qPrintable(run.err));
        }
    }

    // Every command of the table is reachable, and its help names each of its
    // options and the exit statuses.
    void helpListsEveryCommandAndOption()
    {
        const Run general = quotas({"--help"});
        QCOMPARE(general.status, 0);
        for (const cli::Command& command : cli::commands()) {
            QVERIFY2(general.out.contains(QStringLiteral("\n  %1 ").arg(QLatin1String(command.name))), command.name);
            const Run help = quotas({QLatin1String(command.name), QStringLiteral("--help")});
            QCOMPARE(help.status, 0);
            QVERIFY2(help.out.startsWith(QStringLiteral("Utilização: quotas")), command.name);
            for (const cli::OptionHelp& option : command.options)
                QVERIFY2(help.out.contains(QStringLiteral("--%1").arg(QLatin1String(option.name))), option.name);
            for (int status : {0, 1, 2, 3})
                QVERIFY2(help.out.contains(QStringLiteral("\n  %1  ").arg(status)), command.name);
        }
        const Run version = quotas({"--version"});
        QCOMPARE(version.out + QString::number(version.status), QStringLiteral("quotas " QUOTAS_VERSION "\n0"));
    }

    void anUnreachableDatabaseExitsWithOne()
    {
        QCOMPARE(quotas({"config", "--data-source", db->scratch("nowhere/none.db")}).status, 0);
        const Run login = quotas({"login"});
        QVERIFY2(login.status == 1 && login.err.contains("não existe"), qPrintable(login.err));
    }
};

QTEST_GUILESS_MAIN(CliTest)
#include "tst_cli.moc"
