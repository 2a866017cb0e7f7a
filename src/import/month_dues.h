#pragma once

#include <QHash>
#include <QString>
#include <QStringList>
#include <QVariant>
#include <optional>
#include <vector>

namespace quotas {

class Connection;

// A due charged for the month, as read or as the import last wrote it.
struct ChargedDue {
    QVariant quotaId;
    QVariant quota;
    QVariant pago;
    QVariant rend1;
    QVariant rend2;
    int account = -1;  // the member's first account among MonthDues's; -1 when he has none
};

// A member's dues account, with the last values of the run's due type only.
struct DueAccount {
    QVariant squotaId;
    QVariant ultRend1;
    QVariant ultRend2;
    QVariant ultQuota;  // ult_quota_sindicato or ult_quota_seguro
    QVariant ultPerc;   // ult_perc_sindicato or ult_perc_seguro
    QVariant ultAno;
    QVariant ultMes;
    QVariant totalQuotas;
    QVariant totalPago;
};

// What posting a line writes: the due becomes the deduction, paid; the
// account's totals lose the old charge and gain the deduction, and its last
// values become the line's.
struct Deduction {
    double amount = 0;
    std::optional<double> rend1;  // the list's remuneration, when it has the column
    double charged = 0;           // the due's charge before, 0 when Null
};

// The dues of one month and type that the employer's lines name, read a
// chunk of lines at a time (one query per chunk, the members' first
// accounts with them), and the writes of a posted line.
class MonthDues {
public:
    MonthDues(Connection& connection, int month, int year, int tipo);

    // Whether any due of the month and type was charged at all.
    bool anyCharged();

    // Reads the dues, and their members' accounts, of the members with these
    // staff numbers (each once); what find() knows until the next read.
    void read(const QStringList& staffNumbers);
    // The due of the member with this staff number (the first by key when
    // several have it), or nullptr.
    ChargedDue* find(const QString& staffNumber);
    DueAccount* accountOf(const ChargedDue& due);

    // The due's and the account's writes, together or not at all. A column
    // written must still hold what was read, else ConcurrencyError and
    // nothing is written; the totals are added to, so that a payment another
    // user records meanwhile is kept. due and account take the saved values.
    void post(ChargedDue& due, DueAccount& account, const Deduction& deduction);
    // After a failed post: the two rows as the database has them now.
    void reread(ChargedDue& due);

private:
    // The statements of a posted line, translated, made once per run: the
    // movement's and the account's (on PostgreSQL one statement does both).
    const QString& postSql(bool withRend1, bool learnsRate, bool movement);
    QString writeSql(bool withRend1, bool learnsRate, bool movement) const;

    Connection& m_connection;
    int m_month;
    int m_year;
    int m_tipo;
    QString m_dueColumn;
    QString m_rateColumn;
    std::vector<ChargedDue> m_dues;
    std::vector<DueAccount> m_accounts;
    QHash<QString, int> m_byStaffNumber;
    QString m_postSql[8];
};

}  // namespace quotas
