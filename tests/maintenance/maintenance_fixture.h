#pragma once

// Rows the maintenance tests set up and read back, on either engine, in one
// short notation: "SA 1 40.5 12.25" is an account (member, total_quotas,
// total_pago; SI an inactive one), "A 3 12.5 -" a movement (member, quota,
// pago; I inactive, H history), "H 3 - 0 12.5 -" one with rend1 and rend2
// too. "-" is Null; a movement given without them has rend1 1000, rend2 0.

#include "platform/connection.h"
#include "platform/recordset.h"
#include "support/database_fixture.h"

#include <QDate>
#include <QHash>
#include <QLocale>
#include <QStringList>

namespace quotas::test {

// The tables by their short names.
inline const QHash<QString, QString> kTable = {
    {"SA", "tbQuotas_Socios"}, {"SI", "tbQuotas_Socios_Inactivos"}, {"A", "tbQuotas_Movimentos"}, {"I", "tbQuotas_Movimentos_Inactivos"}, {"H", "tbQuotas_Movimentos_Historico"}};

// Accounts get ult_ano 2003 and nothing else; every movement a month of its
// own, so the active table's one-due-a-month rule never trips. Movements
// alternate union and insurance dues: the totals count both.
inline void insertRows(Connection& c, const QStringList& lines)
{
    static int next = 0;
    for (const QString& line : lines) {
        const QStringList f = line.split(u' ');
        QVariantList v = {f[1].toInt()};
        for (const QString& x : f.mid(2))
            v << (x == u'-' ? QVariant(QMetaType::fromType<double>()) : QVariant(x.toDouble()));
        const int n = next++;
        if (f[0].startsWith(u'S'))
            c.execute(QStringLiteral("INSERT INTO %1 (socio_id, ult_ano, total_quotas, total_pago) VALUES (?, 2003, ?, ?)")
                          .arg(kTable[f[0]]),
                      v);
        else
            c.execute(QStringLiteral("INSERT INTO %1 (socio_id, data, ano, mes, quota_no, tipo, ref, rend1, rend2, quota, pago) "
                                     "VALUES (?, ?, ?, ?, ?, ?, ?, ?, ?, ?, ?)")
                          .arg(kTable[f[0]]),
                      QVariantList{v[0], QDate(2000 + n / 12, 1 + n % 12, 1), 2000 + n / 12, 1 + n % 12, n, 1 + n % 2,
                                   n % 2 ? QStringLiteral("Seguro") : QStringLiteral("Sindicato")}
                          + (v.size() == 3 ? QVariantList{1000.0, 0.0} : QVariantList()) + v.mid(1));
    }
}

// What the maintenance may change, in the same notation, accounts first:
// "SA member total_quotas total_pago ult_ano" and "A member rend1 rend2 quota
// pago". Numbers show as stored, so a stray fraction of a cent shows too.
inline QStringList stateOf(Connection& c)
{
    QStringList rows;
    for (const QString key : {"SA", "SI", "A", "I", "H"}) {
        Recordset rs;
        rs.open((key.startsWith(u'S') ? QStringLiteral("SELECT socio_id, total_quotas, total_pago, ult_ano FROM %1 ORDER BY socio_id")
                                      : QStringLiteral("SELECT socio_id, rend1, rend2, quota, pago FROM %1 ORDER BY quota_id"))
                    .arg(kTable[key]),
                c);
        for (; !rs.eof(); rs.moveNext()) {
            QString row = key;
            for (int i = 0; i < rs.fieldCount(); ++i)
                row += u' ' + (rs.value(i).isNull() ? QStringLiteral("-") : QString::number(rs.value(i).toDouble(), 'g', QLocale::FloatingPointShortest));
            rows << row;
        }
    }
    return rows;
}

inline void failUpdates(Connection& c, const QString& table, const QString& condition = {}, const QString& name = QStringLiteral("fail"))
{
    failWrites(c, QStringLiteral("UPDATE"), table, condition, name);
}

}  // namespace quotas::test
