#pragma once

#include "platform/connection.h"
#include "platform/recordset.h"

#include <QString>
#include <memory>

namespace quotas {

// A named command of the data environment: its SQL text, the connection it
// runs on, and its own result set (rsDividas for Dividas, and so on).
class Command {
public:
    Command(QString name, QString text, Connection& connection)
        : m_name(std::move(name)), m_text(std::move(text)), m_connection(connection) {}

    const QString& name() const { return m_name; }
    const QString& text() const { return m_text; }
    Connection& connection() const { return m_connection; }
    Recordset& recordset() { return m_recordset; }

    // Opens the result set on the command's connection when it is not open
    // (a read-only snapshot), and returns it.
    Recordset& execute();

private:
    QString m_name;
    QString m_text;
    Connection& m_connection;
    Recordset m_recordset;
};

// Closes a command's result set when it goes out of scope, however a showing
// ends (after a failure too), so that the next showing reads the database again.
class ClosesResultSet {
public:
    explicit ClosesResultSet(Command& command) : m_command(command) {}
    ~ClosesResultSet()
    {
        if (m_command.recordset().isOpen())
            m_command.recordset().close();
    }
    ClosesResultSet(const ClosesResultSet&) = delete;
    ClosesResultSet& operator=(const ClosesResultSet&) = delete;

private:
    Command& m_command;
};

// The data environment "Data": the two connections and the named commands.
class DataEnvironment {
public:
    DataEnvironment();
    DataEnvironment(const DataEnvironment&) = delete;
    DataEnvironment& operator=(const DataEnvironment&) = delete;

    Connection SqlServer{QStringLiteral("SqlServer")};
    Connection SqlServer_Prints{QStringLiteral("SqlServer_Prints")};

    Command Command1;
    Command Command2;
    Command Meses;
    Command Extras;
    Command Dividas;

    // By name, without regard to case; throws QuotasError for an unknown name.
    Command& command(const QString& name);
};

}  // namespace quotas
