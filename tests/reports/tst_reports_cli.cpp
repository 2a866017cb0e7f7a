// The three reports written to PDF by the quotas program, end to end, and
// read back with poppler's pdftotext and pdffonts.

#include "support/cli_process.h"
#include "support/test_database.h"

#include <QDir>
#include <QFile>
#include <QProcess>
#include <QRegularExpression>
#include <QTest>

using namespace quotas;
using namespace quotas::test;

namespace {

QString tool(const QString& program, const QStringList& args)
{
    QProcess p;
    p.start(program, args);
    if (!p.waitForFinished(60000) || p.exitCode() != 0)
        qFatal("%s failed: %s", qPrintable(program), p.readAllStandardError().constData());
    return QString::fromUtf8(p.readAllStandardOutput());
}

}  // namespace

class ReportsCliTest : public QObject {
    Q_OBJECT

    std::unique_ptr<TestDatabase> db;
    QString registry;

private slots:
    void initTestCase()
    {
        db = std::make_unique<TestDatabase>();
        registry = db->useAsSettings();
        qputenv("QUOTAS_DATA_DIR", db->scratch(QStringLiteral("data")).toUtf8());
        QDir().mkpath(db->scratch(QStringLiteral("data")));
        QFile head(db->scratch(QStringLiteral("data/letterhead.txt")));
        QVERIFY(head.open(QIODevice::WriteOnly));
        head.write("nome = Sindicato de Ensaio\nmorada = Rua Direita, 7, 3000-001 Coimbra\n");
        head.close();
        Connection& c = db->connection();
        c.execute(QStringLiteral("INSERT INTO tbSocios (socio_id, no_tap, nome, morada1, code_postal1, localidade1) VALUES "
                                 "(1, '100200', 'Joaquim Gonçalves', 'Rua Augusta, 10', '1100-053', 'Lisboa'), "
                                 "(2, '100300', 'Ana Conceição', 'Rua do Ouro, 5', '4000-322', 'Porto'), "
                                 "(3, '100400', 'Rui Pago', 'Rua da Prata, 1', '8000-164', 'Faro')"));
        c.execute(QStringLiteral("INSERT INTO tbQuotas_Socios (socio_id, total_quotas, total_pago) VALUES "
                                 "(1, 1500.25, 200), (2, 12.5, 0), (3, 50, 50)"));
        c.execute(QStringLiteral("INSERT INTO extras (Field0, Field1, Field2, Field3) VALUES "
                                 "('999001', 'Linha Rejeitada', '12,50', 'TAP')"));
    }
    void cleanupTestCase() { db.reset(); }

    void writesTheReportToPdf_data()
    {
        QTest::addColumn<QString>("command");
        QTest::addColumn<QStringList>("pages");  // lines that each page holds, spaces squeezed, " / " spaced
        QTest::newRow("listagem") << "listagem"
                                  << QStringList{"Listagem de Quotas em Dívida por Associado\nNº TAP Nome Dívida\n"
                                                 "100300 Ana Conceição 12,50 Esc\n100200 Joaquim Gonçalves 1.300,25 Esc\n"
                                                 "Total de registos listados: 2\nTotal de Dívidas: 1.312,75 Esc\n"
                                                 "Processado por Computador Página: 1 / 1"};
        const QString letter = QStringLiteral("Sindicato de Ensaio\nRua Direita, 7, 3000-001 Coimbra\nAssociado: %1\n"
                                              "Localidade: %2\nAssunto: Regularização de Débitos\n"
                                              "na presente data, de ESC: %3\nA Direcção");
        QTest::newRow("cartas") << "cartas"
                                << QStringList{letter.arg("Ana Conceição", "4000-322 Porto", "12,50 Esc"),
                                               letter.arg("Joaquim Gonçalves", "1100-053 Lisboa", "1.300,25 Esc")};
        QTest::newRow("rejeitados") << "rejeitados"
                                    << QStringList{"Listagem de Dados não Importados para a Base de Dados\n"
                                                   "Campo 1 Campo 2 Campo 3 Campo 4\n999001 Linha Rejeitada 12,50 TAP\n"
                                                   "Total de registos listados: 1"};
    }
    void writesTheReportToPdf()
    {
        QFETCH(QString, command);
        QFETCH(QStringList, pages);
        const QString pdf = db->scratch(command + QStringLiteral(".pdf"));
        const CliRun r = runQuotas(registry, {command, QStringLiteral("--pdf"), pdf});
        QVERIFY2(r.status == 0, qPrintable(r.err));
        QStringList printed = tool(QStringLiteral("pdftotext"), {QStringLiteral("-layout"), pdf, QStringLiteral("-")})
                                  .replace(QRegularExpression(QStringLiteral("[ \\t]+")), QStringLiteral(" "))
                                  .replace(QRegularExpression(QStringLiteral(" ?/ ?")), QStringLiteral(" / "))
                                  .split(u'\f', Qt::SkipEmptyParts);
        printed.removeIf([](const QString& page) { return page.trimmed().isEmpty(); });
        QCOMPARE(printed.size(), pages.size());
        for (int i = 0; i < pages.size(); ++i) {
            for (const QString& line : pages[i].split(u'\n'))
                QVERIFY2(printed[i].contains(line), qPrintable(line + QStringLiteral("\n--- not on this page:\n") + printed[i]));
        }
        // Arial and Times New Roman are printed in their metric twins.
        const QString fonts = tool(QStringLiteral("pdffonts"), {pdf});
        QVERIFY2(fonts.contains(QStringLiteral("LiberationSans")), qPrintable(fonts));
        if (command != QLatin1String("cartas"))
            QVERIFY2(fonts.contains(QStringLiteral("LiberationSerif-Bold")), qPrintable(fonts));
    }

    void refusesBadUseAndReportsAFileItCannotWrite_data()
    {
        QTest::addColumn<QStringList>("args");
        QTest::addColumn<int>("status");
        QTest::newRow("no --pdf") << QStringList{"listagem"} << 2;
        QTest::newRow("folder missing") << QStringList{"listagem", "--pdf", "/nonexistent/folder/out.pdf"} << 1;
    }
    void refusesBadUseAndReportsAFileItCannotWrite()
    {
        QFETCH(QStringList, args);
        QFETCH(int, status);
        const CliRun r = runQuotas(registry, args);
        QCOMPARE(r.status, status);
        QVERIFY(!r.err.trimmed().isEmpty());
        QVERIFY(!QFile::exists(QStringLiteral("/nonexistent/folder/out.pdf")));
    }
};

QTEST_GUILESS_MAIN(ReportsCliTest)
#include "tst_reports_cli.moc"
