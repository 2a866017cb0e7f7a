#pragma once

#include <QHash>
#include <QMetaType>
#include <QString>
#include <QStringList>
#include <QVariant>
#include <QVector>
#include <functional>
#include <optional>
#include <unordered_map>
#include <vector>

class QSqlQuery;

namespace quotas {

class Connection;

// Cursor and lock kinds with the numbers the runs and windows are written with.
enum class Cursor {
    Unspecified = -1,
    ForwardOnly = 0,
    Keyset = 1,
    Dynamic = 2,
    Static = 3
};
enum class Lock {
    Unspecified = -1,
    ReadOnly = 1,
    Pessimistic = 2,
    Optimistic = 3,
    BatchOptimistic = 4
};

// A result set: the rows of one query read at open, a current row, and saves
// of the changed columns back to each column's base table by primary key.
//
// - Field names are matched without regard to case; the first column of a
//   name wins. Null stays distinct from 0 and from the empty text.
// - Saves are optimistic: a changed column is written only where the row
//   still holds what was read, else ConcurrencyError and nothing is written.
//   Running totals changed with addTo() are written as "column + amount", so
//   a concurrent change of the same total is kept, not overwritten.
// - find() costs O(1) per call through an index built once per column, and
//   still finds the first matching row at or after the current one.
// - Moving off a row with pending changes saves them first, as update() does.
// - Unspecified or ReadOnly locking opens a set that cannot be saved.
class Recordset {
public:
    struct Column {
        QString name;
        QString table;  // base table; empty for computed columns
        QMetaType type;
    };

    Recordset() = default;
    ~Recordset();
    Recordset(const Recordset&) = delete;
    Recordset& operator=(const Recordset&) = delete;

    void open(const QString& sql, Connection& connection, Cursor cursor = Cursor::Unspecified,
              Lock lock = Lock::Unspecified, const QVariantList& params = {});
    // A set without a database behind it: text columns, rows added in memory.
    void openInMemory(const QStringList& columns);
    // Reads the rows again with the same text and parameters.
    void requery();
    // Pending changes are dropped.
    void close();
    // Drops the current row's pending changes and reads its columns again
    // from their base tables by primary key: after a rollback, the one row
    // a failed save touched, without reading the whole set again.
    void resync();

    bool isOpen() const { return m_open; }
    int state() const { return m_open ? 1 : 0; }
    Connection* connection() const { return m_connection; }
    Lock lock() const { return m_lock; }

    bool eof() const;
    bool bof() const;
    void moveFirst();
    void moveLast();
    void moveNext();
    void movePrevious();
    int recordCount() const { return m_rowCount; }
    // Index of the current row, -1 at BOF or EOF.
    int position() const;

    int fieldCount() const { return int(m_columns.size()); }
    const Column& column(int index) const { return m_columns.at(size_t(index)); }
    QString fieldName(int index) const { return column(index).name; }
    // -1 when the set has no such column.
    int fieldIndex(const QString& name) const;
    bool hasField(const QString& name) const { return fieldIndex(name) >= 0; }

    // Field of the current row; throws when there is none or no such column.
    QVariant value(int index) const;
    QVariant value(const QString& name) const { return value(requireField(name)); }
    bool isNull(const QString& name) const { return value(name).isNull(); }
    void setValue(int index, const QVariant& value);
    void setValue(const QString& name, const QVariant& value) { setValue(requireField(name), value); }
    // Adds an amount, rounded to cents, to a running total of the current row.
    void addTo(const QString& name, double amount);

    // Searches from the current row forward for the first row whose column
    // equals value (Null never matches). Leaves the set at EOF when none does.
    bool find(const QString& name, const QVariant& value);

    void addNew();
    // Saves the pending changes of the current row (nothing when none).
    void update();
    void cancelUpdate();
    bool editing() const { return m_edit.has_value(); }
    // Deletes the current row; the next moveNext() lands on the row that
    // followed it.
    void deleteCurrent();

    // Raised before every move of the current row (moves, find, addNew).
    std::function<void()> willMove;

private:
    struct Edit {
        int row = -1;
        bool adding = false;
        QVector<QVariant> original;
        std::vector<bool> changed;
        QHash<int, double> added;  // running totals: column -> amount
    };
    using Index = QHash<QString, std::vector<int>>;

    int requireField(const QString& name) const;
    int requireRow() const;
    void beforeMove();
    void beginEdit();
    QVariant& cell(int row, int column) { return m_cells[row * fieldCount() + column]; }
    const QVariant& cell(int row, int column) const { return m_cells[row * fieldCount() + column]; }
    QVariant normalised(int column, const QVariant& value) const;
    QString keyOf(int column, const QVariant& value) const;
    Index& index(int column);
    void reindex(int column, int row, const QVariant& before, const QVariant& after);
    void saveInsert(Edit& edit);
    void saveUpdate(Edit& edit);
    void adoptReturned(int row, const QString& table, QSqlQuery& query);
    QString primaryKeyColumn(const QString& table, int* columnIndex) const;
    void requireWritable() const;

    bool m_open = false;
    Connection* m_connection = nullptr;
    QString m_sql;
    QVariantList m_params;
    Cursor m_cursor = Cursor::Unspecified;
    Lock m_lock = Lock::Unspecified;
    std::vector<Column> m_columns;
    QHash<QString, int> m_byName;
    QVector<QVariant> m_cells;
    int m_rowCount = 0;
    int m_pos = 0;  // -1 BOF, m_rowCount EOF
    bool m_afterDelete = false;
    std::optional<Edit> m_edit;
    std::unordered_map<int, Index> m_indexes;
};

}  // namespace quotas
