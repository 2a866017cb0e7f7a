#pragma once

#include "component/stored_value.h"
#include "generation/due_rules.h"

#include <QVariant>

namespace quotas {

class Connection;

// A member's dues account as the generation sees it: read and locked inside
// the member's transaction, charged with the dues posted to it, and written
// back in one statement before the transaction commits.
class DuesAccount {
public:
    // Reads the member's account; on PostgreSQL its row stays locked until
    // the transaction ends, so a second run visiting him waits here and then
    // sees what this one posted (SQLite's writer lock does the same).
    // False when he has no account.
    bool lock(Connection& connection, const QVariant& socio);

    const QVariant& rend1() const { return m_rend1; }
    const QVariant& rend2() const { return m_rend2; }
    // The account's total, as read: the charges are added to it.
    const StoredNumber& total() const { return m_total; }
    const QVariant& personalRate(DueType type) const
    {
        return type == DueType::Sindicato ? m_percSindicato : m_percSeguro;
    }

    // Adds a due to the total and makes it the type's last amount, with the
    // month it is for.
    void charge(DueType type, double amount, int ano, int mes);
    // Writes the charges (nothing when there were none). The total grows by
    // the amounts rather than being overwritten, so a payment recorded
    // elsewhere in between is kept.
    void save(Connection& connection);

private:
    QVariant m_key;
    QVariant m_rend1;
    QVariant m_rend2;
    QVariant m_percSindicato;
    QVariant m_percSeguro;
    StoredNumber m_total;
    double m_added = 0;
    QVariant m_quotaSindicato;  // Null: unchanged
    QVariant m_quotaSeguro;
    int m_ano = 0;
    int m_mes = 0;
    bool m_charged = false;
};

}  // namespace quotas
