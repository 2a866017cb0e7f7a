#include "support/rows_text.h"

#include "platform/recordset.h"

#include <QLocale>

namespace quotas::test {

QStringList rowsText(Connection& connection, const QString& sql, const QVariantList& params)
{
    QStringList rows;
    Recordset rs;
    for (rs.open(sql, connection, Cursor::Static, Lock::ReadOnly, params); !rs.eof(); rs.moveNext()) {
        QStringList fields;
        for (int i = 0; i < rs.fieldCount(); ++i) {
            const QVariant v = rs.value(i);
            if (v.isNull())
                fields << QStringLiteral("-");
            else
                fields << (v.typeId() == QMetaType::Double ? QString::number(v.toDouble(), 'f', QLocale::FloatingPointShortest) : v.toString());
        }
        rows << fields.join(u'|');
    }
    return rows;
}

}  // namespace quotas::test
