#include "cli/commands.h"

namespace quotas::cli {

namespace {

[[noreturn]] void notYet(const char* command)
{
    throw QuotasError(QStringLiteral("o comando \"%1\" ainda não está disponível nesta versão.").arg(QLatin1String(command)));
}

}  // namespace

int listagem(const QStringList&)
{
    notYet("listagem");
}

int cartas(const QStringList&)
{
    notYet("cartas");
}

int rejeitados(const QStringList&)
{
    notYet("rejeitados");
}

}  // namespace quotas::cli
