#include "record/frm_quota.h"

#include "component/general.h"
#include "component/money.h"
#include "platform/errors.h"
#include "platform/late_binding.h"
#include "platform/message_boxes.h"
#include "platform/recordset.h"
#include "record/movement_saving.h"
#include "record/record_text.h"

#include <QCloseEvent>
#include <QKeyEvent>
#include <QLineEdit>
#include <QPushButton>
#include <QTimer>

namespace quotas {

FrmQuota::FrmQuota(QWidget* parent) : QDialog(parent)
{
    setAttribute(Qt::WA_DeleteOnClose);
    buildControls();
    Timer1 = new QTimer(this);
    Timer1->setObjectName(QStringLiteral("Timer1"));
    connect(Timer1, &QTimer::timeout, this, [this] { guarded([this] { Timer1_Timer(); }); });
    connect(Command1, &QPushButton::clicked, this, [this] { guarded([this] { Command1_Click(); }); });
    connect(Command2, &QPushButton::clicked, this, [this] { guarded([this] { Command2_Click(); }); });
    connect(Command3, &QPushButton::clicked, this, [this] { guarded([this] { Command3_Click(); }); });
    for (QLineEdit* field : {Text5, Text6, Text8})
        field->installEventFilter(this);
    load();
}

FrmQuota::~FrmQuota()
{
    // The rows may outlive the window (Registo holds them too): the data
    // control's notification must not reach a window that is gone.
    if (Adodc1)
        Adodc1->willMove = nullptr;
}

void FrmQuota::load()
{
    GravarPendente = false;
    m_unloaded = false;
    m_restoring = nullptr;
    m_validating = false;
    m_textOnEnter.clear();
    Text8->clear();
    Text13->clear();
    // The computed fields are filled once the window is up and positioned.
    Timer1->start(1);
    Text5->setFocus();  // the first field that takes typing
}

void FrmQuota::setOwner(General* owner)
{
    m_owner = owner;
}

void FrmQuota::setCaller(QObject* caller)
{
    m_caller = caller;
}

void FrmQuota::bind(std::shared_ptr<Recordset> rows, const QVariant& pkey)
{
    if (Adodc1)
        Adodc1->willMove = nullptr;
    Adodc1 = std::move(rows);
    if (m_unloaded)
        load();
    Adodc1->willMove = [this] { GravarPendente = true; };
    Adodc1->moveFirst();
    if (!Adodc1->find(QStringLiteral("quota_id"), pkey))
        Adodc1->moveFirst();
    m_asRead = movementAmounts(*Adodc1);
    m_accountAsRead = accountLastValues(*Adodc1);
    showRow();
}

void FrmQuota::showRow()
{
    const Recordset& row = *Adodc1;
    const QLocale locale;
    auto plain = [&](const char* column) { return row.value(QLatin1String(column)).toString(); };
    auto money = [&](const char* column) { return amountText(row.value(QLatin1String(column)), locale); };
    Text1->setText(formatDataQuota(row.value(QStringLiteral("data"))));
    Text2->setText(plain("ano"));
    Text3->setText(plain("mes"));
    Text4->setText(plain("quota_no"));
    Text7->setText(plain("ref"));
    Text5->setText(money("rend1"));
    Text6->setText(money("rend2"));
    Text9->setText(money("quota"));
    Text10->setText(plain("no_tap"));
    Text11->setText(plain("nome"));
    Text12->setText(plain("nome_guerra"));
}

void FrmQuota::showDue()
{
    const QVariant quota = Adodc1->value(QStringLiteral("quota"));
    Text9->setText(amountText(quota));
}

void FrmQuota::showPorLiquidar()
{
    const double quota = amountOf(Adodc1->value(QStringLiteral("quota")), QStringLiteral("quota"));
    const double pago = amountOf(Adodc1->value(QStringLiteral("pago")), QStringLiteral("pago"));
    Text13->setText(formatMoney(roundCents(quota - pago)));
}

void FrmQuota::Timer1_Timer()
{
    Timer1->stop();
    if (!Adodc1)
        return;
    const double remunerations = amountOf(Adodc1->value(QStringLiteral("rend1")), QStringLiteral("rend1"))
                                 + amountOf(Adodc1->value(QStringLiteral("rend2")), QStringLiteral("rend2"));
    Text8->setText(participationText(amountOf(Adodc1->value(QStringLiteral("quota")), QStringLiteral("quota")), remunerations));
    showPorLiquidar();
}

void FrmQuota::Gravar()
{
    if (!GravarPendente || !Adodc1->editing())
        return;
    gravarQuota(*Adodc1, m_accountAsRead);
    m_asRead = movementAmounts(*Adodc1);
    m_accountAsRead = accountLastValues(*Adodc1);
}

bool FrmQuota::gravarOrTell()
{
    try {
        Gravar();
        return true;
    } catch (const QuotasError& e) {
        tell(QStringLiteral("Não foi possível gravar a quota."), e);
        return false;
    }
}

void FrmQuota::tell(const QString& what, const QuotasError& error)
{
    msgBox(what + QStringLiteral("\n\n") + error.message(), Buttons::Ok, Icon::Critical);
}

void FrmQuota::guarded(const std::function<void()>& handler)
{
    try {
        handler();
    } catch (const QuotasError& e) {
        msgBox(e.message(), Buttons::Ok, Icon::Critical);
    } catch (const std::exception& e) {
        msgBox(QString::fromLocal8Bit(e.what()), Buttons::Ok, Icon::Critical);
    }
}

void FrmQuota::Command3_Click()
{
    if (!validateActiveField())
        return;
    if (!gravarOrTell())
        return;
    done(Accepted);
}

void FrmQuota::done(int result)
{
    if (!m_unloaded) {
        m_unloaded = true;
        Timer1->stop();
        unload();
    }
    QDialog::done(result);
}

void FrmQuota::unload()
{
    if (!Adodc1)
        return;
    // Closing other than by Sair or a payment saves nothing: edits still
    // pending in the row are dropped, never written later.
    Adodc1->cancelUpdate();
    QVariant key;
    try {
        key = Adodc1->value(QStringLiteral("quota_id"));
    } catch (...) {
        return;  // no current row: there is no key to hand back
    }
    try {
        tryCallByName(m_caller, "RemoteKey", {key});
    } catch (...) {
        // What the host does with the key, and how it fails, is its own affair.
    }
}

bool FrmQuota::hasUnsavedEdits() const
{
    if (!Adodc1 || m_unloaded)
        return false;
    if (Adodc1->editing())
        return true;
    const auto* field = qobject_cast<const QLineEdit*>(focusWidget());
    return isAmountField(field) && m_textOnEnter.contains(field) && field->text() != m_textOnEnter.value(field);
}

void FrmQuota::closeEvent(QCloseEvent* event)
{
    // The close control never saves; typed values are only dropped once the
    // user says so.
    if (hasUnsavedEdits()
        && msgBox(QStringLiteral("As alterações a esta quota não foram gravadas.\nQuer fechar a janela sem as gravar?"),
                  Buttons::YesNoDefaultNo, Icon::Question, windowTitle())
               != Answer::Yes) {
        event->ignore();
        return;
    }
    QDialog::closeEvent(event);
}

void FrmQuota::keyPressEvent(QKeyEvent* event)
{
    // Escape would close the window and drop the edits without a word; the
    // window is left with its buttons or its close control.
    if (event->key() == Qt::Key_Escape) {
        event->accept();
        return;
    }
    QDialog::keyPressEvent(event);
}

}  // namespace quotas
