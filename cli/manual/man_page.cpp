// Writes the manual page quotas(1) on stdout, in roff, from the same command
// table as "quotas --help", so the two never disagree. Run by the build.

#include "cli/commands.h"
#include "cli/help.h"

#include <cstdio>

namespace {

using namespace quotas::cli;

QString text(const char* utf8) { return QString::fromUtf8(utf8); }

// Backslashes and hyphens as roff wants them; a line starting with a dot or
// a quote would be read as a request.
QString roff(const QString& plain)
{
    QString out = plain;
    out.replace(u'\\', QStringLiteral("\\e")).replace(u'-', QStringLiteral("\\-"));
    if (out.startsWith(u'.') || out.startsWith(u'\''))
        out.prepend(QStringLiteral("\\&"));
    return out;
}

QString optionTerm(const OptionHelp& option)
{
    QString term = QStringLiteral("\\fB\\-\\-") + roff(text(option.name)) + QStringLiteral("\\fR");
    if (option.value)
        term += QStringLiteral(" \\fI") + roff(text(option.value)) + QStringLiteral("\\fR");
    return term;
}

QString page()
{
    QString out = QStringLiteral(
        ".TH QUOTAS 1 \"\" \"quotas " QUOTAS_VERSION "\" \"Comandos do utilizador\"\n"
        ".nh\n"
        ".SH NOME\n"
        "quotas \\- o módulo de quotas do registo de associados, na linha de comandos\n"
        ".SH SINOPSE\n"
        ".B quotas\n"
        "[\\fB\\-\\-registry\\fR \\fIFICHEIRO\\fR] \\fICOMANDO\\fR [\\fIOPÇÕES\\fR]\n"
        ".br\n"
        ".B quotas\n"
        "\\fICOMANDO\\fR \\fB\\-\\-help\\fR\n"
        ".br\n"
        ".B quotas \\-\\-help\n"
        ".br\n"
        ".B quotas \\-\\-version\n"
        ".SH DESCRIÇÃO\n"
        "\\fBquotas\\fR faz sem janelas o que o programa anfitrião faz pelo menu Quotas: configura a ligação à "
        "base de dados, gera as quotas de um mês, importa a lista de quotas descontadas pela empresa, repara os "
        "dados e escreve as listagens e as cartas em PDF. Serve para tarefas agendadas e scripts; não precisa de "
        "ecrã. As caixas de mensagem são escritas como uma linha na saída padrão; o progresso, na saída de erros.\n"
        ".SH \"OPÇÕES GERAIS\"\n"
        ".TP\n"
        "\\fB\\-\\-registry\\fR \\fIFICHEIRO\\fR\n"
        "Ficheiro de configuração. Sem esta opção, o de \\fBQUOTAS_REGISTRY\\fR e, sem este, "
        "\\fI/etc/quotas/registry.reg\\fR.\n"
        ".TP\n"
        "\\fB\\-h\\fR, \\fB\\-\\-help\\fR\n"
        "Mostra a ajuda geral ou, depois de um comando, a desse comando.\n"
        ".TP\n"
        "\\fB\\-\\-version\\fR\n"
        "Mostra a versão.\n"
        ".SH COMANDOS\n");
    for (const Command& command : commands()) {
        out += QStringLiteral(".SS \"") + roff(synopsis(command)) + QStringLiteral("\"\n") + roff(text(command.description))
               + u'\n';
        if (command.operand)
            out += QStringLiteral(".TP\n\\fI") + roff(text(command.operand)) + QStringLiteral("\\fR\n")
                   + roff(text(command.operandText)) + u'\n';
        for (const OptionHelp& option : command.options)
            out += QStringLiteral(".TP\n") + optionTerm(option) + u'\n' + roff(text(option.text)) + u'\n';
    }
    out += QStringLiteral(".SH \"ESTADO DE SAÍDA\"\n");
    for (const ExitStatus& status : exitStatuses())
        out += QStringLiteral(".TP\n.B %1\n").arg(status.code) + roff(text(status.text)) + u'\n';
    out += QStringLiteral(
        ".SH AMBIENTE\n"
        ".TP\n"
        ".B QUOTAS_REGISTRY\n"
        "O ficheiro de configuração, quando não se dá \\fB\\-\\-registry\\fR.\n"
        ".TP\n"
        ".B QUOTAS_DATA_DIR\n"
        "A pasta dos dados (a animação, o cabeçalho das cartas); por omissão \\fI/usr/share/quotas\\fR.\n"
        ".SH FICHEIROS\n"
        ".TP\n"
        ".I /etc/quotas/registry.reg\n"
        "A configuração da ligação, no formato de exportação do registo do Windows; escrita por "
        "\\fBquotas config\\fR com o modo 0600.\n"
        ".TP\n"
        ".I /etc/quotas/letterhead.txt\n"
        "O nome e a morada do sindicato no cabeçalho das cartas, linhas \\fBnome =\\fR e \\fBmorada =\\fR. "
        "Sem ele vale o exemplo \\fI/usr/share/quotas/letterhead.txt\\fR.\n"
        ".TP\n"
        ".I /usr/share/quotas/\n"
        "A animação da manutenção e os exemplos de listas a importar.\n"
        ".SH EXEMPLOS\n"
        ".nf\n"
        "quotas config \\-\\-data\\-source /var/lib/quotas/quotas.db\n"
        "quotas init\\-db\n"
        "quotas gerar \\-\\-ano 2004 \\-\\-mes 3\n"
        "quotas importar \\-\\-ano 2004 \\-\\-mes 3 \\-\\-tipo 1 \\-\\-pdf rejeitados.pdf lista.csv\n"
        "quotas listagem \\-\\-pdf dividas.pdf\n"
        ".fi\n"
        ".SH \"VER TAMBÉM\"\n"
        ".BR quotas\\-host (1)\n");
    return out;
}

}  // namespace

int main()
{
    std::fputs(page().toUtf8().constData(), stdout);
    return 0;
}
