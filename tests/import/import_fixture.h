#pragma once

// Shared set-up of the import tests: members, charged movements and accounts
// in the test database, and an employer's file behind "Dorvanta.General".

#include "component/shared_objects.h"
#include "import/csv_import_source.h"
#include "platform/components.h"
#include "platform/connection.h"
#include "platform/recordset.h"
#include "support/test_database.h"

#include <QDate>
#include <QFile>
#include <QVariant>
#include <cmath>

namespace quotas::test {

inline const QVariant kNull = QVariant(QMetaType::fromType<double>());

struct ImportFixture {
    TestDatabase& db;

    Connection& c() { return db.connection(); }

    void member(int id, const QString& noTap)
    {
        c().execute(QStringLiteral("INSERT INTO tbSocios (socio_id, no_tap, nome) VALUES (?, ?, ?)"),
                    {id, noTap, QStringLiteral("Associado %1").arg(id)});
    }
    void movement(int socio, int ano, int mes, int tipo, const QVariant& quota, const QVariant& pago,
                  const QVariant& rend1 = 1000.0)
    {
        c().execute(QStringLiteral("INSERT INTO tbQuotas_Movimentos (socio_id, data, ano, mes, tipo, ref, quota_no, rend1, "
                                   "rend2, quota, pago) VALUES (?, ?, ?, ?, ?, ?, 1, ?, 250, ?, ?)"),
                    {socio, QDate(ano, mes, 1), ano, mes, tipo,
                     tipo == 1 ? QStringLiteral("Sindicato") : QStringLiteral("Seguro"), rend1, quota, pago});
    }
    // An account whose totals hold the given charge and payment.
    void account(int socio, double totalQuotas, double totalPago, double rend1 = 1000.0, double rend2 = 0.0)
    {
        c().execute(QStringLiteral("INSERT INTO tbQuotas_Socios (socio_id, ult_ano, ult_mes, ult_rend1, ult_rend2, "
                                   "ult_quota_sindicato, ult_perc_sindicato, ult_quota_seguro, ult_perc_seguro, "
                                   "total_quotas, total_pago) VALUES (?, 2003, 12, ?, ?, 1.11, 0.015, 2.22, 0.02, ?, ?)"),
                    {socio, rend1, rend2, totalQuotas, totalPago});
    }
    // A member charged `quota` for March 2004 of type tipo, with an account.
    void charged(int id, const QString& noTap, double quota, double pago = 0.0, int tipo = 1)
    {
        member(id, noTap);
        movement(id, 2004, 3, tipo, quota, pago);
        account(id, quota, pago);
    }

    QVariant movementValue(int socio, const QString& column, int tipo = 1)
    {
        return c().scalar(QStringLiteral("SELECT %1 FROM tbQuotas_Movimentos WHERE socio_id = ? AND tipo = ?").arg(column),
                          {socio, tipo});
    }
    QVariant accountValue(int socio, const QString& column)
    {
        return c().scalar(QStringLiteral("SELECT %1 FROM tbQuotas_Socios WHERE socio_id = ?").arg(column), {socio});
    }
    // SQLite keeps REAL: amounts are compared in whole cents.
    static qint64 cents(const QVariant& v) { return std::llround(v.toDouble() * 100.0); }

    // Every amount of the dues tables, to tell "nothing changed".
    QString snapshot()
    {
        QString out;
        Recordset rs;
        rs.open(QStringLiteral("SELECT socio_id, tipo, rend1, rend2, quota, pago FROM tbQuotas_Movimentos ORDER BY socio_id, tipo"),
                c());
        for (; !rs.eof(); rs.moveNext())
            for (int i = 0; i < rs.fieldCount(); ++i)
                out += rs.value(i).toString() + u'|';
        rs.open(QStringLiteral("SELECT * FROM tbQuotas_Socios ORDER BY socio_id"), c());
        for (; !rs.eof(); rs.moveNext())
            for (int i = 0; i < rs.fieldCount(); ++i)
                out += rs.value(i).toString() + u'|';
        return out;
    }

    QList<QStringList> extras(int columns = 4)
    {
        QList<QStringList> rows;
        Recordset rs;
        rs.open(QStringLiteral("SELECT * FROM extras ORDER BY extra_id"), c());
        for (; !rs.eof(); rs.moveNext()) {
            QStringList row;
            for (int i = 0; i < columns; ++i)
                row << (rs.isNull(QStringLiteral("Field%1").arg(i)) ? QStringLiteral("<null>")
                                                                     : rs.value(QStringLiteral("Field%1").arg(i)).toString());
            rows << row;
        }
        return rows;
    }

    // The employer's file, given to the import source as it stands.
    QString useFile(const QByteArray& content, const QString& name = QStringLiteral("lista.csv"))
    {
        const QString path = db.scratch(name);
        QFile file(path);
        file.open(QIODevice::WriteOnly | QIODevice::Truncate);
        file.write(content);
        file.close();
        registerComponent(QStringLiteral("Dorvanta.General"),
                          [path] { return std::make_unique<CsvImportSource>(CsvImportSource::fixedFile(path)); });
        return path;
    }
};

}  // namespace quotas::test
