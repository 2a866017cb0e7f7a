#pragma once

#include "component/stored_value.h"
#include "generation/due_rules.h"

#include <QVariant>

class QSqlQuery;

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
    // False when he has no account. Given a month, the same read also says
    // which dues of that month he already has (charged()).
    bool lock(Connection& connection, const QVariant& socio, int ano = 0, int mes = 0);
    // Adds the member's account, with the month as its last and rend1 as
    // its remuneration, and reads it back as lock() does. Must run under the
    // member's lock, after lock() found none.
    void create(Connection& connection, const QVariant& socio, int ano, int mes, const QVariant& rend1);

    // The types (bit tipo set) of the month's dues he had when his account
    // was read.
    unsigned charged() const { return m_chargedTypes; }

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
    bool read(QSqlQuery& q);

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
    unsigned m_chargedTypes = 0;
};

}  // namespace quotas
