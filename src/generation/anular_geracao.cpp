#include "generation/anular_geracao.h"

#include "component/money.h"
#include "component/month_names.h"
#include "generation/dues_account.h"
#include "generation/generation_outcome.h"
#include "platform/connection.h"
#include "platform/transaction.h"

#include <QSqlQuery>
#include <cmath>
#include <map>
#include <optional>

namespace quotas {

namespace {

const QString kPaid = QStringLiteral("já tem pagamentos");
const QString kImported = QStringLiteral("importado da lista da empresa");
const QString kUnreadable = QStringLiteral("valores em branco ou ilegíveis (corra a Manutenção de Dados)");

std::optional<qint64> cents(const QVariant& value)
{
    if (value.isNull())
        return std::nullopt;
    bool ok = false;
    const double amount = value.toDouble(&ok);
    if (!ok || !std::isfinite(amount))
        return std::nullopt;
    return std::llround(amount * 100.0);
}

// The import posts a line by writing the deducted amount into both quota and
// pago and 0 into rend2, and never writes a document; a payment in the record
// window asks for its document. So a due whose pago equals its quota, with
// rend2 0 and no document, is the import's; any other paid due was paid by
// hand. A deduction of 0 leaves pago 0 and a due of 0, which takes back
// nothing: such a due goes like any due of 0.
QString keptBecause(const QVariant& quota, const QVariant& pago, const QVariant& rend2, const QVariant& docNo)
{
    const std::optional<qint64> q = cents(quota), p = cents(pago), r2 = cents(rend2);
    if (!q || !p)
        return kUnreadable;
    if (!docNo.toString().trimmed().isEmpty())
        return kPaid;
    if (*p == 0)
        return QString();
    return *p == *q && r2 && *r2 == 0 ? kImported : kPaid;
}

QString monthOf(const UndoChoice& c)
{
    return QStringLiteral("%1 de %2").arg(monthNames().value(c.mes - 1)).arg(c.ano);
}

const QLocale& portuguese()
{
    static const QLocale locale(QLocale::Portuguese, QLocale::Portugal);
    return locale;
}

QString money(double amount)
{
    return formatMoney(amount, portuguese());
}

QString typeName(int tipo)
{
    return tipo == 1 ? QStringLiteral("Sindicato") : tipo == 2 ? QStringLiteral("Seguro")
                                                               : QStringLiteral("Tipo %1").arg(tipo);
}

// "Sindicato: 2 quotas, € 30,00" per type, and the whole.
QStringList totalsByType(const QList<UndoDue>& list)
{
    std::map<int, std::pair<int, double>> byType;
    double all = 0;
    for (const UndoDue& d : list) {
        auto& t = byType[d.tipo];
        ++t.first;
        t.second = roundCents(t.second + d.quota);
        all = roundCents(all + d.quota);
    }
    QStringList lines;
    for (const auto& [tipo, t] : byType)
        lines << QStringLiteral("  %1: %2, %3").arg(typeName(tipo), duesCount(t.first), money(t.second));
    lines.prepend(QStringLiteral("%1, %2").arg(duesCount(int(list.size())), money(all)));
    return lines;
}

QString line(const UndoDue& d)
{
    QString text = QStringLiteral("  %1  %2  %3  %4")
                       .arg(d.noTap.isEmpty() ? QStringLiteral("(associado %1)").arg(d.socioId.toString()) : d.noTap,
                            d.nome, typeName(d.tipo), money(d.quota));
    if (!d.keptBecause.isEmpty())
        text += QStringLiteral(": ") + d.keptBecause;
    return text;
}

double sum(const QList<UndoDue>& list)
{
    double total = 0;
    for (const UndoDue& d : list)
        total = roundCents(total + d.quota);
    return total;
}

}  // namespace

QString UndoPlan::text() const
{
    QString scope = choice.tipo == 0 ? QStringLiteral("Sindicato e Seguro") : typeName(choice.tipo);
    if (choice.socio != 0)
        scope += QStringLiteral(", um associado");
    QStringList out{QStringLiteral("Anular Geração de %1 (%2)").arg(monthOf(choice), scope)};
    const QStringList goes = totalsByType(removed), stays = totalsByType(kept);
    out << QStringLiteral("A eliminar: ") + goes.front();
    out << goes.mid(1);
    out << QStringLiteral("Ficam: ") + stays.front();
    out << stays.mid(1);
    if (!removed.isEmpty()) {
        out << QString() << QStringLiteral("Quotas a eliminar (Nº Empresa, nome, tipo, valor):");
        for (const UndoDue& d : removed)
            out << line(d);
    }
    if (!kept.isEmpty()) {
        out << QString() << QStringLiteral("Quotas que ficam, e porquê:");
        for (const UndoDue& d : kept)
            out << line(d);
    }
    return out.join(u'\n');
}

QString UndoPlan::confirmation() const
{
    return QStringLiteral("Eliminar %1 de %2, no valor de %3? As contas dos associados descontam este valor; os "
                          "números das quotas não voltam a ser usados.")
        .arg(duesCount(int(removed.size())), monthOf(choice), money(sum(removed)));
}

QString UndoOutcome::summary(const UndoChoice& choice) const
{
    QString text = QStringLiteral("Anulação concluída: %1 de %2 eliminadas, no valor de %3.")
                       .arg(duesCount(removed), monthOf(choice), money(amount));
    if (changedMeanwhile > 0)
        text += QStringLiteral(" %1 entretanto paga(s) ou alterada(s): ficaram.").arg(duesCount(changedMeanwhile));
    return text;
}

UndoPlan planUndo(Connection& connection, const UndoChoice& choice)
{
    UndoPlan plan;
    plan.choice = choice;
    QString sql = QStringLiteral(
        "SELECT m.quota_id, m.socio_id, s.no_tap, s.nome, m.tipo, m.quota, m.pago, m.rend2, m.doc_no "
        "FROM tbQuotas_Movimentos m LEFT OUTER JOIN tbSocios s ON s.socio_id = m.socio_id WHERE m.ano = ? AND m.mes = ?");
    QVariantList params{choice.ano, choice.mes};
    if (choice.tipo != 0) {
        sql += QStringLiteral(" AND m.tipo = ?");
        params << choice.tipo;
    }
    if (choice.socio != 0) {
        sql += QStringLiteral(" AND m.socio_id = ?");
        params << choice.socio;
    }
    sql += QStringLiteral(" ORDER BY m.socio_id, m.tipo, m.quota_id");
    QSqlQuery& q = connection.run(connection.dialect().translate(sql), params);
    while (q.next()) {
        UndoDue due{q.value(0), q.value(1), q.value(2).toString(), q.value(3).toString(), q.value(4).toInt(),
                    q.value(5).toDouble(), keptBecause(q.value(5), q.value(6), q.value(7), q.value(8))};
        (due.keptBecause.isEmpty() ? plan.removed : plan.kept).append(due);
    }
    q.finish();
    return plan;
}

UndoOutcome AnularGeracao(Connection& connection, const UndoPlan& plan)
{
    // The plan's conditions again, on the row as it is now: a payment, an
    // import or an edit made since the plan was read keeps the due.
    static const QString remove = QStringLiteral(
        "DELETE FROM tbQuotas_Movimentos WHERE quota_id = ? AND pago = 0 AND ABS(quota - ?) < 0.005 "
        "AND (doc_no IS NULL OR TRIM(doc_no) = '')");
    const QString decrease = QStringLiteral("UPDATE tbQuotas_Socios SET total_quotas = %1 WHERE socio_id = ?")
                                 .arg(connection.dialect().addToColumn(QStringLiteral("total_quotas")));
    UndoOutcome outcome;
    DuesAccount account;
    LazyCommits lazy(connection);
    for (qsizetype first = 0; first < plan.removed.size();) {
        const QVariant socio = plan.removed[first].socioId;
        qsizetype end = first;
        while (end < plan.removed.size() && plan.removed[end].socioId == socio)
            ++end;
        Transaction tx(connection);
        account.lock(connection, socio);
        int removed = 0;
        double amount = 0;
        for (qsizetype i = first; i < end; ++i) {
            const UndoDue& due = plan.removed[i];
            if (connection.execute(remove, {due.quotaId, due.quota}) == 1) {
                ++removed;
                amount = roundCents(amount + due.quota);
            }
        }
        if (removed > 0 && amount != 0)
            connection.execute(decrease, {-amount, socio});
        tx.commit();
        outcome.removed += removed;
        outcome.amount = roundCents(outcome.amount + amount);
        outcome.changedMeanwhile += int(end - first) - removed;
        first = end;
    }
    lazy.finish();
    return outcome;
}

}  // namespace quotas
