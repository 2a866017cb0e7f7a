#pragma once

#include "reports/letterhead.h"
#include "reports/report_document.h"
#include "reports/stored_amount.h"

#include <QDate>
#include <QString>
#include <QVariant>
#include <vector>

namespace quotas {

class Connection;

// Which movements of one member a statement covers.
struct StatementRequest {
    QVariant socioId;
    int fromPeriod = 0;         // year * 100 + month; 0 from the first movement
    int toPeriod = 0;           // likewise; 0 up to the last
    bool allMovements = false;  // the inactive and history movements too
};

struct StatementLine {
    QVariant date;
    int ano = 0;
    int mes = 0;
    int tipo = 0;
    QString ref;
    QVariant quotaNo;
    StoredAmount due;
    StoredAmount paid;
    QString document;
    QString origin;      // "" active, "Inactivo", "Histórico"
    qint64 balance = 0;  // the open amount so far, in cents

    // The line's open amount; Null amounts count as 0, unreadable ones leave it unknown.
    bool openKnown() const { return !due.unreadable() && !paid.unreadable(); }
    qint64 open() const { return due.centsOrZero() - paid.centsOrZero(); }
};

// A member's dues statement: the listed movements ordered by year, month
// and type, each with the running open balance; the totals of what it
// lists; and whether the account's stored totals still agree with the
// member's active movements (which maintenance would rebuild them from).
struct MemberStatement {
    QString noTap;
    QString nome;
    QString nomeGuerra;
    QString morada;
    QString localidade;  // postcode and town
    std::vector<StatementLine> lines;
    qint64 charged = 0;  // cents
    qint64 paid = 0;
    int unreadable = 0;  // amounts left out of the totals
    QString scope;       // which movements and months, as the header prints it
    bool hasAccount = false;
    StoredAmount storedCharged;  // the account's total_quotas and total_pago
    StoredAmount storedPaid;
    bool accountDiffers = false;

    qint64 open() const { return charged - paid; }
};

// Reads the member's statement; throws QuotasError when the member does not exist.
MemberStatement readMemberStatement(Connection& connection, const StatementRequest& request);

// The member with exactly that staff number; nothing, with the reason in
// problem, when no member or several members have it.
QVariant memberByStaffNumber(Connection& connection, const QString& noTap, QString* problem);

// prtExtratoQuotas: the statement's pages.
ReportDocument layOutMemberStatement(const MemberStatement& statement, const Letterhead& letterhead,
                                     const QDate& printed = QDate::currentDate());

}  // namespace quotas
