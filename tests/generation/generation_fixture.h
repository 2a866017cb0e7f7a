#pragma once

// Rows the generation tests start from, written on the test's own connection.

#include "platform/connection.h"
#include "platform/recordset.h"

#include <QDate>
#include <QVariant>
#include <cmath>

namespace quotas::test {

inline const QVariant kNull = QVariant();

struct GenerationFixture {
    Connection& c;

    void member(int socio, const QString& noTap, const QVariant& fuv = QStringLiteral("A1"),
                const QVariant& empresa = QStringLiteral("TAP"), const QVariant& seguro = 0, const QVariant& end = kNull)
    {
        c.execute(QStringLiteral("INSERT INTO tbSocios (socio_id, no_tap, nome, fuv, empresa, seguro, "
                                 "seguro_data_rescisao) VALUES (?, ?, ?, ?, ?, ?, ?)"),
                  {socio, noTap, QStringLiteral("Associado %1").arg(socio), fuv.isValid() ? fuv : QVariant(QMetaType::fromType<QString>()),
                   empresa.isValid() ? empresa : QVariant(QMetaType::fromType<QString>()), seguro,
                   end.isValid() ? end : QVariant(QMetaType::fromType<QDate>())});
    }
    void category(const QString& code, const QVariant& rend1)
    {
        c.execute(QStringLiteral("INSERT INTO tbfuvs (code, descrit, rend1) VALUES (?, ?, ?)"),
                  {code, code, rend1.isValid() ? rend1 : QVariant(QMetaType::fromType<double>())});
    }
    void employer(const QString& code, const QVariant& rate)
    {
        c.execute(QStringLiteral("INSERT INTO tbEmpresas (code, nome, percent_sindicato) VALUES (?, ?, ?)"),
                  {code, code, rate.isValid() ? rate : QVariant(QMetaType::fromType<double>())});
    }
    // An account with the given remunerations and personal rates (invalid: Null).
    void account(int socio, const QVariant& rend1, const QVariant& rend2, const QVariant& percSindicato = kNull,
                 const QVariant& percSeguro = kNull, double total = 0)
    {
        auto orNull = [](const QVariant& v) { return v.isValid() ? v : QVariant(QMetaType::fromType<double>()); };
        c.execute(QStringLiteral("INSERT INTO tbQuotas_Socios (socio_id, ult_ano, ult_mes, ult_rend1, ult_rend2, "
                                 "ult_perc_sindicato, ult_perc_seguro, total_quotas, total_pago) "
                                 "VALUES (?, 2002, 12, ?, ?, ?, ?, ?, 0)"),
                  {socio, orNull(rend1), orNull(rend2), orNull(percSindicato), orNull(percSeguro), total});
    }

    int count(const QString& table) { return c.scalar(QStringLiteral("SELECT COUNT(*) FROM %1").arg(table)).toInt(); }
    QVariant counter() { return c.scalar(QStringLiteral("SELECT quotas FROM tbcontadores ORDER BY contador_id")); }

    // The member's movement of one type for the month (quota, quota_no, rend1, ...), or an empty set.
    void movement(Recordset& rs, int socio, int ano, int mes, int tipo)
    {
        rs.open(QStringLiteral("SELECT * FROM tbQuotas_Movimentos WHERE socio_id = ? AND ano = ? AND mes = ? AND tipo = ?"),
                c, Cursor::Static, Lock::ReadOnly, {socio, ano, mes, tipo});
    }
    void accountOf(Recordset& rs, int socio)
    {
        rs.open(QStringLiteral("SELECT * FROM tbQuotas_Socios WHERE socio_id = ?"), c, Cursor::Static, Lock::ReadOnly,
                {socio});
    }
    // Movements in a fixed order as text, to compare two states of the table.
    QStringList movementRows()
    {
        Recordset rs;
        rs.open(QStringLiteral("SELECT socio_id, ano, mes, tipo, ref, quota_no, rend1, rend2, quota, pago "
                               "FROM tbQuotas_Movimentos ORDER BY quota_no"),
                c, Cursor::Static, Lock::ReadOnly);
        QStringList rows;
        for (; !rs.eof(); rs.moveNext()) {
            QStringList fields;
            for (int i = 0; i < rs.fieldCount(); ++i)
                fields << rs.value(i).toString();
            rows << fields.join(u'|');
        }
        return rows;
    }
};

// Balances compared at cent precision: SQLite keeps REAL.
inline bool sameCents(double a, double b)
{
    return std::llround(a * 100) == std::llround(b * 100);
}

}  // namespace quotas::test
