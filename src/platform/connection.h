#pragma once

#include "platform/dialect.h"

#include <QHash>
#include <QSqlDatabase>
#include <QString>
#include <QStringList>
#include <QVariantList>
#include <functional>
#include <memory>
#include <optional>

class QSqlQuery;

namespace quotas {

// Where a connection string points. "Data Source" names an SQLite file when
// it is an absolute path, contains "/" or ends in ".db"; anything else is a
// PostgreSQL server "host" or "host,port", with "Initial Catalog" as database.
struct ConnectionTarget {
    Engine engine = Engine::SQLite;
    QString file;  // SQLite
    QString host;  // PostgreSQL
    int port = 5432;
    QString database;
    QString user;
    QString password;
    int timeoutSeconds = 15;

    static ConnectionTarget fromConnectionString(const QString& connectionString);
};

// A named database connection with the state, connection string, open, close
// and execute of the original data environment. Statements are prepared once
// per connection and reused; every value reaches them as a bound parameter.
class Connection {
public:
    enum class OpenMode {
        Existing,
        CreateIfMissing
    };

    explicit Connection(QString name = QString());
    ~Connection();
    Connection(const Connection&) = delete;
    Connection& operator=(const Connection&) = delete;

    const QString& name() const { return m_name; }

    // 0 closed, 1 open, as the host and the runs test it.
    int state() const { return isOpen() ? 1 : 0; }
    bool isOpen() const;

    QString connectionString() const { return m_connectionString; }
    // Throws when the connection is open: close it first.
    void setConnectionString(const QString& text);

    // Opens with the connection string; throws DbError with the reason.
    // An SQLite file must exist unless CreateIfMissing is given.
    void open(OpenMode mode = OpenMode::Existing);
    void close();

    Engine engine() const;
    const Dialect& dialect() const;

    // Runs one statement; returns the number of rows it changed.
    int execute(const QString& sql, const QVariantList& params = {});
    // First column of the first row, or an invalid QVariant when there is no row.
    QVariant scalar(const QString& sql, const QVariantList& params = {});

    // Executes an already translated text with params bound (prepared once
    // per connection when there are params); the caller reads the query and
    // calls finish() before running anything else. Throws DbError.
    QSqlQuery& run(const QString& translatedSql, const QVariantList& params);

    // Appends rows to a table: COPY on PostgreSQL, multi-row INSERTs on
    // SQLite, inside the caller's transaction. next() fills one row's values
    // in the order of columns and returns false after the last. Returns the
    // number of rows written.
    qint64 appendRows(const QString& table, const QStringList& columns, const std::function<bool(QVariantList&)>& next);

    // Name of the primary-key column of a table ("" when it has none).
    QString primaryKey(const QString& table);
    bool hasTable(const QString& table);

    // What a transaction can hold to itself, beyond rows: a member's account
    // and dues, or the adding of the first counter row.
    enum class LockSpace {
        Member = 1364283221,
        FirstCounter = 1364283222
    };
    // Within a transaction: waits until no other transaction holds the same
    // lock, and keeps it until this one ends.
    void lock(LockSpace space, qint64 key = 0);
    void lockMember(const QVariant& socio) { lock(LockSpace::Member, socio.toLongLong()); }

    // Transactions nest: an inner one is a savepoint of the outer one.
    // Prefer the Transaction guard to calling these directly.
    void begin();
    void commit();
    void rollback();
    int transactionDepth() const { return m_depth; }

    // While on, the session's commits, of transactions and of single
    // statements alike, do not wait for the disk. flushCommits() commits once
    // durably, which makes every earlier commit durable too. Call both
    // outside a transaction; prefer the LazyCommits guard.
    void setLazyCommits(bool on);
    void flushCommits();

private:
    void requireOpen() const;
    // True when the server is known to have gone (PostgreSQL only).
    bool lost() const;
    [[noreturn]] void fail(const QString& what, const QString& sql, const QString& driverText) const;

    QString m_name;
    QString m_dbName;
    QString m_connectionString;
    std::optional<Dialect> m_dialect;
    QHash<QString, QSqlQuery*> m_statements;
    QHash<QString, QString> m_primaryKeys;
    int m_depth = 0;
};

}  // namespace quotas
