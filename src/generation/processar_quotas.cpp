#include "generation/processar_quotas.h"

#include "component/money.h"
#include "component/shared_objects.h"
#include "component/stored_value.h"
#include "generation/dues_account.h"
#include "generation/dues_counter.h"
#include "generation/due_rules.h"
#include "generation/lancar_quota.h"
#include "platform/chunked_rows.h"
#include "platform/components.h"
#include "platform/connection.h"
#include "platform/errors.h"
#include "platform/late_binding.h"
#include "platform/recordset.h"
#include "platform/transaction.h"

namespace quotas {

namespace {

// A member's row says whether he has an account and which dues of the
// month he already has, so that a month run again skips the members it
// charged without a transaction each. A due missing here is checked again
// under the account's lock before it is posted.
const QString kMembersSql = QStringLiteral(
    "SELECT s.socio_id AS no, s.no_tap, s.fuv, s.empresa, s.seguro_data_rescisao, s.seguro, "
    "(SELECT MIN(a.squota_id) FROM tbquotas_socios a WHERE a.socio_id = s.socio_id) AS squota_id, "
    "(SELECT COUNT(*) FROM tbQuotas_Movimentos m WHERE m.socio_id = s.socio_id AND m.ano = ? AND m.mes = ? "
    "AND m.tipo = 1) AS sindicato, "
    "(SELECT COUNT(*) FROM tbQuotas_Movimentos m WHERE m.socio_id = s.socio_id AND m.ano = ? AND m.mes = ? "
    "AND m.tipo = 2) AS seguro_lancado "
    "FROM tbsocios s WHERE s.socio_id <= ?%1 ORDER BY s.socio_id");
// A member whose category is not known starts from this remuneration.
constexpr double kUnknownCategoryRend1 = 100000;

// Closes the progress display however the run ends.
class ProgressGuard {
public:
    explicit ProgressGuard(QObject* progress) : m_progress(progress) {}
    ~ProgressGuard()
    {
        try {
            callByName(m_progress, "terminar");
        } catch (...) {
            // The run's own outcome or failure is what the user must see.
        }
    }
    ProgressGuard(const ProgressGuard&) = delete;
    ProgressGuard& operator=(const ProgressGuard&) = delete;

private:
    QObject* m_progress;
};

class Run {
public:
    Run(Connection& connection, int ano, int mes, QDate today)
        : m_connection(connection), m_ano(ano), m_mes(mes), m_today(today), m_counter(connection)
    {
    }

    void openLookups()
    {
        m_categories.open(QStringLiteral("SELECT * from tbfuvs"), m_connection);
        m_employers.open(QStringLiteral("SELECT * from tbEmpresas"), m_connection);
    }

    // One member, all or nothing.
    void visit(const Recordset& member)
    {
        if (fullyCharged(member)) {
            ++m_outcome.members;
            return;
        }
        Transaction tx(m_connection);
        const QVariant no = member.value(QStringLiteral("no"));
        // Whatever indexes the tables have, a second run visiting the member
        // waits here, then finds the account and the dues this one wrote.
        m_connection.lockMember(no);
        if (!m_account.lock(m_connection, no, m_ano, m_mes))
            createAccount(member);
        PostingContext ctx{m_connection, m_ano, m_mes, m_today, member, m_account, m_employers, m_counter, m_outcome, m_account.charged(), {}};
        LancarQuota(ctx, DueType::Sindicato);
        LancarQuota(ctx, DueType::Seguro);
        WriteDues(ctx);
        m_account.save(m_connection);
        tx.commit();
        ++m_outcome.members;
    }

    GenerationOutcome& outcome() { return m_outcome; }

private:
    bool fullyCharged(const Recordset& member) const
    {
        // A value that cannot be read is left to the posting, which reports it.
        const StoredNumber seguro = readStoredNumber(member.value(QStringLiteral("seguro")));
        const StoredDate end = readStoredDate(member.value(QStringLiteral("seguro_data_rescisao")));
        return !member.isNull(QStringLiteral("squota_id")) && member.value(QStringLiteral("sindicato")).toInt() > 0
               && (member.value(QStringLiteral("seguro_lancado")).toInt() > 0
                   || (!seguro.isBad() && end.ok && !insuranceCharged(seguro, end, m_ano, m_mes)));
    }

    void createAccount(const Recordset& member)
    {
        QVariant rend1 = kUnknownCategoryRend1;
        m_categories.moveFirst();
        if (m_categories.find(QStringLiteral("code"), member.value(QStringLiteral("fuv")))) {
            const StoredNumber categoryRend1 = readStoredAmount(m_categories.value(QStringLiteral("rend1")));
            // A category without a usable remuneration leaves the account
            // without one: its dues are reported, never computed from nothing.
            rend1 = categoryRend1.isNumber() ? QVariant(roundCents(categoryRend1.value))
                                             : QVariant(QMetaType::fromType<double>());
        }
        m_account.create(m_connection, member.value(QStringLiteral("no")), m_ano, m_mes, rend1);
        ++m_outcome.accountsCreated;
    }

    Connection& m_connection;
    int m_ano;
    int m_mes;
    QDate m_today;
    DuesCounter m_counter;
    Recordset m_categories;
    Recordset m_employers;
    DuesAccount m_account;
    GenerationOutcome m_outcome;
};

}  // namespace

GenerationOutcome ProcessarQuotas(Connection& connection, int ano, int mes, int socio, QDate today)
{
    if (mes < 1 || mes > 12)
        throw QuotasError(QStringLiteral("O mês de processamento (%1) não é válido: deve estar entre 1 e 12.").arg(mes));
    if (ano < 1900 || ano > 9999)
        throw QuotasError(QStringLiteral("O ano de processamento (%1) não é válido.").arg(ano));

    // The members there are now, as one read of the table would see them,
    // read a chunk at a time: a member added meanwhile waits for the next run.
    Recordset extent;
    extent.open(socio == 0 ? QStringLiteral("SELECT COUNT(*), MAX(socio_id) FROM tbsocios")
                           : QStringLiteral("SELECT COUNT(*), MAX(socio_id) FROM tbsocios WHERE socio_id = ?"),
                connection, Cursor::Unspecified, Lock::ReadOnly, socio == 0 ? QVariantList{} : QVariantList{socio});
    const int count = extent.value(0).toInt();
    const QVariant last = count > 0 ? extent.value(1) : QVariant(0);
    extent.close();
    ChunkedRows members(connection,
                        kMembersSql.arg(socio == 0 ? QStringLiteral("%1") : QStringLiteral(" AND s.socio_id >= ?%1")),
                        QStringLiteral("s.socio_id"), QStringLiteral("no"),
                        socio == 0 ? QVariantList{ano, mes, ano, mes, last} : QVariantList{ano, mes, ano, mes, last, socio});
    Run run(connection, ano, mes, today);
    run.openLookups();

    SharedObjects& objects = shared();
    objects.progress = createComponent(QStringLiteral("Velumo.General"));
    QObject* progress = objects.progress.get();
    ProgressGuard closing(progress);
    callByName(progress, "Iniciar",
               {count, QStringLiteral("Criando registos de quotas, aguarde alguns momentos . . ."),
                QStringLiteral("Processamento de Quotas")});

    LazyCommits lazy(connection);
    for (; !members.eof(); members.moveNext()) {
        try {
            run.visit(members.row());
        } catch (const QuotasError& e) {
            throw QuotasError(QStringLiteral("O processamento de quotas parou no associado com o Nº Empresa %1: %2\n"
                                             "As quotas dos associados anteriores ficaram gravadas; as deste associado "
                                             "não. Volte a gerar o mesmo mês para completar.")
                                  .arg(memberLabel(members.row()), e.message()));
        }
        callByName(progress, "setvalor", {1});
    }
    lazy.finish();
    return run.outcome();
}

GenerationOutcome ProcessarQuotas(int ano, int mes, int socio)
{
    return ProcessarQuotas(Data().SqlServer, ano, mes, socio);
}

}  // namespace quotas
