#pragma once

#include <QDate>
#include <QDialog>
#include <QStringList>

class QCheckBox;
class QLabel;
class QListWidget;
class QPushButton;

namespace quotas {

// The dues import dialog "Importar Registos de Quotas": year, month, dues
// type and how the amounts are written, then the import run. Not modal; it
// unloads itself (deleted) when closed, and closes after every run.
class FrmImportarQuotas : public QDialog {
    Q_OBJECT
public:
    // DryRun: the same choices for "Simular Importação", which shows what
    // the import would do with every line and writes nothing.
    enum class Mode {
        Import,
        DryRun
    };
    explicit FrmImportarQuotas(QWidget* owner = nullptr, Mode mode = Mode::Import);

    // 1 to 12 for a name equal to one of them (case included), else 0.
    static int monthFromName(const QString& name);

    // The date the lists open on: today, unless pinned (tests). An invalid
    // date unpins it.
    static void pinToday(const QDate& date);
    static QDate today();

protected:
    void keyPressEvent(QKeyEvent* event) override;
    void closeEvent(QCloseEvent* event) override;

private:
    void executar();

    QLabel* Label3;
    QListWidget* List1;
    QLabel* Label2;
    QListWidget* List2;
    QPushButton* Command1;
    QPushButton* Command2;
    QLabel* Label1;
    QListWidget* List3;
    QCheckBox* Check1;
    Mode m_mode;
    bool m_running = false;
};

}  // namespace quotas
