// The three reports written to PDF by the quotas program, end to end, and
// read back with poppler's pdftotext, pdfinfo and pdffonts.

#include "support/test_database.h"

#include <QDir>
#include <QFile>
#include <QProcess>
#include <QRegularExpression>
#include <QTest>

using namespace quotas;
using quotas::test::TestDatabase;

namespace {

struct Run {
    int status = -1;
    QString out;
    QString err;
};

QString tool(const QString& program, const QStringList& args)
{
    QProcess p;
    p.start(program, args);
    if (!p.waitForFinished(60000) || p.exitCode() != 0)
        qFatal("%s failed: %s", qPrintable(program), p.readAllStandardError().constData());
    return QString::fromUtf8(p.readAllStandardOutput());
}

// The text of a PDF with runs of spaces squeezed, so that columns read as
// "label value".
QString pdfText(const QString& path)
{
    return tool(QStringLiteral("pdftotext"), {QStringLiteral("-layout"), path, QStringLiteral("-")})
        .replace(QRegularExpression(QStringLiteral("[ \\t]+")), QStringLiteral(" "));
}

int pdfPages(const QString& path)
{
    const QRegularExpressionMatch m =
        QRegularExpression(QStringLiteral("Pages:\\s+(\\d+)")).match(tool(QStringLiteral("pdfinfo"), {path}));
    return m.hasMatch() ? m.captured(1).toInt() : -1;
}

}  // namespace

class ReportsCliTest : public QObject {
    Q_OBJECT

    std::unique_ptr<TestDatabase> db;
    QString registry;

    Run quotas(const QStringList& args)
    {
        QProcess p;
        QProcessEnvironment env = QProcessEnvironment::systemEnvironment();
        env.insert(QStringLiteral("QUOTAS_DATA_DIR"), db->scratch(QStringLiteral("data")));
        p.setProcessEnvironment(env);
        p.start(QStringLiteral(QUOTAS_CLI_BINARY), QStringList{QStringLiteral("--registry"), registry} + args);
        Run r;
        if (!p.waitForFinished(120000))
            return r;
        r.status = p.exitStatus() == QProcess::NormalExit ? p.exitCode() : -1;
        r.out = QString::fromUtf8(p.readAllStandardOutput());
        r.err = QString::fromUtf8(p.readAllStandardError());
        return r;
    }

private slots:
    void initTestCase()
    {
        db = std::make_unique<TestDatabase>();
        registry = db->useAsSettings();
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

    void writesTheDebtListing()
    {
        const QString pdf = db->scratch(QStringLiteral("listagem.pdf"));
        const Run r = quotas({QStringLiteral("listagem"), QStringLiteral("--pdf"), pdf});
        QVERIFY2(r.status == 0, qPrintable(r.err));
        QCOMPARE(pdfPages(pdf), 1);
        const QString text = pdfText(pdf);
        for (const QString& expected :
             {QStringLiteral("Listagem de Quotas em Dívida por Associado"), QStringLiteral("Nº TAP Nome Dívida"),
              QStringLiteral("100300 Ana Conceição 12,50 Esc"), QStringLiteral("100200 Joaquim Gonçalves 1.300,25 Esc"),
              QStringLiteral("Total de registos listados: 2"), QStringLiteral("Total de Dívidas: 1.312,75 Esc"),
              QStringLiteral("Processado por Computador")})
            QVERIFY2(text.contains(expected), qPrintable(expected + QStringLiteral("\n---\n") + text));
        QVERIFY(text.contains(QRegularExpression(QStringLiteral("Página: 1 ?/ ?1"))));
        QVERIFY(!text.contains(QStringLiteral("Rui Pago")));
        QVERIFY(text.indexOf(QStringLiteral("Ana Conceição")) < text.indexOf(QStringLiteral("Joaquim Gonçalves")));
        // Arial and Times New Roman are printed in their metric twins.
        const QString fonts = tool(QStringLiteral("pdffonts"), {pdf});
        QVERIFY2(fonts.contains(QStringLiteral("LiberationSerif-Bold")), qPrintable(fonts));
        QVERIFY2(fonts.contains(QStringLiteral("LiberationSans")), qPrintable(fonts));
    }

    void writesOneLetterPerMemberInDebt()
    {
        const QString pdf = db->scratch(QStringLiteral("cartas.pdf"));
        const Run r = quotas({QStringLiteral("cartas"), QStringLiteral("--pdf"), pdf});
        QVERIFY2(r.status == 0, qPrintable(r.err));
        QCOMPARE(pdfPages(pdf), 2);
        const QString text = pdfText(pdf);
        for (const QString& expected :
             {QStringLiteral("Sindicato de Ensaio"), QStringLiteral("Rua Direita, 7, 3000-001 Coimbra"),
              QStringLiteral("Associado: Ana Conceição"), QStringLiteral("Localidade: 4000-322 Porto"),
              QStringLiteral("Assunto: Regularização de Débitos"), QStringLiteral("na presente data, de ESC: 1.300,25 Esc"),
              QStringLiteral("A Direcção")})
            QVERIFY2(text.contains(expected), qPrintable(expected + QStringLiteral("\n---\n") + text));
        // Page 1 is Ana's letter, page 2 Joaquim's.
        const QStringList pages = text.split(u'\f');
        QVERIFY(pages[0].contains(QStringLiteral("Ana Conceição")) && !pages[0].contains(QStringLiteral("Joaquim")));
        QVERIFY(pages[1].contains(QStringLiteral("Joaquim Gonçalves")));
    }

    void writesTheRejectsListing()
    {
        const QString pdf = db->scratch(QStringLiteral("rejeitados.pdf"));
        const Run r = quotas({QStringLiteral("rejeitados"), QStringLiteral("--pdf"), pdf});
        QVERIFY2(r.status == 0, qPrintable(r.err));
        const QString text = pdfText(pdf);
        for (const QString& expected :
             {QStringLiteral("Listagem de Dados não Importados para a Base de Dados"),
              QStringLiteral("Campo 1 Campo 2 Campo 3 Campo 4"), QStringLiteral("999001 Linha Rejeitada 12,50 TAP"),
              QStringLiteral("Total de registos listados: 1")})
            QVERIFY2(text.contains(expected), qPrintable(expected + QStringLiteral("\n---\n") + text));
    }

    void refusesBadUseAndReportsAFileItCannotWrite_data()
    {
        QTest::addColumn<QStringList>("args");
        QTest::addColumn<int>("status");
        QTest::newRow("no --pdf") << QStringList{QStringLiteral("listagem")} << 2;
        QTest::newRow("folder missing") << QStringList{QStringLiteral("listagem"), QStringLiteral("--pdf"),
                                                       QStringLiteral("/nonexistent/folder/out.pdf")}
                                        << 1;
    }
    void refusesBadUseAndReportsAFileItCannotWrite()
    {
        QFETCH(QStringList, args);
        QFETCH(int, status);
        const Run r = quotas(args);
        QCOMPARE(r.status, status);
        QVERIFY(!r.err.trimmed().isEmpty());
        QVERIFY(!QFile::exists(QStringLiteral("/nonexistent/folder/out.pdf")));
    }
};

QTEST_GUILESS_MAIN(ReportsCliTest)
#include "tst_reports_cli.moc"
