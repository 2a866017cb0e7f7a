#include "support/test_database.h"

#include "component/shared_objects.h"
#include "platform/errors.h"
#include "schema/schema.h"
#include "settings/login.h"
#include "settings/password.h"
#include "settings/registry_file.h"
#include "settings/settings_location.h"

#include <QRandomGenerator>
#include <QSqlDatabase>
#include <QSqlError>
#include <QSqlQuery>

namespace quotas::test {

namespace {

struct ServerSettings {
    QString host;
    int port = 5432;
    QString user;
    QString password;
};

ServerSettings testServer()
{
    ServerSettings s;
    s.host = qEnvironmentVariable("QUOTAS_TEST_PG_HOST");
    s.port = qEnvironmentVariableIntValue("QUOTAS_TEST_PG_PORT");
    s.user = qEnvironmentVariable("QUOTAS_TEST_PG_USER");
    s.password = qEnvironmentVariable("QUOTAS_TEST_PG_PASSWORD");
    if (s.host.isEmpty() || s.port == 0 || s.user.isEmpty())
        throw QuotasError(QStringLiteral("The PostgreSQL test server is not configured (QUOTAS_TEST_PG_HOST, "
                                         "QUOTAS_TEST_PG_PORT, QUOTAS_TEST_PG_USER, QUOTAS_TEST_PG_PASSWORD): "
                                         "run the tests through scripts/test.sh or \"make test\"."));
    return s;
}

// Runs one statement on the server's maintenance database.
void administer(const ServerSettings& s, const QString& statement)
{
    const QString name = QStringLiteral("quotas-test-admin");
    {
        QSqlDatabase db = QSqlDatabase::addDatabase(QStringLiteral("QPSQL"), name);
        db.setHostName(s.host);
        db.setPort(s.port);
        db.setUserName(s.user);
        db.setPassword(s.password);
        db.setDatabaseName(QStringLiteral("postgres"));
        db.setConnectOptions(QStringLiteral("connect_timeout=10"));
        if (!db.open())
            throw QuotasError(QStringLiteral("Cannot reach the PostgreSQL test server: ") + db.lastError().text());
        QSqlQuery q(db);
        const bool ok = q.exec(statement);
        const QString error = q.lastError().text();
        q = QSqlQuery();
        db.close();
        if (!ok)
            throw QuotasError(statement + QStringLiteral(": ") + error);
    }
    QSqlDatabase::removeDatabase(name);
}

}  // namespace

Engine engineUnderTest()
{
    const QString name = qEnvironmentVariable("QUOTAS_TEST_ENGINE", QStringLiteral("sqlite")).toLower();
    return name == QStringLiteral("postgresql") || name == QStringLiteral("pg") ? Engine::PostgreSQL : Engine::SQLite;
}

QString engineName()
{
    return engineUnderTest() == Engine::SQLite ? QStringLiteral("sqlite") : QStringLiteral("postgresql");
}

TestDatabase::TestDatabase(bool withSchema) : TestDatabase(engineUnderTest(), withSchema) {}

TestDatabase::TestDatabase(Engine engine, bool withSchema)
{
    if (!m_dir.isValid())
        throw QuotasError(QStringLiteral("Cannot create a temporary folder."));
    LoginSettings settings;
    settings.securityInfo = QStringLiteral("False");
    if (engine == Engine::SQLite) {
        settings.dataSource = m_dir.filePath(QStringLiteral("quotas.db"));
    } else {
        const ServerSettings server = testServer();
        settings.catalog = QStringLiteral("qt_%1").arg(QRandomGenerator::global()->generate64(), 0, 16);
        administer(server, QStringLiteral("CREATE DATABASE %1").arg(settings.catalog));
        settings.dataSource = QStringLiteral("%1,%2").arg(server.host).arg(server.port);
        settings.user = server.user;
        settings.password = server.password;
    }
    m_dataSource = settings.dataSource;
    m_catalog = settings.catalog;
    m_user = settings.user;
    m_password = settings.password;
    m_connectionString = quotas::connectionString(settings);
    m_connection = std::make_unique<Connection>(QStringLiteral("test"));
    m_connection->setConnectionString(m_connectionString);
    m_connection->open(Connection::OpenMode::CreateIfMissing);
    if (withSchema) {
        createSchema(*m_connection);
        addIndexes(*m_connection);
    }
}

TestDatabase::~TestDatabase()
{
    // The component's shared connections may point here: let them go first.
    releaseShared();
    setRegistryPath(QString());
    m_connection.reset();
    if (!m_catalog.isEmpty()) {
        try {
            administer(testServer(), QStringLiteral("DROP DATABASE IF EXISTS %1 WITH (FORCE)").arg(m_catalog));
        } catch (const QuotasError&) {
            // A database left behind on a throwaway server harms nothing.
        }
    }
}

std::unique_ptr<Connection> TestDatabase::openAnother(const QString& name) const
{
    auto other = std::make_unique<Connection>(name);
    other->setConnectionString(m_connectionString);
    other->open();
    return other;
}

QString TestDatabase::useAsSettings()
{
    RegistryFile file;
    const QString key = loginKeyPath();
    file.setString(key, QStringLiteral("dtSecurityInfo"), QStringLiteral("False"));
    file.setString(key, QStringLiteral("dtUser"), m_user);
    file.setString(key, QStringLiteral("dtPassword"), encodePassword(m_password));
    file.setString(key, QStringLiteral("dtInitialCatalog"), m_catalog);
    file.setString(key, QStringLiteral("dtDataSource"), m_dataSource);
    const QString path = m_dir.filePath(QStringLiteral("registry.reg"));
    file.save(path);
    setRegistryPath(path);
    return path;
}

void TestDatabase::login()
{
    useAsSettings();
    DataEnvironment& data = Data();
    if (!quotas::login(data.SqlServer, data.SqlServer_Prints).ok)
        throw QuotasError(QStringLiteral("Login failed on the test database."));
}

void TestDatabase::clear()
{
    for (const QString& table : schemaTables()) {
        if (table != QStringLiteral("tbmeses") && table != QStringLiteral("tbsexos"))
            m_connection->execute(QStringLiteral("DELETE FROM %1").arg(table));
    }
}

}  // namespace quotas::test
