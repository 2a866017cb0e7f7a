#include "generation/frm_gerar_quotas.h"
#include "platform/dialog_layout.h"
#include "component/year_month_lists.h"

#include "component/shared_objects.h"
#include "generation/member_lookup.h"
#include "generation/processar_quotas.h"
#include "platform/errors.h"
#include "platform/message_boxes.h"

#include <QApplication>
#include <QFocusEvent>
#include <QGroupBox>
#include <QLabel>
#include <QLineEdit>
#include <QListWidget>
#include <QPushButton>

namespace quotas {

namespace {

const QString kCaption = QStringLiteral("Gerar Quotas");

template <typename W>
W* placed(W* widget, const char* name, QRect geometry)
{
    widget->setObjectName(QString::fromLatin1(name));
    widget->setGeometry(geometry);
    return widget;
}

}  // namespace

frmGerarQuotas::frmGerarQuotas(QDate today, QWidget* parent) : QDialog(parent)
{
    setObjectName(QStringLiteral("frmGerarQuotas"));
    setWindowTitle(kCaption);
    setModal(true);
    setFixedSize(twips(0, 0, 6705, 4455).size());
    useDialogFont(this);

    Label3 = placed(new QLabel(QStringLiteral("Ano de Processamento:"), this), "Label3", twips(300, 180, 1755, 255));
    List1 = placed(new QListWidget(this), "List1", twips(300, 480, 1815, 2400));
    // Two captions a few pixels wider, as far as their neighbours allow: at
    // the 8-point font they were cut ("Número de Empresa" lost its colon).
    Label2 = placed(new QLabel(QStringLiteral("Mês de Processamento:"), this), "Label2", twips(2700, 180, 1815, 255));
    List2 = placed(new QListWidget(this), "List2", twips(2700, 480, 1815, 2400));
    Command1 = placed(new QPushButton(QStringLiteral("&Executar"), this), "Command1", twips(4920, 495, 1695, 375));
    Command2 = placed(new QPushButton(QStringLiteral("&Cancelar"), this), "Command2", twips(4920, 900, 1695, 375));
    Frame1 = placed(new QGroupBox(QStringLiteral("Processar Quotas para apenas um Associado:"), this), "Frame1",
                    twips(120, 3060, 6435, 1275));
    Label4 = placed(new QLabel(QStringLiteral("Número de Empresa:"), Frame1), "Label4", twips(180, 420, 1560, 255));
    No_Tap = placed(new QLineEdit(Frame1), "No_Tap", twips(1740, 420, 1395, 285));
    Label1 = placed(new QLabel(QStringLiteral("Nome Completo:"), Frame1), "Label1", twips(180, 780, 1515, 255));
    Text2 = placed(new QLineEdit(Frame1), "Text2", twips(1740, 780, 4455, 285));
    // The name only answers the staff number; typing there would change nothing.
    Text2->setReadOnly(true);

    for (QListWidget* list : {List1, List2})
        list->setSelectionMode(QAbstractItemView::SingleSelection);
    No_Tap->installEventFilter(this);
    connect(Command1, &QPushButton::clicked, this, &frmGerarQuotas::execute);
    connect(Command2, &QPushButton::clicked, this, &QDialog::reject);

    load(today);
}

void frmGerarQuotas::load(QDate today)
{
    fillYearAndMonthLists(List1, List2, today);

    No_Tap->clear();
    Text2->clear();
    m_socio = 0;
    m_checkedText.clear();
    m_checkedOk = true;
}

bool frmGerarQuotas::eventFilter(QObject* watched, QEvent* event)
{
    if (watched == No_Tap && event->type() == QEvent::FocusOut && !m_validating) {
        const Qt::FocusReason reason = static_cast<QFocusEvent*>(event)->reason();
        // Another window taking over (a message box, a menu) is not the user
        // leaving the field, and cancelling never needs a valid number.
        const bool leaving = reason != Qt::ActiveWindowFocusReason && reason != Qt::PopupFocusReason;
        if (leaving && QApplication::focusWidget() != Command2 && isVisible() && !checkNoTap())
            No_Tap->setFocus(Qt::OtherFocusReason);
    }
    return QDialog::eventFilter(watched, event);
}

bool frmGerarQuotas::validateNoTap()
{
    const QString text = No_Tap->text();
    m_validating = true;
    struct Reset {
        bool& flag;
        ~Reset() { flag = false; }
    } reset{m_validating};
    m_checkedText = text;
    if (text.isEmpty()) {
        Text2->clear();
        m_socio = 0;
        m_checkedOk = true;
        return true;
    }
    const std::optional<StaffMember> member = findMemberByStaffNumber(Data().SqlServer, text);
    if (!member) {
        m_socio = 0;
        m_checkedOk = false;
        msgBox(QStringLiteral("Número de Empresa não existe!"), Buttons::Ok, Icon::Information);
        return false;
    }
    Text2->setText(member->nome);
    m_socio = member->socioId;
    m_checkedOk = true;
    return true;
}

bool frmGerarQuotas::checkNoTap()
{
    // A lookup that fails (the database gone, say) must not escape the
    // event handler; the number counts as unchecked, so Executar tries again.
    try {
        return validateNoTap();
    } catch (const QuotasError& e) {
        msgBox(e.message(), Buttons::Ok, Icon::Critical, kCaption);
    } catch (const std::exception& e) {
        msgBox(QString::fromLocal8Bit(e.what()), Buttons::Ok, Icon::Critical, kCaption);
    }
    m_checkedText.clear();
    return false;
}

void frmGerarQuotas::execute()
{
    try {
        // A staff number typed but not yet checked (Enter, or the button's
        // shortcut) is checked now. One found wrong on leaving the field has
        // had its message: the run waits until it is corrected.
        if (No_Tap->text() != m_checkedText ? !validateNoTap() : !m_checkedOk) {
            No_Tap->setFocus(Qt::OtherFocusReason);
            return;
        }
        if (!List1->currentItem() || !List2->currentItem()) {
            msgBox(QStringLiteral("Escolha o ano e o mês de processamento."), Buttons::Ok, Icon::Exclamation, kCaption);
            return;
        }
        if (msgBox(QStringLiteral("Deseja iniciar o processamento de quotas?"), Buttons::YesNo, Icon::Question,
                   QStringLiteral("Processar Quotizações"))
            != Answer::Yes)
            return;
        const int ano = List1->currentItem()->text().toInt();
        const int mes = List2->currentRow() + 1;
        const GenerationOutcome outcome = ProcessarQuotas(ano, mes, m_socio);
        accept();
        msgBox(QStringLiteral("Fim do processamento de quotizações\n\n") + outcome.counts(), Buttons::Ok, Icon::Information,
               kCaption);
        if (outcome.notGenerated() > 0)
            msgBox(outcome.summary(), Buttons::Ok, Icon::Exclamation, kCaption);
    } catch (const QuotasError& e) {
        // What was saved stays saved; the dialog stays open for another try.
        msgBox(e.message(), Buttons::Ok, Icon::Critical, kCaption);
    } catch (const std::exception& e) {
        // Nothing may escape a button's handler into the event loop.
        msgBox(QString::fromLocal8Bit(e.what()), Buttons::Ok, Icon::Critical, kCaption);
    }
}

}  // namespace quotas
