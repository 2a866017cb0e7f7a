#include "import/csv_import_source.h"

#include "import/csv_reader.h"
#include "import/import_recordset.h"
#include "platform/components.h"

#include <QApplication>
#include <QFileDialog>
#include <QFileInfo>

namespace quotas {

namespace {

[[maybe_unused]] const bool registered = [] {
    registerComponent(QStringLiteral("Dorvanta.General"), [] { return std::make_unique<CsvImportSource>(); });
    return true;
}();

QString askWithFileDialog()
{
    // The employer sends a file a month, usually to the same folder.
    static QString lastFolder;
    QString path = QFileDialog::getOpenFileName(
        QApplication::activeWindow(), QStringLiteral("Lista de quotas a importar"), lastFolder,
        QStringLiteral("Ficheiros CSV (*.csv *.txt);;Todos os ficheiros (*)"));
    if (!path.isEmpty())
        lastFolder = QFileInfo(path).absolutePath();
    return path;
}

}  // namespace

CsvImportSource::CsvImportSource(FileChooser chooser, QObject* parent)
    : QObject(parent), m_chooser(chooser ? std::move(chooser) : FileChooser(askWithFileDialog))
{
}

CsvImportSource::FileChooser CsvImportSource::fixedFile(const QString& path)
{
    return [path] { return path; };
}

QObject* CsvImportSource::build()
{
    const QString path = m_chooser();
    if (path.isEmpty())
        return nullptr;
    return new ImportRecordset(CsvLines::open(path), this);
}

}  // namespace quotas
