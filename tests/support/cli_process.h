#pragma once

#include <QProcessEnvironment>
#include <QString>
#include <QStringList>

class QObject;
class QProcess;

namespace quotas::test {

// What the quotas program did.
struct CliRun {
    int status = -1;
    QString out;
    QString err;
};

// Starts the quotas program built with the tests, reading the settings file
// at registry; the caller waits with finishQuotas (two runs may overlap).
QProcess* startQuotas(QObject* parent, const QString& registry, const QStringList& args,
                      const QProcessEnvironment& environment = QProcessEnvironment::systemEnvironment());
CliRun finishQuotas(QProcess* process, int timeoutMs = 300000);

// Runs it to the end.
CliRun runQuotas(const QString& registry, const QStringList& args,
                 const QProcessEnvironment& environment = QProcessEnvironment::systemEnvironment());

}  // namespace quotas::test
