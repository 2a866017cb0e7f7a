#include "cli/commands.h"
#include "cli/options.h"
#include "import/rejects_listing.h"
#include "reports/entry.h"

#include <cstdio>

namespace quotas::cli {

namespace {

QString pdfPath(const QString& command, const QStringList& args)
{
    const Options options(command, args);
    QString path = options.value(QStringLiteral("pdf"));
    if (path.isEmpty())
        throw UsageError(QStringLiteral("%1: falta --pdf SAIDA.").arg(command));
    return path;
}

void written(const QString& what, const QString& path, int pages)
{
    const QString line = pages > 0 ? QStringLiteral("%1: %2 página(s) em %3\n").arg(what).arg(pages).arg(path)
                                   : QStringLiteral("%1: escrita em %2\n").arg(what, path);
    std::fputs(line.toUtf8().constData(), stdout);
}

}  // namespace

int listagem(const QStringList& args)
{
    const QString path = pdfPath(QStringLiteral("listagem"), args);
    connectOrFail();
    written(QStringLiteral("Listagem de Dívidas"), path, writeDebtListingPdf(path));
    return 0;
}

int cartas(const QStringList& args)
{
    const QString path = pdfPath(QStringLiteral("cartas"), args);
    connectOrFail();
    written(QStringLiteral("Cartas de Dívidas"), path, writeDebtLettersPdf(path));
    return 0;
}

int rejeitados(const QStringList& args)
{
    const QString path = pdfPath(QStringLiteral("rejeitados"), args);
    // Login opens SqlServer_Prints too, which the listing reads through.
    connectOrFail();
    writeRejectsListingPdf(path);
    written(QStringLiteral("Listagem de Dados não Importados"), path, 0);
    return 0;
}

}  // namespace quotas::cli
