#include "generation/generation_outcome.h"

namespace quotas {

namespace {

// Enough numbers to find the members; the rest is counted, not listed.
constexpr int kListed = 20;

QString listed(const QStringList& members)
{
    QString text = members.mid(0, kListed).join(QStringLiteral(", "));
    if (members.size() > kListed)
        text += QStringLiteral(" e mais %1").arg(members.size() - kListed);
    return text;
}

}  // namespace

QString duesCount(int n)
{
    return n == 1 ? QStringLiteral("1 quota") : QStringLiteral("%1 quotas").arg(n);
}

QString GenerationOutcome::summary() const
{
    if (notGenerated() == 0)
        return QString();
    QStringList lines;
    lines << (notGenerated() == 1 ? QStringLiteral("Não foi gerada 1 quota:")
                                  : QStringLiteral("Não foram geradas %1 quotas:").arg(notGenerated()));
    if (missingRemuneration > 0)
        lines << QStringLiteral("- %1 porque a conta do associado não tem a remuneração 1 ou a remuneração 2 "
                                "(Nº Empresa: %2);")
                     .arg(duesCount(missingRemuneration), listed(membersMissingRemuneration));
    if (missingRate > 0)
        lines << QStringLiteral("- %1 porque a empresa do associado não tem a percentagem de quotização "
                                "(Nº Empresa: %2);")
                     .arg(duesCount(missingRate), listed(membersMissingRate));
    if (unreadable > 0)
        lines << QStringLiteral("- %1 porque um valor guardado não é um número válido ou a data não é legível "
                                "(Nº Empresa: %2);")
                     .arg(duesCount(unreadable), listed(membersUnreadable));
    lines << QStringLiteral("Corrija estes valores e volte a gerar o mesmo mês: as quotas já geradas não se repetem.");
    return lines.join(u'\n');
}

QString GenerationOutcome::counts() const
{
    return QStringLiteral("Associados processados: %1\nQuotas lançadas: %2\nQuotas não lançadas: %3")
        .arg(members)
        .arg(posted)
        .arg(notGenerated());
}

}  // namespace quotas
