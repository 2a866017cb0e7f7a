// The public class: Registo's early returns, the shared
// objects and the progress window.

#include "component/general.h"
#include "component/progress_window.h"
#include "component/shared_objects.h"
#include "platform/components.h"
#include "platform/late_binding.h"
#include "support/test_database.h"

#include <QProgressBar>
#include <QLabel>
#include <QTest>

using namespace quotas;
using quotas::test::TestDatabase;

class GeneralTest : public QObject {
    Q_OBJECT
private slots:
    void cleanup() { releaseShared(); }

    void registoWithoutAKeyOrRowsShowsNothing()
    {
        General general;
        // No key: nothing at all, not even the database.
        general.Registo(nullptr, QVariant(), QStringLiteral("anything"), QStringLiteral("not even SQL"), nullptr);
        general.Registo(nullptr, QVariant(QMetaType::fromType<int>()), QString(), QStringLiteral("not even SQL"), nullptr);
        TestDatabase db;
        db.login();
        // Rows selected: none, so no window.
        general.Registo(&general, 7, QStringLiteral("x"),
                        QStringLiteral("SELECT tbQuotas_Movimentos.*, tbSocios.no_tap, tbSocios.nome, tbSocios.nome_guerra "
                                       "FROM tbQuotas_Movimentos INNER JOIN tbSocios ON tbQuotas_Movimentos.socio_id = "
                                       "tbSocios.socio_id"),
                        &general);
        QVERIFY(!shared().frmQuota);
    }

    // Releasing a General releases the progress display with it.
    void theProgressWindowShowsAndGoes()
    {
        {
            General general;
            shared().progress = createComponent(QStringLiteral("Velumo.General"));
        }
        QVERIFY(!shared().progress);
        auto component = createComponent(QStringLiteral("Velumo.General"));
        auto* window = qobject_cast<ProgressWindow*>(component.get());
        QVERIFY(window);
        callByName(window, "Iniciar", {3, QStringLiteral("Criando registos de quotas, aguarde alguns momentos . . ."), QStringLiteral("Processamento de Quotas")});
        QVERIFY(window->isVisible());
        QCOMPARE(window->windowTitle(), QStringLiteral("Processamento de Quotas"));
        QCOMPARE(window->findChild<QLabel*>()->text(), QStringLiteral("Criando registos de quotas, aguarde alguns momentos . . ."));
        auto* bar = window->findChild<QProgressBar*>();
        QCOMPARE(bar->maximum(), 3);
        for (int i = 0; i < 5; ++i)
            callByName(window, "setvalor", {1});
        QCOMPARE(bar->value(), 3);  // never beyond the maximum
        callByName(window, "terminar");
        QVERIFY(!window->isVisible());
        callByName(window, "Iniciar", {2, QStringLiteral("outra")});  // the title is optional
        QCOMPARE(bar->value(), 0);
    }
};

QTEST_MAIN(GeneralTest)
#include "tst_general.moc"
