#pragma once

#include <QObject>
#include <QStringList>
#include <memory>

namespace quotas {

class CsvLines;

// What the build of an import source ("Dorvanta.General") returns, late
// bound as a QObject*: the employer's lines, text values under the names the
// source gives its columns, read one at a time from the start. The source
// owns it (it is the source's child) and it lives until the source is
// released. The run takes any other result, or none, for "no usable set".
class ImportRecordset : public QObject {
    Q_OBJECT
public:
    ImportRecordset(std::unique_ptr<CsvLines> lines, QObject* parent);
    ~ImportRecordset() override;

    const QStringList& columns() const;
    qsizetype lineCount() const;
    // The next line; missing values at the end of a short line are left
    // out. False after the last.
    bool next(QStringList& line);

private:
    std::unique_ptr<CsvLines> m_lines;
};

}  // namespace quotas
