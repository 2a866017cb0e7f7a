#include "maintenance/processar_manutencao.h"

#include "component/installation.h"
#include "component/money.h"
#include "maintenance/maintenance_panel.h"
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
    const char* sql;
    const char* label;
};

const NullPass kNullPasses[] = {
    {"Select * from tbQuotas_Movimentos", "Movimentos Activos"},
    {"Select * from tbQuotas_Movimentos_Inactivos", "Movimentos Inactivos"},
    {"Select * from tbQuotas_Movimentos_Historico", "Histórico de Movimentos"},
};

struct TotalsPass {
    const char* accounts;
    const char* groups;
    const char* label;
};

const TotalsPass kTotalsPasses[] = {
    {"Select * from tbQuotas_Socios",
     "SELECT tbQuotas_Movimentos.socio_id,  Sum(tbQuotas_Movimentos.quota) AS tdebito, "
     "Sum(tbQuotas_Movimentos.pago) AS tcredito, Count(tbQuotas_Movimentos.quota_id) AS no_docs "
     "From tbQuotas_Movimentos GROUP BY tbQuotas_Movimentos.socio_id ORDER BY tbQuotas_Movimentos.socio_id",
     "Acumulados Activos"},
    {"Select * from tbQuotas_Socios_Inactivos",
     "SELECT tbQuotas_Movimentos_Inactivos.socio_id,  Sum(tbQuotas_Movimentos_Inactivos.quota) AS tdebito, "
     "Sum(tbQuotas_Movimentos_Inactivos.pago) AS tcredito, Count(tbQuotas_Movimentos_Inactivos.quota_id) AS no_docs "
     "From tbQuotas_Movimentos_Inactivos GROUP BY tbQuotas_Movimentos_Inactivos.socio_id "
     "ORDER BY tbQuotas_Movimentos_Inactivos.socio_id",
     "Acumulados Inactivos"},
};

int requireField(const Recordset& rs, const char* name)
{
    const int index = rs.fieldIndex(QString::fromLatin1(name));
    if (index < 0)
        throw DbError(QStringLiteral("A coluna \"%1\" não foi encontrada.").arg(QString::fromLatin1(name)));
    return index;
}

// Passes 1 to 3. Each repaired row is stored on its own, so a failure keeps
// the rows repaired before it.
void repairNulls(Connection& connection, MaintenancePanel& panel, int pass, const NullPass& what, Recordset& work)
{
    work.open(QString::fromLatin1(what.sql), connection, Cursor::Static, Lock::Optimistic);
    if (work.eof()) {
        panel.startBar(pass, 1);
        panel.stepBar(pass);
        work.close();
        return;
    }
    work.moveLast();
    work.moveFirst();
    panel.startBar(pass, work.recordCount());
    const int amounts[] = {requireField(work, "rend1"), requireField(work, "rend2"), requireField(work, "quota"),
                           requireField(work, "pago")};
    while (!work.eof()) {
        bool changed = false;
        for (const int column : amounts) {
            if (work.value(column).isNull()) {
                work.setValue(column, 0.0);
                changed = true;
            }
        }
        if (changed)
            work.update();
        work.moveNext();
        panel.stepBar(pass);
    }
    work.close();
}

// Passes 4 and 5: the reset and the rebuild of one account table commit
// together, so that a failure half-way leaves the totals as they were rather
// than at 0, which would show every member as paid up.
void rebuildTotals(Connection& connection, MaintenancePanel& panel, int pass, const TotalsPass& what, QObject* progress,
                   bool& progressShown, Recordset& work, Recordset& target)
{
    callByName(progress, "Iniciar", {2, QString::fromUtf8(kFetching), panel.caption()});
    progressShown = true;
    Transaction tx(connection);
    const QString accounts = QString::fromLatin1(what.accounts);
    work.open(accounts, connection, Cursor::Static, Lock::Optimistic);
    {
        const int quotas = requireField(work, "total_quotas");
        const int pago = requireField(work, "total_pago");
        while (!work.eof()) {
            work.setValue(quotas, 0.0);
            work.setValue(pago, 0.0);
            work.update();
            work.moveNext();
            panel.keepAlive();
        }
    }
    work.close();

    target.open(accounts, connection, Cursor::Static, Lock::Optimistic);
    work.open(QString::fromLatin1(what.groups), connection, Cursor::Static, Lock::Optimistic);
    callByName(progress, "setvalor", {2});
    callByName(progress, "terminar");
    progressShown = false;

    if (work.eof()) {
        panel.startBar(pass, 1);
        panel.stepBar(pass);
    } else {
        work.moveLast();
        work.moveFirst();
        panel.startBar(pass, work.recordCount());
        const QString socioId = QStringLiteral("socio_id");
        const int groupSocio = requireField(work, "socio_id");
        const int debit = requireField(work, "tdebito");
        const int credit = requireField(work, "tcredito");
        const int accountSocio = requireField(target, "socio_id");
        const int totalQuotas = requireField(target, "total_quotas");
        const int totalPago = requireField(target, "total_pago");
        while (!work.eof()) {
            const QVariant socio = work.value(groupSocio);
            // The search goes through the set's index on socio_id, built on
            // the first search of the pass: O(1) per member.
            target.moveFirst();
            target.find(socioId, socio);
            if (target.eof()) {
                target.addNew();
                target.setValue(accountSocio, socio);
            }
            // SQLite adds REALs in binary: the sums carry stray fractions of a cent.
            target.setValue(totalQuotas, roundCents(work.value(debit).toDouble()));
            target.setValue(totalPago, roundCents(work.value(credit).toDouble()));
            target.update();
            work.moveNext();
            panel.stepBar(pass);
        }
    }
    work.close();
    target.close();
    tx.commit();
}

QString reasonOf(const std::exception& e)
{
    if (const auto* error = dynamic_cast<const QuotasError*>(&e))
        return error->message();
    return QString::fromLocal8Bit(e.what());
}

}  // namespace

void ProcessarManutencao(Connection& connection, MaintenancePanel& panel)
{
    Recordset work;
    Recordset target;
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
        panel.playAnimation(QDir(installationDataDir()).filePath(QStringLiteral("filemove.avi")));
        int pass = 1;
        for (const NullPass& what : kNullPasses) {
            stage = QString::fromUtf8(what.label);
            repairNulls(connection, panel, pass++, what, work);
        }
        totals = true;
        for (const TotalsPass& what : kTotalsPasses) {
            stage = QString::fromUtf8(what.label);
            rebuildTotals(connection, panel, pass++, what, progress.get(), progressShown, work, target);
        }
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
}

}  // namespace quotas
