#include "host/main_window.h"

#include "component/general.h"
#include "component/money.h"
#include "component/shared_objects.h"
#include "host/member_register.h"
#include "platform/errors.h"
#include "platform/late_binding.h"
#include "platform/message_boxes.h"
#include "platform/recordset.h"
#include "record/record_text.h"

#include <QHBoxLayout>
#include <QHeaderView>
#include <QKeyEvent>
#include <QLabel>
#include <QLineEdit>
#include <QMenuBar>
#include <QMetaMethod>
#include <QSignalBlocker>
#include <QSplitter>
#include <QStatusBar>
#include <QTableView>
#include <QTableWidget>
#include <QVBoxLayout>
#include <memory>

namespace host {

namespace {

// The menu: first the steps of a month's work, each with a key of its own,
// then every other method of General.
struct Entry {
    const char* method;
    const char* caption;
    QKeySequence key;
};
const Entry kEntries[] = {
    {"GerarQuotas", "&Gerar Quotas", Qt::Key_F2},
    {"ImportarQuotas", "&Importar Quotas", Qt::Key_F3},
    {"Registo", "&Registo de Quota", Qt::Key_F4},
    {"CallManutencaoDados", "&Manutenção de Dados", Qt::Key_F5},
    {"ListagemDividas", "&Listagem de Dívidas", Qt::Key_F6},
    {"CartasDividas", "&Cartas de Dívidas", Qt::Key_F7},
    {nullptr, nullptr, {}},
    {"ExtratoQuotas", "&Extrato de Quotas", {}},
    {"ResumoMes", "Res&umo do Mês", {}},
    {"SimularImportacao", "Simular Im&portação", {}},
    {"AnularGeracao", "&Anular Geração", {}},
    {"Login", "Ligar à &Base de Dados", {}},
};

QTableWidgetItem* cell(const QString& text, bool number = false)
{
    auto* item = new QTableWidgetItem(text);
    item->setFlags(item->flags() & ~Qt::ItemIsEditable);
    if (number)
        item->setTextAlignment(Qt::AlignRight | Qt::AlignVCenter);
    return item;
}

template <typename View>
void setUpList(View* v)
{
    v->setSelectionBehavior(QAbstractItemView::SelectRows);
    v->setSelectionMode(QAbstractItemView::SingleSelection);
    v->setEditTriggers(QAbstractItemView::NoEditTriggers);
    v->verticalHeader()->hide();
    v->verticalHeader()->setSectionResizeMode(QHeaderView::Fixed);
    v->verticalHeader()->setDefaultSectionSize(v->fontMetrics().height() + 6);
    // Fixed widths: sizing a column to its contents reads every row.
    v->horizontalHeader()->setSectionResizeMode(QHeaderView::Interactive);
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
      m_register(new MemberRegister(this)),
      m_filter(new MemberFilter(this)),
      m_search(new QLineEdit(this)),
      m_members(new QTableView(this)),
      m_movements(new QTableWidget(this)),
      m_status(new QLabel(this))
{
    setWindowTitle(QStringLiteral("Sindicato - Registo de Associados"));
    m_filter->setSourceModel(m_register);
    m_members->setObjectName(QStringLiteral("members"));
    m_members->setModel(m_filter);
    setUpList(m_members);
    m_members->setSortingEnabled(true);
    m_members->sortByColumn(MemberRegister::Nome, Qt::AscendingOrder);
    const int digit = m_members->fontMetrics().horizontalAdvance(u'0');
    const std::pair<int, int> widths[] = {{0, 12}, {2, 16}, {3, 16}, {4, 16}};  // in digits
    for (const auto& [column, digits] : widths)
        m_members->setColumnWidth(column, digit * digits);
    m_members->horizontalHeader()->setSectionResizeMode(MemberRegister::Nome, QHeaderView::Stretch);

    m_movements->setObjectName(QStringLiteral("movements"));
    m_movements->setColumnCount(9);
    m_movements->setHorizontalHeaderLabels({QStringLiteral("Data"), QStringLiteral("Ano"), QStringLiteral("Mês"),
                                            QStringLiteral("Número"), QStringLiteral("Tipo"), QStringLiteral("Remuneração (1)"),
                                            QStringLiteral("Remuneração (2)"), QStringLiteral("Quota"), QStringLiteral("Pago")});
    setUpList(m_movements);
    m_movements->horizontalHeader()->setStretchLastSection(true);

    m_search->setObjectName(QStringLiteral("search"));
    m_search->setPlaceholderText(QStringLiteral("Número de empresa ou nome"));
    m_search->setClearButtonEnabled(true);
    auto* searchLabel = new QLabel(QStringLiteral("&Procurar:"), this);
    searchLabel->setBuddy(m_search);
    auto* searchRow = new QHBoxLayout;
    searchRow->addWidget(searchLabel);
    searchRow->addWidget(m_search, 1);

    auto* split = new QSplitter(Qt::Vertical, this);
    split->addWidget(m_members);
    split->addWidget(m_movements);
    split->setStretchFactor(0, 3);
    split->setStretchFactor(1, 2);
    auto* central = new QWidget(this);
    auto* column = new QVBoxLayout(central);
    column->addLayout(searchRow);
    column->addWidget(split, 1);
    setCentralWidget(central);
    // Permanent, so that the menu's hints do not wipe it.
    statusBar()->addPermanentWidget(m_status, 1);

    connect(m_search, &QLineEdit::textChanged, this, [this](const QString& text) {
        const QVariant member = currentMember();
        m_filter->setSearch(text);
        selectFirstUnless(member);
        if (currentMember() != member)
            refreshMovements();
        showStatus();
    });
    connect(m_members->selectionModel(), &QItemSelectionModel::currentRowChanged, this,
            [this] { refreshMovements(); });
    auto open = [this](const QVariant& key) {
        try {
            openMovement(key);
        } catch (const quotas::QuotasError& e) {
            quotas::msgBox(e.message(), quotas::Buttons::Ok, quotas::Icon::Critical);
        }
    };
    connect(m_movements, &QTableWidget::cellActivated, this,
            [this, open](int row) { open(m_movements->item(row, 0)->data(Qt::UserRole)); });
    connect(m_members, &QTableView::activated, this, [this] { m_movements->setFocus(); });

    QMenu* menu = menuBar()->addMenu(QStringLiteral("&Quotas"));
    const auto add = [this, menu](const QByteArray& method, const QString& caption, const QKeySequence& key) {
        QAction* action = menu->addAction(caption);
        action->setObjectName(QString::fromLatin1(method));
        action->setShortcut(key);
        connect(action, &QAction::triggered, this, [this, method] { call(method); });
    };
    QList<QByteArray> listed;
    for (const Entry& e : kEntries) {
        if (!e.method) {
            menu->addSeparator();
            continue;
        }
        listed << e.method;
        add(e.method, QString::fromUtf8(e.caption), e.key);
    }
    // A method General gained and the list above does not know yet.
    const QMetaObject& meta = quotas::General::staticMetaObject;
    for (int i = meta.methodOffset(); i < meta.methodCount(); ++i) {
        const QByteArray name = meta.method(i).name();
        if (meta.method(i).methodType() == QMetaMethod::Method && !listed.contains(name)) {
            listed << name;
            add(name, QString::fromLatin1(name), {});
        }
    }
    QAction* find = menu->addAction(QStringLiteral("&Procurar Associado"));
    find->setShortcut(QKeySequence::Find);
    connect(find, &QAction::triggered, this, [this] { m_search->setFocus(); m_search->selectAll(); });
    menu->addSeparator();
    menu->addAction(QStringLiteral("&Sair"), QKeySequence(Qt::CTRL | Qt::Key_Q), this, &QWidget::close);
    resize(900, 600);
}

void MainWindow::call(const QByteArray& method)
{
    try {
        if (method == "Registo") {
            openRecord();
            return;  // the record window's closing refreshes
        }
        if (method == "ExtratoQuotas") {
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
    if (method == "ImportarQuotas") {
        // The import dialog stays open beside the register; the register is
        // read again once it has closed, after its run.
        if (QWidget* dialog = quotas::shared().frmImportarQuotas)
            connect(dialog, &QObject::destroyed, this, &MainWindow::importClosed, Qt::UniqueConnection);
        return;
    }
    refreshMembers();
}

void MainWindow::importClosed()
{
    refreshMembers();
}

QVariant MainWindow::currentMember() const
{
    const QModelIndex current = m_members->currentIndex();
    return current.isValid() ? current.data(MemberRegister::KeyRole) : QVariant();
}

QVariant MainWindow::currentMovement() const
{
    const int row = m_movements->currentRow();
    return row < 0 ? QVariant() : m_movements->item(row, 0)->data(Qt::UserRole);
}

void MainWindow::selectMember(const QVariant& socioId)
{
    placeSelection(socioId);
    refreshMovements();
}

void MainWindow::placeSelection(const QVariant& socioId)
{
    const int row = socioId.isValid() ? m_register->rowOf(socioId.toLongLong()) : -1;
    const QModelIndex index = row < 0 ? QModelIndex() : m_filter->mapFromSource(m_register->index(row, 0));
    const QSignalBlocker blocker(m_members->selectionModel());
    if (!index.isValid()) {
        m_members->selectionModel()->clear();
        return;
    }
    m_members->setCurrentIndex(index);
    m_members->selectRow(index.row());
    m_members->scrollTo(index);
}

void MainWindow::selectFirstUnless(const QVariant& socioId)
{
    placeSelection(socioId);
    if (!currentMember().isValid() && m_filter->rowCount() > 0)
        placeSelection(m_filter->index(0, 0).data(MemberRegister::KeyRole));
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
    m_inRecord = true;
    m_returnedKey = quotaId;
    const std::shared_ptr<void> refresh(nullptr, [this](void*) {
        m_inRecord = false;
        refreshMembers(m_returnedKey);
    });
    m_general.Registo(nullptr, quotaId, QString(), movementsOf(socio), this);
}

void MainWindow::RemoteKey(const QVariant& quotaId)
{
    if (m_inRecord)
        m_returnedKey = quotaId;
    else
        refreshMembers(quotaId);
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
        m_status->setText(e.message());
        return;
    }
    m_movements->setRowCount(rs.recordCount());
    const QLocale locale;
    auto money = [&](int column) {
        const QVariant v = rs.value(column);
        return cell(v.isNull() ? QString() : quotas::formatMoney(v.toDouble(), locale), true);
    };
    int selected = -1;
    for (int row = 0; !rs.eof(); rs.moveNext(), ++row) {
        auto* date = cell(quotas::formatDataQuota(rs.value(1)));
        date->setData(Qt::UserRole, rs.value(0));
        if (select.isValid() && rs.value(0).toLongLong() == select.toLongLong())
            selected = row;
        m_movements->setItem(row, 0, date);
        for (int column = 2; column <= 4; ++column)
            m_movements->setItem(row, column - 1, cell(rs.value(column).toString(), true));
        m_movements->setItem(row, 4, cell(rs.value(5).toString()));
        for (int column = 6; column <= 9; ++column)
            m_movements->setItem(row, column - 1, money(column));
    }
    m_movements->resizeColumnsToContents();  // a member's movements are few
    if (selected >= 0)
        m_movements->setCurrentCell(selected, 0);
}

void MainWindow::refreshMembers(const QVariant& movement)
{
    quotas::Connection& connection = quotas::Data().SqlServer;
    if (!connection.isOpen())
        return;
    ++m_refreshes;
    const QVariant member = currentMember();
    const QVariant keep = movement.isValid() ? movement : currentMovement();
    try {
        m_register->reload(connection);
    } catch (const quotas::QuotasError& e) {
        m_status->setText(e.message());
        return;
    }
    // The member chosen before stays chosen; at the start, the first one.
    selectFirstUnless(member);
    refreshMovements(keep);
    showStatus();
}

void MainWindow::showStatus()
{
    QStringList parts;
    const int shown = m_filter->rowCount(), all = m_register->rowCount();
    parts << (shown == all ? QStringLiteral("%1 associados").arg(all)
                           : QStringLiteral("%1 de %2 associados").arg(shown).arg(all));
    if (m_register->staleCount() > 0)
        parts << QStringLiteral("%1 com totais guardados desactualizados (*): a \"Manutenção de Dados\" reconstrói-os")
                     .arg(m_register->staleCount());
    else if (all > 0 && !m_register->hasDues())
        parts << QStringLiteral("Ainda não há quotas: comece por \"Gerar Quotas\" (F2)");
    m_status->setText(parts.join(QStringLiteral(" · ")));
}

}  // namespace host
