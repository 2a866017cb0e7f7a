#include "platform/recordset.h"

#include "platform/connection.h"
#include "platform/errors.h"
#include "platform/transaction.h"

#include <QDate>
#include <QSqlField>
#include <QSqlQuery>
#include <QSqlRecord>
#include <algorithm>
#include <cmath>

namespace quotas {

namespace {

bool isNumericType(QMetaType type)
{
    switch (type.id()) {
    case QMetaType::Int:
    case QMetaType::UInt:
    case QMetaType::LongLong:
    case QMetaType::ULongLong:
    case QMetaType::Long:
    case QMetaType::ULong:
    case QMetaType::Short:
    case QMetaType::UShort:
    case QMetaType::Double:
    case QMetaType::Float:
    case QMetaType::Bool:
        return true;
    default:
        return false;
    }
}

QString numericKey(double d)
{
    if (std::isfinite(d) && d == std::trunc(d) && std::fabs(d) < 9e15)
        return QStringLiteral("n:") + QString::number(qint64(d));
    return QStringLiteral("n:") + QString::number(d, 'g', 17);
}

double roundCents(double amount)
{
    return std::nearbyint(amount * 100.0) / 100.0;
}

}  // namespace

Recordset::~Recordset() = default;

void Recordset::open(const QString& sql, Connection& connection, Cursor cursor, Lock lock, const QVariantList& params)
{
    close();
    QSqlQuery& q = connection.run(connection.dialect().translate(sql), params);
    const QSqlRecord record = q.record();
    std::vector<Column> columns;
    columns.reserve(size_t(record.count()));
    for (int i = 0; i < record.count(); ++i) {
        const QSqlField f = record.field(i);
        columns.push_back({f.name(), f.tableName(), f.metaType()});
    }
    m_columns = std::move(columns);
    const int n = fieldCount();
    // A join may return two columns of one name: the first one is the field.
    for (int i = 0; i < n; ++i) {
        const QString name = m_columns[size_t(i)].name.toLower();
        if (!m_byName.contains(name))
            m_byName.insert(name, i);
    }
    // Integer-valued amounts come back from SQLite as integers; keep every
    // number of a column in the column's type. A text SQLite kept in a
    // number column stays text, so that it is reported rather than read as 0.
    std::vector<bool> wantsDouble(static_cast<size_t>(n));
    for (int i = 0; i < n; ++i)
        wantsDouble[size_t(i)] = m_columns[size_t(i)].type.id() == QMetaType::Double;
    while (q.next()) {
        for (int i = 0; i < n; ++i) {
            QVariant v = q.value(i);
            if (wantsDouble[size_t(i)] && !v.isNull() && v.metaType().id() != QMetaType::Double
                && isNumericType(v.metaType()))
                v = QVariant(v.toDouble());
            m_cells.append(std::move(v));
        }
        ++m_rowCount;
    }
    q.finish();
    m_open = true;
    m_connection = &connection;
    m_sql = sql;
    m_params = params;
    m_cursor = cursor;
    m_lock = lock;
    m_pos = 0;
}

void Recordset::openInMemory(const QStringList& columns)
{
    close();
    for (const QString& name : columns) {
        if (!m_byName.contains(name.toLower()))
            m_byName.insert(name.toLower(), int(m_columns.size()));
        m_columns.push_back({name, QString(), QMetaType::fromType<QString>()});
    }
    m_open = true;
    m_lock = Lock::Optimistic;
    m_cursor = Cursor::Static;
    m_pos = 0;
}

void Recordset::requery()
{
    if (!m_open || !m_connection)
        throw DbError(QStringLiteral("O conjunto de registos não está aberto."));
    Connection* connection = m_connection;
    const QString sql = m_sql;
    const QVariantList params = m_params;
    open(sql, *connection, m_cursor, m_lock, params);
}

void Recordset::resync()
{
    cancelUpdate();
    const int row = requireRow();
    if (!m_connection)
        return;
    QStringList tables;
    for (const Column& c : m_columns) {
        if (!c.table.isEmpty() && !tables.contains(c.table, Qt::CaseInsensitive))
            tables << c.table;
    }
    for (const QString& table : tables) {
        int keyIndex = -1;
        const QString key = primaryKeyColumn(table, &keyIndex);
        if (keyIndex < 0 || cell(row, keyIndex).isNull())
            continue;
        QStringList names;
        for (const Column& c : m_columns) {
            if (c.table.compare(table, Qt::CaseInsensitive) == 0)
                names << c.name;
        }
        QSqlQuery& q = m_connection->run(QStringLiteral("SELECT %1 FROM %2 WHERE %3 = ?").arg(names.join(u','), table, key),
                                         {cell(row, keyIndex)});
        if (q.next())  // a row gone stays as read: saving it again is refused
            adoptReturned(row, table, q);
        q.finish();
    }
}

void Recordset::close()
{
    m_open = false;
    m_connection = nullptr;
    m_sql.clear();
    m_params.clear();
    m_columns.clear();
    m_byName.clear();
    m_cells.clear();
    m_rowCount = 0;
    m_pos = 0;
    m_afterDelete = false;
    m_edit.reset();
    m_indexes.clear();
}

bool Recordset::eof() const
{
    return m_rowCount == 0 || m_pos >= m_rowCount;
}

bool Recordset::bof() const
{
    return m_rowCount == 0 || m_pos < 0;
}

int Recordset::position() const
{
    return (bof() || eof()) ? -1 : m_pos;
}

void Recordset::beforeMove()
{
    if (!m_open)
        throw DbError(QStringLiteral("O conjunto de registos não está aberto."));
    if (willMove)
        willMove();
    if (m_edit)
        update();
    m_afterDelete = false;
}

void Recordset::moveFirst()
{
    beforeMove();
    m_pos = 0;
}

void Recordset::moveLast()
{
    beforeMove();
    m_pos = m_rowCount == 0 ? 0 : m_rowCount - 1;
}

void Recordset::moveNext()
{
    const bool stay = m_afterDelete;
    if (!stay && eof())
        throw DbError(QStringLiteral("Não é possível avançar: já não há mais registos."));
    beforeMove();
    if (!stay)
        ++m_pos;
}

void Recordset::movePrevious()
{
    if (bof())
        throw DbError(QStringLiteral("Não é possível recuar: não há registos anteriores."));
    beforeMove();
    --m_pos;
}

int Recordset::fieldIndex(const QString& name) const
{
    return m_byName.value(name.toLower(), -1);
}

int Recordset::requireField(const QString& name) const
{
    const int i = fieldIndex(name);
    if (i < 0)
        throw DbError(QStringLiteral("O campo \"%1\" não existe neste conjunto de registos.").arg(name));
    return i;
}

int Recordset::requireRow() const
{
    if (!m_open)
        throw DbError(QStringLiteral("O conjunto de registos não está aberto."));
    if (m_afterDelete || bof() || eof())
        throw DbError(QStringLiteral("Não há registo actual."));
    return m_pos;
}

QVariant Recordset::value(int index) const
{
    const int row = requireRow();
    if (index < 0 || index >= fieldCount())
        throw DbError(QStringLiteral("O campo %1 não existe neste conjunto de registos.").arg(index));
    return cell(row, index);
}

QVariant Recordset::normalised(int column, const QVariant& value) const
{
    const QMetaType type = m_columns[size_t(column)].type;
    if (!type.isValid())
        return value;
    if (value.isNull())
        return QVariant(type);
    if (value.metaType() == type)
        return value;
    QVariant converted = value;
    if (converted.convert(type))
        return converted;
    return value;
}

void Recordset::beginEdit()
{
    if (m_edit)
        return;
    Edit edit;
    edit.row = requireRow();
    const int n = fieldCount();
    edit.original.reserve(n);
    for (int i = 0; i < n; ++i)
        edit.original.append(cell(edit.row, i));
    edit.changed.assign(size_t(n), false);
    m_edit = std::move(edit);
}

void Recordset::setValue(int index, const QVariant& value)
{
    const int row = requireRow();
    if (index < 0 || index >= fieldCount())
        throw DbError(QStringLiteral("O campo %1 não existe neste conjunto de registos.").arg(index));
    beginEdit();
    const QVariant before = cell(row, index);
    const QVariant after = normalised(index, value);
    cell(row, index) = after;
    m_edit->changed[size_t(index)] = true;
    m_edit->added.remove(index);
    reindex(index, row, before, after);
}

void Recordset::addTo(const QString& name, double amount)
{
    const int index = requireField(name);
    const int row = requireRow();
    beginEdit();
    const double cents = roundCents(amount);
    const QVariant before = cell(row, index);
    const QVariant after = normalised(index, roundCents(before.toDouble() + cents));
    cell(row, index) = after;
    if (!m_edit->changed[size_t(index)] || m_edit->added.contains(index))
        m_edit->added[index] += cents;
    m_edit->changed[size_t(index)] = true;
    reindex(index, row, before, after);
}

QString Recordset::keyOf(int column, const QVariant& value) const
{
    if (!value.isValid() || value.isNull())
        return QString();
    QMetaType type = m_columns[size_t(column)].type;
    if (!type.isValid())
        type = value.metaType();
    if (isNumericType(type)) {
        bool ok = false;
        const double d = value.metaType().id() == QMetaType::QString ? value.toString().trimmed().toDouble(&ok)
                                                                     : value.toDouble(&ok);
        return ok ? numericKey(d) : QStringLiteral("x:") + value.toString();
    }
    if (type.id() == QMetaType::QDate || value.metaType().id() == QMetaType::QDate)
        return QStringLiteral("d:") + value.toDate().toString(Qt::ISODate);
    return QStringLiteral("s:") + value.toString();
}

Recordset::Index& Recordset::index(int column)
{
    auto found = m_indexes.find(column);
    if (found != m_indexes.end())
        return found->second;
    Index& idx = m_indexes[column];
    for (int row = 0; row < m_rowCount; ++row) {
        const QString key = keyOf(column, cell(row, column));
        if (!key.isNull())
            idx[key].push_back(row);
    }
    return idx;
}

void Recordset::reindex(int column, int row, const QVariant& before, const QVariant& after)
{
    auto found = m_indexes.find(column);
    if (found == m_indexes.end())
        return;
    Index& idx = found->second;
    const QString oldKey = keyOf(column, before);
    const QString newKey = keyOf(column, after);
    if (oldKey == newKey)
        return;
    if (!oldKey.isNull()) {
        auto& rows = idx[oldKey];
        const auto at = std::lower_bound(rows.begin(), rows.end(), row);
        if (at != rows.end() && *at == row)
            rows.erase(at);
    }
    if (!newKey.isNull()) {
        auto& rows = idx[newKey];
        rows.insert(std::lower_bound(rows.begin(), rows.end(), row), row);
    }
}

bool Recordset::find(const QString& name, const QVariant& value)
{
    const int column = requireField(name);
    beforeMove();
    const int start = std::max(m_pos, 0);
    const QString key = keyOf(column, value);
    if (!key.isNull() && start < m_rowCount) {
        const Index& idx = index(column);
        const auto hit = idx.constFind(key);
        if (hit != idx.constEnd()) {
            const auto at = std::lower_bound(hit->begin(), hit->end(), start);
            if (at != hit->end()) {
                m_pos = *at;
                return true;
            }
        }
    }
    m_pos = m_rowCount;
    return false;
}

void Recordset::addNew()
{
    beforeMove();
    const int n = fieldCount();
    for (int i = 0; i < n; ++i)
        m_cells.append(normalised(i, QVariant()));
    m_pos = m_rowCount++;
    Edit edit;
    edit.row = m_pos;
    edit.adding = true;
    edit.changed.assign(size_t(n), false);
    m_edit = std::move(edit);
}

void Recordset::cancelUpdate()
{
    if (!m_edit)
        return;
    Edit edit = std::move(*m_edit);
    m_edit.reset();
    if (edit.adding) {
        m_cells.remove(edit.row * fieldCount(), fieldCount());
        --m_rowCount;
        m_indexes.clear();
        m_pos = std::min(edit.row, m_rowCount);
        return;
    }
    for (int i = 0; i < fieldCount(); ++i) {
        if (edit.changed[size_t(i)]) {
            reindex(i, edit.row, cell(edit.row, i), edit.original[i]);
            cell(edit.row, i) = edit.original[i];
        }
    }
}

void Recordset::requireWritable() const
{
    if (m_lock == Lock::Unspecified || m_lock == Lock::ReadOnly)
        throw DbError(QStringLiteral("Este conjunto de registos é só de leitura."));
}

void Recordset::update()
{
    if (!m_edit)
        return;
    if (!m_connection) {  // in memory
        m_edit.reset();
        return;
    }
    requireWritable();
    // On failure the row stays in edit, so the caller may retry or cancel.
    if (m_edit->adding)
        saveInsert(*m_edit);
    else
        saveUpdate(*m_edit);
    m_edit.reset();
}

QString Recordset::primaryKeyColumn(const QString& table, int* columnIndex) const
{
    QString key = m_connection->primaryKey(table);
    *columnIndex = -1;
    if (key.isEmpty())
        throw DbError(QStringLiteral("A tabela \"%1\" não tem chave primária: não é possível gravar.").arg(table));
    for (int i = 0; i < fieldCount(); ++i) {
        const Column& c = m_columns[size_t(i)];
        if (c.table.compare(table, Qt::CaseInsensitive) == 0 && c.name.compare(key, Qt::CaseInsensitive) == 0) {
            *columnIndex = i;
            break;
        }
    }
    return key;
}

void Recordset::adoptReturned(int row, const QString& table, QSqlQuery& query)
{
    const QSqlRecord record = query.record();
    for (int r = 0; r < record.count(); ++r) {
        const QString name = record.fieldName(r);
        for (int i = 0; i < fieldCount(); ++i) {
            const Column& c = m_columns[size_t(i)];
            if (c.table.compare(table, Qt::CaseInsensitive) == 0 && c.name.compare(name, Qt::CaseInsensitive) == 0) {
                const QVariant before = cell(row, i);
                const QVariant after = normalised(i, query.value(r));
                cell(row, i) = after;
                reindex(i, row, before, after);
            }
        }
    }
}

void Recordset::saveInsert(Edit& edit)
{
    QString table;
    QStringList names;
    QVariantList values;
    for (int i = 0; i < fieldCount(); ++i) {
        const Column& c = m_columns[size_t(i)];
        if (!edit.changed[size_t(i)])
            continue;
        if (c.table.isEmpty())
            throw DbError(QStringLiteral("O campo calculado \"%1\" não pode ser gravado.").arg(c.name));
        if (table.isEmpty())
            table = c.table;
        else if (table.compare(c.table, Qt::CaseInsensitive) != 0)
            throw DbError(QStringLiteral("Um registo novo só pode ser gravado numa tabela."));
        names << c.name;
        values << cell(edit.row, i);
    }
    if (table.isEmpty()) {
        for (const Column& c : m_columns) {
            if (!c.table.isEmpty()) {
                table = c.table;
                break;
            }
        }
    }
    if (table.isEmpty())
        throw DbError(QStringLiteral("Não é possível gravar um registo novo neste conjunto de registos."));
    QString sql;
    if (names.isEmpty()) {
        sql = QStringLiteral("INSERT INTO %1 DEFAULT VALUES RETURNING *").arg(table);
    } else {
        QStringList marks;
        for (int i = 0; i < names.size(); ++i)
            marks << QStringLiteral("?");
        sql = QStringLiteral("INSERT INTO %1 (%2) VALUES (%3) RETURNING *").arg(table, names.join(u','), marks.join(u','));
    }
    QSqlQuery& q = m_connection->run(sql, values);
    if (q.next())
        adoptReturned(edit.row, table, q);
    q.finish();
}

void Recordset::saveUpdate(Edit& edit)
{
    // One statement per base table whose columns changed.
    QStringList tables;
    for (int i = 0; i < fieldCount(); ++i) {
        if (!edit.changed[size_t(i)])
            continue;
        const Column& c = m_columns[size_t(i)];
        if (c.table.isEmpty())
            throw DbError(QStringLiteral("O campo calculado \"%1\" não pode ser gravado.").arg(c.name));
        bool seen = false;
        for (const QString& t : tables)
            seen = seen || t.compare(c.table, Qt::CaseInsensitive) == 0;
        if (!seen)
            tables << c.table;
    }
    if (tables.isEmpty())
        return;
    const Dialect& dialect = m_connection->dialect();
    std::optional<Transaction> together;
    if (tables.size() > 1)
        together.emplace(*m_connection);
    for (const QString& table : tables) {
        int keyIndex = -1;
        const QString key = primaryKeyColumn(table, &keyIndex);
        if (keyIndex < 0)
            throw DbError(QStringLiteral("A chave \"%1\" da tabela \"%2\" não foi lida: não é possível gravar.").arg(key, table));
        QStringList sets;
        QStringList checks;
        QStringList returned;
        QVariantList setValues;
        QVariantList checkValues;
        for (int i = 0; i < fieldCount(); ++i) {
            const Column& c = m_columns[size_t(i)];
            if (!edit.changed[size_t(i)] || c.table.compare(table, Qt::CaseInsensitive) != 0)
                continue;
            returned << c.name;
            const auto added = edit.added.constFind(i);
            if (added != edit.added.constEnd()) {
                sets << c.name + QStringLiteral(" = ") + dialect.addToColumn(c.name);
                setValues << *added;
            } else {
                sets << c.name + QStringLiteral(" = ?");
                setValues << cell(edit.row, i);
                checks << dialect.nullSafeEquals(c.name);
                checkValues << edit.original[i];
            }
        }
        QString sql = QStringLiteral("UPDATE %1 SET %2 WHERE %3 = ?").arg(table, sets.join(QStringLiteral(", ")), key);
        for (const QString& check : checks)
            sql += QStringLiteral(" AND ") + check;
        sql += QStringLiteral(" RETURNING ") + returned.join(u',');
        QSqlQuery& q = m_connection->run(sql, setValues + QVariantList{edit.original[keyIndex]} + checkValues);
        const bool saved = q.next();
        if (saved)
            adoptReturned(edit.row, table, q);
        q.finish();
        if (!saved)
            throw ConcurrencyError(QStringLiteral("O registo foi alterado ou eliminado por outro utilizador depois de lido. "
                                                  "As alterações não foram gravadas."));
    }
    if (together)
        together->commit();
}

void Recordset::deleteCurrent()
{
    const int row = requireRow();
    if (m_connection) {
        requireWritable();
        QString table;
        for (const Column& c : m_columns) {
            if (!c.table.isEmpty()) {
                table = c.table;
                break;
            }
        }
        int keyIndex = -1;
        const QString key = primaryKeyColumn(table, &keyIndex);
        if (keyIndex < 0)
            throw DbError(QStringLiteral("A chave da tabela \"%1\" não foi lida: não é possível eliminar.").arg(table));
        const QVariant keyValue = m_edit ? m_edit->original[keyIndex] : cell(row, keyIndex);
        if (m_connection->execute(QStringLiteral("DELETE FROM %1 WHERE %2 = ?").arg(table, key), {keyValue}) == 0)
            throw ConcurrencyError(QStringLiteral("O registo já tinha sido eliminado por outro utilizador."));
    }
    m_edit.reset();
    m_cells.remove(row * fieldCount(), fieldCount());
    --m_rowCount;
    m_indexes.clear();
    m_afterDelete = true;
}

}  // namespace quotas
