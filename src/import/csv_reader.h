#pragma once

#include <QByteArray>
#include <QList>
#include <QString>
#include <QStringList>
#include <deque>
#include <memory>

class QIODevice;

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

// The lines of a CSV file whose first line names the columns, read a block
// at a time. Opening goes through the whole file once, to learn its
// encoding (see decodeImportText) and find any fault before anything is
// imported; next() reads it again, so a list of any length takes the memory
// of a block, not of the list.
//
// The file is parsed with libcsv (RFC 4180 quoting, strict): quotes out of
// place, a quoted field left open or a line with more non-empty values than
// the first line has names are faults, named with the file and the line.
// Spaces around unquoted values are dropped; blank lines, and lines whose
// every value is empty, are skipped.
class CsvLines {
public:
    // An unreadable file, one that is not text or a faulty one throws
    // QuotasError with the reason.
    static std::unique_ptr<CsvLines> open(const QString& path);
    // Over text already decoded.
    static std::unique_ptr<CsvLines> fromText(const QString& text, const QString& fileName);
    ~CsvLines();
    CsvLines(const CsvLines&) = delete;
    CsvLines& operator=(const CsvLines&) = delete;

    const QStringList& header() const { return m_header; }  // empty for a file without any line
    char delimiter() const { return m_delimiter; }
    qsizetype lineCount() const { return m_lineCount; }  // the lines after the header
    // The next line, never longer than the header; false after the last.
    bool next(QStringList& line);

    // One record as parsed: its values' bytes, and the line it ended on.
    struct Record {
        QList<QByteArray> values;
        int line = 0;
    };
    class Scanner;

private:
    CsvLines(std::unique_ptr<QIODevice> device, QString fileName, bool decoded);
    void check();
    QString decoded(const QByteArray& value) const;

    std::unique_ptr<QIODevice> m_device;
    QString m_fileName;
    bool m_decoded;  // UTF-8 made from decoded text: no mark, no code page to choose
    bool m_utf16 = false;
    bool m_windows1252 = false;
    char m_delimiter = ';';
    QStringList m_header;
    qsizetype m_lineCount = 0;
    std::unique_ptr<Scanner> m_scanner;
    std::deque<Record> m_pending;
    bool m_pastHeader = false;
};

// Parses decoded text (see CsvLines) into a table; text without any line
// gives an empty table.
CsvTable parseCsv(const QString& text, const QString& fileName);

// Reads, decodes and parses a whole file into a table.
CsvTable readCsvFile(const QString& path);

}  // namespace quotas
