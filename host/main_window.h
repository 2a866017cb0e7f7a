#pragma once

#include <QMainWindow>

class QTableWidget;

namespace quotas {
class General;
}

namespace host {

// The member register standing in for the host application: the members with
// their dues totals, and a "Quotas" menu that calls every method of General.
class MainWindow : public QMainWindow {
    Q_OBJECT
public:
    explicit MainWindow(quotas::General& general, QWidget* parent = nullptr);

    // Reads the members and their accounts again.
    void refreshMembers();
    QTableWidget* members() const { return m_members; }

private:
    void call(const QByteArray& method);
    void openRecord();

    quotas::General& m_general;
    QTableWidget* m_members;
};

}  // namespace host
