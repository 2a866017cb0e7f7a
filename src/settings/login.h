#pragma once

#include <QString>
#include <QStringList>

namespace quotas {

class Connection;

// The key and the five values of the connection settings, in reading order.
QString loginKeyPath();
QStringList loginValueNames();  // dtSecurityInfo, dtUser, dtPassword, dtInitialCatalog, dtDataSource

struct LoginSettings {
    QString securityInfo;
    QString user;
    QString password;  // decoded
    QString catalog;
    QString dataSource;
};

// The connection string of exactly eighteen pieces; a value holding ";" or a
// quote is quoted so that it cannot add properties.
QString connectionString(const LoginSettings& settings);

struct LoginOutcome {
    bool ok = false;
    QString missing;  // the first value that could not be read
};

// Reads the five values in order, with a fresh copy of the key path each
// time, and stops at the first missing one without touching a connection.
// Otherwise closes each connection if open, sets the string and opens it.
// A failure to open passes on as DbError.
LoginOutcome login(Connection& sqlServer, Connection& sqlServerPrints);

// The settings alone, for the command line and the schema set-up.
bool readLoginSettings(LoginSettings& settings, QString* missing = nullptr);

}  // namespace quotas
