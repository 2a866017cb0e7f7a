#pragma once

// Shared set-up of the import tests: members charged for March 2004 with
// their accounts, and an employer's file behind "Dorvanta.General".

#include "component/shared_objects.h"
#include "import/csv_import_source.h"
#include "platform/components.h"
#include "platform/recordset.h"
#include "support/test_database.h"

#include <QDate>
#include <QFile>
#include <cmath>

namespace quotas::test {

inline const QVariant kNull = QVariant(QMetaType::fromType<double>());

struct ImportFixture {
    TestDatabase& db;

    Connection& c() { return db.connection(); }

    void member(int id, const QString& noTap)
    {
        c().execute(QStringLiteral("INSERT INTO tbSocios (socio_id, no_tap, nome) VALUES (?, ?, 'Associado')"), {id, noTap});
    }
    void movement(int socio, int tipo, const QVariant& quota, const QVariant& pago)
    {
        c().execute(QStringLiteral("INSERT INTO tbQuotas_Movimentos (socio_id, data, ano, mes, tipo, ref, quota_no, rend1, "
                                   "rend2, quota, pago) VALUES (?, ?, 2004, 3, ?, 'Sindicato', 1, 1000, 250, ?, ?)"),
                    {socio, QDate(2004, 3, 1), tipo, quota, pago});
    }
    // Rates 0.015 (union) and 0.02 (insurance), last dues 1.11 and 2.22.
    void account(int socio, double totalQuotas, double totalPago, double rend1 = 1000.0, double rend2 = 0.0)
    {
        c().execute(QStringLiteral("INSERT INTO tbQuotas_Socios (socio_id, ult_ano, ult_mes, ult_rend1, ult_rend2, "
                                   "ult_quota_sindicato, ult_perc_sindicato, ult_quota_seguro, ult_perc_seguro, "
                                   "total_quotas, total_pago) VALUES (?, 2003, 12, ?, ?, 1.11, 0.015, 2.22, 0.02, ?, ?)"),
                    {socio, rend1, rend2, totalQuotas, totalPago});
    }
    void charged(int id, const QString& noTap, double quota, double pago = 0.0, int tipo = 1)
    {
        member(id, noTap);
        movement(id, tipo, quota, pago);
        account(id, quota, pago);
    }

    // Amounts in whole cents: SQLite keeps REAL.
    qint64 movementCents(int socio, const char* column, int tipo = 1)
    {
        const QVariant v = c().scalar(
            QStringLiteral("SELECT %1 FROM tbQuotas_Movimentos WHERE socio_id = ? AND tipo = ?").arg(QLatin1String(column)),
            {socio, tipo});
        return std::llround(v.toDouble() * 100.0);
    }
    QVariant accountValue(int socio, const char* column)
    {
        return c().scalar(QStringLiteral("SELECT %1 FROM tbQuotas_Socios WHERE socio_id = ?").arg(QLatin1String(column)),
                          {socio});
    }
    qint64 accountCents(int socio, const char* column) { return std::llround(accountValue(socio, column).toDouble() * 100.0); }

    // Every value of the movements and accounts, to tell "nothing changed".
    QString snapshot()
    {
        QString out;
        for (const char* sql : {"SELECT * FROM tbQuotas_Movimentos ORDER BY quota_id", "SELECT * FROM tbQuotas_Socios ORDER BY squota_id"}) {
            Recordset rs;
            for (rs.open(QLatin1String(sql), c()); !rs.eof(); rs.moveNext())
                for (int i = 0; i < rs.fieldCount(); ++i)
                    out += rs.value(i).toString() + u'|';
        }
        return out;
    }

    // The first columns of extras, Null shown as "<null>".
    QList<QStringList> extras(int columns = 1)
    {
        QList<QStringList> rows;
        Recordset rs;
        for (rs.open(QStringLiteral("SELECT * FROM extras ORDER BY extra_id"), c()); !rs.eof(); rs.moveNext()) {
            QStringList row;
            for (int i = 1; i <= columns; ++i)
                row << (rs.value(i).isNull() ? QStringLiteral("<null>") : rs.value(i).toString());
            rows << row;
        }
        return rows;
    }

    // The employer's file, given to the import source as it stands.
    QString useFile(const QByteArray& content)
    {
        const QString path = db.scratch(QStringLiteral("lista.csv"));
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
