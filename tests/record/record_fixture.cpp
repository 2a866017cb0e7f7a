#include "record_fixture.h"

#include "component/shared_objects.h"
#include "platform/recordset.h"

#include <QApplication>
#include <QDate>
#include <QPointer>
#include <QTest>
#include <QTimer>

namespace quotas::test {

void RecordFixture::addMember(int id)
{
    m_db.connection().execute(
        QStringLiteral("INSERT INTO tbSocios (socio_id, no_tap, nome, nome_guerra) VALUES (?, ?, ?, ?)"),
        {id, QStringLiteral("T%1").arg(id), QStringLiteral("Maria João Conceição %1").arg(id), QStringLiteral("Mimi")});
}

QVariant RecordFixture::addMovement(int socio, const MovementRow& row)
{
    Connection& c = m_db.connection();
    const int tipo = row.ref == QLatin1String("Sindicato") ? 1 : 2;
    c.execute(QStringLiteral("INSERT INTO tbQuotas_Movimentos (socio_id, data, ano, mes, tipo, ref, quota_no, rend1, "
                             "rend2, quota, pago) VALUES (?, ?, ?, ?, ?, ?, ?, ?, ?, ?, ?)"),
              {socio, QDate(row.ano, row.mes, 5), row.ano, row.mes, tipo, row.ref, 700 + row.mes, row.rend1, row.rend2,
               row.quota, row.pago});
    return c.scalar(QStringLiteral("SELECT max(quota_id) FROM tbQuotas_Movimentos"));
}

void RecordFixture::addAccount(int socio, double totalQuotas, double totalPago)
{
    m_db.connection().execute(
        QStringLiteral("INSERT INTO tbQuotas_Socios (socio_id, ult_ano, ult_mes, ult_rend1, ult_rend2, "
                       "ult_quota_sindicato, ult_perc_sindicato, ult_quota_seguro, ult_perc_seguro, total_quotas, "
                       "total_pago) VALUES (?, 2001, 11, 1.0, 2.0, 3.0, 0.5, 4.0, 0.25, ?, ?)"),
        {socio, totalQuotas, totalPago});
}

QVariant RecordFixture::movement(const QVariant& quotaId, const QString& column)
{
    return m_db.connection().scalar(QStringLiteral("SELECT %1 FROM tbQuotas_Movimentos WHERE quota_id = ?").arg(column),
                                    {quotaId});
}

QVariant RecordFixture::account(int socio, const QString& column)
{
    return m_db.connection().scalar(QStringLiteral("SELECT %1 FROM tbQuotas_Socios WHERE socio_id = ?").arg(column),
                                    {socio});
}

bool RecordFixture::hasAccount(int socio)
{
    return m_db.connection()
               .scalar(QStringLiteral("SELECT count(*) FROM tbQuotas_Socios WHERE socio_id = ?"), {socio})
               .toInt()
           > 0;
}

QString RecordFixture::movementsOf(int socio)
{
    return QStringLiteral("SELECT tbQuotas_Movimentos.*, tbSocios.no_tap, tbSocios.nome, tbSocios.nome_guerra "
                          "FROM tbQuotas_Movimentos INNER JOIN tbSocios ON tbQuotas_Movimentos.socio_id = "
                          "tbSocios.socio_id WHERE tbQuotas_Movimentos.socio_id = %1 ORDER BY ano, mes, tipo")
        .arg(socio);
}

bool RecordFixture::open(int socio, const QVariant& pkey, const std::function<void(FrmQuota&)>& script, QObject* caller)
{
    bool ran = false;
    QTimer poll;
    poll.setInterval(2);
    QObject::connect(&poll, &QTimer::timeout, [&] {
        QPointer<FrmQuota> frm = qobject_cast<FrmQuota*>(shared().frmQuota.data());
        if (ran || !frm || !frm->isVisible() || frm->Timer1->isActive())
            return;
        ran = true;
        poll.stop();
        QApplication::setActiveWindow(frm);
        if (!QTest::qWaitForWindowActive(frm))
            qWarning("the record window did not become active");
        script(*frm);
        if (frm && frm->isVisible())
            frm->close();
    });
    poll.start();
    general.Registo(nullptr, pkey, QString(), movementsOf(socio), caller);
    poll.stop();
    return ran;
}

void RecordFixture::tabOut(QWidget* field)
{
    QTest::keyClick(field, Qt::Key_Tab);
}

void RecordFixture::click(QPushButton* button)
{
    QTest::mouseClick(button, Qt::LeftButton);
}

void RecordFixture::type(QLineEdit* field, const QString& text)
{
    field->setFocus(Qt::MouseFocusReason);
    if (text.isEmpty())
        QTest::keyClick(field, Qt::Key_Delete);
    else
        QTest::keyClicks(field, text);
}

}  // namespace quotas::test
