#include "generation/lancar_quota.h"

#include "component/money.h"
#include "generation/dues_counter.h"
#include "generation/generation_outcome.h"
#include "platform/connection.h"
#include "platform/recordset.h"

namespace quotas {

namespace {

void noteOnce(QStringList& members, const QString& label)
{
    // Both dues of one member fail for the same reason: name him once.
    if (members.isEmpty() || members.constLast() != label)
        members << label;
}

}  // namespace

QString memberLabel(const Recordset& member)
{
    const QString noTap = member.value(QStringLiteral("no_tap")).toString().trimmed();
    return noTap.isEmpty() ? QStringLiteral("sem número (associado %1)").arg(member.value(QStringLiteral("no")).toLongLong()) : noTap;
}

bool LancarQuota(PostingContext& ctx, DueType type)
{
    const DueTypeInfo& info = dueTypeInfo(type);
    const QVariant no = ctx.member.value(QStringLiteral("no"));

    // The unique index on (socio_id, ano, mes, tipo) answers this at once.
    ctx.movements.close();
    ctx.movements.open(QStringLiteral("SELECT * FROM tbQuotas_Movimentos WHERE (socio_id=?) AND (ano= ?) AND (mes= ?) "
                                      "AND (tipo=%1)")
                           .arg(info.tipo),
                       ctx.connection, Cursor::Keyset, Lock::Pessimistic, {no, ctx.ano, ctx.mes});
    if (!ctx.movements.eof())
        return false;

    if (type == DueType::Seguro
        && !insuranceCharged(ctx.member.value(QStringLiteral("seguro")),
                             ctx.member.value(QStringLiteral("seguro_data_rescisao")), ctx.ano, ctx.mes))
        return false;

    const QVariant rend1 = ctx.account.value(QStringLiteral("ult_rend1"));
    const QVariant rend2 = ctx.account.value(QStringLiteral("ult_rend2"));
    if (rend1.isNull() || rend2.isNull()) {
        ++ctx.outcome.missingRemuneration;
        noteOnce(ctx.outcome.membersMissingRemuneration, memberLabel(ctx.member));
        return false;
    }

    ctx.employers.moveFirst();
    const bool employerFound = ctx.employers.find(QStringLiteral("code"), ctx.member.value(QStringLiteral("empresa")));
    const std::optional<double> rate =
        dueRate(ctx.account.value(info.personalRate), employerFound,
                employerFound ? ctx.employers.value(QStringLiteral("percent_sindicato")) : QVariant());
    if (!rate) {
        ++ctx.outcome.missingRate;
        noteOnce(ctx.outcome.membersMissingRate, memberLabel(ctx.member));
        return false;
    }

    const double r1 = roundCents(rend1.toDouble());
    const double r2 = roundCents(rend2.toDouble());
    const double amount = dueAmount(r1, r2, *rate);
    const int number = ctx.counter.next();

    Recordset& mv = ctx.movements;
    mv.addNew();
    mv.setValue(QStringLiteral("data"), ctx.today);
    mv.setValue(QStringLiteral("ano"), ctx.ano);
    mv.setValue(QStringLiteral("mes"), ctx.mes);
    mv.setValue(QStringLiteral("socio_id"), no);
    mv.setValue(QStringLiteral("ref"), info.ref);
    mv.setValue(QStringLiteral("rend1"), r1);
    mv.setValue(QStringLiteral("rend2"), r2);
    mv.setValue(QStringLiteral("quota"), amount);
    mv.setValue(QStringLiteral("pago"), 0.0);
    mv.setValue(QStringLiteral("tipo"), info.tipo);
    mv.setValue(QStringLiteral("quota_no"), number);
    mv.update();

    // A running total: saved as "total + amount", so a payment recorded
    // meanwhile is kept.
    ctx.account.addTo(QStringLiteral("total_quotas"), amount);
    ctx.account.setValue(info.amountColumn, amount);
    ctx.account.setValue(QStringLiteral("ult_ano"), ctx.ano);
    ctx.account.setValue(QStringLiteral("ult_mes"), ctx.mes);
    ++ctx.outcome.posted;
    return true;
}

}  // namespace quotas
