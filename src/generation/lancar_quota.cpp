#include "generation/lancar_quota.h"

#include "component/money.h"
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

    if (type == DueType::Seguro
        && !insuranceCharged(ctx.member.value(QStringLiteral("seguro")),
                             ctx.member.value(QStringLiteral("seguro_data_rescisao")), ctx.ano, ctx.mes))
        return false;

    if (ctx.account.rend1().isNull() || ctx.account.rend2().isNull()) {
        ++ctx.outcome.missingRemuneration;
        noteOnce(ctx.outcome.membersMissingRemuneration, memberLabel(ctx.member));
        return false;
    }

    ctx.employers.moveFirst();
    const bool employerFound = ctx.employers.find(QStringLiteral("code"), ctx.member.value(QStringLiteral("empresa")));
    const std::optional<double> rate =
        dueRate(ctx.account.personalRate(type), employerFound,
                employerFound ? ctx.employers.value(QStringLiteral("percent_sindicato")) : QVariant());
    if (!rate) {
        ++ctx.outcome.missingRate;
        noteOnce(ctx.outcome.membersMissingRate, memberLabel(ctx.member));
        return false;
    }

    const double rend1 = roundCents(ctx.account.rend1().toDouble());
    const double rend2 = roundCents(ctx.account.rend2().toDouble());
    const double amount = dueAmount(rend1, rend2, *rate);
    const int number = ctx.counter.next();
    ctx.connection.execute(QStringLiteral("INSERT INTO tbQuotas_Movimentos (data, ano, mes, socio_id, ref, rend1, rend2, "
                                          "quota, pago, tipo, quota_no) VALUES (?, ?, ?, ?, ?, ?, ?, ?, 0, ?, ?)"),
                           {ctx.today, ctx.ano, ctx.mes, ctx.member.value(QStringLiteral("no")), info.ref, rend1, rend2,
                            amount, info.tipo, number});
    ctx.account.charge(type, amount, ctx.ano, ctx.mes);
    ctx.charged |= 1u << info.tipo;
    ++ctx.outcome.posted;
    return true;
}

}  // namespace quotas
