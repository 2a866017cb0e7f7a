// The two buttons that end the window's work on a movement: a payment
// against the due ("&Liquidar") and the cancellation of the charge
// ("&Anular"). Both close the window once their work is saved; a refusal,
// a cancelled box or a failure leaves it open.

#include "record/frm_quota.h"

#include "component/money.h"
#include "component/month_names.h"
#include "component/stored_value.h"
#include "platform/errors.h"
#include "platform/message_boxes.h"
#include "platform/recordset.h"
#include "record/movement_saving.h"
#include "record/record_text.h"

#include <cmath>

namespace quotas {

namespace {

// The width of tbQuotas_Movimentos.doc_no.
constexpr int documentWidth = 60;

// Up to this much above the outstanding amount a payment is taken as typed
// (small change, rounding on the receipt); beyond it the user confirms.
constexpr qint64 overpaymentMarginCents = 10;

qint64 inCents(double amount)
{
    return std::llround(amount * 100.0);
}

}  // namespace

void FrmQuota::Command2_Click()
{
    if (!validateActiveField())
        return;
    const double quota = amountOf(Adodc1->value(QStringLiteral("quota")), QStringLiteral("quota"));
    const double pago = amountOf(Adodc1->value(QStringLiteral("pago")), QStringLiteral("pago"));
    if (inCents(pago) == inCents(quota))
        return;

    const std::optional<QString> answer = inputBox(QStringLiteral("Digite a importância a liquidar."),
                                                   QStringLiteral("Pagamento"), plainNumber(quota - pago));
    if (!answer)
        return;
    const std::optional<double> typed = parseDecimal(*answer);
    if (!typed)
        return;
    if (!amountInRange(*typed) || !amountInRange(pago + *typed)) {
        refuse(invalidValue());
        return;
    }
    // Refused before the save step: an amount that comes to nothing in
    // cents must not leave the corrections saved with no payment and no word.
    const double amount = roundCents(*typed);
    if (amount <= 0.0) {
        refuse(invalidValue());
        return;
    }
    if (!gravarOrTell())
        return;

    const double outstanding = roundCents(quota - pago);
    if (inCents(amount) - inCents(outstanding) > overpaymentMarginCents) {
        const QString question = QStringLiteral("A importância de %1 é superior ao valor por liquidar (%2).\n\n"
                                                "Quer registar este pagamento?")
                                     .arg(formatMoney(amount), formatMoney(outstanding));
        if (msgBox(question, Buttons::YesNo, Icon::Question, QStringLiteral("Pagamento")) != Answer::Yes)
            return;
    }

    // Asked before anything is written, so that no transaction waits on the
    // user; the payment stands whether or not a document is given.
    const QString prompt = QStringLiteral("Indique o documento comprovativo de pagamento da quota:");
    std::optional<QString> document = inputBox(prompt, QStringLiteral("Tipo de Documento"), QString());
    while (document && document->size() > documentWidth) {
        msgBox(QStringLiteral("A referência do documento não pode ter mais de %1 caracteres.").arg(documentWidth),
               Buttons::Ok, Icon::Information);
        document = inputBox(prompt, QStringLiteral("Tipo de Documento"), *document);
    }

    try {
        liquidarQuota(*Adodc1, amount, document.value_or(QString()));
    } catch (const QuotasError& e) {
        tell(QStringLiteral("O pagamento não foi registado."), e);
        return;
    }
    m_asRead = movementAmounts(*Adodc1);
    done(Accepted);
}

void FrmQuota::Command1_Click()
{
    if (!validateActiveField())
        return;
    // The second line names the movement, so that no one deletes another by
    // mistake; Enter answers No.
    const int mes = Adodc1->value(QStringLiteral("mes")).toInt();
    // A movement whose amount cannot be read can still be deleted.
    const StoredNumber due = readStoredAmount(Adodc1->value(QStringLiteral("quota")));
    const QString movement = QStringLiteral("%1, %2 de %3, %4")
                                 .arg(Adodc1->value(QStringLiteral("ref")).toString(), monthNames().value(mes - 1, QString::number(mes)),
                                      Adodc1->value(QStringLiteral("ano")).toString(),
                                      due.isBad() ? due.raw.toString() : formatMoney(due.value));
    if (msgBox(QStringLiteral("Quer eliminar este registo?\n") + movement, Buttons::YesNoDefaultNo, Icon::Question,
               QStringLiteral("Quotizações"))
        != Answer::Yes)
        return;
    try {
        anularQuota(*Adodc1, m_asRead);
    } catch (const QuotasError& e) {
        tell(QStringLiteral("Não foi possível eliminar o registo."), e);
        return;
    }
    done(Accepted);
}

}  // namespace quotas
