#pragma once

#include <QMainWindow>
#include <QVariant>

class QLabel;
class QLineEdit;
class QTableView;
class QTableWidget;

namespace quotas {
class General;
}

namespace host {

class MemberFilter;
class MemberRegister;

// The member register standing in for the host application: the members with
// their dues totals (sorted by any column, narrowed by a search), the selected
// member's dues movements, and a "Quotas" menu that calls every method of
// General in the order of a month's work. A movement opens in the record
// window by a double click or Enter; the window hands its key back through
// RemoteKey. Every action reads the register once when it is over.
class MainWindow : public QMainWindow {
    Q_OBJECT
public:
    explicit MainWindow(quotas::General& general, QWidget* parent = nullptr);

    // Reads the members and their accounts again, keeping the selection, and
    // then the selected member's movements, selecting the one whose quota_id
    // is movement (else the one selected before).
    void refreshMembers(const QVariant& movement = QVariant());
    // How many times the register has been read: one per action.
    int refreshes() const { return m_refreshes; }
    // Reads the selected member's movements again and selects the one whose
    // quota_id is select (none when it is not among them).
    void refreshMovements(const QVariant& select = QVariant());

    QTableView* members() const { return m_members; }
    MemberRegister* memberRegister() const { return m_register; }
    QLineEdit* search() const { return m_search; }
    // Makes the member with this socio_id the current one (none when hidden
    // by the search) and lists his movements.
    void selectMember(const QVariant& socioId);
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
    void importClosed();
    void openRecord();
    void showStatus();
    // Selects this member (none when he is not listed) without reading his
    // movements; or else the first one listed.
    void placeSelection(const QVariant& socioId);
    void selectFirstUnless(const QVariant& socioId);

    quotas::General& m_general;
    MemberRegister* m_register;
    MemberFilter* m_filter;
    QLineEdit* m_search;
    QTableView* m_members;
    QTableWidget* m_movements;
    QLabel* m_status;
    int m_refreshes = 0;
    // While the record window is open the key it hands back waits here, so
    // that its closing costs one refresh.
    bool m_inRecord = false;
    QVariant m_returnedKey;
};

}  // namespace host
