// The import's dry run on both engines: each verdict on a hand-made month,
// the dry run agreeing line by line with the import that follows it, not a
// row of the database changed by it, and "quotas importar --simular".

#include "component/shared_objects.h"
#include "import/import_verdict.h"
#include "import/processar_importacao.h"
#include "support/database_fixture.h"
#include "support/recording_progress.h"
#include "support/scripted_boxes.h"

#include <QTest>

using namespace quotas;
using namespace quotas::test;
using namespace Qt::StringLiterals;

namespace {

// Each line's verdict as "line|no_tap|verdict|quota before|pago before|quota after|pago after|reason".
QStringList described(const ImportVerdicts& verdicts)
{
    QStringList out;
    const auto amount = [](qint64 cents) { return QString::number(double(cents) / 100.0, 'f', 2); };
    for (const ImportVerdict& v : verdicts.lines) {
        const bool posted = v.kind == ImportVerdict::Kind::Post;
        out << u"%1|%2|%3|%4|%5|%6"_s.arg(v.line).arg(v.noTap, v.kindText(),
                                                      v.matched ? amount(v.quotaBefore) + u'|' + amount(v.pagoBefore) : u"|"_s,
                                                      posted ? amount(v.quotaAfter) + u'|' + amount(v.pagoAfter) : u"|"_s, v.reason);
    }
    return out;
}

}  // namespace

class ImportDryRunTest : public QObject, DatabaseFixture {
    Q_OBJECT

    // Member id with staff number noTap charged quota and paid pago for March 2004; an account unless told otherwise.
    void charged(int id, const QString& noTap, double quota, double pago, bool withAccount = true)
    {
        c().execute(u"INSERT INTO tbSocios (socio_id, no_tap, nome) VALUES (?, ?, 'Associado')"_s, {id, noTap});
        c().execute(u"INSERT INTO tbQuotas_Movimentos (socio_id, data, ano, mes, tipo, ref, quota_no, rend1, rend2, quota, pago) "
                    "VALUES (?, '2004-03-01', 2004, 3, 1, 'Sindicato', ?, 1000, 0, ?, ?)"_s,
                    {id, id, quota, pago});
        if (withAccount)
            c().execute(u"INSERT INTO tbQuotas_Socios (socio_id, ult_rend1, ult_rend2, total_quotas, total_pago) VALUES (?, 1000, 0, ?, ?)"_s,
                        {id, quota, pago});
    }
    // A month with one case of each verdict.
    QString month()
    {
        charged(1, u"101"_s, 10, 0);   // unpaid: posted
        charged(2, u"102"_s, 12, 12);  // paid as deducted: left alone
        charged(3, u"103"_s, 5, 5);    // paid, deduction above the charge: posted
        charged(4, u"104"_s, 10, 0, false);
        charged(5, u"105"_s, 10, 0);
        charged(6, u"106"_s, 10, 0);
        c().execute(u"INSERT INTO extras (Field0) VALUES ('antes')"_s);
        return useImportFile("no_tap;quota\n101;8.00\n102;12.00\n103;7.50\n999;1.00\n104;9.00\n105;abc\n101;8.00\n106;0\n");
    }

private slots:
    void initTestCase()
    {
        openDatabase();
    }
    void init()
    {
        db->clear();
        db->login();
        RecordingProgress::install();
        shared().SemSeparadorDecimal = false;
        setRejectsListing([] {});
    }

    void tellsEachVerdictWritesNothingAndAgreesWithTheImport()
    {
        month();
        const QStringList before = everything();
        ScriptedBoxes boxes;
        ImportVerdicts dry;
        SimularImportacao(3, 2004, 1, dry);
        QCOMPARE(described(dry), (QStringList{"1|101|registar|10.00|0.00|8.00|8.00|",
                                              "2|102|deixar|12.00|12.00|||já registada",
                                              "3|103|registar|5.00|5.00|7.50|7.50|",
                                              "4|999|rejeitar|||||sem quota gerada",
                                              "5|104|rejeitar|10.00|0.00|||sem conta",
                                              "6|105|rejeitar|10.00|0.00|||valor ilegível",
                                              "7|101|deixar|8.00|8.00|||já registada",
                                              "8|106|deixar|10.00|0.00|||desconto de 0,00"}));
        QCOMPARE(everything(), before);
        QVERIFY(boxes.shown.isEmpty());
        // The import that follows does line for line what the dry run said.
        ImportVerdicts done;
        const ImportSummary summary = ProcessarImportacao(3, 2004, 1, &done);
        QCOMPARE(described(done), described(dry));
        QCOMPARE(summary.posted, dry.count(ImportVerdict::Kind::Post));
        QCOMPARE(rows(u"SELECT pago FROM tbQuotas_Movimentos ORDER BY socio_id"_s),
                 (QStringList{"8", "12", "7.5", "0", "0", "0"}));
    }

    // stdout one line per line of the file, then the totals; the exit status the import would have.
    void quotasImportarSimular()
    {
        const QString file = month();
        const QStringList before = everything();
        const CliRun r = runQuotas(registry, {u"importar"_s, u"--simular"_s, u"--ano"_s, u"2004"_s, u"--mes"_s, u"3"_s, u"--tipo"_s, u"1"_s, file});
        QCOMPARE(r.status, 3);
        const QStringList out = r.out.split(u'\n', Qt::SkipEmptyParts);
        QCOMPARE(out.size(), 9);
        QCOMPARE(out[0], u"1\t101\tregistar\t10,00\t0,00\t8,00\t8,00\t"_s);
        QCOMPARE(out[5], u"6\t105\trejeitar\t10,00\t0,00\t\t\tvalor ilegível"_s);
        QCOMPARE(out[8], u"A registar: 2 linha(s), 15,50 Esc; a deixar (já registadas): 3; a rejeitar: 3."_s);
        QCOMPARE(everything(), before);
        const CliRun clean = runQuotas(registry, {u"importar"_s, u"--simular"_s, u"--ano"_s, u"2004"_s, u"--mes"_s, u"3"_s, u"--tipo"_s, u"1"_s,
                                                  useImportFile("no_tap;quota\n101;8.00\n")});
        QCOMPARE(clean.status, 0);
    }
};

QTEST_MAIN(ImportDryRunTest)
#include "tst_import_dry_run.moc"
