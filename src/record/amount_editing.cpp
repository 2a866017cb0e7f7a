// Editing the three inputs of the due, (remuneration 1 + remuneration 2) x
// participation: entering a field prepares its text, leaving it validates,
// recomputes the due and refreshes "Por Liquidar:", or refuses and keeps the
// focus where it was.

#include "record/frm_quota.h"

#include "component/money.h"
#include "component/stored_value.h"
#include "platform/message_boxes.h"
#include "platform/recordset.h"
#include "record/record_text.h"

#include <QFocusEvent>
#include <QKeyEvent>
#include <QLineEdit>

namespace quotas {

namespace {

QString belowPaid()
{
    return QStringLiteral("Este valor não é válido porque resultou numa quota inferior à parte já liquidada.");
}

// The window losing or regaining activation (a message box, another
// program) is not the user leaving or entering a field.
bool activationOnly(Qt::FocusReason reason)
{
    return reason == Qt::ActiveWindowFocusReason || reason == Qt::PopupFocusReason;
}

}  // namespace

QString FrmQuota::invalidValue()
{
    return QStringLiteral("Tem de introduzir um valor válido neste campo.");
}

bool FrmQuota::isAmountField(const QObject* object) const
{
    return object && (object == Text5 || object == Text6 || object == Text8);
}

bool FrmQuota::eventFilter(QObject* watched, QEvent* event)
{
    const QEvent::Type type = event->type();
    if (type == QEvent::KeyPress && isAmountField(watched)) {
        // Enter goes on to the next field, so that the due is recomputed as
        // leaving the field recomputes it.
        const int key = static_cast<QKeyEvent*>(event)->key();
        if (key == Qt::Key_Return || key == Qt::Key_Enter) {
            focusNextChild();
            return true;
        }
    }
    if (!isAmountField(watched) || (type != QEvent::FocusIn && type != QEvent::FocusOut) || !Adodc1 || m_unloaded)
        return QDialog::eventFilter(watched, event);
    auto* field = static_cast<QLineEdit*>(watched);
    const Qt::FocusReason reason = static_cast<QFocusEvent*>(event)->reason();

    if (type == QEvent::FocusIn) {
        if (m_restoring == field)
            return true;  // back after a refusal: the typed text stays as it is
        if (!activationOnly(reason) || !m_textOnEnter.contains(field))
            guarded([&] { enterField(field); });
        return false;
    }

    if (activationOnly(reason) || m_validating)
        return false;
    m_validating = true;
    QString refusal;
    guarded([&] { refusal = leaveField(field); });
    if (refusal.isEmpty()) {
        m_textOnEnter.remove(field);
        // Out of the field, a remuneration shows in its display format again.
        if (field != Text8) {
            guarded([&] {
                const QVariant value = Adodc1->value(field == Text5 ? QStringLiteral("rend1") : QStringLiteral("rend2"));
                field->setText(amountText(value));
            });
        }
        m_validating = false;
        return false;
    }
    // The focus goes back before the message, so the user is still in the
    // field when told; the field itself never notices it was left.
    m_restoring = field;
    field->setFocus(Qt::OtherFocusReason);
    m_restoring = nullptr;
    refuse(refusal);
    m_validating = false;
    return true;
}

void FrmQuota::enterField(QLineEdit* field)
{
    if (field != Text8) {
        // The user edits the number itself, not its money format.
        const QVariant value = Adodc1->value(field == Text5 ? QStringLiteral("rend1") : QStringLiteral("rend2"));
        const StoredNumber stored = readStoredAmount(value);
        field->setText(stored.isNumber() ? plainNumber(stored.value) : stored.isNull() ? QString()
                                                                                       : value.toString());
    }
    field->setSelection(0, int(field->text().size()));
    m_textOnEnter.insert(field, field->text());
    field->setModified(false);
}

QString FrmQuota::leaveField(QLineEdit* field)
{
    // Passing through a field without typing changes nothing: recomputing
    // from the participation as shown (rounded to 5 places) would move a due
    // that nobody touched, and could even trap the user in the field.
    const auto entered = m_textOnEnter.constFind(field);
    if (entered != m_textOnEnter.constEnd() && *entered == field->text() && !field->isModified())
        return QString();
    if (field == Text8)
        return leaveParticipation();
    if (field == Text5)
        return leaveRemuneration(field, QStringLiteral("rend1"), QStringLiteral("rend2"));
    return leaveRemuneration(field, QStringLiteral("rend2"), QStringLiteral("rend1"));
}

double FrmQuota::participation() const
{
    if (const std::optional<double> typed = parseDecimal(Text8->text()))
        return *typed;
    // Before the refresh has filled the field: the participation it will show.
    const double remunerations = amountOf(Adodc1->value(QStringLiteral("rend1")), QStringLiteral("rend1"))
                                 + amountOf(Adodc1->value(QStringLiteral("rend2")), QStringLiteral("rend2"));
    if (remunerations == 0.0)
        return 0.0;
    return roundHalfEven(amountOf(Adodc1->value(QStringLiteral("quota")), QStringLiteral("quota")) / remunerations, 5);
}

QString FrmQuota::leaveRemuneration(QLineEdit* field, const QString& column, const QString& otherColumn)
{
    const std::optional<double> typed = parseDecimal(field->text());
    if (!typed || !amountInRange(*typed))
        return invalidValue();
    // The due is computed from the remuneration as it will be stored.
    const double remuneration = roundCents(*typed);
    const double due = (remuneration + amountOf(Adodc1->value(otherColumn), otherColumn)) * participation();
    if (!amountInRange(due))
        return invalidValue();
    // Compared unrounded: a due that only rounding lifts to the paid part
    // is still below it.
    if (!(due >= amountOf(Adodc1->value(QStringLiteral("pago")), QStringLiteral("pago"))))
        return belowPaid();
    Adodc1->setValue(column, remuneration);
    Adodc1->setValue(QStringLiteral("quota"), roundCents(due));
    showDue();
    showPorLiquidar();
    return QString();
}

QString FrmQuota::leaveParticipation()
{
    const std::optional<double> typed = parseDecimal(Text8->text());
    if (!typed)
        return invalidValue();
    // Not held against the paid part: a lower due shows as an overpayment.
    const double remunerations = amountOf(Adodc1->value(QStringLiteral("rend1")), QStringLiteral("rend1"))
                                 + amountOf(Adodc1->value(QStringLiteral("rend2")), QStringLiteral("rend2"));
    if (!amountInRange(remunerations * *typed))
        return invalidValue();
    Adodc1->setValue(QStringLiteral("quota"), roundCents(remunerations * *typed));
    showDue();
    showPorLiquidar();
    return QString();
}

void FrmQuota::refuse(const QString& message)
{
    msgBox(message, Buttons::Ok, Icon::Information, QStringLiteral("Quotas"));
}

bool FrmQuota::validateActiveField()
{
    QWidget* focused = focusWidget();
    if (!isAmountField(focused) || !Adodc1)
        return true;
    auto* field = static_cast<QLineEdit*>(focused);
    const QString refusal = leaveField(field);
    if (!refusal.isEmpty()) {
        refuse(refusal);
        return false;
    }
    // Still in the field: what it holds now counts as entered.
    m_textOnEnter.insert(field, field->text());
    field->setModified(false);
    return true;
}

}  // namespace quotas
