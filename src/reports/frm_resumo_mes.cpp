#include "reports/frm_resumo_mes.h"

#include "component/year_month_lists.h"
#include "platform/dialog_layout.h"
#include "platform/errors.h"
#include "platform/message_boxes.h"
#include "reports/entry.h"

#include <QLabel>
#include <QListWidget>
#include <QPushButton>

namespace quotas {

namespace {

const QString kCaption = QStringLiteral("Resumo do Mês");

}  // namespace

frmResumoMes::frmResumoMes(QDate today, QWidget* parent) : QDialog(parent)
{
    setObjectName(QStringLiteral("frmResumoMes"));
    setWindowTitle(kCaption);
    setModal(true);
    setFixedSize(twips(0, 0, 6705, 3100).size());
    useDialogFont(this);

    (new QLabel(QStringLiteral("Ano:"), this))->setGeometry(twips(300, 180, 1755, 255));
    List1 = new QListWidget(this);
    List1->setObjectName(QStringLiteral("List1"));
    List1->setGeometry(twips(300, 480, 1815, 2400));
    (new QLabel(QStringLiteral("Mês:"), this))->setGeometry(twips(2700, 180, 1755, 255));
    List2 = new QListWidget(this);
    List2->setObjectName(QStringLiteral("List2"));
    List2->setGeometry(twips(2700, 480, 1815, 2400));
    auto* mostrar = new QPushButton(QStringLiteral("&Mostrar"), this);
    mostrar->setObjectName(QStringLiteral("Command1"));
    mostrar->setGeometry(twips(4920, 495, 1695, 375));
    mostrar->setDefault(true);
    auto* sair = new QPushButton(QStringLiteral("&Sair"), this);
    sair->setObjectName(QStringLiteral("Command2"));
    sair->setGeometry(twips(4920, 900, 1695, 375));

    fillYearAndMonthLists(List1, List2, today);
    connect(mostrar, &QPushButton::clicked, this, &frmResumoMes::showSummary);
    connect(sair, &QPushButton::clicked, this, &QDialog::accept);
}

void frmResumoMes::showSummary()
{
    if (!List1->currentItem() || !List2->currentItem()) {
        msgBox(QStringLiteral("Escolha o ano e o mês."), Buttons::Ok, Icon::Exclamation, kCaption);
        return;
    }
    try {
        showMonthSummary(List1->currentItem()->text().toInt(), List2->currentRow() + 1);
    } catch (const QuotasError& e) {
        msgBox(e.message(), Buttons::Ok, Icon::Critical, kCaption);
    }
}

}  // namespace quotas
