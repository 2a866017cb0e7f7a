#pragma once

// What the record window's tests share: members and movements in the test
// database, the window opened through General::Registo with a script that
// drives it while it is modal, and host objects that receive RemoteKey.

#include "component/general.h"
#include "platform/errors.h"
#include "record/frm_quota.h"
#include "support/scripted_boxes.h"
#include "support/test_database.h"

#include <QObject>
#include <QVariantList>
#include <functional>
#include <memory>

namespace quotas::test {

struct MovementRow {
    QVariant rend1 = 1000.0;
    QVariant rend2 = 0.0;
    QVariant quota = 15.0;
    QVariant pago = 0.0;
    QString ref = QStringLiteral("Sindicato");
    int ano = 2003;
    int mes = 3;
};

class RecordFixture {
public:
    explicit RecordFixture(TestDatabase& db) : m_db(db) {}

    // A member of the register (socio_id = id) with staff number and names.
    void addMember(int id);
    // A movement of the member; returns its quota_id.
    QVariant addMovement(int socio, const MovementRow& row);
    // A dues account with last values of its own and the given totals.
    void addAccount(int socio, double totalQuotas, double totalPago);

    // One column of one row, read on the test's own connection.
    QVariant movement(const QVariant& quotaId, const QString& column);
    QVariant account(int socio, const QString& column);
    bool hasAccount(int socio);

    // The text the host hands to Registo for a member's movements.
    static QString movementsOf(int socio);

    // Opens the window with General::Registo on the member's movements,
    // positioned on pkey, and runs script once the window is up and its
    // computed fields are filled. The window is closed with its close
    // control if the script leaves it open. False when no window showed.
    bool open(int socio, const QVariant& pkey, const std::function<void(FrmQuota&)>& script, QObject* caller = nullptr);

    // Leaves the focused field for the next one, as the Tab key does.
    static void tabOut(QWidget* field);
    // Gives a field the focus and types text over what entering selected.
    static void type(QLineEdit* field, const QString& text);

    General general;

private:
    TestDatabase& m_db;
};

// A host object that records the keys it is handed.
class RecordingCaller : public QObject {
    Q_OBJECT
public:
    QVariantList keys;
    Q_INVOKABLE void RemoteKey(const QVariant& key) { keys << key; }
};

// A host object whose RemoteKey fails.
class FailingCaller : public QObject {
    Q_OBJECT
public:
    int calls = 0;
    Q_INVOKABLE void RemoteKey(const QVariant&)
    {
        ++calls;
        throw QuotasError(QStringLiteral("falhou"));
    }
};

// A host object without RemoteKey.
class SilentCaller : public QObject {
    Q_OBJECT
};

}  // namespace quotas::test

Q_DECLARE_METATYPE(quotas::test::MovementRow)
