#include "cli/commands.h"

namespace quotas::cli {

int importar(const QStringList&)
{
    throw QuotasError(QStringLiteral("o comando \"importar\" ainda não está disponível nesta versão."));
}

}  // namespace quotas::cli
