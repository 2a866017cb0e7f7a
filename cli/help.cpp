#include "cli/help.h"

namespace quotas::cli {

namespace {

QString text(const char* utf8) { return QString::fromUtf8(utf8); }

QString spelling(const OptionHelp& option)
{
    QString s = QStringLiteral("--") + text(option.name);
    if (option.value)
        s += u' ' + text(option.value);
    return s;
}

// Two columns, the second starting where the widest first one ends.
QString columns(const QList<std::pair<QString, QString>>& rows)
{
    qsizetype width = 0;
    for (const auto& row : rows)
        width = std::max(width, row.first.size());
    QString out;
    for (const auto& row : rows)
        out += QStringLiteral("  ") + row.first.leftJustified(width + 2) + row.second + u'\n';
    return out;
}

// A paragraph broken into lines of at most width characters, for a terminal.
QString wrapped(const QString& paragraph, int width = 78)
{
    QString out;
    QString line;
    for (const QString& word : paragraph.split(u' ', Qt::SkipEmptyParts)) {
        if (!line.isEmpty() && line.size() + 1 + word.size() > width) {
            out += line + u'\n';
            line.clear();
        }
        line += (line.isEmpty() ? QString() : QStringLiteral(" ")) + word;
    }
    return out + line + u'\n';
}

QString statusesSection()
{
    QList<std::pair<QString, QString>> rows;
    for (const ExitStatus& status : exitStatuses())
        rows.append({QString::number(status.code), text(status.text)});
    return QStringLiteral("Estado de saída:\n") + columns(rows);
}

}  // namespace

const std::vector<ExitStatus>& exitStatuses()
{
    static const std::vector<ExitStatus> statuses = {
        {0, "feito;"},
        {3, "feito, mas ficou algo por fazer (quotas por gerar, linhas rejeitadas): a contagem sai na saída padrão;"},
        {1, "falhou (o motivo, na saída de erros);"},
        {2, "erro de utilização ou de configuração."},
    };
    return statuses;
}

QString synopsis(const Command& command)
{
    QString s = text(command.name);
    for (const OptionHelp& option : command.options)
        s += option.required ? u' ' + spelling(option) : QStringLiteral(" [") + spelling(option) + u']';
    if (command.operand)
        s += u' ' + text(command.operand);
    return s;
}

QString versionText() { return QStringLiteral("quotas " QUOTAS_VERSION "\n"); }

QString generalHelp()
{
    QList<std::pair<QString, QString>> commandRows;
    for (const Command& command : commands())
        commandRows.append({text(command.name), text(command.summary)});
    return QStringLiteral("Utilização: quotas [--registry FICHEIRO] COMANDO [OPÇÕES]\n"
                          "           quotas COMANDO --help\n"
                          "           quotas --version\n\n"
                          "O módulo de quotas do registo de associados, sem janelas.\n\n"
                          "Opções gerais:\n")
           + columns({{QStringLiteral("--registry FICHEIRO"),
                       QStringLiteral("Ficheiro de configuração (senão $QUOTAS_REGISTRY, senão /etc/quotas/registry.reg).")},
                      {QStringLiteral("-h, --help"), QStringLiteral("Mostra esta ajuda.")},
                      {QStringLiteral("--version"), QStringLiteral("Mostra a versão.")}})
           + QStringLiteral("\nComandos:\n") + columns(commandRows) + u'\n' + statusesSection();
}

QString commandHelp(const Command& command)
{
    QList<std::pair<QString, QString>> rows;
    if (command.operand)
        rows.append({text(command.operand), text(command.operandText)});
    for (const OptionHelp& option : command.options)
        rows.append({spelling(option), text(option.text)});
    rows.append({QStringLiteral("-h, --help"), QStringLiteral("Mostra esta ajuda.")});
    return QStringLiteral("Utilização: quotas [--registry FICHEIRO] ") + synopsis(command) + QStringLiteral("\n\n")
           + wrapped(text(command.description)) + QStringLiteral("\nOpções:\n") + columns(rows) + u'\n' + statusesSection();
}

}  // namespace quotas::cli
