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

// For the length of a run: its commits do not wait for the disk, and
// finish() ends the run with one commit that does wait, which makes every
// earlier one durable as well. A crash during the run loses at most its last
// moments, which running it again completes, and every member's or line's
// writes still commit or vanish together. Outside a transaction only.
class LazyCommits {
public:
    explicit LazyCommits(Connection& connection) : m_connection(connection) { m_connection.setLazyCommits(true); }
    ~LazyCommits()
    {
        if (m_done)
            return;
        try {
            m_connection.setLazyCommits(false);
            // A run that stopped keeps what it saved before the stop.
            m_connection.flushCommits();
        } catch (...) {
            // The failure that stopped the run is the one worth reporting.
        }
    }
    LazyCommits(const LazyCommits&) = delete;
    LazyCommits& operator=(const LazyCommits&) = delete;

    // Throws DbError when the durable commit fails.
    void finish()
    {
        m_connection.setLazyCommits(false);
        m_connection.flushCommits();
        m_done = true;
    }

private:
    Connection& m_connection;
    bool m_done = false;
};

}  // namespace quotas
