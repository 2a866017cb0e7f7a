#pragma once

#include "platform/connection.h"

namespace quotas {

// Groups the writes of one member or one line: rolled back unless committed.
// Result sets keep the values they wrote; after a rollback, reopen them
// rather than trust those values.
class Transaction {
public:
    explicit Transaction(Connection& connection) : m_connection(connection) { m_connection.begin(); }
    ~Transaction()
    {
        if (!m_done) {
            try {
                m_connection.rollback();
            } catch (...) {
                // The original failure is the one worth reporting.
            }
        }
    }
    Transaction(const Transaction&) = delete;
    Transaction& operator=(const Transaction&) = delete;

    void commit()
    {
        m_connection.commit();
        m_done = true;
    }

private:
    Connection& m_connection;
    bool m_done = false;
};

}  // namespace quotas
