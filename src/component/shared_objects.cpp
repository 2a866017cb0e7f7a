#include "component/shared_objects.h"

namespace quotas {

SharedObjects& shared()
{
    thread_local SharedObjects objects;
    return objects;
}

DataEnvironment& Data()
{
    SharedObjects& s = shared();
    if (!s.data)
        s.data = std::make_unique<DataEnvironment>();
    return *s.data;
}

void releaseShared()
{
    SharedObjects& s = shared();
    s.progress.reset();
    for (QPointer<QWidget>* w : {&s.frmGerarQuotas, &s.frmImportarQuotas, &s.frmQuota, &s.frmManutencaoDados})
        delete w->data();
    for (QPointer<QObject>* o : {&s.prtListagemDividas, &s.prtCartasDividas, &s.prtExtra})
        delete o->data();
    s.data.reset();
}

}  // namespace quotas
