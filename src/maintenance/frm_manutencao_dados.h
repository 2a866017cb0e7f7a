#pragma once

#include "maintenance/maintenance_panel.h"

#include <QDialog>
#include <QElapsedTimer>

class QLabel;
class QProgressBar;
class QPushButton;

namespace quotas {

class Animation;

// The maintenance dialog: a banner, the busy animation, one labelled bar per
// pass and the buttons "&Iniciar" and "&Sair". It does nothing until the user
// presses "&Iniciar", which runs ProcessarManutencao on the SqlServer
// connection; a failure is told in a box and leaves "&Iniciar" to try again.
// While the run works the dialog takes no input and cannot be closed.
class FrmManutencaoDados : public QDialog, private MaintenancePanel {
    Q_OBJECT
public:
    explicit FrmManutencaoDados(QWidget* parent = nullptr);

    bool running() const { return m_running; }

    // Controls, by their names in the layout.
    QLabel* Label1;
    QLabel* Label2;
    QLabel* Label3;
    QLabel* Label4;
    QLabel* Label5;
    QLabel* Label6;
    QLabel* Label7;
    Animation* Animation1;
    QProgressBar* ProgressBar1;
    QProgressBar* ProgressBar2;
    QProgressBar* ProgressBar3;
    QProgressBar* ProgressBar4;
    QProgressBar* ProgressBar5;
    QPushButton* Command1;
    QPushButton* Command2;

public slots:
    void reject() override;

protected:
    void closeEvent(QCloseEvent* event) override;

private slots:
    void Command1_Click();
    void Command2_Click();

private:
    QProgressBar* bar(int pass) const;

    QString caption() const override;
    void startBar(int pass, int maximum) override;
    void stepBar(int pass) override;
    void keepAlive() override;
    void playAnimation(const QString& clipFile) override;
    void stopAnimation() override;
    void showFinished() override;

    bool m_running = false;
    QElapsedTimer m_sincePump;
};

}  // namespace quotas
