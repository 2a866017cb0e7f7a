#pragma once

#include "component/data_environment.h"

#include <QObject>
#include <QPointer>
#include <QStringList>
#include <QWidget>
#include <memory>

namespace quotas {

// The objects every General of one host thread shares. Each exists at most
// once per thread and is created by the first method that needs it; windows
// that unload themselves (deleted on close) leave their pointer null, so the
// next call builds a fresh one.
struct SharedObjects {
    std::unique_ptr<DataEnvironment> data;

    QPointer<QWidget> frmGerarQuotas;
    QPointer<QWidget> frmImportarQuotas;
    QPointer<QWidget> frmQuota;
    QPointer<QWidget> frmManutencaoDados;

    QPointer<QObject> prtListagemDividas;
    QPointer<QObject> prtCartasDividas;
    QPointer<QObject> prtExtra;

    // The progress display of the dues generation run; released when a
    // General object terminates.
    std::unique_ptr<QObject> progress;

    // Amounts in the import source are whole cents (no decimal point).
    bool SemSeparadorDecimal = false;
    // Why each line of the last import's rejects was left out, in the order
    // they were written to extras. Kept here rather than in a column, since
    // extras belongs to the host's database and keeps its shape.
    QStringList rejectReasons;
};

SharedObjects& shared();

// The data environment, created on first use.
DataEnvironment& Data();

// Closes and drops this thread's shared objects. The host and the command
// line call it before the application object goes, since windows and
// connections must not outlive it.
void releaseShared();

}  // namespace quotas
