#include "platform/connection.h"

#include "platform/connection_string.h"
#include "platform/errors.h"
#include "platform/sqlite_collation.h"
#include "platform/transaction.h"

#include <QAtomicInt>
#include <QFileInfo>
#include <QSqlDriver>
#include <QSqlError>
#include <QSqlIndex>
#include <QSqlQuery>
#include <libpq-fe.h>

namespace quotas {

namespace {

QAtomicInt connectionCounter;

bool looksLikeFile(const QString& source)
{
    return source.startsWith(u'/') || source.contains(u'/') || source.endsWith(QStringLiteral(".db"), Qt::CaseInsensitive);
}

}  // namespace

ConnectionTarget ConnectionTarget::fromConnectionString(const QString& connectionString)
{
    const auto props = parseConnectionString(connectionString);
    ConnectionTarget t;
    const QString source = props.value(QStringLiteral("data source")).trimmed();
    if (source.isEmpty())
        throw DbError(QStringLiteral("O texto de ligação não indica a origem dos dados (Data Source)."));
    bool ok = false;
    const int timeout = props.value(QStringLiteral("connect timeout")).toInt(&ok);
    if (ok && timeout > 0)
        t.timeoutSeconds = timeout;
    t.database = props.value(QStringLiteral("initial catalog"));
    t.user = props.value(QStringLiteral("user id"));
    t.password = props.value(QStringLiteral("password"));
    if (looksLikeFile(source)) {
        t.engine = Engine::SQLite;
        t.file = source;
        return t;
    }
    t.engine = Engine::PostgreSQL;
    const qsizetype comma = source.indexOf(u',');
    t.host = (comma < 0 ? source : source.left(comma)).trimmed();
    if (comma >= 0) {
        const int port = source.mid(comma + 1).trimmed().toInt(&ok);
        if (!ok || port <= 0 || port > 65535)
            throw DbError(QStringLiteral("A porta do servidor em \"%1\" não é válida.").arg(source));
        t.port = port;
    }
    return t;
}

Connection::Connection(QString name) : m_name(std::move(name)) {}

Connection::~Connection()
{
    close();
}

bool Connection::isOpen() const
{
    return !m_dbName.isEmpty();
}

void Connection::setConnectionString(const QString& text)
{
    if (isOpen())
        throw DbError(QStringLiteral("Não é possível mudar o texto de ligação de \"%1\" com a ligação aberta.").arg(m_name));
    m_connectionString = text;
}

void Connection::open(OpenMode mode)
{
    if (isOpen())
        throw DbError(QStringLiteral("A ligação \"%1\" já está aberta.").arg(m_name));
    const ConnectionTarget target = ConnectionTarget::fromConnectionString(m_connectionString);
    const Dialect dialect(target.engine);
    const QString dbName = QStringLiteral("quotas-%1-%2").arg(connectionCounter.fetchAndAddRelaxed(1)).arg(m_name);
    {
        QSqlDatabase db = QSqlDatabase::addDatabase(dialect.driverName(), dbName);
        QStringList setup;
        if (target.engine == Engine::SQLite) {
            if (mode == OpenMode::Existing && !QFileInfo::exists(target.file)) {
                db = QSqlDatabase();
                QSqlDatabase::removeDatabase(dbName);
                throw DbError(QStringLiteral("A base de dados \"%1\" não existe.").arg(target.file));
            }
            db.setDatabaseName(target.file);
            db.setConnectOptions(QStringLiteral("QSQLITE_BUSY_TIMEOUT=%1").arg(target.timeoutSeconds * 1000));
            setup << QStringLiteral("PRAGMA journal_mode=WAL") << QStringLiteral("PRAGMA synchronous=NORMAL");
        } else {
            db.setHostName(target.host);
            db.setPort(target.port);
            db.setDatabaseName(target.database);
            db.setUserName(target.user);
            db.setPassword(target.password);
            db.setConnectOptions(QStringLiteral("connect_timeout=%1").arg(target.timeoutSeconds));
            setup << QStringLiteral("SET client_min_messages TO warning");
        }
        if (!db.open()) {
            const QString reason = db.lastError().text();
            db = QSqlDatabase();
            QSqlDatabase::removeDatabase(dbName);
            throw DbError(QStringLiteral("Não foi possível abrir a base de dados (%1): %2")
                              .arg(target.engine == Engine::SQLite ? target.file : target.host, reason.trimmed()));
        }
        if (target.engine == Engine::SQLite && !registerPortugueseCollation(db)) {
            db.close();
            db = QSqlDatabase();
            QSqlDatabase::removeDatabase(dbName);
            throw DbError(QStringLiteral("Não foi possível preparar a ordenação portuguesa na base de dados."));
        }
        for (const QString& statement : setup) {
            QSqlQuery q(db);
            if (!q.exec(statement)) {
                const QString reason = q.lastError().text();
                q = QSqlQuery();
                db.close();
                db = QSqlDatabase();
                QSqlDatabase::removeDatabase(dbName);
                throw DbError(QStringLiteral("Não foi possível preparar a base de dados: %1").arg(reason));
            }
        }
    }
    m_dbName = dbName;
    m_dialect.emplace(target.engine);
    m_depth = 0;
}

void Connection::close()
{
    if (!isOpen())
        return;
    qDeleteAll(m_statements);
    m_statements.clear();
    m_primaryKeys.clear();
    {
        QSqlDatabase db = QSqlDatabase::database(m_dbName, false);
        db.close();
    }
    QSqlDatabase::removeDatabase(m_dbName);
    m_dbName.clear();
    m_dialect.reset();
    m_depth = 0;
}

void Connection::requireOpen() const
{
    if (!isOpen())
        throw DbError(QStringLiteral("A ligação \"%1\" à base de dados não está aberta.").arg(m_name));
}

bool Connection::lost() const
{
    if (!isOpen() || m_dialect->engine() != Engine::PostgreSQL)
        return false;
    // libpq knows whether its connection is gone.
    const QVariant handle = QSqlDatabase::database(m_dbName, false).driver()->handle();
    const char* type = handle.typeName();
    if (!handle.isValid() || (qstrcmp(type, "PGconn*") != 0 && qstrcmp(type, "pg_conn*") != 0))
        return false;
    const PGconn* pg = *static_cast<PGconn* const*>(handle.constData());
    return pg && PQstatus(pg) == CONNECTION_BAD;
}

void Connection::fail(const QString& what, const QString& sql, const QString& driverText) const
{
    if (lost())
        throw ConnectionLostError(QStringLiteral("perdeu-se a ligação à base de dados (o servidor parou ou reiniciou, ou a "
                                                 "rede falhou)."));
    throw DbError(QStringLiteral("Erro na base de dados ao %1: %2\n[%3]").arg(what, driverText.trimmed(), sql));
}

Engine Connection::engine() const
{
    requireOpen();
    return m_dialect->engine();
}

const Dialect& Connection::dialect() const
{
    requireOpen();
    return *m_dialect;
}

QSqlQuery& Connection::run(const QString& translatedSql, const QVariantList& params)
{
    requireOpen();
    const bool prepared = !params.isEmpty();
    // Statements with values are prepared once and reused. Those without are
    // sent as they stand: PostgreSQL cannot prepare BEGIN, SET or DDL.
    QSqlQuery*& q = m_statements[prepared ? translatedSql : QString()];
    if (!q) {
        q = new QSqlQuery(QSqlDatabase::database(m_dbName, false));
        // SQLite reads rows one at a time anyway; PostgreSQL needs the whole
        // result to report each column's table.
        q->setForwardOnly(m_dialect->engine() == Engine::SQLite);
        if (prepared && !q->prepare(translatedSql)) {
            const QString reason = q->lastError().text();
            delete q;
            m_statements.remove(translatedSql);
            fail(QStringLiteral("preparar a instrução"), translatedSql, reason);
        }
    }
    bool ok = false;
    if (prepared) {
        for (int i = 0; i < params.size(); ++i)
            q->bindValue(i, params[i]);
        ok = q->exec();
    } else {
        ok = q->exec(translatedSql);
    }
    if (!ok) {
        const QString reason = q->lastError().text();
        q->finish();
        fail(QStringLiteral("executar a instrução"), translatedSql, reason);
    }
    return *q;
}

int Connection::execute(const QString& sql, const QVariantList& params)
{
    QSqlQuery& q = run(dialect().translate(sql), params);
    const int affected = q.numRowsAffected();
    q.finish();
    return affected;
}

QVariant Connection::scalar(const QString& sql, const QVariantList& params)
{
    QSqlQuery& q = run(dialect().translate(sql), params);
    QVariant value;
    if (q.next())
        value = q.value(0);
    q.finish();
    return value;
}

QString Connection::primaryKey(const QString& table)
{
    requireOpen();
    const QString key = table.toLower();
    auto found = m_primaryKeys.constFind(key);
    if (found != m_primaryKeys.constEnd())
        return *found;
    const QSqlIndex index = QSqlDatabase::database(m_dbName, false).primaryIndex(m_dialect->catalogName(table));
    QString column = index.count() == 1 ? index.fieldName(0) : QString();
    m_primaryKeys.insert(key, column);
    return column;
}

bool Connection::hasTable(const QString& table)
{
    requireOpen();
    const QStringList tables = QSqlDatabase::database(m_dbName, false).tables(QSql::Tables);
    for (const QString& t : tables) {
        if (t.compare(table, Qt::CaseInsensitive) == 0)
            return true;
    }
    return false;
}

void Connection::lock(LockSpace space, qint64 key)
{
    if (m_depth == 0)
        throw DbError(QStringLiteral("Um bloqueio só pode ser pedido dentro de uma transacção."));
    const QString sql = dialect().transactionLock();
    if (sql.isEmpty())
        return;
    // The lock takes 32-bit numbers: keys 2^32 apart share a lock, which
    // costs a wait at most.
    const qint32 low = qint32(quint32(quint64(key) & 0xffffffffu));
    QSqlQuery& q = run(sql, {qint32(space), low});
    q.finish();
}

void Connection::begin()
{
    execute(m_depth == 0 ? dialect().beginTransaction() : QStringLiteral("SAVEPOINT sp%1").arg(m_depth));
    ++m_depth;
}

void Connection::setLazyCommits(bool on)
{
    const QString setting = dialect().lazyCommits(on);
    if (!setting.isEmpty())
        execute(setting);
}

void Connection::flushCommits()
{
    const QString mark = dialect().durableMark();
    if (mark.isEmpty() || m_depth > 0)
        return;
    Transaction durable(*this);
    scalar(mark);
    durable.commit();
}

void Connection::commit()
{
    if (m_depth == 0)
        return;
    // The depth drops only once the commit went through, so that a failed
    // commit can still be rolled back.
    const int level = m_depth - 1;
    execute(level == 0 ? QStringLiteral("COMMIT") : QStringLiteral("RELEASE SAVEPOINT sp%1").arg(level));
    m_depth = level;
}

void Connection::rollback()
{
    if (m_depth == 0)
        return;
    --m_depth;
    if (!isOpen())
        return;
    if (m_depth == 0) {
        execute(QStringLiteral("ROLLBACK"));
    } else {
        execute(QStringLiteral("ROLLBACK TO SAVEPOINT sp%1").arg(m_depth));
        execute(QStringLiteral("RELEASE SAVEPOINT sp%1").arg(m_depth));
    }
}

}  // namespace quotas
