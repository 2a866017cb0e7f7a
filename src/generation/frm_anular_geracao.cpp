#include "generation/frm_anular_geracao.h"

#include "component/month_names.h"
#include "component/shared_objects.h"
#include "generation/anular_geracao.h"
#include "generation/member_lookup.h"
#include "platform/errors.h"
#include "platform/message_boxes.h"

#include <QComboBox>
#include <QFontDatabase>
#include <QFormLayout>
#include <QHBoxLayout>
#include <QLineEdit>
#include <QPlainTextEdit>
#include <QPushButton>
#include <QSpinBox>
#include <QVBoxLayout>

namespace quotas {

namespace {

const QString kUndoCaption = QStringLiteral("Anular Geração");

}  // namespace

frmAnularGeracao::frmAnularGeracao(QDate today, QWidget* parent) : QDialog(parent)
{
    setObjectName(QStringLiteral("frmAnularGeracao"));
    setWindowTitle(kUndoCaption);
    setModal(true);
    Ano = new QSpinBox(this);
    Ano->setRange(1999, today.year() + 1);
    Ano->setValue(today.year());
    Mes = new QComboBox(this);
    Mes->addItems(monthNames());
    Mes->setCurrentIndex(today.month() - 1);
    Tipo = new QComboBox(this);
    Tipo->addItems({QStringLiteral("Sindicato e Seguro"), QStringLiteral("Sindicato"), QStringLiteral("Seguro")});
    No_Tap = new QLineEdit(this);
    No_Tap->setPlaceholderText(QStringLiteral("todos os associados"));
    Plano = new QPlainTextEdit(this);
    Plano->setReadOnly(true);
    Plano->setFont(QFontDatabase::systemFont(QFontDatabase::FixedFont));
    Plano->setMinimumSize(640, 320);
    VerPlano = new QPushButton(QStringLiteral("&Ver Plano"), this);
    Anular = new QPushButton(QStringLiteral("&Anular..."), this);
    Fechar = new QPushButton(QStringLiteral("&Fechar"), this);
    // Enter must never start a removal.
    for (QPushButton* b : {VerPlano, Anular, Fechar})
        b->setAutoDefault(false);

    auto* form = new QFormLayout;
    form->addRow(QStringLiteral("Ano:"), Ano);
    form->addRow(QStringLiteral("Mês:"), Mes);
    form->addRow(QStringLiteral("Tipo de quota:"), Tipo);
    form->addRow(QStringLiteral("Número de Empresa:"), No_Tap);
    auto* buttons = new QHBoxLayout;
    buttons->addStretch();
    buttons->addWidget(VerPlano);
    buttons->addWidget(Anular);
    buttons->addWidget(Fechar);
    auto* layout = new QVBoxLayout(this);
    layout->addLayout(form);
    layout->addWidget(Plano);
    layout->addLayout(buttons);

    connect(VerPlano, &QPushButton::clicked, this, &frmAnularGeracao::showPlan);
    connect(Anular, &QPushButton::clicked, this, &frmAnularGeracao::undo);
    connect(Fechar, &QPushButton::clicked, this, &QDialog::reject);
}

bool frmAnularGeracao::readChoice(UndoChoice& choice)
{
    choice.ano = Ano->value();
    choice.mes = Mes->currentIndex() + 1;
    choice.tipo = Tipo->currentIndex();
    choice.socio = 0;
    if (No_Tap->text().isEmpty())
        return true;
    const std::optional<StaffMember> member = findMemberByStaffNumber(Data().SqlServer, No_Tap->text());
    if (!member) {
        msgBox(QStringLiteral("Número de Empresa não existe!"), Buttons::Ok, Icon::Information, kUndoCaption);
        No_Tap->setFocus(Qt::OtherFocusReason);
        return false;
    }
    choice.socio = member->socioId;
    return true;
}

bool frmAnularGeracao::showPlan()
{
    try {
        UndoChoice choice;
        if (!readChoice(choice))
            return false;
        Plano->setPlainText(planUndo(Data().SqlServer, choice).text());
        return true;
    } catch (const QuotasError& e) {
        msgBox(e.message(), Buttons::Ok, Icon::Critical, kUndoCaption);
        return false;
    }
}

void frmAnularGeracao::undo()
{
    try {
        UndoChoice choice;
        if (!readChoice(choice))
            return;
        // The plan is read again now: what the question names is what goes.
        const UndoPlan plan = planUndo(Data().SqlServer, choice);
        Plano->setPlainText(plan.text());
        if (plan.removed.isEmpty()) {
            msgBox(QStringLiteral("Não há quotas a eliminar."), Buttons::Ok, Icon::Information, kUndoCaption);
            return;
        }
        if (msgBox(plan.confirmation(), Buttons::YesNoDefaultNo, Icon::Question, kUndoCaption) != Answer::Yes)
            return;
        const UndoOutcome outcome = AnularGeracao(Data().SqlServer, plan);
        Plano->setPlainText(planUndo(Data().SqlServer, choice).text());
        msgBox(outcome.summary(choice), Buttons::Ok, Icon::Information, kUndoCaption);
    } catch (const QuotasError& e) {
        // Each member's removal committed or not as a whole; the plan shows where things stand.
        msgBox(e.message(), Buttons::Ok, Icon::Critical, kUndoCaption);
        showPlan();
    }
}

}  // namespace quotas
