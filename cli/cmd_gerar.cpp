#include "cli/commands.h"

namespace quotas::cli {

int gerar(const QStringList&)
{
    throw QuotasError(QStringLiteral("o comando \"gerar\" ainda não está disponível nesta versão."));
}

}  // namespace quotas::cli
