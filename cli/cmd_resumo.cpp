#include "cli/commands.h"
#include "cli/options.h"
#include "reports/entry.h"

#include <cstdio>

namespace quotas::cli {

int resumo(const QStringList& args)
{
    const Options options(QStringLiteral("resumo"), args);
    const int year = options.number(QStringLiteral("ano"), 1000, 9999);
    const int month = options.number(QStringLiteral("mes"), 1, 12);
    const QString pdf = options.value(QStringLiteral("pdf"));
    const QString csv = options.value(QStringLiteral("csv"));
    if (pdf.isEmpty() && csv.isEmpty())
        throw UsageError(QStringLiteral("resumo: indique --pdf SAIDA, --csv SAIDA ou ambos."));
    connectOrFail();
    if (!pdf.isEmpty()) {
        const int pages = writeMonthSummaryPdf(year, month, pdf);
        std::fputs(QStringLiteral("Resumo do Mês: %1 página(s) em %2\n").arg(pages).arg(pdf).toUtf8().constData(), stdout);
    }
    if (!csv.isEmpty()) {
        writeMonthSummaryCsv(year, month, csv);
        std::fputs(QStringLiteral("Resumo do Mês: escrito em %1\n").arg(csv).toUtf8().constData(), stdout);
    }
    return 0;
}

}  // namespace quotas::cli
