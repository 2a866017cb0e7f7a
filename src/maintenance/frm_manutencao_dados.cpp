#include "maintenance/frm_manutencao_dados.h"
#include "platform/dialog_layout.h"

#include "component/shared_objects.h"
#include "maintenance/processar_manutencao.h"
#include "platform/animation.h"
#include "platform/errors.h"
#include "platform/message_boxes.h"

#include <QCloseEvent>
#include <QCoreApplication>
#include <QLabel>
#include <QProgressBar>
#include <QPushButton>
#include <algorithm>

namespace quotas {

FrmManutencaoDados::FrmManutencaoDados(QWidget* parent)
    : QDialog(parent, Qt::Dialog | Qt::MSWindowsFixedSizeDialogHint | Qt::WindowTitleHint | Qt::WindowSystemMenuHint
                          | Qt::WindowCloseButtonHint)
{
    setObjectName(QStringLiteral("frmManutencaoDados"));
    setWindowTitle(maintenanceCaption());
    setFixedSize(twips(0, 0, 7725, 4290).size());
    useDialogFont(this);

    auto label = [this](const char* name, const QString& text, const QRect& geometry) {
        auto* l = new QLabel(text, this);
        l->setObjectName(QString::fromLatin1(name));
        l->setGeometry(geometry);
        return l;
    };
    Label7 = label("Label7", QString(), twips(60, 60, 7515, 375));
    Label7->setAutoFillBackground(true);
    QPalette banner = Label7->palette();
    banner.setColor(QPalette::Window, palette().color(QPalette::Dark));  // the application workspace
    banner.setColor(QPalette::WindowText, palette().color(QPalette::Base));
    Label7->setPalette(banner);

    Label6 = label("Label6", QStringLiteral("Procedimentos de Manutenção da Base de Dados"), twips(120, 120, 7335, 255));
    Label6->setAutoFillBackground(true);
    Label6->setPalette(banner);
    QFont title(QStringLiteral("Arial"));
    title.setPointSizeF(9.75);
    title.setBold(true);
    Label6->setFont(title);

    Animation1 = new Animation(this);
    Animation1->setObjectName(QStringLiteral("Animation1"));
    Animation1->setGeometry(twips(240, 480, 1215, 555));

    auto progress = [this](const char* name, int top) {
        auto* b = new QProgressBar(this);
        b->setObjectName(QString::fromLatin1(name));
        b->setGeometry(twips(780, top, 4635, 195));
        b->setRange(0, 100);
        b->setValue(0);
        b->setTextVisible(false);
        return b;
    };
    Label1 = label("Label1", QStringLiteral("Movimentos Activos:"), twips(780, 1380, 2655, 195));
    ProgressBar1 = progress("ProgressBar1", 1620);
    Label2 = label("Label2", QStringLiteral("Movimentos Inactivos:"), twips(780, 1920, 2655, 195));
    ProgressBar2 = progress("ProgressBar2", 2160);
    Label3 = label("Label3", QStringLiteral("Histórico de Movimentos:"), twips(780, 2460, 2655, 195));
    ProgressBar3 = progress("ProgressBar3", 2700);
    Label4 = label("Label4", QStringLiteral("Acumulados Activos:"), twips(780, 3000, 2655, 195));
    ProgressBar4 = progress("ProgressBar4", 3240);
    Label5 = label("Label5", QStringLiteral("Acumulados Inactivos:"), twips(780, 3540, 2655, 195));
    ProgressBar5 = progress("ProgressBar5", 3780);

    Command1 = new QPushButton(QStringLiteral("&Iniciar"), this);
    Command1->setObjectName(QStringLiteral("Command1"));
    Command1->setGeometry(twips(5760, 3300, 1815, 375));
    Command2 = new QPushButton(QStringLiteral("&Sair"), this);
    Command2->setObjectName(QStringLiteral("Command2"));
    Command2->setGeometry(twips(5760, 3780, 1815, 375));
    connect(Command1, &QPushButton::clicked, this, &FrmManutencaoDados::Command1_Click);
    connect(Command2, &QPushButton::clicked, this, &FrmManutencaoDados::Command2_Click);
}

void FrmManutencaoDados::Command1_Click()
{
    if (m_running)
        return;
    m_running = true;
    m_sincePump.start();
    try {
        ProcessarManutencao(Data().SqlServer, *this);
    } catch (const QuotasError& e) {
        m_running = false;
        msgBox(e.message(), Buttons::Ok, Icon::Critical, QStringLiteral("Manutenção"));
        return;
    }
    m_running = false;
}

void FrmManutencaoDados::Command2_Click()
{
    close();
}

void FrmManutencaoDados::reject()
{
    if (!m_running)
        QDialog::reject();
}

void FrmManutencaoDados::closeEvent(QCloseEvent* event)
{
    // The run lets events through to keep the animation moving; a close
    // request among them must wait until it has ended.
    if (m_running) {
        event->ignore();
        return;
    }
    QDialog::closeEvent(event);
}

QProgressBar* FrmManutencaoDados::bar(int pass) const
{
    QProgressBar* const bars[] = {ProgressBar1, ProgressBar2, ProgressBar3, ProgressBar4, ProgressBar5};
    return bars[std::clamp(pass, 1, 5) - 1];
}

QString FrmManutencaoDados::caption() const
{
    return windowTitle();
}

void FrmManutencaoDados::startBar(int pass, int maximum)
{
    QProgressBar* b = bar(pass);
    b->setMaximum(std::max(maximum, 1));
    b->setValue(0);
    keepAlive();
}

void FrmManutencaoDados::stepBar(int pass)
{
    QProgressBar* b = bar(pass);
    if (b->value() < b->maximum())
        b->setValue(b->value() + 1);
    keepAlive();
}

void FrmManutencaoDados::keepAlive()
{
    // Often enough for the animation's frames, seldom enough to cost the
    // run nothing. Input waits: the dialog takes none while the run works.
    if (m_sincePump.isValid() && m_sincePump.elapsed() < 25)
        return;
    m_sincePump.start();
    QCoreApplication::processEvents(QEventLoop::ExcludeUserInputEvents);
}

void FrmManutencaoDados::playAnimation(const QString& clipFile)
{
    if (Animation1->open(clipFile))
        Animation1->play();
}

void FrmManutencaoDados::stopAnimation()
{
    Animation1->stop();
}

void FrmManutencaoDados::showFinished()
{
    Command2->setFocus();
    Command2->setText(QStringLiteral("&Fechar"));
    Command1->hide();
}

}  // namespace quotas
