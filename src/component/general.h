#pragma once

#include <QObject>
#include <QString>
#include <QVariant>

namespace quotas {

// The dues component's one public class. The host creates it, calls Login
// once, then the other methods; each shows one window or report and, except
// ImportarQuotas, returns when it has closed. Failures are not trapped: they
// pass to the host as the method's exception (QuotasError).
class General : public QObject {
    Q_OBJECT
public:
    explicit General(QObject* parent = nullptr);
    // Releases the shared progress display; connections and windows stay.
    ~General() override;

    // The database maintenance dialog, modal.
    Q_INVOKABLE void CallManutencaoDados();
    // The debt listing's preview, modal.
    Q_INVOKABLE void ListagemDividas();
    // The debt letters' preview, modal.
    Q_INVOKABLE void CartasDividas();
    // The import dialog, not modal: returns at once.
    Q_INVOKABLE void ImportarQuotas();
    // The dues generation dialog, modal.
    Q_INVOKABLE void GerarQuotas();
    // Reads the connection settings and opens both connections. False when a
    // setting is missing (no connection touched); the arguments are not used.
    Q_INVOKABLE bool Login(const QVariant& temp1 = QVariant(), const QVariant& temp2 = QVariant(),
                           const QVariant& temp3 = QVariant());
    // The member dues record window on the rows StrWhere selects, positioned
    // on movement Pkey; Caller's RemoteKey receives the quota_id on closing.
    // Nothing happens for an empty Pkey or when StrWhere selects no row.
    // Rs and Tabela are not used.
    Q_INVOKABLE void Registo(QObject* Rs = nullptr, const QVariant& Pkey = QVariant(), const QString& Tabela = QString(),
                             const QString& StrWhere = QString(), QObject* Caller = nullptr);

    // Beyond the host's original seven, which keep their places above.

    // The dues statement of member socio (socio_id), every active movement,
    // in a modal print preview. Nothing happens for an empty socio.
    Q_INVOKABLE void ExtratoQuotas(const QVariant& socio = QVariant());
    // The month's reconciliation summary: the dialog that chooses the year
    // and month and previews it, modal.
    Q_INVOKABLE void ResumoMes();
    // The import's dry run: the import dialog's choices, then what the
    // import would do with every line of the list, writing nothing; modal.
    Q_INVOKABLE void SimularImportacao();
    // The dialog that takes back a month's generated dues, modal.
    Q_INVOKABLE void AnularGeracao();
};

}  // namespace quotas
