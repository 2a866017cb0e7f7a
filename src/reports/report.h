#pragma once

#include "reports/report_document.h"
#include "reports/report_layout.h"

#include <QDate>
#include <QObject>
#include <QPointer>
#include <functional>
#include <memory>

class QWidget;

namespace quotas {

class Recordset;

// A report bound to a named command of Data (prtListagemDividas,
// prtCartasDividas, prtExtra): it runs the command when the command's result
// set is not open, lays the rows out and shows, prints or writes the pages.
// It leaves the result set open; the caller decides when to close it.
class Report : public QObject {
    Q_OBJECT
public:
    explicit Report(ReportLayout layout, QObject* parent = nullptr);

    const ReportLayout& layout() const { return *m_layout; }
    void setLayout(ReportLayout layout);

    // The pages of the command's rows as they stand.
    ReportDocument run(const QDate& printed = QDate::currentDate());

    // A modal print preview that pages, zooms, prints and exports; returns
    // when the user closes it.
    void showPreview(QWidget* parent = nullptr);

    // The same pages in a PDF file; returns the number of pages.
    int writePdf(const QString& path);

    // Receives every document a report lays out, before it is shown or
    // written (one per thread; an empty function removes it).
    static void setObserver(std::function<void(const ReportDocument&)> observer);

private:
    std::shared_ptr<const ReportLayout> m_layout;
};

// Lays pages out as Report::run does, telling the observer, for reports
// whose rows are computed rather than read from a named command.
ReportDocument layOutObservedReport(const std::shared_ptr<const ReportLayout>& layout, Recordset& rows,
                                    const QDate& printed = QDate::currentDate());

// The modal print preview of pages already laid out.
void showReportPreview(const ReportDocument& doc, QWidget* parent = nullptr);

// The report held in one of the shared slots (prtListagemDividas ...), created
// with its layout on first use.
Report& heldReport(QPointer<QObject>& slot, const std::function<ReportLayout()>& layout);

}  // namespace quotas
