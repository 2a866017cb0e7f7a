#include "cli/commands.h"

namespace quotas::cli {

int manutencao(const QStringList&)
{
    throw QuotasError(QStringLiteral("o comando \"manutencao\" ainda não está disponível nesta versão."));
}

}  // namespace quotas::cli
