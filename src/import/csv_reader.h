#pragma once

#include <QList>
#include <QString>
#include <QStringList>

namespace quotas {

// The contents of a CSV file whose first line names the columns.
struct CsvTable {
    QStringList header;       // names as written, case kept
    QList<QStringList> rows;  // never longer than the header; a shorter row lacks its last values
    char delimiter = ';';
};

// The delimiter of a file, judged from its first line: whichever of ';',
// tab and ',' occurs most often outside quotes, ';' on a tie (the
// spreadsheets of a Portuguese office write ';'), ';' when none occurs.
char detectDelimiter(const QString& headerLine);

// Parses decoded text with libcsv (RFC 4180 quoting, strict): quotes out of
// place, a quoted field left open or a line with more non-empty values than
// the first line has names throw QuotasError naming fileName and the line.
// Spaces around unquoted values are dropped; blank lines are skipped. Text
// without any line gives an empty table.
CsvTable parseCsv(const QString& text, const QString& fileName);

// Reads, decodes (see decodeImportText) and parses a file; an unreadable
// file or one that is not text throws QuotasError.
CsvTable readCsvFile(const QString& path);

}  // namespace quotas
