#pragma once

#include <QDate>
#include <QDialog>

class QListWidget;

namespace quotas {

// Chooses the year and month of the month's summary, with the lists of the
// generation dialog; "Mostrar" previews the summary and leaves the dialog
// open for another month.
class frmResumoMes : public QDialog {
    Q_OBJECT
public:
    explicit frmResumoMes(QDate today = QDate::currentDate(), QWidget* parent = nullptr);

    QListWidget* List1;  // years
    QListWidget* List2;  // months

private:
    void showSummary();
};

}  // namespace quotas
