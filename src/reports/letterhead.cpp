#include "reports/letterhead.h"

#include "component/installation.h"
#include "platform/errors.h"

#include <QDir>
#include <QFile>

namespace quotas {

QString letterheadPath()
{
    return QDir(installationDataDir()).filePath(QStringLiteral("letterhead.txt"));
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
