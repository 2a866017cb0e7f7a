#include "schema/copy_installation.h"

#include "platform/connection.h"
#include "platform/transaction.h"
#include "schema/schema.h"

#include <QLocale>
#include <QSqlQuery>
#include <QSqlRecord>
#include <cmath>

namespace quotas {

namespace {

QString amount(qint64 cents)
{
    // Without grouping: large sums stay one unbroken word, easy to compare.
    static const QLocale portuguese = [] {
        QLocale l(QLocale::Portuguese, QLocale::Portugal);
        l.setNumberOptions(QLocale::OmitGroupSeparator);
        return l;
    }();
    return portuguese.toString(double(cents) / 100.0, 'f', 2);
}

// The target's columns that the source has too (an old database may lack one).
QStringList sharedColumns(Connection& source, const QString& table)
{
    QSqlQuery& q = source.run(QStringLiteral("SELECT * FROM %1 WHERE 1 = 0").arg(table), {});
    const QSqlRecord record = q.record();
    q.finish();
    QStringList columns;
    for (const QString& column : tableColumns(table).all)
        if (record.indexOf(column) >= 0)
            columns << column;
    return columns;
}

// One transaction: the table is copied whole or not at all.
qint64 copyTable(Connection& source, Connection& target, const QString& table)
{
    const QStringList columns = sharedColumns(source, table);
    if (columns.isEmpty())
        return 0;
    const QString key = tableColumns(table).identity;
    Transaction tx(target);
    // A table created just now may hold its first rows (the months' names): the source's replace them.
    target.execute(QStringLiteral("DELETE FROM %1").arg(table));
    QSqlQuery& rows = source.run(QStringLiteral("SELECT %1 FROM %2%3")
                                     .arg(columns.join(QStringLiteral(", ")), table,
                                          key.isEmpty() ? QString() : QStringLiteral(" ORDER BY ") + key),
                                 {});
    // The server builds an index faster once over all the rows than row by
    // row: the table's indexes other than its key are made again afterwards.
    QStringList indexes;
    if (target.engine() == Engine::PostgreSQL) {
        QSqlQuery& q = target.run(QStringLiteral("SELECT indexname, indexdef FROM pg_indexes WHERE schemaname = "
                                                 "current_schema() AND tablename = ? AND indexname NOT IN (SELECT "
                                                 "conname FROM pg_constraint)"),
                                  {table.toLower()});
        QStringList names;
        while (q.next()) {
            names << q.value(0).toString();
            indexes << q.value(1).toString();
        }
        q.finish();
        for (const QString& name : names)
            target.execute(QStringLiteral("DROP INDEX %1").arg(name));
    }
    qint64 copied = 0;
    try {
        copied = target.appendRows(table, columns, [&](QVariantList& row) {
            if (!rows.next())
                return false;
            for (int i = 0; i < columns.size(); ++i)
                row << rows.value(i);
            return true;
        });
    } catch (...) {
        rows.finish();
        throw;
    }
    rows.finish();
    for (const QString& index : indexes)
        target.execute(index);
    tx.commit();
    return copied;
}

// Row count and, per money column, the sum in whole cents.
QList<qint64> measure(Connection& connection, const QString& table, const QStringList& money)
{
    QStringList parts{QStringLiteral("COUNT(*)")};
    for (const QString& column : money)
        parts << QStringLiteral("SUM(%1)").arg(column);
    QSqlQuery& q = connection.run(QStringLiteral("SELECT %1 FROM %2").arg(parts.join(QStringLiteral(", ")), table), {});
    QList<qint64> out;
    if (q.next())
        for (int i = 0; i < parts.size(); ++i)
            out << (i == 0 ? q.value(0).toLongLong() : std::llround(q.value(i).toDouble() * 100.0));
    q.finish();
    return out;
}

TableComparison compare(Connection& source, Connection& target, const QString& table)
{
    TableComparison c;
    c.table = table;
    const QStringList shared = source.hasTable(table) ? sharedColumns(source, table) : QStringList();
    QStringList money;
    for (const QString& column : tableColumns(table).money)
        if (shared.contains(column))
            money << column;
    const QList<qint64> there = shared.isEmpty() ? QList<qint64>(money.size() + 1, 0) : measure(source, table, money);
    const QList<qint64> here = measure(target, table, money);
    c.sourceRows = there.value(0);
    c.targetRows = here.value(0);
    for (int i = 0; i < money.size(); ++i)
        c.sums.append({money[i], there.value(i + 1), here.value(i + 1)});
    return c;
}

// Leaves the target as it was found, as far as it can; returns what it could not undo.
QStringList undoCopy(Connection& target, const QStringList& created, const QStringList& filled)
{
    QStringList left;
    for (const QString& table : schemaTables()) {
        const bool made = created.contains(table);
        if (!made && !filled.contains(table))
            continue;
        try {
            target.execute(made ? QStringLiteral("DROP TABLE %1").arg(table) : QStringLiteral("DELETE FROM %1").arg(table));
        } catch (const QuotasError&) {
            left << table;
        }
    }
    return left;
}

}  // namespace

bool TableComparison::matches() const
{
    if (sourceRows != targetRows)
        return false;
    for (const Sum& s : sums)
        if (s.sourceCents != s.targetCents)
            return false;
    return true;
}

QString TableComparison::text() const
{
    QString line = QStringLiteral("%1 registos %2 / %3").arg(table + u':', -31).arg(sourceRows).arg(targetRows);
    for (const Sum& s : sums)
        line += QStringLiteral("; %1 %2 / %3").arg(s.column, amount(s.sourceCents), amount(s.targetCents));
    return line + (matches() ? QStringLiteral("  certo") : QStringLiteral("  DIFERENTE"));
}

bool CopyVerification::matches() const
{
    for (const TableComparison& t : tables)
        if (!t.matches())
            return false;
    return true;
}

QString CopyVerification::text() const
{
    QStringList lines{QStringLiteral("Verificação (origem / destino):")};
    for (const TableComparison& t : tables)
        lines << QStringLiteral("  ") + t.text();
    return lines.join(u'\n');
}

CopyVerification copyInstallation(Connection& source, Connection& target, const std::function<void(const QString&)>& progress)
{
    QStringList holding;
    for (const QString& table : schemaTables()) {
        if (!target.hasTable(table))
            continue;
        const qint64 rows = target.scalar(QStringLiteral("SELECT COUNT(*) FROM %1").arg(table)).toLongLong();
        if (rows > 0)
            holding << QStringLiteral("%1 (%2 registos)").arg(table).arg(rows);
    }
    if (!holding.isEmpty())
        throw TargetNotEmpty(QStringLiteral("a base de dados de destino já tem dados: %1. A cópia só se faz para uma base "
                                            "de dados vazia; nada foi alterado.")
                                 .arg(holding.join(QStringLiteral(", "))));

    QStringList created;
    QStringList filled;
    try {
        created = createSchema(target);
        CopyVerification verification;
        for (const QString& table : schemaTables()) {
            if (!created.contains(table))
                filled << table;
            const qint64 copied = source.hasTable(table) ? copyTable(source, target, table) : 0;
            if (progress)
                progress(source.hasTable(table) ? QStringLiteral("%1: %2 registos copiados").arg(table).arg(copied)
                                                : QStringLiteral("%1: não existe na origem, criada vazia").arg(table));
        }
        moveSequencesPastKeys(target);
        for (const QString& table : schemaTables())
            verification.tables << compare(source, target, table);
        if (!verification.matches())
            throw DbError(verification.text() + QStringLiteral("\nA cópia não confere com a origem."));
        return verification;
    } catch (const QuotasError& e) {
        const QStringList left = undoCopy(target, created, filled);
        QString text = e.message();
        text += left.isEmpty() ? QStringLiteral("\nA base de dados de destino ficou como estava.")
                               : QStringLiteral("\nNão foi possível desfazer a cópia: apague na base de dados de destino as "
                                                "tabelas %1.")
                                     .arg(left.join(QStringLiteral(", ")));
        throw DbError(text);
    }
}

}  // namespace quotas
