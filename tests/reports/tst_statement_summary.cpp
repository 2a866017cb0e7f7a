// The member statement and the month's summary on both engines: the running
// balance and the totals, the account check, the month's sums on a hand-made
// month, that the summary agrees with the statements and the debt listing,
// and both written by the quotas program (PDF read back, CSV bytes).

#include "component/shared_objects.h"
#include "reports/entry.h"
#include "reports/member_statement.h"
#include "reports/month_summary.h"
#include "reports/report.h"
#include "reports/report_format.h"
#include "support/database_fixture.h"

#include <QFile>
#include <QTest>

using namespace quotas;
using namespace quotas::test;
using namespace Qt::StringLiterals;

namespace {

struct Movement {
    const char* table;  // "", "Inactivos", "Historico"
    int socio, ano, mes, tipo;
    QVariant quota, pago;
    const char* doc;
};

struct StatementCase {
    StatementRequest request;
    QStringList lines;  // mes/ano|ref|open|balance|origin
    QString totals;     // charged|paid|open
    bool differs;
};

QString cents(qint64 c)
{
    return formatCents(c, u"0.00"_s);
}

}  // namespace
Q_DECLARE_METATYPE(StatementCase)

class StatementSummaryTest : public QObject, DatabaseFixture {
    Q_OBJECT

    void member(int id, const QString& noTap, const QString& nome, const QVariant& totalQuotas = QVariant(),
                const QVariant& totalPago = QVariant(), const QString& empresa = QString(), int seguro = 0)
    {
        c().execute(u"INSERT INTO tbSocios (socio_id, no_tap, nome, nome_guerra, morada1, code_postal1, "
                    "localidade1, empresa, seguro) VALUES (?, ?, ?, ?, 'Rua do Ouro, 5', '1100-053', 'Lisboa', ?, ?)"_s,
                    {id, noTap, nome, nome.section(u' ', 0, 0), empresa, seguro});
        if (totalQuotas.isValid())
            c().execute(u"INSERT INTO tbQuotas_Socios (socio_id, ult_rend1, ult_rend2, total_quotas, total_pago) "
                        "VALUES (?, 1000, 0, ?, ?)"_s,
                        {id, totalQuotas, totalPago});
    }
    void move(const Movement& m)
    {
        const QString table = u"tbQuotas_Movimentos"_s + (*m.table ? u"_"_s + QLatin1String(m.table) : QString());
        c().execute(u"INSERT INTO %1 (socio_id, data, ano, mes, tipo, ref, quota_no, quota, pago, doc_no) "
                    "VALUES (?, ?, ?, ?, ?, ?, ?, ?, ?, ?)"_s.arg(table),
                    {m.socio, QDate(m.ano, m.mes, 1), m.ano, m.mes, m.tipo,
                     m.tipo == 1 ? u"Sindicato"_s : u"Seguro"_s, m.ano * 100 + m.mes, m.quota, m.pago,
                     *m.doc ? QVariant(QString::fromUtf8(m.doc)) : QVariant(QMetaType::fromType<QString>())});
    }
    // Member 1 with active movements over three months, one inactive and one in the history.
    void statementMember(double totalQuotas, double totalPago)
    {
        member(1, u"100200"_s, u"Joaquim Gonçalves"_s, totalQuotas, totalPago);
        for (const Movement& m : {Movement{"", 1, 2004, 2, 2, 5.0, 0.0, ""}, Movement{"", 1, 2004, 1, 1, 30.0, 30.0, ""},
                                  Movement{"", 1, 2004, 2, 1, 30.0, 10.0, "R-17"}, Movement{"", 1, 2004, 3, 1, 30.0, kNullNumber, ""},
                                  Movement{"Inactivos", 1, 2004, 2, 1, 12.0, 0.0, ""},
                                  Movement{"Historico", 1, 2003, 12, 1, 25.0, 25.0, ""}})
            move(m);
    }

private slots:
    void initTestCase()
    {
        openDatabase();
        qputenv("QUOTAS_DATA_DIR", db->scratch(u"data"_s).toUtf8());
    }
    void init()
    {
        db->clear();
        db->login();
    }

    void statementRunsTheBalanceInOrder_data()
    {
        QTest::addColumn<StatementCase>("k");
        const QStringList active = {"01/2004|Sindicato|0,00|0,00|", "02/2004|Sindicato|20,00|20,00|",
                                    "02/2004|Seguro|5,00|25,00|", "03/2004|Sindicato|30,00|55,00|"};
        QTest::newRow("active, every month") << StatementCase{{1, 0, 0, false}, active, "95,00|40,00|55,00", false};
        QTest::newRow("from February") << StatementCase{{1, 200402, 0, false}, {"02/2004|Sindicato|20,00|20,00|", "02/2004|Seguro|5,00|25,00|", "03/2004|Sindicato|30,00|55,00|"}, "65,00|10,00|55,00", false};
        QTest::newRow("every table, to February")
            << StatementCase{{1, 0, 200402, true},
                             {"12/2003|Sindicato|0,00|0,00|Histórico", "01/2004|Sindicato|0,00|0,00|",
                              "02/2004|Sindicato|20,00|20,00|", "02/2004|Sindicato|12,00|32,00|Inactivo",
                              "02/2004|Seguro|5,00|37,00|"},
                             "102,00|65,00|37,00",
                             false};
    }
    void statementRunsTheBalanceInOrder()
    {
        QFETCH(StatementCase, k);
        statementMember(95, 40);
        const MemberStatement s = readMemberStatement(c(), k.request);
        QStringList lines;
        for (const StatementLine& l : s.lines)
            lines << u"%1/%2|%3|%4|%5|%6"_s.arg(l.mes, 2, 10, QLatin1Char('0')).arg(l.ano).arg(l.ref, cents(l.open()), cents(l.balance), l.origin);
        QCOMPARE(lines, k.lines);
        QCOMPARE(u"%1|%2|%3"_s.arg(cents(s.charged), cents(s.paid), cents(s.open())), k.totals);
        QCOMPARE(s.accountDiffers, k.differs);
    }

    // The account is compared with every active movement, whatever the statement shows.
    void statementTellsWhenTheAccountDiffers_data()
    {
        QTest::addColumn<QVariant>("totalQuotas");
        QTest::addColumn<QVariant>("totalPago");
        QTest::addColumn<bool>("differs");
        QTest::newRow("agrees") << QVariant(95.0) << QVariant(40.0) << false;
        QTest::newRow("a cent more charged") << QVariant(95.01) << QVariant(40.0) << true;
        QTest::newRow("paid differs") << QVariant(95.0) << QVariant(30.0) << true;
        QTest::newRow("Null totals") << kNullNumber << kNullNumber << true;
        QTest::newRow("no account") << QVariant() << QVariant() << true;
    }
    void statementTellsWhenTheAccountDiffers()
    {
        QFETCH(QVariant, totalQuotas);
        QFETCH(QVariant, totalPago);
        QFETCH(bool, differs);
        member(1, u"100200"_s, u"Joaquim Gonçalves"_s, totalQuotas, totalPago);
        for (const Movement& m : {Movement{"", 1, 2004, 1, 1, 65.0, 40.0, ""}, Movement{"", 1, 2004, 2, 1, 30.0, kNullNumber, ""},
                                  Movement{"Inactivos", 1, 2004, 2, 1, 12.0, 0.0, ""}})
            move(m);
        const MemberStatement s = readMemberStatement(c(), {1, 200402, 200402, true});
        QCOMPARE(s.accountDiffers, differs);
        const ReportDocument doc = layOutMemberStatement(s, Letterhead{});
        bool shown = false;
        for (const PlacedItem& item : doc.pages.back().items)
            shown = shown || item.text.endsWith(u"os acumulados da conta diferem: corra a Manutenção de Dados."_s);
        QCOMPARE(shown, differs);
    }

    // A hand-made month: the sums per type, what needs attention, and the
    // agreement with the statements and with the debt listing.
    void summaryAddsUpTheMonthAndAgrees()
    {
        c().execute(u"INSERT INTO tbEmpresas (code, percent_sindicato) VALUES ('TAP', 0.015), ('SEM', NULL)"_s);
        member(1, u"101"_s, u"Ana Silva"_s, 40.0, 0.0, u"TAP"_s, 1);
        member(2, u"102"_s, u"Bruno Costa"_s, 33.33, 0.0, u"TAP"_s);
        member(3, u"103"_s, u"Carla Dias"_s, 25.1, 0.0, u"SEM"_s, 1);             // insured; her insurance cannot be computed
        member(4, u"104"_s, u"Duarte Reis"_s);                                    // no account
        for (const Movement& m : {Movement{"", 1, 2004, 3, 1, 30.0, 30.0, ""},    // deducted by the list
                                  Movement{"", 1, 2004, 3, 2, 10.0, 4.0, "R-1"},  // paid at the desk
                                  Movement{"", 2, 2004, 3, 1, 33.33, 0.01, ""},
                                  Movement{"", 2, 2004, 2, 1, 99.0, 0.0, ""},           // another month
                                  Movement{"", 3, 2004, 3, 1, 25.1, kNullNumber, ""}})  // unpaid, before maintenance
            move(m);
        c().execute(u"INSERT INTO extras (Field0) VALUES ('999'), ('998')"_s);
        c().execute(u"UPDATE tbQuotas_Socios SET total_quotas = 10 WHERE socio_id = 1"_s);
        // Member 3's account lost its remunerations after this month was charged.
        c().execute(u"UPDATE tbQuotas_Socios SET ult_rend1 = NULL WHERE socio_id = 3"_s);

        const MonthSummary s = readMonthSummary(c(), 2004, 3);
        QStringList figures;
        for (const MonthTypeFigures& f : {s.types[0], s.types[1], s.total()})
            figures << u"%1|%2|%3|%4|%5|%6|%7"_s.arg(f.ref).arg(f.members).arg(f.dues).arg(
                cents(f.charged), cents(f.deducted), cents(f.paidOtherwise), cents(f.open));
        QCOMPARE(figures, (QStringList{"Sindicato|3|3|88,43|30,01|0,00|58,42", "Seguro|1|1|10,00|0,00|4,00|6,00",
                                       "Total|4|4|98,43|30,01|4,00|64,42"}));
        // Member 3's insurance (no remunerations), and nobody else's.
        QCOMPARE(u"%1|%2|%3"_s.arg(s.rejectedLines).arg(s.membersWithoutAccount).arg(s.duesNotComputed), u"2|1|1"_s);

        qint64 statementsOpen = 0;
        for (int socio : {1, 2, 3})
            statementsOpen += readMemberStatement(c(), {socio, 200403, 200403, false}).open();
        QCOMPARE(statementsOpen, s.total().open);

        // Once the accounts hold this month only, the debt listing totals the same open amount.
        c().execute(u"DELETE FROM tbQuotas_Movimentos WHERE mes = 2"_s);
        c().execute(u"UPDATE tbQuotas_Socios SET total_quotas = (SELECT SUM(quota) FROM tbQuotas_Movimentos m "
                    "WHERE m.socio_id = tbQuotas_Socios.socio_id), total_pago = (SELECT SUM(COALESCE(pago, 0)) "
                    "FROM tbQuotas_Movimentos m WHERE m.socio_id = tbQuotas_Socios.socio_id)"_s);
        QString listed;
        Report::setObserver([&](const ReportDocument& doc) {
            for (const PlacedItem& item : doc.pages.back().items)
                if (item.item->name == "fnDividas"_L1)
                    listed = item.text;
        });
        writeDebtListingPdf(db->scratch(u"listagem.pdf"_s));
        Report::setObserver({});
        QCOMPARE(listed, formatReportValue(double(readMonthSummary(c(), 2004, 3).total().open) / 100.0,
                                           u"#,##0.00 Esc"_s));
    }

    // The quotas program: PDF pages read back, the CSV's bytes, the exit statuses.
    void theCommandsWriteTheReports()
    {
        statementMember(95, 40);
        member(2, u"100300"_s, u"Rita Sá"_s, 0.0, 0.0);
        member(3, u"100300"_s, u"Rui Sá"_s, 0.0, 0.0);
        const QString pdf = db->scratch(u"extrato.pdf"_s), resumo = db->scratch(u"resumo.pdf"_s), csv = db->scratch(u"resumo.csv"_s);
        const CliRun statement = quotas({u"extrato"_s, u"--no-tap"_s, u"100200"_s, u"--ate"_s, u"2004-02"_s, u"--pdf"_s, pdf});
        QVERIFY2(statement.status == 0, qPrintable(statement.err));
        const CliRun summary = quotas({u"resumo"_s, u"--ano"_s, u"2004"_s, u"--mes"_s, u"2"_s, u"--pdf"_s, resumo, u"--csv"_s, csv});
        QVERIFY2(summary.status == 0, qPrintable(summary.err));
        const QString s = pdfText(pdf);
        for (const QString& line : {u"Extrato de Quotas"_s, u"Nº Empresa: 100200"_s, u"Nome: Joaquim Gonçalves"_s,
                                    u"Localidade: 1100-053 Lisboa"_s, u"Movimentos: activos, até 02/2004"_s,
                                    u"Data Mês/Ano Tipo Nº Quota Quota Pago Em Aberto Documento Saldo Origem"_s,
                                    u"01-02-2004 02/2004 Sindicato 200402 30,00 10,00 20,00 R-17 20,00"_s,
                                    u"Total em aberto: 25,00 Esc"_s, u"Página: 1"_s})
            QVERIFY2(s.contains(line), qPrintable(line + u"\n--- not in:\n"_s + s));
        const QString r = pdfText(resumo);
        for (const QString& line : {u"Resumo do Mês"_s, u"Fevereiro de 2004"_s, u"Sindicato 1 1 30,00 Esc 0,00 Esc 10,00 Esc 20,00 Esc"_s,
                                    u"Total 2 2 35,00 Esc 0,00 Esc 10,00 Esc 25,00 Esc"_s, u"Associados sem conta de quotas: 0"_s})
            QVERIFY2(r.contains(line), qPrintable(line + u"\n--- not in:\n"_s + r));
        QFile file(csv);
        QVERIFY(file.open(QIODevice::ReadOnly));
        QCOMPARE(file.readAll(), QByteArray("\xEF\xBB\xBFResumo do Mês;Fevereiro de 2004\r\n"
                                            "Tipo;Sócios cobrados;Nº de quotas;Valor das quotas;Descontado na lista;Pago de outra forma;Em aberto\r\n"
                                            "Sindicato;1;1;30,00;0,00;10,00;20,00\r\nSeguro;1;1;5,00;0,00;0,00;5,00\r\n"
                                            "Total;2;2;35,00;0,00;10,00;25,00\r\n\r\n"
                                            "Linhas rejeitadas na última importação;0\r\nAssociados sem conta de quotas;0\r\n"
                                            "Quotas do mês que a geração não pôde calcular;0\r\n"));
        // An unknown or shared staff number, a bad month: usage, with a message.
        for (const QStringList& args : {QStringList{u"--no-tap"_s, u"999"_s}, QStringList{u"--no-tap"_s, u"100300"_s},
                                        QStringList{u"--no-tap"_s, u"100200"_s, u"--desde"_s, u"2004-13"_s}}) {
            const CliRun bad = quotas(QStringList{u"extrato"_s} + args + QStringList{u"--pdf"_s, pdf});
            QVERIFY2(bad.status == 2 && !bad.err.isEmpty(), qPrintable(args.join(u' ') + u": "_s + bad.err));
        }
    }
};

QTEST_MAIN(StatementSummaryTest)
#include "tst_statement_summary.moc"
