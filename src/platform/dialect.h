#pragma once

#include <QHash>
#include <QString>

namespace quotas {

enum class Engine {
    SQLite,
    PostgreSQL
};

// Everything that differs between the two database engines lives here; the
// system's SQL texts are written once and translated on their way out.
class Dialect {
public:
    explicit Dialect(Engine engine) : m_engine(engine) {}

    Engine engine() const { return m_engine; }
    QString driverName() const;

    // String concatenation is written "a + ' ' + b" in the system's texts;
    // both engines want "||". A "+" is rewritten when an operand beside it is
    // a string literal, so arithmetic stays untouched. "COLLATE portugues"
    // (Portuguese order) is SQLite's collation of that name, registered on
    // the connection, and the server's ICU collation on PostgreSQL.
    QString translate(const QString& sql) const;

    QString beginTransaction() const;
    // Turns on or off, for the session, commits that do not wait for the
    // disk; empty when the engine has no such setting.
    QString lazyCommits(bool on) const;
    // Run inside a transaction to give it a commit record of its own, so
    // that its commit waits for the disk and with it every earlier commit;
    // empty when the engine needs none.
    QString durableMark() const;
    // "column equals the bound value", Null equal to Null.
    QString nullSafeEquals(const QString& column) const;
    // The new value of a running total: the column plus the bound amount,
    // with a Null total counting as 0 and the sum kept in whole cents.
    QString addToColumn(const QString& column) const;
    // Appended to a SELECT that must lock the rows it reads until the
    // transaction ends (SQLite's writer lock already serialises writers).
    QString forUpdate() const;
    // A statement taking a lock on two numbers (what is locked, and which
    // one) until the transaction ends, whatever indexes the tables have: an
    // advisory lock on PostgreSQL; nothing on SQLite, whose BEGIN IMMEDIATE
    // already holds the one writer lock.
    QString transactionLock() const;
    // The column that addresses a row of a table that may have no key.
    QString rowAddress() const;
    // How the engine's catalogue spells an unquoted table name.
    QString catalogName(const QString& table) const;

private:
    Engine m_engine;
    mutable QHash<QString, QString> m_translated;
};

}  // namespace quotas
