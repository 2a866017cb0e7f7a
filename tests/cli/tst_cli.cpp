// The command line as scripts use it: settings, schema, login, exit statuses.

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
        return quotas({QStringLiteral("config"), QStringLiteral("--data-source"), db->dataSource(), QStringLiteral("--catalog"),
                       db->catalog(), QStringLiteral("--user"), db->user(), QStringLiteral("--password"), db->password()});
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
        const Run config = configure();
        QCOMPARE(config.status, 0);
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
        const Run login = quotas({QStringLiteral("login"), QStringLiteral("--print-connection-string")});
        QCOMPARE(login.status, 0);
        QCOMPARE(login.out.trimmed(), db->connectionString());
    }

    void missingSettingsAreNamed()
    {
        const Run login = quotas({QStringLiteral("login")});
        QCOMPARE(login.status, 2);
        QVERIFY(login.err.contains(QStringLiteral("dtSecurityInfo")));
        QVERIFY(login.err.contains(registry));
        QCOMPARE(quotas({QStringLiteral("init-db")}).status, 2);
    }

    void initDbCreatesOnceAndAddsDemoMembers()
    {
        QCOMPARE(configure().status, 0);
        const Run first = quotas({QStringLiteral("init-db"), QStringLiteral("--demo"), QStringLiteral("25")});
        QCOMPARE(first.status, 0);
        QVERIFY(first.out.contains(QStringLiteral("tbQuotas_Movimentos")));
        const Run second = quotas({QStringLiteral("init-db")});
        QCOMPARE(second.status, 0);
        QVERIFY(second.out.contains(QStringLiteral("já tinha todas as tabelas")));
        QCOMPARE(db->connection().scalar(QStringLiteral("SELECT COUNT(*) FROM tbSocios")).toInt(), 25);
    }

    void usageProblemsExitWithTwo_data()
    {
        QTest::addColumn<QStringList>("args");
        QTest::newRow("no command") << QStringList{};
        QTest::newRow("unknown command") << QStringList{"voar"};
        QTest::newRow("unknown option") << QStringList{"login", "--depressa"};
        QTest::newRow("config without source") << QStringList{"config", "--user", "x"};
        QTest::newRow("demo not a number") << QStringList{"init-db", "--demo", "muitos"};
    }
    void usageProblemsExitWithTwo()
    {
        QFETCH(QStringList, args);
        const Run run = quotas(args);
        QCOMPARE(run.status, 2);
        QVERIFY(!run.err.trimmed().isEmpty());
    }

    void anUnreachableDatabaseExitsWithOne()
    {
        QCOMPARE(quotas({QStringLiteral("config"), QStringLiteral("--data-source"),
                         db->scratch(QStringLiteral("nowhere/none.db"))})
                     .status,
                 0);
        const Run login = quotas({QStringLiteral("login")});
        QCOMPARE(login.status, 1);
        QVERIFY(login.err.contains(QStringLiteral("não existe")));
    }
};

QTEST_GUILESS_MAIN(CliTest)
#include "tst_cli.moc"
