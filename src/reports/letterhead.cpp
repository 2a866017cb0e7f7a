#include "reports/letterhead.h"

#include "component/installation.h"
#include "platform/errors.h"

#include <QDir>
#include <QFile>
#include <QFileInfo>

namespace quotas {

QString letterheadPath()
{
    const QString name = QStringLiteral("letterhead.txt");
    // The administrator's copy in /etc/quotas is edited in place and kept by
    // upgrades; a data folder named in the environment (tests, trials) wins.
    if (qEnvironmentVariableIsEmpty("QUOTAS_DATA_DIR")) {
        QString edited = QStringLiteral("/etc/quotas/") + name;
        if (QFileInfo::exists(edited))
            return edited;
    }
    return QDir(installationDataDir()).filePath(name);
}

Letterhead readLetterhead(const QString& path)
{
    Letterhead letterhead;
    QFile file(path);
    if (!file.exists())
        return letterhead;
    if (!file.open(QIODevice::ReadOnly))
        throw QuotasError(QStringLiteral("Não foi possível ler o timbre das cartas em \"%1\": %2").arg(path, file.errorString()));
    const QString text = QString::fromUtf8(file.readAll());
    for (QString line : text.split(u'\n')) {
        line = line.trimmed();
        if (line.isEmpty() || line.startsWith(u'#'))
            continue;
        const qsizetype equals = line.indexOf(u'=');
        if (equals < 0)
            continue;
        const QString key = line.left(equals).trimmed().toLower();
        const QString value = line.mid(equals + 1).trimmed();
        if (key == QStringLiteral("nome"))
            letterhead.name = value;
        else if (key == QStringLiteral("morada"))
            letterhead.address = value;
    }
    return letterhead;
}

}  // namespace quotas
