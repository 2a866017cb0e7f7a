#pragma once

// Shared by the record window's tests: rows in the test database, and the
// window opened through General::Registo with a script run while it is modal.

#include "component/general.h"
#include "platform/errors.h"
#include "record/frm_quota.h"
#include "support/scripted_boxes.h"
#include "support/test_database.h"

#include <QLineEdit>
#include <QPushButton>
#include <functional>

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

    // Member `id` ("T<id>", "Maria João Conceição <id>", "Mimi").
    void addMember(int id);
    QVariant addMovement(int socio, const MovementRow& row);  // its quota_id
    // Last values 2001/11, rend 1 and 2, union due 3 (rate 0.5), insurance 4 (0.25).
    void addAccount(int socio, double totalQuotas, double totalPago);

    QVariant movement(const QVariant& quotaId, const QString& column);
    QVariant account(int socio, const QString& column);
    bool hasAccount(int socio);
    static QString movementsOf(int socio);

    // Registo on the member's movements at pkey; script runs once the window
    // is up and refreshed, and the close control shuts it if left open.
    // False when no window showed.
    bool open(int socio, const QVariant& pkey, const std::function<void(FrmQuota&)>& script, QObject* caller = nullptr);

    // Focus into a field and typing over what entering selected; Tab out.
    static void type(QLineEdit* field, const QString& text);
    static void tabOut(QWidget* field);
    static void click(QPushButton* button);

    General general;

private:
    TestDatabase& m_db;
};

class RecordingCaller : public QObject {
    Q_OBJECT
public:
    QVariantList keys;
    bool fail = false;
    Q_INVOKABLE void RemoteKey(const QVariant& key)
    {
        keys << key;
        if (fail)
            throw QuotasError(QStringLiteral("falhou"));
    }
};

}  // namespace quotas::test

Q_DECLARE_METATYPE(quotas::test::MovementRow)
