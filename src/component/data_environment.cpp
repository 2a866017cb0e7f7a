#include "component/data_environment.h"

#include "platform/errors.h"

namespace quotas {

Recordset& Command::execute()
{
    if (!m_recordset.isOpen()) {
        if (m_text.isEmpty())
            throw QuotasError(QStringLiteral("O comando \"%1\" não tem texto.").arg(m_name));
        m_recordset.open(m_text, m_connection, Cursor::Static, Lock::ReadOnly);
    }
    return m_recordset;
}

DataEnvironment::DataEnvironment()
    : Command1(QStringLiteral("Command1"), QString(), SqlServer),
      Command2(QStringLiteral("Command2"), QStringLiteral("select * from tbsexos"), SqlServer),
      Meses(QStringLiteral("Meses"), QStringLiteral("Select *, code + ' - ' + descrit as completo from tbmeses"), SqlServer),
      Extras(QStringLiteral("Extras"), QStringLiteral("SELECT * FROM Extras"), SqlServer_Prints),
      // The debt is compared in whole cents: SQLite keeps REAL amounts, where
      // 1.10 - 0.10 is a hair above 1. Names in Portuguese order on both
      // engines, a member without a name first; equal names keep the
      // accounts' order.
      Dividas(QStringLiteral("Dividas"),
              QStringLiteral("select tbQuotas_Socios.*,total_quotas - total_pago as total_divida,tbSocios.no_tap,"
                             "tbsocios.nome,tbsocios.morada1,tbsocios.code_postal1 + ' ' + tbsocios.localidade1 as "
                             "Codigo_Postal from (tbQuotas_Socios left outer join tbsocios on tbquotas_socios.socio_id "
                             "= tbsocios.socio_id) where round(total_quotas - total_pago, 2) > 1 order by tbsocios.nome "
                             "COLLATE portugues NULLS FIRST, tbQuotas_Socios.squota_id"),
              SqlServer_Prints)
{
}

Command& DataEnvironment::command(const QString& name)
{
    for (Command* c : {&Command1, &Command2, &Meses, &Extras, &Dividas}) {
        if (c->name().compare(name, Qt::CaseInsensitive) == 0)
            return *c;
    }
    throw QuotasError(QStringLiteral("O comando \"%1\" não existe.").arg(name));
}

}  // namespace quotas
