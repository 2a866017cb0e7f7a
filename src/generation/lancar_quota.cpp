#include "generation/lancar_quota.h"

#include "component/money.h"
#include "component/stored_value.h"
#include "generation/dues_account.h"
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
    return noTap.isEmpty() ? QStringLiteral("sem número (associado %1)").arg(member.value(QStringLiteral("no")).toLongLong())
                           : noTap;
}

bool LancarQuota(PostingContext& ctx, DueType type)
{
    const DueTypeInfo& info = dueTypeInfo(type);
    if (ctx.charged & (1u << info.tipo))
        return false;

    // A value that is not what its column promises leaves the due out,
    // named; it is never taken as 0 or as "no end date".
    auto unreadable = [&](const QString& column, const QString& problem) {
        ++ctx.outcome.unreadable;
        noteOnce(ctx.outcome.membersUnreadable,
                 QStringLiteral("%1 (%2: %3)").arg(memberLabel(ctx.member), column, problem));
        return false;
    };

    if (type == DueType::Seguro) {
        const StoredNumber seguro = readStoredNumber(ctx.member.value(QStringLiteral("seguro")));
        if (seguro.isBad())
            return unreadable(QStringLiteral("seguro"), seguro.problem());
        const StoredDate end = readStoredDate(ctx.member.value(QStringLiteral("seguro_data_rescisao")));
        if (!end.ok && seguro.value != 0)
            return unreadable(QStringLiteral("seguro_data_rescisao"), end.problem());
        if (!insuranceCharged(seguro, end, ctx.ano, ctx.mes))
            return false;
    }

    const StoredNumber rend1 = readStoredAmount(ctx.account.rend1());
    const StoredNumber rend2 = readStoredAmount(ctx.account.rend2());
    if (rend1.isBad())
        return unreadable(QStringLiteral("ult_rend1"), rend1.problem());
    if (rend2.isBad())
        return unreadable(QStringLiteral("ult_rend2"), rend2.problem());
    if (ctx.account.total().isBad())
        return unreadable(QStringLiteral("total_quotas"), ctx.account.total().problem());
    if (rend1.isNull() || rend2.isNull()) {
        ++ctx.outcome.missingRemuneration;
        noteOnce(ctx.outcome.membersMissingRemuneration, memberLabel(ctx.member));
        return false;
    }

    const StoredNumber personal = readStoredNumber(ctx.account.personalRate(type));
    if (personal.isBad())
        return unreadable(info.personalRate, personal.problem());
    ctx.employers.moveFirst();
    const bool employerFound = ctx.employers.find(QStringLiteral("code"), ctx.member.value(QStringLiteral("empresa")));
    const StoredNumber employer =
        readStoredNumber(employerFound ? ctx.employers.value(QStringLiteral("percent_sindicato")) : QVariant());
    if (employer.isBad() && !(personal.isNumber() && personal.value > 0))
        return unreadable(QStringLiteral("percent_sindicato"), employer.problem());
    const std::optional<double> rate = dueRate(personal, employerFound, employer);
    if (!rate) {
        ++ctx.outcome.missingRate;
        noteOnce(ctx.outcome.membersMissingRate, memberLabel(ctx.member));
        return false;
    }

    const double amount = dueAmount(roundCents(rend1.value), roundCents(rend2.value), *rate);
    if (!amountInRange(amount))
        return unreadable(QStringLiteral("quota"), QStringLiteral("valor calculado fora dos limites de ±9.999.999.999,99"));
    ctx.dues.append({type, roundCents(rend1.value), roundCents(rend2.value), amount});
    ctx.charged |= 1u << info.tipo;
    return true;
}

void WriteDues(PostingContext& ctx)
{
    if (ctx.dues.isEmpty())
        return;
    QString sql = QStringLiteral("INSERT INTO tbQuotas_Movimentos (data, ano, mes, socio_id, ref, rend1, rend2, quota, pago, "
                                 "tipo, quota_no) VALUES ");
    QVariantList params;
    int number = ctx.counter.reserve(int(ctx.dues.size()));
    for (const PostingContext::Due& due : std::as_const(ctx.dues)) {
        const DueTypeInfo& info = dueTypeInfo(due.type);
        if (!params.isEmpty())
            sql += QStringLiteral(", ");
        sql += QStringLiteral("(?, ?, ?, ?, ?, ?, ?, ?, 0, ?, ?)");
        params << ctx.today << ctx.ano << ctx.mes << ctx.member.value(QStringLiteral("no")) << info.ref << due.rend1
               << due.rend2 << due.amount << info.tipo << number++;
    }
    ctx.connection.execute(sql, params);
    for (const PostingContext::Due& due : std::as_const(ctx.dues))
        ctx.account.charge(due.type, due.amount, ctx.ano, ctx.mes);
    ctx.outcome.posted += int(ctx.dues.size());
    ctx.dues.clear();
}

}  // namespace quotas
