#include "host/main_window.h"

#include "component/general.h"
#include "component/money.h"
#include "component/shared_objects.h"
#include "platform/errors.h"
#include "platform/late_binding.h"
#include "platform/message_boxes.h"
#include "platform/recordset.h"
#include "record/record_text.h"

#include <QHeaderView>
#include <QMenuBar>
#include <QMetaMethod>
#include <QSignalBlocker>
#include <QSplitter>
#include <QStatusBar>
#include <QTableWidget>

namespace host {

namespace {

QString captionOf(const QByteArray& method)
{
    static const QHash<QByteArray, QString> captions = {
        {"CallManutencaoDados", QStringLiteral("&Manutenção de Dados")},
        {"ListagemDividas", QStringLiteral("&Listagem de Dívidas")},
        {"CartasDividas", QStringLiteral("&Cartas de Dívidas")},
        {"ImportarQuotas", QStringLiteral("&Importar Quotas")},
        {"GerarQuotas", QStringLiteral("&Gerar Quotas")},
        {"AnularGeracao", QStringLiteral("&Anular Geração")},
        {"Login", QStringLiteral("Ligar à &Base de Dados")},
        {"Registo", QStringLiteral("&Registo de Quota")},
        {"ExtratoQuotas", QStringLiteral("&Extrato de Quotas")},
        {"ResumoMes", QStringLiteral("Res&umo do Mês")},
    };
    return captions.value(method, QString::fromLatin1(method));
}

QTableWidgetItem* cell(const QString& text, bool number = false)
{
    auto* item = new QTableWidgetItem(text);
    item->setFlags(item->flags() & ~Qt::ItemIsEditable);
    if (number)
        item->setTextAlignment(Qt::AlignRight | Qt::AlignVCenter);
    return item;
}

QTableWidget* table(QWidget* parent, const QStringList& headers, int stretch)
{
    auto* t = new QTableWidget(parent);
    t->setColumnCount(int(headers.size()));
    t->setHorizontalHeaderLabels(headers);
    t->setSelectionBehavior(QAbstractItemView::SelectRows);
    t->setSelectionMode(QAbstractItemView::SingleSelection);
    t->verticalHeader()->hide();
    t->verticalHeader()->setDefaultSectionSize(t->fontMetrics().height() + 6);
    t->horizontalHeader()->setSectionResizeMode(QHeaderView::ResizeToContents);
    t->horizontalHeader()->setSectionResizeMode(stretch, QHeaderView::Stretch);
    return t;
}

// The row whose first cell carries key, -1 when none does.
int rowOf(const QTableWidget* t, const QVariant& key)
{
    if (!key.isValid() || key.isNull())
        return -1;
    for (int row = 0; row < t->rowCount(); ++row) {
        if (t->item(row, 0)->data(Qt::UserRole).toLongLong() == key.toLongLong())
            return row;
    }
    return -1;
}

QVariant keyOf(const QTableWidget* t)
{
    const int row = t->currentRow();
    return row < 0 ? QVariant() : t->item(row, 0)->data(Qt::UserRole);
}

// The text the record window browses: the member's movements with the
// member's staff number and names.
QString movementsOf(const QVariant& socio)
{
    return QStringLiteral("SELECT tbQuotas_Movimentos.*, tbSocios.no_tap, tbSocios.nome, tbSocios.nome_guerra "
                          "FROM tbQuotas_Movimentos INNER JOIN tbSocios ON tbQuotas_Movimentos.socio_id = "
                          "tbSocios.socio_id WHERE tbQuotas_Movimentos.socio_id = %1 ORDER BY ano, mes, tipo")
        .arg(socio.toLongLong());
}

}  // namespace

MainWindow::MainWindow(quotas::General& general, QWidget* parent)
    : QMainWindow(parent),
      m_general(general),
      m_members(table(this, {QStringLiteral("Nº Empresa"), QStringLiteral("Nome"), QStringLiteral("Total Quotas"), QStringLiteral("Total Pago"), QStringLiteral("Em Dívida")},
                      1)),
      m_movements(table(this,
                        {QStringLiteral("Data"), QStringLiteral("Ano"), QStringLiteral("Mês"), QStringLiteral("Número"),
                         QStringLiteral("Tipo"), QStringLiteral("Remuneração (1)"), QStringLiteral("Remuneração (2)"),
                         QStringLiteral("Quota"), QStringLiteral("Pago")},
                        4))
{
    setWindowTitle(QStringLiteral("Sindicato - Registo de Associados"));
    m_members->setObjectName(QStringLiteral("members"));
    m_movements->setObjectName(QStringLiteral("movements"));
    auto* split = new QSplitter(Qt::Vertical, this);
    split->addWidget(m_members);
    split->addWidget(m_movements);
    split->setStretchFactor(0, 3);
    split->setStretchFactor(1, 2);
    setCentralWidget(split);
    connect(m_members, &QTableWidget::currentCellChanged, this, [this](int row, int, int previous) {
        if (row != previous)
            refreshMovements();
    });
    connect(m_movements, &QTableWidget::cellDoubleClicked, this, [this](int row) {
        const QVariant key = m_movements->item(row, 0)->data(Qt::UserRole);
        try {
            openMovement(key);
        } catch (const quotas::QuotasError& e) {
            quotas::msgBox(e.message(), quotas::Buttons::Ok, quotas::Icon::Critical);
        }
        refreshMembers();
    });

    // One entry per method of General, in the order of its interface.
    QMenu* menu = menuBar()->addMenu(QStringLiteral("&Quotas"));
    const QMetaObject& meta = quotas::General::staticMetaObject;
    QList<QByteArray> seen;
    for (int i = meta.methodOffset(); i < meta.methodCount(); ++i) {
        const QByteArray name = meta.method(i).name();
        if (meta.method(i).methodType() != QMetaMethod::Method || seen.contains(name))
            continue;
        seen << name;
        QAction* action = menu->addAction(captionOf(name));
        action->setObjectName(QString::fromLatin1(name));
        connect(action, &QAction::triggered, this, [this, name] { call(name); });
    }
    menu->addSeparator();
    menu->addAction(QStringLiteral("&Sair"), this, &QWidget::close);
    resize(900, 600);
}

void MainWindow::call(const QByteArray& method)
{
    try {
        if (method == "Registo")
            openRecord();
        else if (method == "ExtratoQuotas") {
            if (currentMember().isValid())
                m_general.ExtratoQuotas(currentMember());
            else
                quotas::msgBox(QStringLiteral("Escolha um associado."), quotas::Buttons::Ok, quotas::Icon::Information);
        } else if (method == "Login") {
            if (!m_general.Login())
                quotas::msgBox(QStringLiteral("A configuração da base de dados está incompleta."), quotas::Buttons::Ok,
                               quotas::Icon::Exclamation);
        } else
            quotas::callByName(&m_general, method.constData());
    } catch (const quotas::QuotasError& e) {
        quotas::msgBox(e.message(), quotas::Buttons::Ok, quotas::Icon::Critical);
    }
    refreshMembers();
}

QVariant MainWindow::currentMember() const
{
    return keyOf(m_members);
}

QVariant MainWindow::currentMovement() const
{
    return keyOf(m_movements);
}

void MainWindow::openRecord()
{
    if (!currentMember().isValid()) {
        quotas::msgBox(QStringLiteral("Escolha primeiro um associado."), quotas::Buttons::Ok, quotas::Icon::Information);
        return;
    }
    // The selected movement, else the member's latest.
    QVariant key = currentMovement();
    if (!key.isValid() && m_movements->rowCount() > 0)
        key = m_movements->item(0, 0)->data(Qt::UserRole);
    if (!key.isValid()) {
        quotas::msgBox(QStringLiteral("Este associado não tem movimentos de quotas."), quotas::Buttons::Ok,
                       quotas::Icon::Information);
        return;
    }
    openMovement(key);
}

void MainWindow::openMovement(const QVariant& quotaId)
{
    const QVariant socio = currentMember();
    if (!socio.isValid())
        return;
    m_general.Registo(nullptr, quotaId, QString(), movementsOf(socio), this);
}

void MainWindow::RemoteKey(const QVariant& quotaId)
{
    refreshMembers();
    refreshMovements(quotaId);
}

void MainWindow::refreshMovements(const QVariant& select)
{
    const QSignalBlocker blocker(m_movements);
    m_movements->setRowCount(0);
    const QVariant socio = currentMember();
    quotas::Connection& connection = quotas::Data().SqlServer;
    if (!socio.isValid() || !connection.isOpen())
        return;
    quotas::Recordset rs;
    try {
        rs.open(QStringLiteral("SELECT quota_id, data, ano, mes, quota_no, ref, rend1, rend2, quota, pago "
                               "FROM tbQuotas_Movimentos WHERE socio_id = ? ORDER BY ano DESC, mes DESC, tipo"),
                connection, quotas::Cursor::ForwardOnly, quotas::Lock::ReadOnly, {socio});
    } catch (const quotas::QuotasError& e) {
        statusBar()->showMessage(e.message());
        return;
    }
    m_movements->setRowCount(rs.recordCount());
    const QLocale locale;
    auto money = [&](int column) {
        const QVariant v = rs.value(column);
        return cell(v.isNull() ? QString() : quotas::formatMoney(v.toDouble(), locale), true);
    };
    for (int row = 0; !rs.eof(); rs.moveNext(), ++row) {
        auto* date = cell(quotas::formatDataQuota(rs.value(1)));
        date->setData(Qt::UserRole, rs.value(0));
        m_movements->setItem(row, 0, date);
        for (int column = 2; column <= 4; ++column)
            m_movements->setItem(row, column - 1, cell(rs.value(column).toString(), true));
        m_movements->setItem(row, 4, cell(rs.value(5).toString()));
        for (int column = 6; column <= 9; ++column)
            m_movements->setItem(row, column - 1, money(column));
    }
    const int selected = rowOf(m_movements, select);
    if (selected >= 0)
        m_movements->setCurrentCell(selected, 0);
}

void MainWindow::refreshMembers()
{
    quotas::Connection& connection = quotas::Data().SqlServer;
    if (!connection.isOpen())
        return;
    quotas::Recordset rs;
    try {
        rs.open(QStringLiteral("SELECT tbSocios.socio_id, tbSocios.no_tap, tbSocios.nome, tbQuotas_Socios.total_quotas, "
                               "tbQuotas_Socios.total_pago FROM tbSocios LEFT OUTER JOIN tbQuotas_Socios ON "
                               "tbSocios.socio_id = tbQuotas_Socios.socio_id ORDER BY tbSocios.nome"),
                connection, quotas::Cursor::ForwardOnly, quotas::Lock::ReadOnly);
    } catch (const quotas::QuotasError& e) {
        statusBar()->showMessage(e.message());
        return;
    }
    const QVariant member = currentMember();
    const QVariant movement = currentMovement();
    const QSignalBlocker blocker(m_members);
    m_members->setRowCount(rs.recordCount());
    const QLocale locale;
    for (int row = 0; !rs.eof(); rs.moveNext(), ++row) {
        auto* number = cell(rs.value(1).toString());
        number->setData(Qt::UserRole, rs.value(0));
        m_members->setItem(row, 0, number);
        m_members->setItem(row, 1, cell(rs.value(2).toString()));
        const bool hasAccount = !rs.value(3).isNull();
        const double charged = rs.value(3).toDouble();
        const double paid = rs.value(4).toDouble();
        m_members->setItem(row, 2, cell(hasAccount ? quotas::formatMoney(charged, locale) : QString(), true));
        m_members->setItem(row, 3, cell(hasAccount ? quotas::formatMoney(paid, locale) : QString(), true));
        m_members->setItem(row, 4, cell(hasAccount ? quotas::formatMoney(charged - paid, locale) : QString(), true));
    }
    // The member chosen before stays chosen; at the start, the first one.
    const int selected = rowOf(m_members, member);
    if (selected >= 0 || m_members->rowCount() > 0)
        m_members->setCurrentCell(std::max(selected, 0), 0);
    refreshMovements(movement);
    statusBar()->showMessage(QStringLiteral("%1 associados").arg(m_members->rowCount()));
}

}  // namespace host
