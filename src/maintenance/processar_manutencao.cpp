#include "maintenance/processar_manutencao.h"

#include "component/installation.h"
#include "component/money.h"
#include "component/stored_value.h"
#include "maintenance/maintenance_panel.h"
#include "platform/chunked_rows.h"
#include "platform/components.h"
#include "platform/connection.h"
#include "platform/errors.h"
#include "platform/late_binding.h"
#include "platform/message_boxes.h"
#include "platform/recordset.h"
#include "platform/transaction.h"

#include <QDir>
#include <QObject>
#include <memory>

namespace quotas {

namespace {

const char* const kFetching = "Recebendo informação do servidor, aguarde alguns momentos . . .";

struct NullPass {
    const char* table;
    const char* label;
};

const NullPass kNullPasses[] = {
    {"tbQuotas_Movimentos", "Movimentos Activos"},
    {"tbQuotas_Movimentos_Inactivos", "Movimentos Inactivos"},
    {"tbQuotas_Movimentos_Historico", "Histórico de Movimentos"},
};

struct TotalsPass {
    const char* accounts;
    const char* movements;
    const char* label;
};

const TotalsPass kTotalsPasses[] = {
    {"tbQuotas_Socios", "tbQuotas_Movimentos", "Acumulados Activos"},
    {"tbQuotas_Socios_Inactivos", "tbQuotas_Movimentos_Inactivos", "Acumulados Inactivos"},
};

QString keyOf(Connection& connection, const QString& table)
{
    QString key = connection.primaryKey(table);
    if (key.isEmpty())
        throw DbError(QStringLiteral("A tabela \"%1\" não tem chave primária: não é possível gravar.").arg(table));
    return key;
}

// Passes 1 to 3. The table is read in chunks in the order of its key, so the
// run holds one chunk whatever the table's size. Each repaired row is saved
// on its own, so a failure keeps the rows repaired before it; a Null another
// user filled in meanwhile keeps that user's value.
void repairNulls(Connection& connection, MaintenancePanel& panel, int pass, const NullPass& what)
{
    const QString table = QString::fromLatin1(what.table);
    const QString key = keyOf(connection, table);
    // The rows there are now, as one read of the table would see them: rows
    // added meanwhile are left to the next run.
    Recordset extent;
    extent.open(QStringLiteral("SELECT COUNT(*), MAX(%1) FROM %2").arg(key, table), connection);
    const int rows = extent.value(0).toInt();
    const QVariant last = extent.value(1);
    extent.close();
    if (rows == 0) {
        panel.startBar(pass, 1);
        panel.stepBar(pass);
        return;
    }
    panel.startBar(pass, rows);
    const QString repair = QStringLiteral("UPDATE %1 SET rend1 = COALESCE(rend1, 0), rend2 = COALESCE(rend2, 0), "
                                          "quota = COALESCE(quota, 0), pago = COALESCE(pago, 0) WHERE %2 = ?")
                               .arg(table, key);
    ChunkedRows work(connection,
                     QStringLiteral("SELECT %1, rend1, rend2, quota, pago FROM %2 WHERE %1 <= ?%3 ORDER BY %1")
                         .arg(key, table, QStringLiteral("%1")),
                     key, key, {last});
    for (; !work.eof(); work.moveNext()) {
        bool hasNull = false;
        for (int column = 1; column <= 4; ++column) {
            // The totals are summed from these columns: a value that is not a
            // number would enter them as 0 or as infinity.
            const StoredNumber amount = readStoredAmount(work.value(column));
            if (amount.isBad())
                throw QuotasError(QStringLiteral("na tabela %1, o movimento com %2 %3 tem na coluna %4 um %5. "
                                                 "Corrija esse valor.")
                                      .arg(table, key, work.value(0).toString(), work.row().fieldName(column).toLower(),
                                           amount.problem()));
            hasNull = hasNull || amount.isNull();
        }
        if (hasNull)
            connection.execute(repair, {work.value(0)});
        panel.stepBar(pass);
    }
}

// Passes 4 and 5: the reset and the rebuild of one account table commit
// together, so that a failure half-way leaves the totals as they were rather
// than at 0, which would show every member as paid up. The grouped sums are
// read in chunks in the order of socio_id; each goes to the member's first
// account, or to a new one when he has none. Movements without a member
// enter no account; returns how many there were.
int rebuildTotals(Connection& connection, MaintenancePanel& panel, int pass, const TotalsPass& what, QObject* progress,
                  bool& progressShown)
{
    callByName(progress, "Iniciar", {2, QString::fromUtf8(kFetching), panel.caption()});
    progressShown = true;
    const QString accounts = QString::fromLatin1(what.accounts);
    const QString movements = QString::fromLatin1(what.movements);
    const QString key = keyOf(connection, accounts);
    Transaction tx(connection);
    connection.execute(QStringLiteral("UPDATE %1 SET total_quotas = 0, total_pago = 0").arg(accounts));
    const int members =
        connection.scalar(QStringLiteral("SELECT COUNT(DISTINCT socio_id) FROM %1").arg(movements)).toInt();
    ChunkedRows groups(connection,
                       QStringLiteral("SELECT socio_id, SUM(quota) AS tdebito, SUM(pago) AS tcredito, COUNT(quota_id) AS "
                                      "no_docs FROM %1 WHERE socio_id IS NOT NULL%2 GROUP BY socio_id ORDER BY socio_id")
                           .arg(movements, QStringLiteral("%1")),
                       QStringLiteral("socio_id"), QStringLiteral("socio_id"));
    callByName(progress, "setvalor", {2});
    callByName(progress, "terminar");
    progressShown = false;

    if (groups.eof()) {
        panel.startBar(pass, 1);
        panel.stepBar(pass);
    } else {
        panel.startBar(pass, members);
        const QString toFirstAccount =
            QStringLiteral("UPDATE %1 SET total_quotas = ?, total_pago = ? WHERE %2 = (SELECT MIN(%2) FROM %1 WHERE "
                           "socio_id = ?)")
                .arg(accounts, key);
        const QString newAccount =
            QStringLiteral("INSERT INTO %1 (socio_id, total_quotas, total_pago) VALUES (?, ?, ?)").arg(accounts);
        for (; !groups.eof(); groups.moveNext()) {
            const QVariant socio = groups.value(0);
            // SQLite adds REALs in binary: the sums carry stray fractions of a cent.
            const double quotas = roundCents(groups.value(1).toDouble());
            const double pago = roundCents(groups.value(2).toDouble());
            if (connection.execute(toFirstAccount, {quotas, pago, socio}) == 0) {
                // A run that reached the member meanwhile may be giving him
                // an account: wait for it, and keep that one.
                connection.lockMember(socio);
                if (connection.execute(toFirstAccount, {quotas, pago, socio}) == 0)
                    connection.execute(newAccount, {socio, quotas, pago});
            }
            panel.stepBar(pass);
        }
    }
    const int withoutMember =
        connection.scalar(QStringLiteral("SELECT COUNT(*) FROM %1 WHERE socio_id IS NULL").arg(movements)).toInt();
    tx.commit();
    return withoutMember;
}

QString reasonOf(const std::exception& e)
{
    if (const auto* error = dynamic_cast<const QuotasError*>(&e))
        return error->message();
    return QString::fromLocal8Bit(e.what());
}

}  // namespace

int ProcessarManutencao(Connection& connection, MaintenancePanel& panel)
{
    int withoutMember = 0;
    std::unique_ptr<QObject> progress;
    try {
        progress = createComponent(QStringLiteral("Velumo.General"));
    } catch (const QuotasError& e) {
        throw QuotasError(QStringLiteral("A manutenção de dados não foi iniciada: %1").arg(e.message()));
    }

    QString stage = QString::fromUtf8(kNullPasses[0].label);
    bool totals = false;
    bool progressShown = false;
    auto stop = [&](const QString& reason) {
        panel.stopAnimation();
        // The progress window of an interrupted pass would otherwise stay up.
        if (progressShown) {
            try {
                tryCallByName(progress.get(), "terminar");
            } catch (...) {
                // The failure that stopped the run is the one to report.
            }
        }
        progress.reset();
        QString text = QStringLiteral("A manutenção de dados foi interrompida em \"%1\": %2\n\n"
                                      "O que foi gravado até aí fica gravado")
                           .arg(stage, reason);
        text += totals ? QStringLiteral("; os acumulados desta fase mantêm os valores anteriores.")
                       : QStringLiteral(".");
        return QuotasError(text + QStringLiteral(" Pode iniciar a manutenção de novo."));
    };
    try {
        LazyCommits lazy(connection);
        panel.playAnimation(QDir(installationDataDir()).filePath(QStringLiteral("filemove.avi")));
        int pass = 1;
        for (const NullPass& what : kNullPasses) {
            stage = QString::fromUtf8(what.label);
            repairNulls(connection, panel, pass++, what);
        }
        totals = true;
        for (const TotalsPass& what : kTotalsPasses) {
            stage = QString::fromUtf8(what.label);
            withoutMember += rebuildTotals(connection, panel, pass++, what, progress.get(), progressShown);
        }
        lazy.finish();
    } catch (const std::exception& e) {
        throw stop(reasonOf(e));
    } catch (...) {
        throw stop(QStringLiteral("erro desconhecido."));
    }

    panel.showFinished();
    progress.reset();
    panel.stopAnimation();
    msgBox(QStringLiteral("Manutenção de Dados Concluída."), Buttons::Ok, Icon::Information,
           QStringLiteral("Manutenção"));
    if (withoutMember > 0)
        msgBox(QStringLiteral("%1 movimentos sem associado (socio_id vazio) ficaram fora dos acumulados.")
                   .arg(withoutMember),
               Buttons::Ok, Icon::Exclamation, QStringLiteral("Manutenção"));
    return withoutMember;
}

}  // namespace quotas
