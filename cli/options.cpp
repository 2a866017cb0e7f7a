#include "cli/options.h"

#include "cli/commands.h"

namespace quotas::cli {

Options::Options(const QString& command, const QList<QCommandLineOption>& options, const QStringList& args,
                 int positional)
    : m_command(command)
{
    m_parser.setSingleDashWordOptionMode(QCommandLineParser::ParseAsLongOptions);
    m_parser.addOptions(options);
    if (!m_parser.parse(QStringList{command} + args))
        throw UsageError(QStringLiteral("%1: %2").arg(command, m_parser.errorText()));
    if (m_parser.positionalArguments().size() != positional)
        throw UsageError(positional == 0
                             ? QStringLiteral("%1: argumentos a mais: %2").arg(command, m_parser.positionalArguments().join(u' '))
                             : QStringLiteral("%1: indique %2 ficheiro(s).").arg(command).arg(positional));
}

int Options::number(const QString& name, int low, int high) const
{
    if (!m_parser.isSet(name))
        throw UsageError(QStringLiteral("%1: falta --%2.").arg(m_command, name));
    bool ok = false;
    const int n = m_parser.value(name).toInt(&ok);
    if (!ok || n < low || n > high)
        throw UsageError(QStringLiteral("%1: --%2 deve ser um número entre %3 e %4.").arg(m_command, name).arg(low).arg(high));
    return n;
}

}  // namespace quotas::cli
