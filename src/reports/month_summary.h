#pragma once

#include "reports/report_document.h"

#include <QByteArray>
#include <QDate>
#include <QString>
#include <array>

namespace quotas {

class Connection;

// One dues type's figures for a month, amounts in whole cents.
struct MonthTypeFigures {
    int tipo = 0;
    QString ref;
    int members = 0;           // members charged
    int dues = 0;              // movements
    qint64 charged = 0;        // sum of quota
    qint64 deducted = 0;       // paid without a document: what the employer's list posted
    qint64 paidOtherwise = 0;  // paid with a document, in the record window
    qint64 open = 0;           // charged - deducted - paidOtherwise
    int unreadable = 0;        // amounts left out of the sums

    MonthTypeFigures& operator+=(const MonthTypeFigures& other);
};

// The month's reconciliation: what was charged, deducted, paid and is still
// open per dues type, and what needs the treasurer's attention.
struct MonthSummary {
    int year = 0;
    int month = 0;
    std::array<MonthTypeFigures, 2> types;  // Sindicato, Seguro
    int rejectedLines = 0;                  // rows of extras: the last import's rejects
    int membersWithoutAccount = 0;
    int duesNotComputed = 0;  // dues of the month generation cannot compute

    MonthTypeFigures total() const;
};

MonthSummary readMonthSummary(Connection& connection, int year, int month);

// prtResumoMes: the summary's page.
ReportDocument layOutMonthSummary(const MonthSummary& summary, const QDate& printed = QDate::currentDate());

// The same figures for a spreadsheet on a Portuguese desktop: UTF-8 with a
// byte order mark, ";" between values, decimal comma, CRLF line ends.
QByteArray monthSummaryCsv(const MonthSummary& summary);

}  // namespace quotas
