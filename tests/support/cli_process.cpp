#include "support/cli_process.h"

#include <QProcess>

namespace quotas::test {

QProcess* startQuotas(QObject* parent, const QString& registry, const QStringList& args,
                      const QProcessEnvironment& environment)
{
    auto* p = new QProcess(parent);
    p->setProcessEnvironment(environment);
    p->start(QStringLiteral(QUOTAS_CLI_BINARY), QStringList{QStringLiteral("--registry"), registry} + args);
    return p;
}

CliRun finishQuotas(QProcess* p, int timeoutMs)
{
    if (!p->waitForFinished(timeoutMs))
        p->kill();
    return {p->exitStatus() == QProcess::NormalExit ? p->exitCode() : -1, QString::fromUtf8(p->readAllStandardOutput()),
            QString::fromUtf8(p->readAllStandardError())};
}

CliRun runQuotas(const QString& registry, const QStringList& args, const QProcessEnvironment& environment)
{
    QProcess p;
    p.setProcessEnvironment(environment);
    p.start(QStringLiteral(QUOTAS_CLI_BINARY), QStringList{QStringLiteral("--registry"), registry} + args);
    return finishQuotas(&p);
}

}  // namespace quotas::test
