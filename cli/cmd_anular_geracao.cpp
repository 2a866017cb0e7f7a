#include "cli/commands.h"
#include "cli/options.h"
#include "component/shared_objects.h"
#include "generation/anular_geracao.h"
#include "generation/member_lookup.h"

#include <cstdio>

namespace quotas::cli {

// Prints the plan; only --confirmar removes anything, without a question.
int anularGeracao(const QStringList& args)
{
    const Options options(QStringLiteral("anular-geracao"), args);
    UndoChoice choice;
    choice.ano = options.number(QStringLiteral("ano"), 1900, 9999);
    choice.mes = options.number(QStringLiteral("mes"), 1, 12);
    if (options.isSet(QStringLiteral("tipo")))
        choice.tipo = options.number(QStringLiteral("tipo"), 1, 2);
    connectOrFail();
    const QString noTap = options.value(QStringLiteral("no-tap"));
    if (!noTap.isEmpty()) {
        const std::optional<StaffMember> member = findMemberByStaffNumber(Data().SqlServer, noTap);
        if (!member)
            throw UsageError(QStringLiteral("Número de Empresa não existe!"));
        choice.socio = member->socioId;
    }
    const UndoPlan plan = planUndo(Data().SqlServer, choice);
    std::fputs((plan.text() + u'\n').toUtf8().constData(), stdout);
    if (!options.isSet(QStringLiteral("confirmar"))) {
        std::fputs("Nada foi alterado: para eliminar estas quotas repita o comando com --confirmar.\n", stdout);
        return 0;
    }
    const UndoOutcome outcome = AnularGeracao(Data().SqlServer, plan);
    std::fputs((outcome.summary(choice) + u'\n').toUtf8().constData(), stdout);
    return outcome.changedMeanwhile > 0 ? 3 : 0;
}

}  // namespace quotas::cli
