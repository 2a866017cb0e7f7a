#pragma once

#include <QString>
#include <stdexcept>

namespace quotas {

// Every failure that reaches the host or the user carries a Portuguese message.
class QuotasError : public std::runtime_error {
public:
    explicit QuotasError(const QString& message)
        : std::runtime_error(message.toStdString()), m_message(message) {}
    const QString& message() const noexcept { return m_message; }

private:
    QString m_message;
};

// A database call failed (connection, statement, save).
class DbError : public QuotasError {
public:
    using QuotasError::QuotasError;
};

// A save found the row changed or deleted by someone else since it was read:
// nothing was written.
class ConcurrencyError : public DbError {
public:
    using DbError::DbError;
};

// The database server went away (stopped, restarted, the network lost):
// nothing more can be written on this connection.
class ConnectionLostError : public DbError {
public:
    using DbError::DbError;
};

}  // namespace quotas
