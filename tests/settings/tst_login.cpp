// Login: the five settings read in order, the connection string of eighteen
// pieces, both connections opened once, nothing touched when a value is missing.

#include "component/general.h"
#include "component/shared_objects.h"
#include "platform/errors.h"
#include "settings/login.h"
#include "settings/password.h"
#include "settings/registry_file.h"
#include "settings/settings_location.h"
#include "support/test_database.h"

#include <QSqlDatabase>
#include <QTest>

using namespace quotas;
using quotas::test::TestDatabase;

class LoginTest : public QObject {
    Q_OBJECT

    std::unique_ptr<TestDatabase> db;

    // A settings file with the five values, the test database's where values
    // gives none (a null text), some of them left out.
    void writeSettings(const QStringList& leaveOut = {}, const QStringList& values = {})
    {
        const QStringList mine = {QStringLiteral("False"), db->user(), db->password(), db->catalog(), db->dataSource()};
        RegistryFile file;
        for (int i = 0; i < mine.size(); ++i) {
            const QString value = i < values.size() && !values[i].isNull() ? values[i] : mine[i];
            if (!leaveOut.contains(loginValueNames()[i]))
                file.setString(loginKeyPath(), loginValueNames()[i], i == 2 ? encodePassword(value) : value);
        }
        const QString path = db->scratch(QStringLiteral("login.reg"));
        file.save(path);
        setRegistryPath(path);
    }

private slots:
    void initTestCase() { db = std::make_unique<TestDatabase>(); }
    void cleanupTestCase() { db.reset(); }
    void cleanup() { releaseShared(); }

    // A second login leaves each connection open once.
    void opensBothConnectionsWithTheEighteenPieces()
    {
        writeSettings();
        General general;
        QVERIFY(general.Login(QStringLiteral("ignored"), 42, QVariant()));
        const QString text = QStringLiteral("Provider=MSDataShape.1;Persist Security Info=False;Connect Timeout=15;Data Source=")
                             + db->dataSource() + QStringLiteral(";User ID=") + db->user() + QStringLiteral(";Password=")
                             + db->password() + QStringLiteral(";Initial Catalog=") + db->catalog()
                             + QStringLiteral(";Data Provider=SQLOLEDB.1");
        const int open = QSqlDatabase::connectionNames().size();
        QVERIFY(general.Login());
        QCOMPARE(QSqlDatabase::connectionNames().size(), open);
        QCOMPARE(Data().SqlServer.connectionString(), text);
        QCOMPARE(Data().SqlServer_Prints.connectionString(), text);
        QCOMPARE(Data().SqlServer.state() + Data().SqlServer_Prints.state(), 2);
        QCOMPARE(Data().SqlServer.scalar(QStringLiteral("SELECT COUNT(*) FROM tbmeses")).toInt(), 12);
    }

    void stopsAtTheFirstMissingValue_data()
    {
        QTest::addColumn<QStringList>("leaveOut");
        QTest::addColumn<QString>("missing");
        for (const QString& name : loginValueNames())
            QTest::newRow(qPrintable(name)) << QStringList{name} << name;
        QTest::newRow("user and the rest") << QStringList{"dtUser", "dtPassword", "dtDataSource"} << "dtUser";
    }
    void stopsAtTheFirstMissingValue()
    {
        QFETCH(QStringList, leaveOut);
        QFETCH(QString, missing);
        // An open connection with its old string stays as it is.
        writeSettings();
        QVERIFY(General().Login());
        const QString before = Data().SqlServer.connectionString();
        writeSettings(leaveOut, {QString(), QStringLiteral("someone-else")});
        const LoginOutcome outcome = login(Data().SqlServer, Data().SqlServer_Prints);
        QVERIFY(!outcome.ok);
        QCOMPARE(outcome.missing, missing);
        QCOMPARE(Data().SqlServer.connectionString(), before);
        QCOMPARE(Data().SqlServer.state() + Data().SqlServer_Prints.state(), 2);
        QVERIFY(!General().Login());
    }

    void anEmptyValueIsNotMissing()
    {
        writeSettings({}, {QStringLiteral("")});
        QVERIFY(General().Login());
        QVERIFY(Data().SqlServer.connectionString().startsWith(
            QStringLiteral("Provider=MSDataShape.1;Persist Security Info=;Connect Timeout=15;")));
    }

    void anUnreachableDatabaseIsTheMethodsError()
    {
        const bool lite = test::engineUnderTest() == Engine::SQLite;
        writeSettings({}, {QString(), QStringLiteral("u"), QStringLiteral("p"), QStringLiteral("nada"),
                           lite ? db->scratch(QStringLiteral("missing/none.db")) : QStringLiteral("127.0.0.1,1")});
        QVERIFY_THROWS_EXCEPTION(DbError, General().Login());
        QCOMPARE(Data().SqlServer.state(), 0);
    }
};

QTEST_GUILESS_MAIN(LoginTest)
#include "tst_login.moc"
