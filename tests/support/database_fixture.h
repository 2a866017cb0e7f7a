#pragma once

#include "support/cli_process.h"
#include "support/rows_text.h"
#include "support/test_database.h"

#include <memory>

namespace quotas::test {

// What a test of the runs holds: a fresh database of the engine under test,
// logged in on the shared data environment, the settings file that points the
// quotas program at it, and short ways to set up and read back rows.
class DatabaseFixture {
protected:
    std::unique_ptr<TestDatabase> db;
    QString registry;

    void openDatabase();
    Connection& c() { return db->connection(); }
    QStringList rows(const QString& sql, const QVariantList& params = {}) { return rowsText(c(), sql, params); }
    CliRun quotas(const QStringList& args) { return runQuotas(registry, args); }
    // Every row of every table, for "nothing changed".
    QStringList everything();
    // A file of the scratch folder holding bytes; returns its path.
    QString writeFile(const QString& name, const QByteArray& bytes);
    // The employer's list the import reads, as it stands; returns its path.
    QString useImportFile(const QByteArray& bytes);
};

// Makes every write (event INSERT or UPDATE) of a table fail with "falha
// simulada" where the condition (on NEW, and OLD for an update) holds, as a
// database failure in the middle of a run would; no condition ends it.
// Triggers of another name stand beside it.
void failWrites(Connection& c, const QString& event, const QString& table, const QString& condition = {},
                const QString& name = QStringLiteral("fail"));

// The text of a PDF file as pdftotext lays it out, runs of spaces squeezed to
// one, the pages separated by form feeds.
QString pdfText(const QString& path);

// A Null number, as a column of money holds it.
inline const QVariant kNullNumber = QVariant(QMetaType::fromType<double>());

}  // namespace quotas::test
