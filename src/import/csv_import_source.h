#pragma once

#include <QObject>
#include <QString>
#include <functional>

namespace quotas {

// The import source "Dorvanta.General": the employer's list read from a CSV
// file whose first line names the columns (see csv_reader.h). Registered
// under that ProgID with a file dialog as its chooser; the command line
// registers it again with the file it was given.
class CsvImportSource : public QObject {
    Q_OBJECT
public:
    // The path of the file to read, or an empty text when the user cancelled.
    using FileChooser = std::function<QString()>;

    // Without a chooser, build() asks with a file dialog.
    explicit CsvImportSource(FileChooser chooser = {}, QObject* parent = nullptr);

    // A chooser that always gives path, for the command line and the tests.
    static FileChooser fixedFile(const QString& path);

    // The lines of the chosen file as an ImportRecordset owned by this
    // object, which reads them as they are asked for; nullptr when no file
    // was chosen (nothing to import, nothing to say). An unreadable or
    // malformed file throws QuotasError with the reason, before anything is
    // imported.
    Q_INVOKABLE QObject* build();

private:
    FileChooser m_chooser;
};

}  // namespace quotas
