// The texts that leave for the database: connection strings, where they
// point, and the dialect's rewrite of the system's SQL.

#include "platform/connection.h"
#include "platform/connection_string.h"
#include "platform/dialect.h"
#include "platform/errors.h"

#include <QTest>

using namespace quotas;

class ConnectionTextTest : public QObject {
    Q_OBJECT
private slots:
    void quotingKeepsEveryValueWhole_data()
    {
        QTest::addColumn<QString>("value");
        QTest::addColumn<QString>("written");
        const auto row = [](const char* tag, const char* value, const char* written) { QTest::newRow(tag) << value << written; };
        row("plain", "sa", "sa");
        row("empty", "", "");
        row("semicolon", "a;Provider=X", "\"a;Provider=X\"");
        row("double quote", "pa\"ss", "'pa\"ss'");
        row("single quote", "o'neil", "\"o'neil\"");
        row("both quotes", "a'b\";c", "\"a'b\"\";c\"");
        row("outer spaces", " x ", "\" x \"");
        row("equals sign", "a=b", "a=b");
        // Regression: "User ID==x" reads as the escaped "=" of a keyword "User ID=".
        row("leading equals sign", "=x", "\"=x\"");
    }
    void quotingKeepsEveryValueWhole()
    {
        QFETCH(QString, value);
        QFETCH(QString, written);
        QCOMPARE(quoteConnectionValue(value), written);
        const auto parsed = parseConnectionString(QStringLiteral("User ID=") + written + QStringLiteral(";Password=p"));
        QCOMPARE(parsed.value(QStringLiteral("user id")), value);
        QCOMPARE(parsed.value(QStringLiteral("password")), QStringLiteral("p"));
        QCOMPARE(parsed.size(), 2);
    }

    void dataSourcePicksTheEngine_data()
    {
        QTest::addColumn<QString>("source");
        QTest::addColumn<bool>("sqlite");
        QTest::addColumn<QString>("host");
        QTest::addColumn<int>("port");
        QTest::newRow("absolute path") << "/var/lib/quotas/q" << true << "" << 5432;
        QTest::newRow("relative path") << "data/q.sqlite" << true << "" << 5432;
        QTest::newRow(".db file") << "quotas.db" << true << "" << 5432;
        QTest::newRow("server") << "dbserver" << false << "dbserver" << 5432;
        QTest::newRow("server and port") << "10.0.0.5,6543" << false << "10.0.0.5" << 6543;
    }
    void dataSourcePicksTheEngine()
    {
        QFETCH(QString, source);
        QFETCH(bool, sqlite);
        QFETCH(QString, host);
        QFETCH(int, port);
        const auto t = ConnectionTarget::fromConnectionString(
            QStringLiteral("Data Source=%1;Initial Catalog=sind;User ID=u;Password=p;Connect Timeout=7").arg(source));
        QCOMPARE(t.engine == Engine::SQLite, sqlite);
        QCOMPARE(sqlite ? t.file : t.host, sqlite ? source : host);
        QCOMPARE(t.port, port);
        QCOMPARE(t.timeoutSeconds, 7);
        QCOMPARE(t.database, QStringLiteral("sind"));
    }

    void malformedTextIsRefused()
    {
        QVERIFY_THROWS_EXCEPTION(QuotasError, parseConnectionString(QStringLiteral("Password=\"abc;User ID=x")));
        QVERIFY_THROWS_EXCEPTION(DbError, ConnectionTarget::fromConnectionString(QStringLiteral("Data Source=h,port")));
        QVERIFY_THROWS_EXCEPTION(DbError, ConnectionTarget::fromConnectionString(QStringLiteral("User ID=x")));
    }

    void concatenationBecomesPipes_data()
    {
        QTest::addColumn<QString>("sql");
        QTest::addColumn<QString>("translated");
        const auto row = [](const char* tag, const char* sql, const char* translated) { QTest::newRow(tag) << sql << translated; };
        row("months", "Select *, code + ' - ' + descrit as completo from tbmeses", "Select *, code || ' - ' || descrit as completo from tbmeses");
        row("postcode", "a.code_postal1 + ' ' + a.localidade1 as x", "a.code_postal1 || ' ' || a.localidade1 as x");
        row("arithmetic stays", "total_quotas + 1, a + b", "total_quotas + 1, a + b");
        row("plus inside a literal", "'a + b' + c", "'a + b' || c");
        row("quote doubled in literal", "'it''s' + x", "'it''s' || x");
        row("placeholder", "x + ? , ? + 'a'", "x + ? , ? || 'a'");
    }
    void concatenationBecomesPipes()
    {
        QFETCH(QString, sql);
        QFETCH(QString, translated);
        for (Engine e : {Engine::SQLite, Engine::PostgreSQL})
            QCOMPARE(Dialect(e).translate(sql), translated);
    }
};

QTEST_GUILESS_MAIN(ConnectionTextTest)
#include "tst_connection_text.moc"
