#include "platform/connection.h"

#include <QDate>
#include <QDateTime>
#include <QLocale>
#include <QSqlDatabase>
#include <QSqlDriver>
#include <libpq-fe.h>

namespace quotas {

namespace {

// Rows per INSERT on SQLite: far below its limit of bound values for the
// widest table, enough that the statements' own cost vanishes.
constexpr int kRowsPerInsert = 200;
// Bytes handed to the server at a time.
constexpr qsizetype kCopyChunk = 1 << 20;

// One value in COPY's text format.
void appendCopyText(QByteArray& out, const QVariant& value)
{
    if (!value.isValid() || value.isNull()) {
        out += "\\N";
        return;
    }
    QByteArray text;
    switch (value.typeId()) {
    case QMetaType::Double: text = QString::number(value.toDouble(), 'g', QLocale::FloatingPointShortest).toLatin1(); break;
    case QMetaType::QDate: text = value.toDate().toString(Qt::ISODate).toLatin1(); break;
    case QMetaType::QDateTime: text = value.toDateTime().toString(Qt::ISODateWithMs).toLatin1(); break;
    default: text = value.toString().toUtf8(); break;
    }
    for (const char c : std::as_const(text)) {
        switch (c) {
        case '\\': out += "\\\\"; break;
        case '\t': out += "\\t"; break;
        case '\n': out += "\\n"; break;
        case '\r': out += "\\r"; break;
        default: out += c; break;
        }
    }
}

QString insertOf(const QString& table, const QStringList& columns, int rows)
{
    const QString row = QStringLiteral("(") + QStringList(columns.size(), QStringLiteral("?")).join(QStringLiteral(", ")) + u')';
    return QStringLiteral("INSERT INTO %1 (%2) VALUES %3")
        .arg(table, columns.join(QStringLiteral(", ")), QStringList(rows, row).join(QStringLiteral(", ")));
}

}  // namespace

qint64 Connection::appendRows(const QString& table, const QStringList& columns,
                              const std::function<bool(QVariantList&)>& next)
{
    requireOpen();
    const QString statement = QStringLiteral("COPY %1 (%2) FROM STDIN").arg(table, columns.join(QStringLiteral(", ")));
    qint64 written = 0;
    QVariantList row;
    row.reserve(columns.size());
    if (m_dialect->engine() == Engine::SQLite) {
        QVariantList batch;
        const auto flush = [&](int rows) {
            execute(insertOf(table, columns, rows), batch);
            batch.clear();
        };
        while (next(row)) {
            batch += row;
            row.clear();
            if (++written % kRowsPerInsert == 0)
                flush(kRowsPerInsert);
        }
        if (written % kRowsPerInsert != 0)
            flush(int(written % kRowsPerInsert));
        return written;
    }

    // Qt's driver has no COPY; its connection's own libpq handle does, inside
    // the transaction the caller began on it.
    const QVariant handle = QSqlDatabase::database(m_dbName, false).driver()->handle();
    const bool isPq = qstrcmp(handle.typeName(), "PGconn*") == 0 || qstrcmp(handle.typeName(), "pg_conn*") == 0;
    PGconn* pg = isPq ? *static_cast<PGconn* const*>(handle.constData()) : nullptr;
    if (!pg)
        fail(QStringLiteral("copiar os registos"), statement, QStringLiteral("sem ligação ao servidor"));
    const auto serverError = [&] { return QString::fromUtf8(PQerrorMessage(pg)); };
    // Whatever ends the copy, the connection must leave COPY mode before it is used again.
    const auto finish = [&](const char* abort) {
        const bool ended = PQputCopyEnd(pg, abort) == 1;
        QString error = ended ? QString() : serverError();
        while (PGresult* r = PQgetResult(pg)) {
            if (error.isEmpty() && PQresultStatus(r) != PGRES_COMMAND_OK)
                error = QString::fromUtf8(PQresultErrorMessage(r));
            PQclear(r);
        }
        return error;
    };

    PGresult* started = PQexec(pg, statement.toUtf8().constData());
    const bool copying = PQresultStatus(started) == PGRES_COPY_IN;
    const QString startError = copying ? QString() : QString::fromUtf8(PQresultErrorMessage(started));
    PQclear(started);
    if (!copying)
        fail(QStringLiteral("copiar os registos"), statement, startError);

    QByteArray buffer;
    buffer.reserve(kCopyChunk + 4096);
    QString error;
    try {
        while (next(row)) {
            for (qsizetype i = 0; i < row.size(); ++i) {
                if (i > 0)
                    buffer += '\t';
                appendCopyText(buffer, row[i]);
            }
            buffer += '\n';
            row.clear();
            ++written;
            if (buffer.size() >= kCopyChunk) {
                if (PQputCopyData(pg, buffer.constData(), int(buffer.size())) != 1) {
                    error = serverError();
                    break;
                }
                buffer.clear();
            }
        }
        if (error.isEmpty() && !buffer.isEmpty() && PQputCopyData(pg, buffer.constData(), int(buffer.size())) != 1)
            error = serverError();
    } catch (...) {
        finish("the rows could not be read");
        throw;
    }
    const QString ended = finish(error.isEmpty() ? nullptr : "failed");
    if (!error.isEmpty() || !ended.isEmpty())
        fail(QStringLiteral("copiar os registos"), statement, error.isEmpty() ? ended : error);
    return written;
}

}  // namespace quotas
