#include "host/member_register.h"

#include "component/money.h"
#include "platform/recordset.h"

#include <QFont>
#include <cmath>

namespace host {

namespace {

qint64 cents(double amount)
{
    return std::llround(amount * 100.0);
}

}  // namespace

QString folded(const QString& text)
{
    // The letters of Portuguese (and the rest of Latin-1) by table, which is
    // what nearly every name holds; anything else through decomposition.
    static const QString latin1 = [] {
        QString map(256, QChar());
        for (int c = 0; c < 256; ++c) {
            const QString d = QString(QChar(c)).normalized(QString::NormalizationForm_D);
            map[c] = d.isEmpty() ? QChar(c) : d.front().toCaseFolded();
        }
        return map;
    }();
    QString out;
    out.reserve(text.size());
    for (const QChar c : text) {
        if (c.unicode() < 256) {
            out += latin1[c.unicode()];
            continue;
        }
        for (const QChar d : QString(c).normalized(QString::NormalizationForm_D)) {
            if (d.category() != QChar::Mark_NonSpacing)
                out += d.toCaseFolded();
        }
    }
    return out;
}

void MemberRegister::reload(quotas::Connection& connection)
{
    // The open amount comes from the movements in the same statement, so that
    // the register costs one reading however many members there are.
    quotas::Recordset rs;
    rs.open(QStringLiteral("SELECT tbSocios.socio_id, tbSocios.no_tap, tbSocios.nome, tbQuotas_Socios.total_quotas, "
                           "tbQuotas_Socios.total_pago, SUM(m.quota), SUM(m.pago), COUNT(m.socio_id) FROM tbSocios "
                           "LEFT OUTER JOIN tbQuotas_Socios ON tbSocios.socio_id = tbQuotas_Socios.socio_id "
                           "LEFT OUTER JOIN tbQuotas_Movimentos m ON tbSocios.socio_id = m.socio_id "
                           "GROUP BY tbSocios.socio_id, tbSocios.no_tap, tbSocios.nome, tbQuotas_Socios.total_quotas, "
                           "tbQuotas_Socios.total_pago ORDER BY tbSocios.socio_id"),
            connection, quotas::Cursor::ForwardOnly, quotas::Lock::ReadOnly);
    QList<Member> members;
    members.reserve(rs.recordCount());
    for (; !rs.eof(); rs.moveNext()) {
        Member m;
        m.socioId = rs.value(0).toLongLong();
        m.noTap = rs.value(1).toString();
        m.nome = rs.value(2).toString();
        m.foldedNoTap = folded(m.noTap);
        m.foldedNome = folded(m.nome);
        m.hasAccount = !rs.value(3).isNull() || !rs.value(4).isNull();
        m.totalQuotas = rs.value(3).toDouble();
        m.totalPago = rs.value(4).toDouble();
        const bool hasMovements = rs.value(7).toInt() > 0;
        const double charged = rs.value(5).toDouble(), paid = rs.value(6).toDouble();
        m.owed = quotas::roundCents(charged - paid);
        m.stale = (hasMovements || m.hasAccount)
                  && (cents(m.totalQuotas) != cents(charged) || cents(m.totalPago) != cents(paid) || !m.hasAccount);
        members << m;
    }
    beginResetModel();
    m_members = std::move(members);
    m_rows.clear();
    m_rows.reserve(m_members.size());
    m_stale = 0;
    m_hasDues = false;
    for (int row = 0; row < m_members.size(); ++row) {
        m_rows.insert(m_members[row].socioId, row);
        m_stale += m_members[row].stale ? 1 : 0;
        m_hasDues = m_hasDues || m_members[row].hasAccount || m_members[row].stale;
    }
    endResetModel();
}

int MemberRegister::rowCount(const QModelIndex& parent) const
{
    return parent.isValid() ? 0 : int(m_members.size());
}

int MemberRegister::columnCount(const QModelIndex& parent) const
{
    return parent.isValid() ? 0 : ColumnCount;
}

QVariant MemberRegister::data(const QModelIndex& index, int role) const
{
    if (!index.isValid())
        return {};
    const Member& m = m_members.at(index.row());
    const int column = index.column();
    const bool stored = column == TotalQuotas || column == TotalPago;
    switch (role) {
    case Qt::DisplayRole:
        switch (column) {
        case NoTap: return m.noTap;
        case Nome: return m.nome;
        case TotalQuotas:
        case TotalPago:
            if (!m.hasAccount)
                return m.stale ? QStringLiteral("*") : QString();
            return quotas::formatMoney(column == TotalQuotas ? m.totalQuotas : m.totalPago)
                   + (m.stale ? QStringLiteral(" *") : QString());
        case EmDivida: return m.hasAccount || m.stale ? quotas::formatMoney(m.owed) : QString();
        }
        break;
    case Qt::TextAlignmentRole:
        return column >= TotalQuotas ? QVariant(Qt::AlignRight | Qt::AlignVCenter) : QVariant();
    case Qt::FontRole:
        if (stored && m.stale) {
            QFont italic;
            italic.setItalic(true);
            return italic;
        }
        break;
    case Qt::ToolTipRole:
        if (stored && m.stale)
            return QStringLiteral("Os totais guardados não coincidem com os movimentos (o valor em dívida é o dos "
                                  "movimentos). A \"Manutenção de Dados\" reconstrói-os.");
        break;
    case KeyRole: return m.socioId;
    case StaleRole: return m.stale;
    }
    return {};
}

QVariant MemberRegister::headerData(int section, Qt::Orientation orientation, int role) const
{
    if (orientation != Qt::Horizontal || role != Qt::DisplayRole)
        return {};
    static const QStringList headers = {QStringLiteral("Nº Empresa"), QStringLiteral("Nome"), QStringLiteral("Total Quotas"),
                                        QStringLiteral("Total Pago"), QStringLiteral("Em Dívida")};
    return headers.value(section);
}

const MemberRegister* MemberFilter::source() const
{
    return static_cast<const MemberRegister*>(sourceModel());
}

void MemberFilter::setSearch(const QString& text)
{
    const QString search = folded(text.trimmed());
    if (search == m_search)
        return;
    m_search = search;
    invalidateRowsFilter();
}

bool MemberFilter::filterAcceptsRow(int sourceRow, const QModelIndex&) const
{
    const MemberRegister::Member& m = source()->member(sourceRow);
    return m_search.isEmpty() || m.foldedNoTap.contains(m_search) || m.foldedNome.contains(m_search);
}

bool MemberFilter::lessThan(const QModelIndex& left, const QModelIndex& right) const
{
    const MemberRegister::Member& a = source()->member(left.row());
    const MemberRegister::Member& b = source()->member(right.row());
    switch (left.column()) {
    case MemberRegister::NoTap: {
        bool numberA = false, numberB = false;
        const qint64 na = a.noTap.toLongLong(&numberA), nb = b.noTap.toLongLong(&numberB);
        if (numberA && numberB)
            return na < nb;
        if (numberA != numberB)
            return numberA;  // numbers before other texts
        return a.noTap < b.noTap;
    }
    case MemberRegister::Nome: {
        // Names by their letters first, so that "Álvaro" comes among the A's.
        const int c = a.foldedNome.compare(b.foldedNome);
        return c != 0 ? c < 0 : a.nome < b.nome;
    }
    case MemberRegister::TotalQuotas: return a.totalQuotas < b.totalQuotas;
    case MemberRegister::TotalPago: return a.totalPago < b.totalPago;
    default: return a.owed < b.owed;
    }
}

}  // namespace host
