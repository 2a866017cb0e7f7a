#include "generation/lancar_quota.h"

#include "component/money.h"
#include "component/stored_value.h"
#include "generation/dues_account.h"
#include "generation/dues_counter.h"
#include "generation/generation_outcome.h"
#include "platform/connection.h"
#include "platform/recordset.h"

#include <QSqlQuery>

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

unsigned chargedTypes(Connection& connection, const QVariant& socio, int ano, int mes)
{
    QSqlQuery& q = connection.run(connection.dialect().translate(QStringLiteral(
                                      "SELECT tipo FROM tbQuotas_Movimentos WHERE (socio_id=?) AND (ano= ?) AND (mes= ?)")),
                                  {socio, ano, mes});
    unsigned charged = 0;
    while (q.next()) {
        const int tipo = q.value(0).toInt();
        if (tipo > 0 && tipo < 32)
            charged |= 1u << tipo;
    }
    q.finish();
    return charged;
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
    const int number = ctx.counter.next();
    ctx.connection.execute(QStringLiteral("INSERT INTO tbQuotas_Movimentos (data, ano, mes, socio_id, ref, rend1, rend2, "
                                          "quota, pago, tipo, quota_no) VALUES (?, ?, ?, ?, ?, ?, ?, ?, 0, ?, ?)"),
                           {ctx.today, ctx.ano, ctx.mes, ctx.member.value(QStringLiteral("no")), info.ref,
                            roundCents(rend1.value), roundCents(rend2.value), amount, info.tipo, number});
    ctx.account.charge(type, amount, ctx.ano, ctx.mes);
    ctx.charged |= 1u << info.tipo;
    ++ctx.outcome.posted;
    return true;
}

}  // namespace quotas
