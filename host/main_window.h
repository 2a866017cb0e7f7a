#pragma once

#include <QMainWindow>
#include <QVariant>

class QTableWidget;

namespace quotas {
class General;
}

namespace host {

// The member register standing in for the host application: the members with
// their dues totals, the selected member's dues movements, and a "Quotas"
// menu that calls every method of General. A movement opens in the record
// window by a double click; the window hands its key back through RemoteKey.
class MainWindow : public QMainWindow {
    Q_OBJECT
public:
    explicit MainWindow(quotas::General& general, QWidget* parent = nullptr);

    // Reads the members and their accounts again, keeping the selection.
    void refreshMembers();
    // Reads the selected member's movements again and selects the one whose
    // quota_id is select (none when it is not among them).
    void refreshMovements(const QVariant& select = QVariant());

    QTableWidget* members() const { return m_members; }
    QTableWidget* movements() const { return m_movements; }
    // The socio_id of the selected member, the quota_id of the selected
    // movement; invalid when none is selected.
    QVariant currentMember() const;
    QVariant currentMovement() const;

    // Opens the record window on one movement of the selected member, as the
    // double click does.
    void openMovement(const QVariant& quotaId);

    // Called by the record window as it closes, with the key of the movement
    // it showed: that movement is selected again, with both lists refreshed.
    Q_INVOKABLE void RemoteKey(const QVariant& quotaId);

private:
    void call(const QByteArray& method);
    void openRecord();

    quotas::General& m_general;
    QTableWidget* m_members;
    QTableWidget* m_movements;
};

}  // namespace host
