// Taking back a month's generated dues on both engines: which dues go and
// which stay, the totals after it, "quotas anular-geracao" narrowed to a
// type and a member and its dry run,
// two undos at once beside payments, and the dialog's confirmation.

#include "generation/anular_geracao.h"
#include "generation/frm_anular_geracao.h"
#include "generation/processar_quotas.h"
#include "schema/demo_data.h"
#include "support/database_fixture.h"
#include "support/recording_progress.h"
#include "support/scripted_boxes.h"

#include <QComboBox>
#include <QPlainTextEdit>
#include <QProcess>
#include <QSpinBox>
#include <QTest>

using namespace quotas;
using namespace quotas::test;

namespace {

QStringList keys(const QList<UndoDue>& dues)
{
    QStringList out;
    for (const UndoDue& d : dues)
        out << QStringLiteral("%1|%2").arg(d.socioId.toInt()).arg(d.tipo);
    return out;
}

}  // namespace

class UndoTest : public QObject, DatabaseFixture {
    Q_OBJECT

    void generate(int mes) { ProcessarQuotas(c(), 2004, mes, 0, QDate(2004, mes, 1)); }

    // Members 1 to 6, insured, charged February and March 2004 (37.50 of
    // each type), then March touched: 2's union due paid by hand, 3's taken
    // from the employer's list, 4's insurance given a document, 5's union
    // due with pago Null, 6's union due paid in full by hand.
    void sixMembersWithMarchTouched()
    {
        for (int socio = 1; socio <= 6; ++socio)
            c().execute(QStringLiteral("INSERT INTO tbSocios (socio_id, no_tap, nome, fuv, empresa, seguro) VALUES (?, ?, ?, "
                                       "'A1', 'TAP', 1)"),
                        {socio, QString::number(1000 + socio), QStringLiteral("Associado %1").arg(socio)});
        generate(2);
        generate(3);
        const QString march = QStringLiteral(" WHERE ano = 2004 AND mes = 3 AND socio_id = ? AND tipo = ?");
        c().execute("UPDATE tbQuotas_Movimentos SET pago = 5, doc_no = 'R1'" + march, {2, 1});
        c().execute("UPDATE tbQuotas_Movimentos SET doc_no = 'R2'" + march, {4, 2});
        c().execute("UPDATE tbQuotas_Movimentos SET pago = NULL" + march, {5, 1});
        c().execute("UPDATE tbQuotas_Movimentos SET pago = quota, rend2 = 0, doc_no = 'R3'" + march, {6, 1});
        const CliRun imported = quotas({"importar", "--ano", "2004", "--mes", "3", "--tipo", "1", writeFile("marco.csv", "no_tap;quota\n1003;30.00\n")});
        QVERIFY2(imported.status == 0, qPrintable(imported.err));
    }

private slots:
    void initTestCase()
    {
        openDatabase();
        RecordingProgress::install();
    }
    void init()
    {
        db->clear();
        c().execute(QStringLiteral("INSERT INTO tbEmpresas (code, nome, percent_sindicato) VALUES ('TAP', 'TAP', 0.015)"));
        c().execute(QStringLiteral("INSERT INTO tbfuvs (code, descrit, rend1) VALUES ('A1', 'A1', 2500)"));
    }

    // The plan's text, the undo, the totals it leaves (what the maintenance
    // would rebuild, and member 1's as before March), and March again.
    void undoThenMaintenanceThenMarchAgain()
    {
        sixMembersWithMarchTouched();
        const QString accountsKept = "SELECT socio_id, ult_ano, ult_mes, ult_rend1, ult_rend2, ult_quota_sindicato, "
                                     "ult_quota_seguro, total_pago FROM tbQuotas_Socios ORDER BY 1";
        const QStringList lastValues = rows(accountsKept) + rows("SELECT quotas FROM tbcontadores");
        const UndoPlan plan = planUndo(c(), {2004, 3, 0, 0});
        QCOMPARE(plan.text(), QStringLiteral(
                                  "Anular Geração de Março de 2004 (Sindicato e Seguro)\n"
                                  "A eliminar: 7 quotas, € 262,50\n"
                                  "  Sindicato: 2 quotas, € 75,00\n"
                                  "  Seguro: 5 quotas, € 187,50\n"
                                  "Ficam: 5 quotas, € 180,00\n"
                                  "  Sindicato: 4 quotas, € 142,50\n"
                                  "  Seguro: 1 quota, € 37,50\n"
                                  "\n"
                                  "Quotas a eliminar (Nº Empresa, nome, tipo, valor):\n"
                                  "  1001  Associado 1  Sindicato  € 37,50\n"
                                  "  1001  Associado 1  Seguro  € 37,50\n"
                                  "  1002  Associado 2  Seguro  € 37,50\n"
                                  "  1003  Associado 3  Seguro  € 37,50\n"
                                  "  1004  Associado 4  Sindicato  € 37,50\n"
                                  "  1005  Associado 5  Seguro  € 37,50\n"
                                  "  1006  Associado 6  Seguro  € 37,50\n"
                                  "\n"
                                  "Quotas que ficam, e porquê:\n"
                                  "  1002  Associado 2  Sindicato  € 37,50: já tem pagamentos\n"
                                  "  1003  Associado 3  Sindicato  € 30,00: importado da lista da empresa\n"
                                  "  1004  Associado 4  Seguro  € 37,50: já tem pagamentos\n"
                                  "  1005  Associado 5  Sindicato  € 37,50: valores em branco ou ilegíveis (corra a "
                                  "Manutenção de Dados)\n"
                                  "  1006  Associado 6  Sindicato  € 37,50: já tem pagamentos"));
        QCOMPARE(plan.confirmation(), QStringLiteral("Eliminar 7 quotas de Março de 2004, no valor de € 262,50? As contas dos "
                                                     "associados descontam este valor; os números das quotas não voltam a "
                                                     "ser usados."));
        const UndoOutcome done = AnularGeracao(c(), plan);
        QCOMPARE(done.summary(plan.choice), QStringLiteral("Anulação concluída: 7 quotas de Março de 2004 eliminadas, no valor "
                                                           "de € 262,50."));
        QCOMPARE(keys(planUndo(c(), {2004, 3, 0, 0}).kept), keys(plan.kept));
        QCOMPARE(planUndo(c(), {2004, 3, 0, 0}).removed.size(), 0);
        QCOMPARE(rows(accountsKept) + rows("SELECT quotas FROM tbcontadores"), lastValues);
        // February's two dues, as before March was generated.
        QCOMPARE(rows("SELECT total_quotas FROM tbQuotas_Socios WHERE socio_id = 1"), QStringList{"75"});
        const QStringList totals = rows("SELECT socio_id, total_quotas FROM tbQuotas_Socios ORDER BY 1");
        QCOMPARE(quotas({"manutencao"}).status, 0);
        QCOMPARE(rows("SELECT socio_id, total_quotas FROM tbQuotas_Socios ORDER BY 1"), totals);

        generate(3);
        QCOMPARE(rows("SELECT COUNT(*), COUNT(DISTINCT quota_no), MIN(quota_no) FROM tbQuotas_Movimentos WHERE ano = 2004 AND "
                      "mes = 3 AND quota_no > 24"),
                 QStringList{"7|7|25"});
        QCOMPARE(rows("SELECT COUNT(*) FROM tbQuotas_Movimentos WHERE ano = 2004 AND mes = 3"), QStringList{"12"});
    }

    // Without --confirmar nothing changes; a wrong option changes nothing either.
    void commandLine()
    {
        sixMembersWithMarchTouched();
        const QStringList before = everything();
        const CliRun plan = quotas({"anular-geracao", "--ano", "2004", "--mes", "3", "--tipo", "1", "--no-tap", "1001"});
        QCOMPARE(plan.status, 0);
        QCOMPARE(plan.out, "Anular Geração de Março de 2004 (Sindicato, um associado)\nA eliminar: 1 quota, € 37,50\n  "
                           "Sindicato: 1 quota, € 37,50\nFicam: 0 quotas, € 0,00\n\nQuotas a eliminar (Nº Empresa, nome, "
                           "tipo, valor):\n  1001  Associado 1  Sindicato  € 37,50\nNada foi alterado: para eliminar estas "
                           "quotas repita o comando com --confirmar.\n");
        QCOMPARE(quotas({"anular-geracao", "--ano", "2004", "--mes", "3", "--no-tap", "9999", "--confirmar"}).status, 2);
        QCOMPARE(quotas({"anular-geracao", "--ano", "2004", "--mes", "3", "--tipo", "3", "--confirmar"}).status, 2);
        QCOMPARE(everything(), before);
        const CliRun done = quotas({"anular-geracao", "--ano", "2004", "--mes", "3", "--tipo", "2", "--confirmar"});
        QVERIFY2(done.status == 0 && done.out.endsWith("Anulação concluída: 5 quotas de Março de 2004 eliminadas, no valor de "
                                                       "€ 187,50.\n"),
                 qPrintable(done.out + done.err));
    }

    // Two undos of one month at once while the test pays dues of that
    // month: every payment that was recorded keeps its due, nothing else
    // stays, and no account is decreased twice.
    void twoUndosBesidePayments()
    {
        constexpr int kMembers = 600;
        addDemoMembers(c(), kMembers);
        generate(3);
        const QStringList args = {"anular-geracao", "--ano", "2004", "--mes", "3", "--confirmar"};
        QProcess* first = startQuotas(this, registry, args);
        QProcess* second = startQuotas(this, registry, args);
        // From the last member down, against the undos' order.
        const QStringList due = rows("SELECT quota_id FROM tbQuotas_Movimentos ORDER BY socio_id DESC, tipo");
        auto payer = db->openAnother(QStringLiteral("payer"));
        QStringList paid;
        for (const QString& id : due) {
            if (first->state() == QProcess::NotRunning && second->state() == QProcess::NotRunning)
                break;
            payer->begin();
            // As the import posts a deduction: no document.
            const bool done = payer->execute(QStringLiteral("UPDATE tbQuotas_Movimentos SET pago = quota, rend2 = 0 WHERE "
                                                            "quota_id = ?"),
                                             {id.toInt()})
                              == 1;
            payer->commit();
            if (done)
                paid << id;
        }
        const CliRun a = finishQuotas(first), b = finishQuotas(second);
        QVERIFY2((a.status == 0 || a.status == 3) && (b.status == 0 || b.status == 3), qPrintable(a.err + b.err));
        QVERIFY2(!paid.isEmpty(), "no payment overlapped the undos");
        QCOMPARE(rows("SELECT quota_id FROM tbQuotas_Movimentos ORDER BY socio_id DESC, tipo"), paid);
        QCOMPARE(rows("SELECT COUNT(*) FROM tbQuotas_Socios a WHERE ABS(COALESCE(a.total_quotas, 0) - COALESCE((SELECT "
                      "SUM(m.quota) FROM tbQuotas_Movimentos m WHERE m.socio_id = a.socio_id), 0)) > 0.005"),
                 QStringList{"0"});
    }

    // The dialog asks with No as the default: the unscripted answer removes
    // nothing; Yes removes the plan.
    void dialogAsksBeforeRemoving()
    {
        sixMembersWithMarchTouched();
        ScriptedBoxes boxes;
        frmAnularGeracao dialog(QDate(2004, 3, 10));
        dialog.Tipo->setCurrentIndex(2);
        const QString ask = planUndo(c(), {2004, 3, 2, 0}).confirmation();
        dialog.undo();
        QCOMPARE(boxes.last().buttons, Buttons::YesNoDefaultNo);
        QCOMPARE(boxes.last().text, ask);
        QCOMPARE(rows("SELECT COUNT(*) FROM tbQuotas_Movimentos WHERE mes = 3"), QStringList{"12"});
        QVERIFY(dialog.Plano->toPlainText().startsWith("Anular Geração de Março de 2004 (Seguro)\nA eliminar: 5 quotas"));
        boxes.answer(Answer::Yes);
        dialog.undo();
        QCOMPARE(boxes.texts().mid(1), QStringList({ask,
                                                    "Anulação concluída: 5 quotas de Março de 2004 eliminadas, no valor de € 187,50."}));
        QCOMPARE(rows("SELECT COUNT(*) FROM tbQuotas_Movimentos WHERE mes = 3"), QStringList{"7"});
    }
};

QTEST_MAIN(UndoTest)
#include "tst_anular_geracao.moc"
