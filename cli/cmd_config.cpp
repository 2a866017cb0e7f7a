#include "cli/commands.h"
#include "cli/options.h"
#include "settings/code_page.h"
#include "settings/login.h"
#include "settings/password.h"
#include "settings/registry_file.h"
#include "settings/settings_location.h"

#include <QFileInfo>
#include <algorithm>
#include <cstdio>

namespace quotas::cli {

int config(const QStringList& args)
{
    const Options options(QStringLiteral("config"), args);
    if (!options.isSet(QStringLiteral("data-source")) || options.value(QStringLiteral("data-source")).trimmed().isEmpty())
        throw UsageError(QStringLiteral("config: falta --data-source."));
    // The reader takes one line per value and Windows-1252 text (the
    // password is stored in Base64, so any character of it passes).
    for (const char* option : {"data-source", "catalog", "user", "security-info"}) {
        const QString value = options.value(QString::fromLatin1(option));
        if (std::any_of(value.cbegin(), value.cend(), [](QChar c) { return c.category() == QChar::Other_Control; }))
            throw UsageError(QStringLiteral("config: o valor de --%1 tem caracteres de controlo (mudança de linha, "
                                            "tabulação...), que o ficheiro de configuração não guarda.")
                                 .arg(QLatin1String(option)));
        if (fromCodePage1252(toCodePage1252(value)) != value)
            throw UsageError(QStringLiteral("config: o valor de --%1 tem caracteres que o ficheiro de configuração não guarda "
                                            "(só os do alfabeto da Europa Ocidental, Windows-1252).")
                                 .arg(QLatin1String(option)));
    }
    const QString path = registryPath();
    // An existing file keeps its other keys; one we cannot read is not overwritten.
    RegistryFile file;
    try {
        if (QFileInfo::exists(path))
            file = RegistryFile::load(path);
    } catch (const QuotasError& e) {
        throw UsageError(e.message());
    }
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
