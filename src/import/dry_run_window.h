#pragma once

#include "import/import_verdict.h"
#include "reports/report_document.h"

#include <QDate>
#include <QDialog>

class QTableWidget;

namespace quotas {

// prtSimulacaoImportacao: the verdicts of a dry run as printed pages.
ReportDocument layOutDryRun(const ImportVerdicts& verdicts, const QString& subject,
                            const QDate& printed = QDate::currentDate());

// The window "Simular Importação": what the import would do with every line
// of the list, the counts below, and "Imprimir" for the same on paper.
class DryRunWindow : public QDialog {
    Q_OBJECT
public:
    // subject says which list, month and type ("Sindicato, Março de 2004").
    DryRunWindow(ImportVerdicts verdicts, QString subject, QWidget* parent = nullptr);

    QTableWidget* table() const { return m_table; }

private:
    ImportVerdicts m_verdicts;
    QString m_subject;
    QTableWidget* m_table;
};

// One verdict as the window's, the printed page's and the command line's
// columns: line, staff number, verdict, due and paid before, after, reason.
QStringList dryRunCells(const ImportVerdict& verdict);

// The counts and sum of a dry run, as the window and the command line say them.
QString dryRunTotals(const ImportVerdicts& verdicts);

}  // namespace quotas
