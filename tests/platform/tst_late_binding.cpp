// Components by ProgID and calls by method name.

#include "platform/components.h"
#include "platform/errors.h"
#include "platform/late_binding.h"

#include <QTest>

using namespace quotas;

class Target : public QObject {
    Q_OBJECT
public:
    QStringList calls;
    Q_INVOKABLE void Iniciar(int maximum, const QString& message, const QString& title = QString())
    {
        calls << QStringLiteral("%1|%2|%3").arg(maximum).arg(message, title);
    }
    Q_INVOKABLE int twice(int n) { return 2 * n; }
    Q_INVOKABLE QVariant echo(const QVariant& v) { return v; }
    Q_INVOKABLE void fails() { throw QuotasError(QStringLiteral("falhou")); }
};

class LateBindingTest : public QObject {
    Q_OBJECT
private slots:
    void callsByNameWithConvertedArguments()
    {
        Target t;
        callByName(&t, "Iniciar", {QStringLiteral("3"), QStringLiteral("msg")});
        callByName(&t, "Iniciar", {short(2), QStringLiteral("m"), QStringLiteral("T")});
        QCOMPARE(t.calls, QStringList({"3|msg|", "2|m|T"}));
        QCOMPARE(callByName(&t, "twice", {21}).toInt(), 42);
        QCOMPARE(callByName(&t, "echo", {QStringLiteral("x")}).toString(), QStringLiteral("x"));
    }

    void missingMethodsAndObjects()
    {
        Target t;
        QVERIFY(!tryCallByName(&t, "RemoteKey", {1}));
        QVERIFY(!tryCallByName(nullptr, "RemoteKey", {1}));
        QVERIFY_THROWS_EXCEPTION(QuotasError, callByName(&t, "RemoteKey", {1}));
        QVERIFY_THROWS_EXCEPTION(QuotasError, callByName(&t, "twice", {}));
        QVERIFY_THROWS_EXCEPTION(QuotasError, callByName(&t, "fails"));
    }

    void componentsComeFromTheirFactories()
    {
        registerComponent(QStringLiteral("Test.Target"), [] { return std::make_unique<Target>(); });
        auto object = createComponent(QStringLiteral("test.target"));
        QVERIFY(qobject_cast<Target*>(object.get()));
        unregisterComponent(QStringLiteral("Test.Target"));
        QVERIFY_THROWS_EXCEPTION(QuotasError, createComponent(QStringLiteral("Test.Target")));
    }
};

QTEST_GUILESS_MAIN(LateBindingTest)
#include "tst_late_binding.moc"
