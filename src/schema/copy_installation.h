#pragma once

#include "platform/errors.h"

#include <QList>
#include <QString>
#include <functional>

namespace quotas {

class Connection;

// The target already holds rows: nothing was done.
class TargetNotEmpty : public QuotasError {
public:
    using QuotasError::QuotasError;
};

// One table on both sides after a copy: rows, and the sum of each money column.
struct TableComparison {
    QString table;
    qint64 sourceRows = 0;
    qint64 targetRows = 0;
    struct Sum {
        QString column;
        qint64 sourceCents = 0;
        qint64 targetCents = 0;
    };
    QList<Sum> sums;

    bool matches() const;
    QString text() const;
};

struct CopyVerification {
    QList<TableComparison> tables;
    bool matches() const;
    QString text() const;
};

// Copies every table of the dues database, and the host's tables the module
// reads, from source into an empty target, keys and all, creating the tables
// as init-db does; then moves the target's key sequences past the copied
// keys and compares both sides table by table. Each table is copied in one
// transaction. A copy that fails, or whose comparison differs, drops again
// the tables it created (and empties those it found empty); what could not
// be dropped is named in the error. progress receives one line per table.
CopyVerification copyInstallation(Connection& source, Connection& target,
                                  const std::function<void(const QString&)>& progress = {});

}  // namespace quotas
