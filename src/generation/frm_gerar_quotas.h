#pragma once

#include <QDate>
#include <QDialog>
#include <functional>

class QGroupBox;
class QLabel;
class QLineEdit;
class QListWidget;
class QPushButton;

namespace quotas {

// The dues generation dialog: the processing year and month, optionally
// one member by his staff number, confirmation, then the run.
class frmGerarQuotas : public QDialog {
    Q_OBJECT
public:
    // today decides the years offered and the preselection.
    explicit frmGerarQuotas(QDate today = QDate::currentDate(), QWidget* parent = nullptr);

    // Fills the lists and clears the member, as every showing starts.
    void load(QDate today);

    // The member the run is narrowed to (socio_id), 0 for all members.
    int selectedMember() const { return m_socio; }

    QLabel* Label3;
    QListWidget* List1;
    QLabel* Label2;
    QListWidget* List2;
    QPushButton* Command1;
    QPushButton* Command2;
    QGroupBox* Frame1;
    QLabel* Label4;
    QLineEdit* No_Tap;
    QLabel* Label1;
    QLineEdit* Text2;

protected:
    bool eventFilter(QObject* watched, QEvent* event) override;

private:
    // The lookup of the typed staff number; false (with the message) when
    // no member has it.
    bool validateNoTap();
    // validateNoTap for an event handler: a failure is shown, never thrown.
    bool checkNoTap();
    void execute();

    int m_socio = 0;
    QString m_checkedText;  // the staff number the last validation saw
    bool m_checkedOk = true;
    bool m_validating = false;
};

}  // namespace quotas
