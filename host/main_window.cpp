#include "host/main_window.h"

#include "component/general.h"
#include "component/money.h"
#include "component/shared_objects.h"
#include "platform/errors.h"
#include "platform/late_binding.h"
#include "platform/message_boxes.h"
#include "platform/recordset.h"

#include <QHeaderView>
#include <QMenuBar>
#include <QMetaMethod>
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
        {"Login", QStringLiteral("Ligar à &Base de Dados")},
        {"Registo", QStringLiteral("&Registo de Quota")},
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

}  // namespace

MainWindow::MainWindow(quotas::General& general, QWidget* parent)
    : QMainWindow(parent), m_general(general), m_members(new QTableWidget(this))
{
    setWindowTitle(QStringLiteral("Sindicato - Registo de Associados"));
    m_members->setColumnCount(5);
    m_members->setHorizontalHeaderLabels({QStringLiteral("Nº Empresa"), QStringLiteral("Nome"),
                                          QStringLiteral("Total Quotas"), QStringLiteral("Total Pago"),
                                          QStringLiteral("Em Dívida")});
    m_members->setSelectionBehavior(QAbstractItemView::SelectRows);
    m_members->setSelectionMode(QAbstractItemView::SingleSelection);
    m_members->verticalHeader()->hide();
    m_members->horizontalHeader()->setSectionResizeMode(1, QHeaderView::Stretch);
    setCentralWidget(m_members);

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
        else if (method == "Login") {
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

void MainWindow::openRecord()
{
    const int row = m_members->currentRow();
    if (row < 0) {
        quotas::msgBox(QStringLiteral("Escolha primeiro um associado."), quotas::Buttons::Ok, quotas::Icon::Information);
        return;
    }
    const QVariant socio = m_members->item(row, 0)->data(Qt::UserRole);
    quotas::Recordset last;
    last.open(QStringLiteral("SELECT quota_id FROM tbQuotas_Movimentos WHERE socio_id = ? ORDER BY ano DESC, mes DESC, tipo"),
              quotas::Data().SqlServer, quotas::Cursor::ForwardOnly, quotas::Lock::ReadOnly, {socio});
    if (last.eof()) {
        quotas::msgBox(QStringLiteral("Este associado não tem movimentos de quotas."), quotas::Buttons::Ok,
                       quotas::Icon::Information);
        return;
    }
    m_general.Registo(nullptr, last.value(0), QString(),
                      QStringLiteral("SELECT tbQuotas_Movimentos.*, tbSocios.no_tap, tbSocios.nome, tbSocios.nome_guerra "
                                     "FROM tbQuotas_Movimentos INNER JOIN tbSocios ON tbQuotas_Movimentos.socio_id = "
                                     "tbSocios.socio_id WHERE tbQuotas_Movimentos.socio_id = %1 ORDER BY ano, mes, tipo")
                          .arg(socio.toLongLong()),
                      this);
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
    const int selected = m_members->currentRow();
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
    if (selected >= 0 && selected < m_members->rowCount())
        m_members->selectRow(selected);
    statusBar()->showMessage(QStringLiteral("%1 associados").arg(m_members->rowCount()));
}

}  // namespace host
