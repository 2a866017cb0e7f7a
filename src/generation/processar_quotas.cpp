#include "generation/processar_quotas.h"

#include "component/money.h"
#include "component/shared_objects.h"
#include "generation/dues_account.h"
#include "generation/dues_counter.h"
#include "generation/lancar_quota.h"
#include "platform/components.h"
#include "platform/connection.h"
#include "platform/errors.h"
#include "platform/late_binding.h"
#include "platform/recordset.h"
#include "platform/transaction.h"

namespace quotas {

namespace {

const QString kMembersSql = QStringLiteral(
    "SELECT tbsocios.socio_id as no, tbsocios.no_tap, tbsocios.fuv, tbsocios.empresa, tbsocios.seguro_data_rescisao, "
    "tbsocios.seguro, tbquotas_socios.* FROM tbsocios LEFT OUTER JOIN tbquotas_socios ON tbsocios.socio_id = "
    "tbquotas_socios.socio_id");
const QString kNewAccountSql = QStringLiteral(
    "INSERT INTO tbQuotas_Socios (socio_id, ult_ano, ult_mes, ult_rend1, ult_rend2, ult_quota_sindicato, "
    "ult_quota_seguro, total_quotas, total_pago) VALUES (?,?,?,?,0,0,0,0,0) ON CONFLICT (socio_id) DO NOTHING");

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
    void visit(Recordset& member)
    {
        Transaction tx(m_connection);
        const QVariant no = member.value(QStringLiteral("no"));
        if (member.isNull(QStringLiteral("squota_id")))
            createAccount(member);
        if (!m_account.lock(m_connection, no)) {
            // Deleted since the members were read.
            createAccount(member);
            if (!m_account.lock(m_connection, no))
                throw DbError(QStringLiteral("Não foi possível criar a conta de quotas do associado."));
        }
        PostingContext ctx{m_connection, m_ano, m_mes, m_today, member,
                           m_account, m_employers, m_counter, m_outcome, chargedTypes(m_connection, no, m_ano, m_mes)};
        LancarQuota(ctx, DueType::Sindicato);
        LancarQuota(ctx, DueType::Seguro);
        m_account.save(m_connection);
        tx.commit();
        ++m_outcome.members;
    }

    GenerationOutcome& outcome() { return m_outcome; }

private:
    void createAccount(Recordset& member)
    {
        QVariant rend1 = kUnknownCategoryRend1;
        m_categories.moveFirst();
        if (m_categories.find(QStringLiteral("code"), member.value(QStringLiteral("fuv")))) {
            const QVariant categoryRend1 = m_categories.value(QStringLiteral("rend1"));
            // A category without remuneration leaves the account without
            // one: its dues are reported, never computed from nothing.
            rend1 = categoryRend1.isNull() ? QVariant(QMetaType::fromType<double>())
                                           : QVariant(roundCents(categoryRend1.toDouble()));
        }
        // When a second run created the account first, nothing is inserted.
        m_outcome.accountsCreated +=
            m_connection.execute(kNewAccountSql, {member.value(QStringLiteral("no")), m_ano, m_mes, rend1});
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

    Recordset members;
    if (socio == 0)
        members.open(kMembersSql + QStringLiteral(" ORDER BY tbsocios.socio_id"), connection, Cursor::Keyset,
                     Lock::ReadOnly);
    else
        members.open(kMembersSql + QStringLiteral(" WHERE tbsocios.socio_id = ? ORDER BY tbsocios.socio_id"),
                     connection, Cursor::Keyset, Lock::ReadOnly, {socio});
    Run run(connection, ano, mes, today);
    run.openLookups();

    SharedObjects& objects = shared();
    objects.progress = createComponent(QStringLiteral("Velumo.General"));
    QObject* progress = objects.progress.get();
    ProgressGuard closing(progress);
    callByName(progress, "Iniciar",
               {members.recordCount(), QStringLiteral("Criando registos de quotas, aguarde alguns momentos . . ."),
                QStringLiteral("Processamento de Quotas")});

    for (; !members.eof(); members.moveNext()) {
        try {
            run.visit(members);
        } catch (const QuotasError& e) {
            throw QuotasError(QStringLiteral("O processamento de quotas parou no associado com o Nº Empresa %1: %2\n"
                                             "As quotas dos associados anteriores ficaram gravadas; as deste associado "
                                             "não. Volte a gerar o mesmo mês para completar.")
                                  .arg(memberLabel(members), e.message()));
        }
        callByName(progress, "setvalor", {1});
    }
    return run.outcome();
}

GenerationOutcome ProcessarQuotas(int ano, int mes, int socio)
{
    return ProcessarQuotas(Data().SqlServer, ano, mes, socio);
}

}  // namespace quotas
