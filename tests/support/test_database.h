#pragma once

#include "platform/connection.h"

#include <QString>
#include <QTemporaryDir>
#include <memory>

namespace quotas::test {

// The engine this test process runs on: QUOTAS_TEST_ENGINE=sqlite|postgresql.
Engine engineUnderTest();
QString engineName();

// A fresh database of the engine under test, dropped when it goes. On
// PostgreSQL it is a new database on the test server named by
// QUOTAS_TEST_PG_HOST, _PORT, _USER and _PASSWORD; when those are missing the
// constructor throws, so the test fails instead of skipping. withSchema
// gives the tables with every index init-db adds; without it the database is
// empty (createSchema alone gives the host's original shape).
class TestDatabase {
public:
    explicit TestDatabase(bool withSchema = true);
    TestDatabase(Engine engine, bool withSchema);
    ~TestDatabase();
    TestDatabase(const TestDatabase&) = delete;
    TestDatabase& operator=(const TestDatabase&) = delete;

    // The connection string Login would build for this database.
    const QString& connectionString() const { return m_connectionString; }
    QString dataSource() const { return m_dataSource; }
    QString catalog() const { return m_catalog; }
    QString user() const { return m_user; }
    QString password() const { return m_password; }

    // A connection of the test's own, for setting up rows and checking them.
    Connection& connection() { return *m_connection; }
    // Another, independent connection (a second user).
    std::unique_ptr<Connection> openAnother(const QString& name = QStringLiteral("other")) const;

    // Writes a settings file with the five values pointing here, makes it
    // the file the component reads, and returns its path.
    QString useAsSettings();
    // useAsSettings(), then Login on the shared data environment.
    void login();

    // Empties every table of the schema (between test functions).
    void clear();

    // A folder that lives as long as this object.
    QString scratch(const QString& name) const { return m_dir.filePath(name); }

private:
    QTemporaryDir m_dir;
    QString m_dataSource;
    QString m_catalog;
    QString m_user;
    QString m_password;
    QString m_connectionString;
    std::unique_ptr<Connection> m_connection;
};

}  // namespace quotas::test
