#pragma once

#include <QAbstractTableModel>
#include <QHash>
#include <QList>
#include <QSortFilterProxyModel>

namespace quotas {
class Connection;
}

namespace host {

// The members with their dues accounts, read in one statement. The open
// amount is the movements' own (dues less payments); the account's stored
// totals stand beside it and are marked when they no longer agree, since
// they are only rebuilt by the maintenance.
class MemberRegister : public QAbstractTableModel {
    Q_OBJECT
public:
    enum Column {
        NoTap,
        Nome,
        TotalQuotas,
        TotalPago,
        EmDivida,
        ColumnCount
    };
    // The member's socio_id, on every column.
    static constexpr int KeyRole = Qt::UserRole;
    // True on a row whose stored totals disagree with its movements.
    static constexpr int StaleRole = Qt::UserRole + 1;

    struct Member {
        qint64 socioId = 0;
        QString noTap, nome;
        QString foldedNoTap, foldedNome;  // without accents, in lower case: what the search matches
        bool hasAccount = false;
        double totalQuotas = 0, totalPago = 0;  // as stored
        double owed = 0;                        // from the movements
        bool stale = false;
    };

    using QAbstractTableModel::QAbstractTableModel;

    // Reads the register again; throws QuotasError when the database fails.
    void reload(quotas::Connection& connection);
    int rowOf(qint64 socioId) const { return m_rows.value(socioId, -1); }
    const Member& member(int row) const { return m_members.at(row); }
    int staleCount() const { return m_stale; }
    // False until some member has a dues account or a movement.
    bool hasDues() const { return m_hasDues; }

    int rowCount(const QModelIndex& parent = QModelIndex()) const override;
    int columnCount(const QModelIndex& parent = QModelIndex()) const override;
    QVariant data(const QModelIndex& index, int role = Qt::DisplayRole) const override;
    QVariant headerData(int section, Qt::Orientation orientation, int role = Qt::DisplayRole) const override;

private:
    QList<Member> m_members;
    QHash<qint64, int> m_rows;
    int m_stale = 0;
    bool m_hasDues = false;
};

// Sorting by any column (names in alphabetical order regardless of accents
// and case, staff numbers as numbers when they are) and the search, which
// keeps the members whose staff number or name holds the typed text,
// accents and letter case aside.
class MemberFilter : public QSortFilterProxyModel {
    Q_OBJECT
public:
    using QSortFilterProxyModel::QSortFilterProxyModel;
    void setSearch(const QString& text);

protected:
    bool filterAcceptsRow(int sourceRow, const QModelIndex& sourceParent) const override;
    bool lessThan(const QModelIndex& left, const QModelIndex& right) const override;

private:
    const MemberRegister* source() const;
    QString m_search;
};

// Text without accents, in lower case: "Conceição" is "conceicao".
QString folded(const QString& text);

}  // namespace host
