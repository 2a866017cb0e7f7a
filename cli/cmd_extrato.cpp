#include "cli/commands.h"
#include "cli/options.h"
#include "component/shared_objects.h"
#include "reports/entry.h"

#include <QRegularExpression>
#include <cstdio>

namespace quotas::cli {

namespace {

// "AAAA-MM" as year * 100 + month; 0 when the option is not given.
int periodOption(const Options& options, const QString& name)
{
    if (!options.isSet(name))
        return 0;
    static const QRegularExpression form(QStringLiteral("^(\\d{4})-(\\d{2})$"));
    const QRegularExpressionMatch m = form.match(options.value(name));
    const int month = m.hasMatch() ? m.captured(2).toInt() : 0;
    if (month < 1 || month > 12)
        throw UsageError(QStringLiteral("extrato: --%1 deve ser um mês na forma AAAA-MM (2004-03, por exemplo).").arg(name));
    return m.captured(1).toInt() * 100 + month;
}

}  // namespace

int extrato(const QStringList& args)
{
    const Options options(QStringLiteral("extrato"), args);
    const QString noTap = options.value(QStringLiteral("no-tap"));
    if (noTap.isEmpty())
        throw UsageError(QStringLiteral("extrato: falta --no-tap N."));
    const QString pdf = options.value(QStringLiteral("pdf"));
    if (pdf.isEmpty())
        throw UsageError(QStringLiteral("extrato: falta --pdf SAIDA."));
    StatementRequest request;
    request.fromPeriod = periodOption(options, QStringLiteral("desde"));
    request.toPeriod = periodOption(options, QStringLiteral("ate"));
    if (request.fromPeriod && request.toPeriod && request.fromPeriod > request.toPeriod)
        throw UsageError(QStringLiteral("extrato: --desde é posterior a --ate."));
    request.allMovements = options.isSet(QStringLiteral("todos-os-movimentos"));
    connectOrFail();
    QString problem;
    request.socioId = memberByStaffNumber(Data().SqlServer, noTap, &problem);
    if (!request.socioId.isValid())
        throw UsageError(QStringLiteral("extrato: ") + problem);
    const int pages = writeMemberStatementPdf(request, pdf);
    std::fputs(QStringLiteral("Extrato de Quotas: %1 página(s) em %2\n").arg(pages).arg(pdf).toUtf8().constData(), stdout);
    return 0;
}

}  // namespace quotas::cli
