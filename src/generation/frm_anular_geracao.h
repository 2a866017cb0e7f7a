#pragma once

#include <QDate>
#include <QDialog>

class QComboBox;
class QLineEdit;
class QPlainTextEdit;
class QPushButton;
class QSpinBox;

namespace quotas {

struct UndoChoice;

// "Anular Geração": the month (and optionally the type and one member) whose
// generated dues are taken back, the plan of what goes and what stays, and
// the confirmation, whose default answer is No.
class frmAnularGeracao : public QDialog {
    Q_OBJECT
public:
    explicit frmAnularGeracao(QDate today = QDate::currentDate(), QWidget* parent = nullptr);

    QSpinBox* Ano;
    QComboBox* Mes;
    QComboBox* Tipo;
    QLineEdit* No_Tap;
    QPlainTextEdit* Plano;
    QPushButton* VerPlano;
    QPushButton* Anular;
    QPushButton* Fechar;

    // The plan for the choices shown; false (with the message) when they
    // cannot be read.
    bool showPlan();
    // The plan again, the question, and the removal when the answer is Yes.
    void undo();

private:
    bool readChoice(UndoChoice& choice);
};

}  // namespace quotas
