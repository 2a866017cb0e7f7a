#pragma once

// Shared by the record window's tests and the host's: a test database with
// members 1 and 2, rows added and read back as text, and the record window
// opened through General::Registo with a script run while it is modal.

#include "component/general.h"
#include "component/shared_objects.h"
#include "platform/errors.h"
#include "record/frm_quota.h"
#include "support/scripted_boxes.h"
#include "support/test_database.h"

#include <QApplication>
#include <QLineEdit>
#include <QPointer>
#include <QPushButton>
#include <QSqlQuery>
#include <QTest>
#include <QTimer>

using namespace Qt::StringLiterals;

namespace quotas::test {

struct MovementRow {
    QVariant rend1 = 1000.0, rend2 = 0.0, quota = 15.0, pago = 0.0;
    QString ref = u"Sindicato"_s;
    int ano = 2003, mes = 3;
};

class RecordingCaller : public QObject {
    Q_OBJECT
public:
    QVariantList keys;
    bool fail = false;
    Q_INVOKABLE void RemoteKey(const QVariant& key)
    {
        keys << key;
        if (fail)
            throw QuotasError(u"falhou"_s);
    }
};

// Member socio's movements with the member's columns, as the host selects them.
inline QString movementsOf(int socio)
{
    return u"SELECT tbQuotas_Movimentos.*, tbSocios.no_tap, tbSocios.nome, tbSocios.nome_guerra FROM tbQuotas_Movimentos "
           "INNER JOIN tbSocios ON tbQuotas_Movimentos.socio_id = tbSocios.socio_id "
           "WHERE tbQuotas_Movimentos.socio_id = %1 ORDER BY ano, mes, tipo"_s.arg(socio);
}

// The base of the test objects: every test function starts on an empty
// database holding members 1 ("T1", "Maria João Conceição 1", "Mimi") and 2.
class RecordTest : public QObject {
    Q_OBJECT
protected slots:
    void initTestCase()
    {
        db = std::make_unique<TestDatabase>();
        db->login();
    }
    void cleanupTestCase() { releaseShared(); }
    void init()
    {
        db->clear();
        db->connection().execute(u"INSERT INTO tbSocios (socio_id, no_tap, nome, nome_guerra) VALUES "
                                 "(1, 'T1', 'Maria João Conceição 1', 'Mimi'), (2, 'T2', 'Rui 2', 'Rui')"_s);
    }

protected:
    std::unique_ptr<TestDatabase> db;

    QVariant addMovement(const MovementRow& r)  // member 1's; returns its quota_id
    {
        db->connection().execute(u"INSERT INTO tbQuotas_Movimentos (socio_id, data, ano, mes, tipo, ref, quota_no, rend1, rend2, "
                                 "quota, pago) VALUES (1, ?, ?, ?, ?, ?, ?, ?, ?, ?, ?)"_s,
                                 {QDate(r.ano, r.mes, 5), r.ano, r.mes, r.ref == "Sindicato"_L1 ? 1 : 2, r.ref, 700 + r.mes,
                                  r.rend1, r.rend2, r.quota, r.pago});
        return db->connection().scalar(u"SELECT max(quota_id) FROM tbQuotas_Movimentos"_s);
    }
    // Last values 2001/11, rend 1 and 2, union due 3 (rate 0.5), insurance 4 (0.25).
    void addAccount(double totalQuotas, double totalPago)
    {
        db->connection().execute(u"INSERT INTO tbQuotas_Socios (socio_id, ult_ano, ult_mes, ult_rend1, ult_rend2, ult_quota_sindicato, "
                                 "ult_perc_sindicato, ult_quota_seguro, ult_perc_seguro, total_quotas, total_pago) "
                                 "VALUES (1, 2001, 11, 1.0, 2.0, 3.0, 0.5, 4.0, 0.25, ?, ?)"_s,
                                 {totalQuotas, totalPago});
    }

    // The columns that spec names ("pago=4; doc_no=R") read from the movement
    // or from member 1's account, in the same form, numbers as plain decimals;
    // "none" when there is no row.
    QString read(const QString& spec, const QVariant& movement = {})
    {
        QStringList columns;
        for (const QString& part : spec.split(u"; "_s))
            columns << part.section(u'=', 0, 0);
        Connection& c = db->connection();
        const QString from = movement.isValid() ? u"tbQuotas_Movimentos WHERE quota_id"_s : u"tbQuotas_Socios WHERE socio_id"_s;
        QSqlQuery& q = c.run(c.dialect().translate(u"SELECT %1 FROM %2 = ?"_s.arg(spec == "none"_L1 ? u"1"_s : columns.join(u','), from)),
                             {movement.isValid() ? movement : 1});
        QStringList values;
        for (int i = 0; i < columns.size() && (i > 0 || q.next()); ++i) {  // nothing when there is no row
            bool number = false;
            const double d = q.value(i).toDouble(&number);
            values << columns[i] + u'=' + (q.value(i).isNull() ? u"null"_s : number ? QString::number(d, 'g', 12) : q.value(i).toString());
        }
        q.finish();
        return values.isEmpty() ? u"none"_s : values.join(u"; "_s);
    }
    // Runs script on the record window that opener brings up, once it is
    // refreshed, and closes it with the close control if still open. False
    // when no window showed.
    static bool drive(const std::function<void()>& opener, const std::function<void(FrmQuota&)>& script)
    {
        bool ran = false;
        QTimer poll;
        QObject::connect(&poll, &QTimer::timeout, [&] {
            QPointer<FrmQuota> frm = qobject_cast<FrmQuota*>(shared().frmQuota.data());
            if (ran || !frm || !frm->isVisible() || frm->Timer1->isActive())
                return;
            ran = true;
            QApplication::setActiveWindow(frm);
            QVERIFY(QTest::qWaitForWindowActive(frm));
            script(*frm);
            if (frm && frm->isVisible())
                frm->close();
        });
        poll.start(2);
        opener();
        return ran;
    }
    // Registo on member 1's movements, positioned on pkey.
    static bool open(const QVariant& pkey, const std::function<void(FrmQuota&)>& script, QObject* caller = nullptr)
    {
        General general;
        return drive([&] { general.Registo(nullptr, pkey, QString(), movementsOf(1), caller); }, script);
    }

    // Focus into a field and type over what entering selected.
    static void type(QLineEdit* field, const QString& text)
    {
        field->setFocus(Qt::MouseFocusReason);
        QTest::keyClick(field, Qt::Key_Delete);
        QTest::keyClicks(field, text);
    }
    static void click(QPushButton* button) { QTest::mouseClick(button, Qt::LeftButton); }
    // Each box as "title (icon, yes/no) text" or "title [proposed text] text", to the text's first line,
    // with "(another user)" when the rest names another user.
    static QStringList described(const ScriptedBoxes& boxes)
    {
        const char* icons[] = {"", "critical", "question", "exclamation", "information"};
        QStringList out;
        for (const ShownBox& b : boxes.shown) {
            const QString mark = b.isInput ? u'[' + b.defaultText + u']'
                                           : u"(%1%2)"_s.arg(QLatin1String(icons[int(b.icon)]), b.buttons == Buttons::YesNo ? ", yes/no"_L1 : ""_L1);
            out << u"%1 %2 %3%4"_s.arg(b.title, mark, b.text.section(u'\n', 0, 0), b.text.contains(u"outro utilizador"_s) ? u" (another user)"_s : QString());
        }
        return out;
    }
};

}  // namespace quotas::test

Q_DECLARE_METATYPE(quotas::test::MovementRow)
