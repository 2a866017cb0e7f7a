#pragma once

#include <QString>
#include <vector>

namespace quotas {

// What the import does, or would do, with one line of the employer's list.
struct ImportVerdict {
    enum class Kind {
        Post,
        LeaveAlone,
        Reject
    };
    int line = 0;   // the line's place among the data lines, from 1
    QString noTap;  // the line's first value
    Kind kind = Kind::Reject;
    QString reason;          // why a line is left alone or rejected
    bool matched = false;    // a charged movement was found: the amounts below mean something
    qint64 quotaBefore = 0;  // cents
    qint64 pagoBefore = 0;
    qint64 quotaAfter = 0;
    qint64 pagoAfter = 0;

    // "registar", "deixar", "rejeitar"
    QString kindText() const;
};

// The verdicts of a whole list, with the counts and the sum of what would be posted.
struct ImportVerdicts {
    std::vector<ImportVerdict> lines;
    int count(ImportVerdict::Kind kind) const;
    qint64 postedCents() const;  // the sum of the posted deductions
};

}  // namespace quotas
