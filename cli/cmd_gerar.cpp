#include "cli/commands.h"
#include "cli/options.h"
#include "component/shared_objects.h"
#include "generation/member_lookup.h"
#include "generation/processar_quotas.h"
#include "platform/message_boxes.h"

#include <cstdio>

namespace quotas::cli {

// The dialog's run without the dialog: no confirmation, the same closing
// message and counts, and the dues that could not be generated after them.
int gerar(const QStringList& args)
{
    const Options options(QStringLiteral("gerar"), args);
    const int ano = options.number(QStringLiteral("ano"), 1900, 9999);
    const int mes = options.number(QStringLiteral("mes"), 1, 12);
    connectOrFail();
    int socio = 0;
    // An empty number means every member, as in the dialog.
    const QString noTap = options.value(QStringLiteral("no-tap"));
    if (!noTap.isEmpty()) {
        const std::optional<StaffMember> member = findMemberByStaffNumber(Data().SqlServer, noTap);
        if (!member)
            throw UsageError(QStringLiteral("Número de Empresa não existe!"));
        socio = member->socioId;
    }
    const GenerationOutcome outcome = ProcessarQuotas(ano, mes, socio);
    msgBox(QStringLiteral("Fim do processamento de quotizações"), Buttons::Ok, Icon::Information,
           QStringLiteral("Gerar Quotas"));
    // The counts a script reads, a line each, as the dialog shows them.
    std::fputs((outcome.counts() + u'\n').toUtf8().constData(), stdout);
    if (outcome.notGenerated() == 0)
        return 0;
    msgBox(outcome.summary(), Buttons::Ok, Icon::Exclamation, QStringLiteral("Gerar Quotas"));
    return kLeftOut;
}

}  // namespace quotas::cli
