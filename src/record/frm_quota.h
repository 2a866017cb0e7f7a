#pragma once

#include <QDialog>
#include <QHash>
#include <QPointer>
#include <QVariant>
#include <QVariantList>
#include <functional>
#include <memory>

class QGroupBox;
class QLabel;
class QLineEdit;
class QPushButton;
class QTimer;

namespace quotas {

class General;
class QuotasError;
class Recordset;

// The member dues record window "Quota": one movement of one member, with
// its remunerations and participation open to correction, a payment
// ("&Liquidar"), the cancellation of the charge ("&Anular") and "&Sair".
// General::Registo opens it on the rows the host selects; when it closes,
// for whatever reason, the host object's RemoteKey receives the quota_id.
// The window deletes itself on closing, so each Registo loads a fresh one.
class FrmQuota : public QDialog {
    Q_OBJECT
public:
    explicit FrmQuota(QWidget* parent = nullptr);
    ~FrmQuota() override;

    // What Registo hands over: the General that opened the window (kept, not
    // used further) and the host object to notify (nullptr for none).
    void setOwner(General* owner);
    void setCaller(QObject* caller);
    // Binds Adodc1 to rows and positions it: the first row, then forward to
    // quota_id = pkey, back to the first row when there is none.
    void bind(std::shared_ptr<Recordset> rows, const QVariant& pkey);

    // The save step: the movement's values become the account's last values,
    // then the movement is saved. Nothing happens while GravarPendente is
    // false or nothing in the row was changed.
    // false. Throws DbError; nothing is written then.
    void Gravar();

    // Set by the data control before every move; nothing sets it back.
    bool GravarPendente = false;
    // The data control: the rows Registo opened, on the movement shown.
    std::shared_ptr<Recordset> Adodc1;

    QGroupBox* Frame1;      // "Quota"
    QGroupBox* Frame2;      // "Importancias:"
    QGroupBox* Frame3;      // "Associado:"
    QLineEdit* Text1;       // data
    QLineEdit* Text2;       // ano
    QLineEdit* Text3;       // mes
    QLineEdit* Text4;       // quota_no
    QLineEdit* Text5;       // rend1, editable
    QLineEdit* Text6;       // rend2, editable
    QLineEdit* Text7;       // ref
    QLineEdit* Text8;       // participation, editable, not bound
    QLineEdit* Text9;       // quota
    QLineEdit* Text10;      // no_tap
    QLineEdit* Text11;      // nome
    QLineEdit* Text12;      // nome_guerra
    QLineEdit* Text13;      // the unpaid part, not bound
    QPushButton* Command1;  // "&Anular"
    QPushButton* Command2;  // "&Liquidar"
    QPushButton* Command3;  // "&Sair"
    QTimer* Timer1;         // the one-shot refresh after opening

public slots:
    // Every way of closing ends here: the unload step, then the window goes.
    void done(int result) override;

protected:
    bool eventFilter(QObject* watched, QEvent* event) override;
    void keyPressEvent(QKeyEvent* event) override;
    void closeEvent(QCloseEvent* event) override;

private:
    void buildControls();
    // Typed values not saved: in the row, or in the field being edited.
    bool hasUnsavedEdits() const;
    void load();

    void Timer1_Timer();
    void Command1_Click();  // cancellation
    void Command2_Click();  // payment
    void Command3_Click();  // Sair
    void unload();

    // Shows the bound columns of the current row in their display formats.
    void showRow();
    void showDue();
    void showPorLiquidar();

    // Amount editing: entering prepares the text; leaving validates and
    // gives the refusal's message, or an empty text when it accepts.
    bool isAmountField(const QObject* object) const;
    void enterField(QLineEdit* field);
    QString leaveField(QLineEdit* field);
    QString leaveRemuneration(QLineEdit* field, const QString& column, const QString& otherColumn);
    QString leaveParticipation();
    double participation() const;
    void refuse(const QString& message);
    static QString invalidValue();
    // Validates the field that has the focus before a button acts on the
    // row, as leaving it would; false when it refuses.
    bool validateActiveField();

    // Gravar with a failure shown to the user; false when it failed.
    bool gravarOrTell();
    void tell(const QString& what, const QuotasError& error);
    // Runs an event handler; a failure is shown instead of escaping into
    // the event loop.
    void guarded(const std::function<void()>& handler);

    QPointer<General> m_owner;
    QPointer<QObject> m_caller;
    // The movement's amounts as last read or saved, for the cancellation's
    // check that nobody changed them meanwhile.
    QVariantList m_asRead;
    // The account's last values when the movement was read, for the save
    // step's check that nobody changed them meanwhile.
    QVariantList m_accountAsRead;
    // What each editable field held when the user entered it.
    QHash<const QLineEdit*, QString> m_textOnEnter;
    QLineEdit* m_restoring = nullptr;
    bool m_validating = false;
    bool m_unloaded = false;
};

}  // namespace quotas
