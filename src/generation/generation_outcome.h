#pragma once

#include <QString>
#include <QStringList>

namespace quotas {

// A count of dues in words: "1 quota", "3 quotas".
QString duesCount(int n);

// What a generation run did, and the dues it could not post.
struct GenerationOutcome {
    int members = 0;  // members visited
    int posted = 0;   // movements created
    int accountsCreated = 0;
    // Dues not posted because the account has no remuneration 1 or 2.
    int missingRemuneration = 0;
    // Dues not posted because the employer's rate is empty.
    int missingRate = 0;
    // Staff numbers (or member keys when there is none) of those members,
    // once each, in the order met.
    QStringList membersMissingRemuneration;
    QStringList membersMissingRate;
    // Dues not posted because a value they are computed from is not a
    // finite number within range, or the insurance end date is not a date;
    // each member once, with the column and the value ("1234 (ult_rend1:
    // valor ilegível (abc))").
    int unreadable = 0;
    QStringList membersUnreadable;

    int notGenerated() const { return missingRemuneration + missingRate + unreadable; }
    // The Portuguese account of the dues not generated and why; empty when
    // every due could be posted.
    QString summary() const;
    // How many members the run went through and how many dues it posted and
    // left out, one per line, for the closing message.
    QString counts() const;
};

}  // namespace quotas
