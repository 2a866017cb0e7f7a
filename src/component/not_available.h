#pragma once

#include "platform/errors.h"

namespace quotas {

// What a method says while its window is not part of this build yet.
[[noreturn]] inline void windowNotAvailable(const QString& caption)
{
    throw QuotasError(QStringLiteral("A janela \"%1\" ainda não está disponível nesta versão.").arg(caption));
}

}  // namespace quotas
