#include "cli/commands.h"
#include "cli/options.h"
#include "settings/login.h"
#include "settings/password.h"
#include "settings/registry_file.h"
#include "settings/settings_location.h"

#include <QFileInfo>
#include <cstdio>

namespace quotas::cli {

int config(const QStringList& args)
{
    const Options options(QStringLiteral("config"),
                          {{QStringLiteral("data-source"), QStringLiteral("Origem dos dados."), QStringLiteral("DS")},
                           {QStringLiteral("catalog"), QStringLiteral("Base de dados."), QStringLiteral("NOME")},
                           {QStringLiteral("user"), QStringLiteral("Utilizador."), QStringLiteral("U")},
                           {QStringLiteral("password"), QStringLiteral("Palavra-passe."), QStringLiteral("P")},
                           {QStringLiteral("security-info"), QStringLiteral("Persist Security Info."), QStringLiteral("TEXTO")}},
                          args);
    if (!options.isSet(QStringLiteral("data-source")) || options.value(QStringLiteral("data-source")).trimmed().isEmpty())
        throw UsageError(QStringLiteral("config: falta --data-source."));
    const QString path = registryPath();
    // An existing file keeps its other keys; one we cannot read is not overwritten.
    RegistryFile file = QFileInfo::exists(path) ? RegistryFile::load(path) : RegistryFile();
    const QString key = loginKeyPath();
    const QString securityInfo =
        options.isSet(QStringLiteral("security-info")) ? options.value(QStringLiteral("security-info")) : QStringLiteral("False");
    file.setString(key, QStringLiteral("dtSecurityInfo"), securityInfo);
    file.setString(key, QStringLiteral("dtUser"), options.value(QStringLiteral("user")));
    file.setString(key, QStringLiteral("dtPassword"), encodePassword(options.value(QStringLiteral("password"))));
    file.setString(key, QStringLiteral("dtInitialCatalog"), options.value(QStringLiteral("catalog")));
    file.setString(key, QStringLiteral("dtDataSource"), options.value(QStringLiteral("data-source")));
    file.save(path);
    std::fputs(QStringLiteral("Configuração gravada em %1.\n").arg(path).toUtf8().constData(), stdout);
    return 0;
}

}  // namespace quotas::cli
