#include "record/frm_quota.h"

#include <QGridLayout>
#include <QGroupBox>
#include <QHBoxLayout>
#include <QLabel>
#include <QLineEdit>
#include <QPalette>
#include <QPushButton>
#include <QVBoxLayout>

namespace quotas {

namespace {

QLineEdit* field(QWidget* parent, const char* name, bool editable, bool number)
{
    auto* edit = new QLineEdit(parent);
    edit->setObjectName(QLatin1String(name));
    edit->setReadOnly(!editable);
    if (!editable) {
        // Drawn on the window's own colour, so that it does not look typed
        // into, and out of the Tab order; a click still selects its text.
        QPalette palette = edit->palette();
        palette.setColor(QPalette::Base, palette.color(QPalette::Window));
        edit->setPalette(palette);
        edit->setFocusPolicy(Qt::ClickFocus);
    }
    if (number)
        edit->setAlignment(Qt::AlignRight | Qt::AlignVCenter);
    return edit;
}

// One "label: field" row of a group, the label's buddy being the field.
void addRow(QGridLayout* grid, int row, int column, const QString& caption, QLineEdit* edit, int span = 1)
{
    auto* label = new QLabel(caption, edit->parentWidget());
    label->setBuddy(edit);
    grid->addWidget(label, row, column);
    grid->addWidget(edit, row, column + 1, 1, span);
}

QPushButton* button(QWidget* parent, const char* name, const QString& caption)
{
    auto* b = new QPushButton(caption, parent);
    b->setObjectName(QLatin1String(name));
    // Enter in a field must never press a button: no default button.
    b->setAutoDefault(false);
    b->setDefault(false);
    // A click leaves the focus where it is; the button validates the field
    // being edited itself before it acts (validateActiveField).
    b->setFocusPolicy(Qt::TabFocus);
    return b;
}

}  // namespace

void FrmQuota::buildControls()
{
    setWindowTitle(QStringLiteral("Quota"));
    setObjectName(QStringLiteral("frmQuota"));

    Frame1 = new QGroupBox(QStringLiteral("Quota"), this);
    Frame1->setObjectName(QStringLiteral("Frame1"));
    Text1 = field(Frame1, "Text1", false, false);
    Text2 = field(Frame1, "Text2", false, true);
    Text3 = field(Frame1, "Text3", false, true);
    Text4 = field(Frame1, "Text4", false, true);
    Text7 = field(Frame1, "Text7", false, false);
    auto* quotaGrid = new QGridLayout(Frame1);
    addRow(quotaGrid, 0, 0, QStringLiteral("Data de Processamento:"), Text1);
    addRow(quotaGrid, 1, 0, QStringLiteral("Relativo as Ano:"), Text2);
    addRow(quotaGrid, 2, 0, QStringLiteral("Relativo ao Mês:"), Text3);
    addRow(quotaGrid, 3, 0, QStringLiteral("Número de Quota:"), Text4);
    addRow(quotaGrid, 4, 0, QStringLiteral("Tipo de Quota:"), Text7);

    Frame2 = new QGroupBox(QStringLiteral("Importancias:"), this);
    Frame2->setObjectName(QStringLiteral("Frame2"));
    Text5 = field(Frame2, "Text5", true, true);
    Text6 = field(Frame2, "Text6", true, true);
    Text8 = field(Frame2, "Text8", true, true);
    Text9 = field(Frame2, "Text9", false, true);
    Text13 = field(Frame2, "Text13", false, true);
    auto* amountGrid = new QGridLayout(Frame2);
    addRow(amountGrid, 0, 0, QStringLiteral("Remuneração (1):"), Text5);
    addRow(amountGrid, 1, 0, QStringLiteral("Remuneração (2):"), Text6);
    addRow(amountGrid, 2, 0, QStringLiteral("Participação:"), Text8);
    addRow(amountGrid, 3, 0, QStringLiteral("Valor Quota :"), Text9);
    addRow(amountGrid, 4, 0, QStringLiteral("Por Liquidar:"), Text13);

    Frame3 = new QGroupBox(QStringLiteral("Associado:"), this);
    Frame3->setObjectName(QStringLiteral("Frame3"));
    Text10 = field(Frame3, "Text10", false, false);
    Text11 = field(Frame3, "Text11", false, false);
    Text12 = field(Frame3, "Text12", false, false);
    auto* memberGrid = new QGridLayout(Frame3);
    addRow(memberGrid, 0, 0, QStringLiteral("No Empresa:"), Text10);
    addRow(memberGrid, 0, 2, QStringLiteral("Nome Guerra:"), Text12);
    addRow(memberGrid, 1, 0, QStringLiteral("Nome:"), Text11, 3);
    memberGrid->setColumnStretch(1, 1);
    memberGrid->setColumnStretch(3, 2);

    Command1 = button(this, "Command1", QStringLiteral("&Anular"));
    Command2 = button(this, "Command2", QStringLiteral("&Liquidar"));
    Command3 = button(this, "Command3", QStringLiteral("&Sair"));

    auto* groups = new QGridLayout;
    groups->addWidget(Frame1, 0, 0);
    groups->addWidget(Frame2, 0, 1);
    groups->addWidget(Frame3, 1, 0, 1, 2);
    auto* buttons = new QHBoxLayout;
    buttons->addWidget(Command1);
    buttons->addStretch(1);
    buttons->addWidget(Command2);
    buttons->addWidget(Command3);
    auto* whole = new QVBoxLayout(this);
    whole->addLayout(groups);
    whole->addLayout(buttons);

    // The fields that take typing, then the buttons.
    QWidget* order[] = {Text5, Text6, Text8, Command1, Command2, Command3};
    for (size_t i = 1; i < std::size(order); ++i)
        setTabOrder(order[i - 1], order[i]);
    resize(600, 370);
}

}  // namespace quotas
