#include "import/processar_importacao.h"

#include "component/money.h"
#include "component/month_names.h"
#include "component/shared_objects.h"
#include "component/stored_value.h"
#include "generation/substituir_caracter.h"
#include "import/import_recordset.h"
#include "import/import_verdict.h"
#include "import/month_dues.h"
#include "import/rejects_listing.h"
#include "platform/components.h"
#include "platform/errors.h"
#include "platform/late_binding.h"
#include "platform/message_boxes.h"
#include "platform/recordset.h"
#include "platform/transaction.h"

#include <QLocale>
#include <QSet>
#include <QStringList>
#include <cmath>
#include <memory>
#include <optional>
#include <unordered_map>

namespace quotas {

namespace {

// The rejects list keeps at most this many values of a line.
constexpr int kRejectColumns = 21;
// The lines read, and matched with their dues, at a time.
constexpr size_t kChunkLines = 500;

RejectsListing& listingInUse()
{
    thread_local RejectsListing listing;
    return listing;
}

// The run must go on whatever the progress display does.
class Progress {
public:
    Progress()
    {
        try {
            m_display = createComponent(QStringLiteral("Velumo.General"));
        } catch (const QuotasError&) {
        }
    }
    void call(const char* method, const QVariantList& args = {})
    {
        try {
            if (m_display)
                callByName(m_display.get(), method, args);
        } catch (const QuotasError&) {
        }
    }
    void release()
    {
        call("terminar");
        m_display.reset();
    }

private:
    std::unique_ptr<QObject> m_display;
};

qint64 cents(double amount)
{
    return std::llround(amount * 100.0);
}

// An imported amount: "." and "," both read as the decimal separator, whole
// cents when the source carries no separator. Nothing when the value is not
// a number.
std::optional<double> readAmount(const QVariant& value, bool wholeCents)
{
    if (!value.isValid() || value.isNull())
        return std::nullopt;
    const std::optional<double> number = parseDecimal(SubstituirCaracter(value, QStringLiteral("."), QStringLiteral(",")));
    if (!number)
        return std::nullopt;
    const double amount = roundCents(wholeCents ? *number / 100.0 : *number);
    if (!amountInRange(amount))
        return std::nullopt;
    return amount;
}

using Outcome = ImportVerdict::Kind;

// One line of the employer's list: its values, Null where a short line
// has none.
struct SourceLine {
    QStringList values;
    QVariant value(int column) const { return column < values.size() ? QVariant(values[column]) : QVariant(); }
};

// The run's state for the lines.
struct Lines {
    MonthDues& dues;
    int quotaColumn;
    int rend1Column;  // -1 when the source has none
    bool wholeCents;

    // Set for the dry run: the lines are decided and nothing is written. A
    // line it would post leaves its amount here, by quota_id, so that a later
    // line of the same movement is decided as the import would decide it.
    std::unordered_map<qint64, double>* simulated = nullptr;
    // What was decided for the current line, and why.
    ImportVerdict verdict;
    // The due the current line was matched with, for a failed post.
    ChargedDue* due = nullptr;

    QVariant dueAmount(const QVariant& stored) const
    {
        if (simulated) {
            const auto posted = simulated->find(due->quotaId.toLongLong());
            if (posted != simulated->end())
                return posted->second;  // quota and pago alike
        }
        return stored;
    }
    Outcome decided(Outcome kind, const QString& reason = QString())
    {
        verdict.kind = kind;
        verdict.reason = reason;
        return kind;
    }

    // Decides a line and, unless this is the dry run, posts it.
    Outcome process(const SourceLine& line)
    {
        verdict = ImportVerdict{};
        due = nullptr;
        const QVariant key = line.value(0);
        verdict.noTap = key.toString();
        if (!key.isNull())
            due = dues.find(key.toString());
        if (!due)
            return decided(Outcome::Reject, QStringLiteral("sem quota gerada"));
        // A Null pago is not 0 and a Null quota is not below q: compared with
        // Null, the line is left alone.
        const QVariant storedQuota = dueAmount(due->quota);
        const QVariant storedPago = dueAmount(due->pago);
        const StoredNumber quota = readStoredAmount(storedQuota);
        const StoredNumber pago = readStoredAmount(storedPago);
        const double charged = quota.isNumber() ? quota.value : 0.0;
        const bool unpaid = pago.isNumber() && cents(pago.value) == 0;
        verdict.matched = true;
        verdict.quotaBefore = cents(charged);
        verdict.pagoBefore = cents(pago.isNumber() ? pago.value : 0.0);
        // The account of the member whose movement was found, so that a staff
        // number two members share can never split one line between them.
        DueAccount* account = dues.accountOf(*due);
        if (!account)
            return decided(Outcome::Reject, QStringLiteral("sem conta"));

        const std::optional<double> q = readAmount(line.value(quotaColumn), wholeCents);
        if (!q)
            return decided(Outcome::Reject, QStringLiteral("valor ilegível"));
        std::optional<double> r;
        if (rend1Column >= 0) {
            r = readAmount(line.value(rend1Column), wholeCents);
            if (!r)
                return decided(Outcome::Reject, QStringLiteral("valor ilegível"));
        }

        // What the line is compared with and added to must be numbers.
        for (const QVariant& stored :
             {storedQuota, storedPago, account->ultRend1, account->ultRend2, account->totalQuotas, account->totalPago}) {
            if (readStoredAmount(stored).isBad())
                return decided(Outcome::Reject, QStringLiteral("valor ilegível na base de dados"));
        }
        if (!((unpaid && cents(*q) != 0) || (quota.isNumber() && cents(*q) > cents(charged))))
            return decided(Outcome::LeaveAlone, unpaid ? QStringLiteral("desconto de 0,00") : QStringLiteral("já registada"));
        decided(Outcome::Post);
        verdict.quotaAfter = verdict.pagoAfter = cents(*q);
        if (simulated)
            (*simulated)[due->quotaId.toLongLong()] = *q;
        else
            dues.post(*due, *account, Deduction{*q, r, charged});
        return Outcome::Post;
    }

    // After a failed post the line's two rows may hold values the database
    // no longer has (another user's change is why it failed): read those
    // two again, so that a later line of that member is decided on them.
    void resynchronise()
    {
        if (!due)
            return;
        try {
            dues.reread(*due);
        } catch (const QuotasError&) {
            // Left as read: a later line of that member fails and is listed too.
        }
    }
};

// A rejected line: its first values (a short line's missing ones left
// out) and why it was rejected.
struct Reject {
    QStringList values;
    QString reason;
};

// extras holds the rejects of the last run that had any: all of them or,
// when the rewrite fails, still those of the run before.
void rewriteExtras(Connection& connection, const std::vector<Reject>& rejects)
{
    Transaction tx(connection);
    connection.execute(QStringLiteral("DELETE FROM extras"));
    // The host's shape: its key, then the values by position.
    QStringList columns;
    {
        Recordset extras;
        extras.open(QStringLiteral("Select * from extras where 1 = 0"), connection, Cursor::Static, Lock::ReadOnly);
        for (int c = 1; c < extras.fieldCount() && c - 1 < kRejectColumns; ++c)
            columns << extras.fieldName(c);
    }
    size_t next = 0;
    connection.appendRows(QStringLiteral("extras"), columns, [&](QVariantList& row) {
        if (next == rejects.size())
            return false;
        const QStringList& values = rejects[next++].values;
        for (qsizetype c = 0; c < columns.size(); ++c)
            row << (c < values.size() ? QVariant(values[c]) : QVariant());
        return true;
    });
    tx.commit();
}

void showListing()
{
    Connection& prints = Data().SqlServer_Prints;
    if (!prints.isOpen())
        prints.open();
    try {
        const RejectsListing& listing = listingInUse();
        if (listing)
            listing();
        else
            showRejectsListing();
    } catch (...) {
        prints.close();
        throw;
    }
    prints.close();
}

}  // namespace

QString ImportSummary::counts() const
{
    return QStringLiteral("Linhas lançadas: %1\nLinhas deixadas como estavam (já lançadas): %2\nLinhas rejeitadas: %3")
        .arg(posted)
        .arg(lines - posted - rejected)
        .arg(rejected);
}

RejectsListing setRejectsListing(RejectsListing listing)
{
    RejectsListing previous = std::move(listingInUse());
    listingInUse() = std::move(listing);
    return previous;
}

namespace {

// The import, or with dryRun only its decisions: the same reading of the
// list and the same matching, the sets opened read-only and nothing written.
ImportSummary runImport(int month, int year, int tipo, ImportVerdicts* verdicts, bool dryRun)
{
    ImportSummary summary;
    std::unique_ptr<QObject> component = createComponent(QStringLiteral("Dorvanta.General"));
    const QVariant built = callByName(component.get(), "build");

    auto* set = qobject_cast<ImportRecordset*>(built.value<QObject*>());
    if (!set)
        return summary;
    if (set->lineCount() == 0) {
        summary.refusal = QStringLiteral("Não foram indicados registos para importar.");
        msgBox(summary.refusal, Buttons::Ok, Icon::Information);
        return summary;
    }

    // Names are compared exactly: "Quota" is not "quota".
    int noTapColumn = -1;
    int quotaColumn = -1;
    int rend1Column = -1;
    const int columns = int(set->columns().size());
    for (int i = 0; i < columns; ++i) {
        const QString& name = set->columns()[i];
        if (name == QLatin1String("no_tap") && noTapColumn < 0)
            noTapColumn = i;
        else if (name == QLatin1String("quota") && quotaColumn < 0)
            quotaColumn = i;
        else if (name == QLatin1String("rend1") && rend1Column < 0)
            rend1Column = i;
    }
    if (noTapColumn < 0 || quotaColumn < 0) {
        summary.refusal = QStringLiteral("Não foram especificados os campos no_tap ou quota.");
        msgBox(summary.refusal, Buttons::Ok, Icon::Information);
        return summary;
    }

    Progress progress;
    progress.call("Iniciar", {int(set->lineCount()), QStringLiteral("Transferindo dados, aguarde uns momentos . . .")});

    Connection& connection = Data().SqlServer;
    MonthDues dues(connection, month, year, tipo);
    bool charged = false;
    try {
        charged = dues.anyCharged();
    } catch (const QuotasError& e) {
        component.reset();
        progress.release();
        summary.refusal = QStringLiteral("Não foi possível ler os registos de quotas: %1").arg(e.message());
        msgBox(summary.refusal, Buttons::Ok, Icon::Critical);
        return summary;
    }

    std::vector<Reject> rejects;
    if (!charged) {
        // Nothing to post against: the month was never generated. The
        // progress window goes first, so that the message is not behind it.
        progress.release();
        summary.refusal = QStringLiteral("Não foram processados os registos de quotas referente a %1 / %2.").arg(month).arg(year);
        msgBox(summary.refusal + QStringLiteral("\n\nGere primeiro as quotas de %1 de %2 (\"Gerar Quotas\").").arg(monthNames().value(month - 1, QString::number(month))).arg(year));
    } else {
        Lines lines{dues, quotaColumn, rend1Column, shared().SemSeparadorDecimal, nullptr, ImportVerdict{}, nullptr};
        std::unordered_map<qint64, double> simulated;
        if (dryRun)
            lines.simulated = &simulated;
        // Every later line would fail too: the run stops at the line it
        // was at, and says so, rather than reject the rest of the file.
        // lines: the data lines gone through, the one it stopped at included.
        const auto stopped = [&](const QuotasError& e, int lines) {
            component.reset();
            progress.release();
            return QuotasError(QStringLiteral("A importação das quotas de %1 / %2 parou na linha %3 do ficheiro: %4\n"
                                              "As %5 linhas lançadas até aí ficam gravadas. Volte a importar o mesmo "
                                              "ficheiro para a completar: as linhas já lançadas não se repetem.")
                                   .arg(month)
                                   .arg(year)
                                   .arg(lines + 1)  // the first line names the columns
                                   .arg(e.message())
                                   .arg(summary.posted));
        };
        LazyCommits lazy(connection);
        std::vector<SourceLine> chunk;
        for (bool more = true; more;) {
            // A chunk of lines, and the dues they name in one read.
            chunk.clear();
            QSet<QString> staffNumbers;
            try {
                SourceLine line;
                while (chunk.size() < kChunkLines && (more = set->next(line.values))) {
                    if (!line.value(0).isNull())
                        staffNumbers << line.values[0];
                    chunk.push_back(line);
                }
                if (!chunk.empty())
                    dues.read(staffNumbers.values());
            } catch (const QuotasError& e) {
                throw stopped(e, summary.lines + 1);
            }
            for (const SourceLine& line : chunk) {
                ++summary.lines;
                Outcome outcome = Outcome::Reject;
                try {
                    outcome = lines.process(line);
                } catch (const ConnectionLostError& e) {
                    throw stopped(e, summary.lines);
                } catch (const ConcurrencyError&) {
                    ++summary.failed;
                    lines.resynchronise();
                    lines.decided(Outcome::Reject, QStringLiteral("alterado por outro utilizador"));
                } catch (const QuotasError&) {
                    ++summary.failed;
                    lines.resynchronise();
                    lines.decided(Outcome::Reject, QStringLiteral("não gravado"));
                }
                if (verdicts) {
                    lines.verdict.line = summary.lines;
                    verdicts->lines.push_back(lines.verdict);
                }
                if (outcome == Outcome::Post)
                    ++summary.posted;
                else if (outcome == Outcome::Reject && !dryRun)
                    rejects.push_back({line.values.mid(0, kRejectColumns), lines.verdict.reason});
                progress.call("setvalor", {1});
            }
        }
        lazy.finish();
    }

    component.reset();  // the source goes with its component
    progress.release();

    if (dryRun) {
        summary.rejected = verdicts ? verdicts->count(Outcome::Reject) : 0;
        return summary;
    }
    summary.rejected = int(rejects.size());
    if (summary.rejected == 0)
        return summary;
    msgBox(QStringLiteral("Durante o processo de importação de dados não foram registados %1 associados.")
               .arg(summary.rejected),
           Buttons::Ok, Icon::Critical);
    try {
        rewriteExtras(connection, rejects);
        shared().rejectReasons.clear();
        for (const Reject& reject : rejects)
            shared().rejectReasons << reject.reason;
    } catch (const QuotasError& e) {
        summary.extrasSaved = false;
        msgBox(QStringLiteral("Não foi possível gravar os registos não importados na tabela extras, que ficou como "
                              "estava: %1")
                   .arg(e.message()),
               Buttons::Ok, Icon::Critical);
        return summary;
    }
    try {
        showListing();
    } catch (const QuotasError& e) {
        msgBox(QStringLiteral("Não foi possível mostrar a listagem dos registos não importados: %1").arg(e.message()),
               Buttons::Ok, Icon::Exclamation);
    }
    return summary;
}

}  // namespace

ImportSummary ProcessarImportacao(int month, int year, int tipo, ImportVerdicts* verdicts)
{
    return runImport(month, year, tipo, verdicts, false);
}

ImportSummary SimularImportacao(int month, int year, int tipo, ImportVerdicts& verdicts)
{
    return runImport(month, year, tipo, &verdicts, true);
}

}  // namespace quotas
