#include "import/frm_importar_quotas.h"
#include "platform/dialog_layout.h"
#include "component/month_names.h"
#include "component/year_month_lists.h"

#include "component/shared_objects.h"
#include "import/dry_run_window.h"
#include "import/processar_importacao.h"
#include "platform/errors.h"
#include "platform/message_boxes.h"

#include <QCheckBox>
#include <QCloseEvent>
#include <QKeyEvent>
#include <QLabel>
#include <QListWidget>
#include <QPushButton>

namespace quotas {

namespace {

QDate& pinnedToday()
{
    static QDate date;
    return date;
}

template <typename W>
W* place(W* widget, const QString& name, const QRect& geometry)
{
    widget->setObjectName(name);
    widget->setGeometry(geometry);
    return widget;
}

}  // namespace

int FrmImportarQuotas::monthFromName(const QString& name)
{
    return int(monthNames().indexOf(name)) + 1;  // indexOf compares exactly; -1 gives 0
}

void FrmImportarQuotas::pinToday(const QDate& date)
{
    pinnedToday() = date;
}

QDate FrmImportarQuotas::today()
{
    return pinnedToday().isValid() ? pinnedToday() : QDate::currentDate();
}

FrmImportarQuotas::FrmImportarQuotas(QWidget* owner, Mode mode)
    : QDialog(owner, Qt::Dialog | Qt::MSWindowsFixedSizeDialogHint | Qt::CustomizeWindowHint | Qt::WindowTitleHint
                         | Qt::WindowCloseButtonHint),
      Label3(place(new QLabel(QStringLiteral("Ano de Importação:"), this), QStringLiteral("Label3"), twips(180, 180, 1755, 255))),
      List1(place(new QListWidget(this), QStringLiteral("List1"), twips(180, 480, 1815, 2595))),
      Label2(place(new QLabel(QStringLiteral("Mês de Importação:"), this), QStringLiteral("Label2"), twips(2580, 180, 1755, 255))),
      List2(place(new QListWidget(this), QStringLiteral("List2"), twips(2580, 480, 1815, 2595))),
      Command1(place(new QPushButton(QStringLiteral("&Executar"), this), QStringLiteral("Command1"), twips(5160, 180, 1575, 375))),
      Command2(place(new QPushButton(QStringLiteral("&Cancelar"), this), QStringLiteral("Command2"), twips(5160, 600, 1575, 375))),
      Label1(place(new QLabel(QStringLiteral("Referente a:"), this), QStringLiteral("Label1"), twips(4920, 1440, 1755, 255))),
      List3(place(new QListWidget(this), QStringLiteral("List3"), twips(4920, 1680, 1815, 1425))),
      Check1(place(new QCheckBox(QStringLiteral("Os registos estão separados com um ponto (.)"), this),
                   QStringLiteral("Check1"), twips(180, 3330, 6585, 285))),
      m_mode(mode)
{
    setObjectName(QStringLiteral("frmImportarQuotas"));
    setWindowTitle(QStringLiteral("Importar Registos de Quotas"));
    if (mode == Mode::DryRun) {
        setObjectName(QStringLiteral("frmSimularImportacao"));
        setWindowTitle(QStringLiteral("Simular Importação"));
        Command1->setText(QStringLiteral("&Simular"));
    }
    setAttribute(Qt::WA_DeleteOnClose);
    setFixedSize(twips(0, 0, 6945, 3795).size());
    useDialogFont(this);
    setSizeGripEnabled(false);

    // Neither button answers Enter by itself.
    for (QPushButton* button : {Command1, Command2}) {
        button->setAutoDefault(false);
        button->setDefault(false);
    }
    setTabOrder(List2, List1);
    setTabOrder(List1, Command2);
    setTabOrder(Command2, Command1);
    setTabOrder(Command1, List3);
    setTabOrder(List3, Check1);

    // The box opens checked: the amounts carry a decimal point.
    Check1->setChecked(true);
    shared().SemSeparadorDecimal = false;
    connect(Check1, &QCheckBox::toggled, this, [](bool checked) { shared().SemSeparadorDecimal = !checked; });

    fillYearAndMonthLists(List1, List2, today());
    List3->addItems({QStringLiteral("Sindicato"), QStringLiteral("Plano de Saúde")});
    List3->setCurrentRow(0);
    for (QListWidget* list : {List1, List2, List3}) {
        list->setSelectionMode(QAbstractItemView::SingleSelection);
        if (list->currentItem())
            list->scrollToItem(list->currentItem());
    }

    connect(Command1, &QPushButton::clicked, this, &FrmImportarQuotas::executar);
    connect(Command2, &QPushButton::clicked, this, &QWidget::close);
    List2->setFocus();
}

void FrmImportarQuotas::executar()
{
    if (m_running)
        return;
    m_running = true;
    const auto selected = [](QListWidget* list) { return list->currentItem() ? list->currentItem()->text() : QString(); };
    const int month = monthFromName(selected(List2));
    const int tipo = selected(List3) == QLatin1String("Sindicato") ? 1 : 2;
    const int year = selected(List1).toInt();
    // Nothing may escape into the event loop: what the run does not tell the
    // user itself (a file that cannot be read, say) is told here.
    try {
        if (m_mode == Mode::DryRun) {
            ImportVerdicts verdicts;
            SimularImportacao(month, year, tipo, verdicts);
            // A list the import would refuse has been told of by the run.
            if (!verdicts.lines.empty()) {
                DryRunWindow window(std::move(verdicts),
                                    QStringLiteral("%1, %2 de %3").arg(selected(List3), selected(List2), selected(List1)),
                                    this);
                window.exec();
            }
        } else {
            const ImportSummary summary = ProcessarImportacao(month, year, tipo);
            if (summary.lines > 0)
                msgBox(QStringLiteral("Fim da importação de quotas.\n\n") + summary.counts(), Buttons::Ok, Icon::Information,
                       windowTitle());
        }
    } catch (const QuotasError& e) {
        msgBox(e.message(), Buttons::Ok, Icon::Critical);
    } catch (const std::exception& e) {
        msgBox(QString::fromLocal8Bit(e.what()), Buttons::Ok, Icon::Critical);
    }
    m_running = false;
    close();
}

void FrmImportarQuotas::keyPressEvent(QKeyEvent* event)
{
    // The dialog has no cancel button: Escape does not close it.
    if (event->key() == Qt::Key_Escape) {
        event->accept();
        return;
    }
    QDialog::keyPressEvent(event);
}

void FrmImportarQuotas::closeEvent(QCloseEvent* event)
{
    // Deleting the dialog under its own running import would pull the
    // ground from under it; it closes itself when the run returns.
    if (m_running) {
        event->ignore();
        return;
    }
    QDialog::closeEvent(event);
}

}  // namespace quotas
