#include "support/database_fixture.h"

#include "import/csv_import_source.h"
#include "platform/components.h"
#include "platform/errors.h"
#include "schema/schema.h"

#include <QFile>
#include <QProcess>
#include <QRegularExpression>

namespace quotas::test {

void DatabaseFixture::openDatabase()
{
    db = std::make_unique<TestDatabase>();
    db->login();
    registry = db->useAsSettings();
}

QStringList DatabaseFixture::everything()
{
    QStringList all;
    for (const QString& table : schemaTables())
        all << QStringLiteral("== ") + table << rows(QStringLiteral("SELECT * FROM %1 ORDER BY 1").arg(table));
    return all;
}

QString DatabaseFixture::writeFile(const QString& name, const QByteArray& bytes)
{
    const QString path = db->scratch(name);
    QFile file(path);
    if (!file.open(QIODevice::WriteOnly) || file.write(bytes) != bytes.size())
        throw QuotasError(QStringLiteral("Cannot write ") + path);
    return path;
}

QString DatabaseFixture::useImportFile(const QByteArray& bytes)
{
    const QString path = writeFile(QStringLiteral("lista.csv"), bytes);
    registerComponent(QStringLiteral("Dorvanta.General"), [path] { return std::make_unique<CsvImportSource>(CsvImportSource::fixedFile(path)); });
    return path;
}

QString pdfText(const QString& path)
{
    QProcess p;
    p.start(QStringLiteral("pdftotext"), {QStringLiteral("-layout"), path, QStringLiteral("-")});
    p.waitForFinished();
    return QString::fromUtf8(p.readAllStandardOutput()).replace(QRegularExpression(QStringLiteral("[ \\t]+")), QStringLiteral(" "));
}

void failWrites(Connection& c, const QString& event, const QString& table, const QString& condition, const QString& name)
{
    const bool lite = c.engine() == Engine::SQLite;
    const QString trigger = name + u'_' + table;
    c.execute(QStringLiteral("DROP TRIGGER IF EXISTS ") + trigger + (lite ? QString() : QStringLiteral(" ON ") + table));
    if (condition.isEmpty())
        return;
    if (lite) {
        c.execute(QStringLiteral("CREATE TRIGGER %1 BEFORE %2 ON %3 WHEN %4 BEGIN SELECT RAISE(ABORT, 'falha simulada'); END")
                      .arg(trigger, event, table, condition));
        return;
    }
    c.execute(QStringLiteral("CREATE OR REPLACE FUNCTION %1() RETURNS trigger AS $$ BEGIN IF %2 THEN "
                             "RAISE EXCEPTION 'falha simulada'; END IF; RETURN NEW; END $$ LANGUAGE plpgsql")
                  .arg(trigger, condition));
    c.execute(QStringLiteral("CREATE TRIGGER %1 BEFORE %2 ON %3 FOR EACH ROW EXECUTE FUNCTION %1()").arg(trigger, event, table));
}

}  // namespace quotas::test
