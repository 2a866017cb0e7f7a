#pragma once

#include <QStringList>

namespace quotas {

// The long month names in the language of the union's staff, January first:
// the dialogs offer them and the import compares against them exactly.
inline const QStringList& monthNames()
{
    static const QStringList names = {
        QStringLiteral("Janeiro"), QStringLiteral("Fevereiro"), QStringLiteral("Março"), QStringLiteral("Abril"),
        QStringLiteral("Maio"), QStringLiteral("Junho"), QStringLiteral("Julho"), QStringLiteral("Agosto"),
        QStringLiteral("Setembro"), QStringLiteral("Outubro"), QStringLiteral("Novembro"), QStringLiteral("Dezembro")};
    return names;
}

}  // namespace quotas
