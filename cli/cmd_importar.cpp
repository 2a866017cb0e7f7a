#include "cli/commands.h"
#include "cli/options.h"
#include "component/shared_objects.h"
#include "import/csv_import_source.h"
#include "import/dry_run_window.h"
#include "import/processar_importacao.h"
#include "import/rejects_listing.h"
#include "platform/components.h"

#include <QFile>
#include <QFileInfo>
#include <cstdio>

namespace quotas::cli {

namespace {

// The dry run: one tab-separated line per line of the list, then the
// counts; the exit status is the one the import would end with.
int simulate(int month, int year, int tipo)
{
    ImportVerdicts verdicts;
    const ImportSummary summary = SimularImportacao(month, year, tipo, verdicts);
    for (const ImportVerdict& verdict : verdicts.lines)
        std::fputs((dryRunCells(verdict).join(u'\t') + u'\n').toUtf8().constData(), stdout);
    if (!summary.refusal.isEmpty())
        throw QuotasError(summary.refusal);
    std::fputs((dryRunTotals(verdicts) + u'\n').toUtf8().constData(), stdout);
    return summary.rejected > 0 ? kLeftOut : 0;
}

}  // namespace

int importar(const QStringList& args)
{
    const Options options(QStringLiteral("importar"), args);
    const int year = options.number(QStringLiteral("ano"), 1000, 9999);
    const int month = options.number(QStringLiteral("mes"), 1, 12);
    const int tipo = options.number(QStringLiteral("tipo"), 1, 2);
    const QString file = options.positional().front();
    const QString pdf = options.isSet(QStringLiteral("pdf")) ? QFileInfo(options.value(QStringLiteral("pdf"))).absoluteFilePath()
                                                             : QString();
    connectOrFail();

    shared().SemSeparadorDecimal = options.isSet(QStringLiteral("sem-separador"));
    registerComponent(QStringLiteral("Dorvanta.General"),
                      [file] { return std::make_unique<CsvImportSource>(CsvImportSource::fixedFile(file)); });
    if (options.isSet(QStringLiteral("simular")))
        return simulate(month, year, tipo);
    // OUT always tells of this run: a listing left by an earlier one goes first.
    if (!pdf.isEmpty() && QFileInfo::exists(pdf) && !QFile::remove(pdf))
        throw QuotasError(QStringLiteral("não foi possível apagar a listagem anterior em %1.").arg(pdf));
    // Headless there is no preview: the listing goes to the PDF when one was
    // asked for, and is otherwise left in extras for "quotas rejeitados".
    QString listingFailure;
    bool listingWritten = false;
    setRejectsListing([&] {
        if (pdf.isEmpty())
            return;
        try {
            writeRejectsListingPdf(pdf);
            listingWritten = true;
        } catch (const QuotasError& e) {
            listingFailure = e.message();
        }
    });
    ImportSummary summary;
    try {
        summary = ProcessarImportacao(month, year, tipo);
    } catch (...) {
        setRejectsListing({});
        throw;
    }
    setRejectsListing({});

    if (!summary.refusal.isEmpty())
        throw QuotasError(summary.refusal);
    if (!summary.extrasSaved)
        throw QuotasError(QStringLiteral("os registos não importados não foram gravados na tabela extras."));
    if (!listingFailure.isEmpty())
        throw QuotasError(QStringLiteral("a importação foi feita, mas a listagem dos registos não importados não foi "
                                         "escrita em %1: %2")
                              .arg(pdf, listingFailure));
    std::fputs((summary.counts() + u'\n').toUtf8().constData(), stdout);
    if (listingWritten)
        std::fputs(QStringLiteral("Listagem dos registos não importados escrita em %1.\n").arg(pdf).toUtf8().constData(),
                   stdout);
    else if (!pdf.isEmpty())
        std::fputs(QStringLiteral("Nenhuma linha foi rejeitada: não há listagem a escrever em %1.\n").arg(pdf).toUtf8().constData(),
                   stdout);
    // Done, but the rejected lines (counted on stdout) were left out.
    return summary.rejected > 0 ? kLeftOut : 0;
}

}  // namespace quotas::cli
