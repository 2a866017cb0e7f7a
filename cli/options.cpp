#include "cli/options.h"

#include "cli/commands.h"

namespace quotas::cli {

Options::Options(const QString& command, const QStringList& args)
    : m_command(command)
{
    const Command* entry = findCommand(command);
    Q_ASSERT(entry);
    for (const OptionHelp& option : entry->options)
        m_parser.addOption(option.value ? QCommandLineOption(QString::fromUtf8(option.name), QString::fromUtf8(option.text),
                                                             QString::fromUtf8(option.value))
                                        : QCommandLineOption(QString::fromUtf8(option.name), QString::fromUtf8(option.text)));
    m_parser.setSingleDashWordOptionMode(QCommandLineParser::ParseAsLongOptions);
    if (!m_parser.parse(QStringList{command} + args))
        throw UsageError(QStringLiteral("%1: %2").arg(command, m_parser.errorText()));
    const int positional = entry->operand ? 1 : 0;
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
