#include "component/general.h"

#include "component/shared_objects.h"
#include "generation/entry.h"
#include "import/entry.h"
#include "maintenance/entry.h"
#include "platform/recordset.h"
#include "record/entry.h"
#include "reports/entry.h"
#include "settings/login.h"

#include <memory>

namespace quotas {

General::General(QObject* parent) : QObject(parent) {}

General::~General()
{
    shared().progress.reset();
}

void General::CallManutencaoDados()
{
    showMaintenanceDialog();
}

void General::ListagemDividas()
{
    showDebtListing();
}

void General::CartasDividas()
{
    showDebtLetters();
}

void General::ImportarQuotas()
{
    showImportDialog();
}

void General::GerarQuotas()
{
    showGenerationDialog();
}

bool General::Login(const QVariant&, const QVariant&, const QVariant&)
{
    DataEnvironment& data = Data();
    return login(data.SqlServer, data.SqlServer_Prints).ok;
}

void General::Registo(QObject*, const QVariant& Pkey, const QString&, const QString& StrWhere, QObject* Caller)
{
    if (!Pkey.isValid() || Pkey.isNull())
        return;
    auto rs = std::make_shared<Recordset>();
    rs->open(StrWhere, Data().SqlServer, Cursor::Dynamic, Lock::Optimistic);
    if (rs->eof())
        return;
    rs->moveFirst();
    showRecordWindow(*this, rs, Pkey, Caller);
}

void General::ExtratoQuotas(const QVariant& socio)
{
    if (!socio.isValid() || socio.isNull())
        return;
    StatementRequest request;
    request.socioId = socio;
    showMemberStatement(request);
}

void General::ResumoMes()
{
    showMonthSummaryDialog();
}

void General::SimularImportacao()
{
    showDryRunDialog();
}

void General::AnularGeracao()
{
    showUndoDialog();
}

}  // namespace quotas
