// The result set on both engines: reading, Null, names, chunks, the indexed
// search, optimistic conflicts, running totals, and saving a row moved off.

#include "platform/chunked_rows.h"
#include "platform/errors.h"
#include "platform/recordset.h"
#include "platform/transaction.h"
#include "support/test_database.h"

#include <QDate>
#include <QTest>

using namespace quotas;
using quotas::test::TestDatabase;

class RecordsetTest : public QObject {
    Q_OBJECT

    std::unique_ptr<TestDatabase> db;
    Connection& c() { return db->connection(); }

    void addMovement(int socio, int ano, int mes, int tipo, const QVariant& quota, const QVariant& pago)
    {
        c().execute(QStringLiteral("INSERT INTO tbQuotas_Movimentos (socio_id, ano, mes, tipo, ref, quota, pago, data) "
                                   "VALUES (?, ?, ?, ?, 'Sindicato', ?, ?, ?)"),
                    {socio, ano, mes, tipo, quota, pago, QDate(2003, 1, 15)});
    }

private slots:
    void initTestCase() { db = std::make_unique<TestDatabase>(); }
    void cleanupTestCase() { db.reset(); }
    void init() { db->clear(); }

    void readsRowsWithNullAndCaseInsensitiveNames()
    {
        c().execute(QStringLiteral("INSERT INTO tbSocios (socio_id, no_tap, nome) VALUES (1, '', 'Ana'), (2, NULL, 'Rui')"));
        addMovement(1, 2003, 1, 1, 0.0, QVariant(QMetaType::fromType<double>()));
        Recordset rs;
        // Two columns of one name: the first one is the field.
        rs.open(QStringLiteral("SELECT tbSocios.no_tap, tbQuotas_Movimentos.*, tbSocios.nome AS pago FROM tbQuotas_Movimentos "
                               "LEFT OUTER JOIN tbSocios ON tbQuotas_Movimentos.socio_id = tbSocios.socio_id"),
                c(), Cursor::Keyset, Lock::Optimistic);
        QCOMPARE(rs.recordCount(), 1);
        QVERIFY(!rs.isNull(QStringLiteral("NO_TAP")));
        QCOMPARE(rs.value(QStringLiteral("No_Tap")).toString(), QString());
        QVERIFY(!rs.isNull(QStringLiteral("quota")));
        QCOMPARE(rs.value(QStringLiteral("QUOTA")).toDouble(), 0.0);
        QVERIFY(rs.isNull(QStringLiteral("pago")));
        QCOMPARE(rs.value(QStringLiteral("data")).toDate(), QDate(2003, 1, 15));
        QVERIFY_THROWS_EXCEPTION(DbError, rs.value(QStringLiteral("nothing")));
        rs.moveNext();
        QVERIFY(rs.eof());
        QVERIFY_THROWS_EXCEPTION(DbError, rs.value(0));
    }

    // A chunk that ends the table exactly, a last short one, a condition
    // of the caller's and a key named otherwise in the result: each row is
    // read once, in key order.
    void chunkedRowsReadEveryRowOnceInKeyOrder_data()
    {
        QTest::addColumn<int>("members");
        QTest::addColumn<int>("chunk");
        QTest::addColumn<QString>("expected");
        QTest::newRow("exact chunks") << 6 << 3 << "1 2 3 4 5 6";
        QTest::newRow("last chunk short") << 7 << 3 << "1 2 3 4 5 6 7";
        QTest::newRow("one chunk") << 2 << 3 << "1 2";
        QTest::newRow("none") << 0 << 3 << "";
    }

    void chunkedRowsReadEveryRowOnceInKeyOrder()
    {
        QFETCH(int, members);
        QFETCH(int, chunk);
        QFETCH(QString, expected);
        // Stored out of key order, with a row the caller's condition leaves out.
        for (int i = members; i >= 1; --i)
            c().execute(QStringLiteral("INSERT INTO tbSocios (socio_id, nome) VALUES (?, 'x')"), {i * 10});
        c().execute(QStringLiteral("INSERT INTO tbSocios (socio_id, nome) VALUES (999, 'y')"));
        ChunkedRows rows(c(),
                         QStringLiteral("SELECT nome, socio_id AS no FROM tbSocios WHERE nome = ?%1 ORDER BY socio_id"),
                         QStringLiteral("socio_id"), QStringLiteral("no"), {QStringLiteral("x")}, chunk);
        QStringList read;
        for (; !rows.eof(); rows.moveNext())
            read << QString::number(rows.value(rows.fieldIndex(QStringLiteral("no"))).toInt() / 10);
        QCOMPARE(read.join(u' '), expected);
    }

    void findGivesTheFirstMatchAtOrAfterTheCurrentRow_data()
    {
        QTest::addColumn<int>("from");
        QTest::addColumn<QString>("key");
        QTest::addColumn<int>("found");
        QTest::newRow("first of two") << 0 << "7" << 0;
        QTest::newRow("from the row after it") << 1 << "7" << 2;
        QTest::newRow("past the last") << 3 << "7" << -1;
        QTest::newRow("a quote is just a character") << 0 << "x'y" << 3;
        QTest::newRow("no injection") << 0 << "x' OR '1'='1" << -1;
        QTest::newRow("text is exact") << 0 << "07" << 5;
        QTest::newRow("edited into the key") << 0 << "new" << 1;
    }
    void findGivesTheFirstMatchAtOrAfterTheCurrentRow()
    {
        QFETCH(int, from);
        QFETCH(QString, key);
        QFETCH(int, found);
        Recordset rs;
        rs.openInMemory({QStringLiteral("no_tap")});
        for (const char* k : {"7", "3", "7", "x'y", "3", "07"}) {
            rs.addNew();
            rs.setValue(0, QString::fromLatin1(k));
            rs.update();
        }
        rs.moveFirst();
        rs.find(QStringLiteral("no_tap"), QStringLiteral("3"));  // builds the index before the edit
        rs.setValue(0, QStringLiteral("new"));
        rs.update();
        rs.moveFirst();
        for (int i = 0; i < from; ++i)
            rs.moveNext();
        QCOMPARE(rs.find(QStringLiteral("no_tap"), key), found >= 0);
        QCOMPARE(rs.position(), found);
        QCOMPARE(rs.eof(), found < 0);
    }

    void findComparesNumbersByValueAndNeverMatchesNull()
    {
        for (int id : {5, 9, 12})
            c().execute(QStringLiteral("INSERT INTO tbQuotas_Socios (socio_id, total_quotas) VALUES (?, ?)"),
                        {id, id == 9 ? QVariant(QMetaType::fromType<double>()) : QVariant(10.5)});
        Recordset rs;
        rs.open(QStringLiteral("SELECT * FROM tbQuotas_Socios ORDER BY socio_id"), c(), Cursor::Static, Lock::Optimistic);
        const auto position = [&](const char* column, const QVariant& v) {
            rs.moveFirst();
            rs.find(QString::fromLatin1(column), v);
            return rs.position();
        };
        QCOMPARE(position("socio_id", 9.0), 1);
        QCOMPARE(position("socio_id", QStringLiteral("12")), 2);
        QCOMPARE(position("total_quotas", QVariant(QMetaType::fromType<double>())), -1);
        QCOMPARE(position("total_quotas", 10.5), 0);
    }

    // A new row takes the key and the defaults the database gives it.
    void addNewTakesTheKeyTheDatabaseGives()
    {
        Recordset rs;
        rs.open(QStringLiteral("SELECT * FROM tbQuotas_Socios WHERE socio_id = 42"), c(), Cursor::Keyset, Lock::Optimistic);
        rs.addNew();
        rs.setValue(QStringLiteral("socio_id"), 42);
        rs.update();
        QCOMPARE(rs.value(QStringLiteral("squota_id")).toLongLong(), c().scalar(QStringLiteral("SELECT squota_id FROM tbQuotas_Socios")).toLongLong());
        QCOMPARE(rs.value(QStringLiteral("total_pago")).toDouble(), 0.0);
    }

    void aConcurrentChangeIsRefusedNotOverwritten()
    {
        addMovement(1, 2003, 1, 1, 10.0, 0.0);
        Recordset mine;
        mine.open(QStringLiteral("SELECT * FROM tbQuotas_Movimentos"), c(), Cursor::Dynamic, Lock::Optimistic);
        auto other = db->openAnother();
        other->execute(QStringLiteral("UPDATE tbQuotas_Movimentos SET quota = 12.5"));
        mine.setValue(QStringLiteral("quota"), 9.0);
        QVERIFY_THROWS_EXCEPTION(ConcurrencyError, mine.update());
        QCOMPARE(c().scalar(QStringLiteral("SELECT quota FROM tbQuotas_Movimentos")).toDouble(), 12.5);
        // A column the other user did not touch still saves.
        mine.cancelUpdate();
        mine.setValue(QStringLiteral("doc_no"), QStringLiteral("R-1"));
        mine.update();
        QCOMPARE(c().scalar(QStringLiteral("SELECT doc_no FROM tbQuotas_Movimentos")).toString(), QStringLiteral("R-1"));
        // A deleted row is a conflict too.
        other->execute(QStringLiteral("DELETE FROM tbQuotas_Movimentos"));
        mine.setValue(QStringLiteral("doc_no"), QStringLiteral("R-2"));
        QVERIFY_THROWS_EXCEPTION(ConcurrencyError, mine.update());
    }

    void runningTotalsKeepAConcurrentPayment()
    {
        c().execute(QStringLiteral("INSERT INTO tbQuotas_Socios (socio_id, total_pago) VALUES (1, 100.10)"));
        c().execute(QStringLiteral("INSERT INTO tbQuotas_Socios (socio_id, total_pago) VALUES (2, NULL)"));
        Recordset mine;
        mine.open(QStringLiteral("SELECT * FROM tbQuotas_Socios ORDER BY socio_id"), c(), Cursor::Dynamic, Lock::Optimistic);
        auto other = db->openAnother();
        other->execute(QStringLiteral("UPDATE tbQuotas_Socios SET total_pago = total_pago + 5 WHERE socio_id = 1"));
        mine.addTo(QStringLiteral("total_pago"), 0.2);
        mine.update();
        QCOMPARE(mine.value(QStringLiteral("total_pago")).toDouble(), 105.30);
        QCOMPARE(c().scalar(QStringLiteral("SELECT total_pago FROM tbQuotas_Socios WHERE socio_id = 1")).toDouble(), 105.30);
        mine.moveNext();
        mine.addTo(QStringLiteral("total_pago"), 4.005);  // cents, ties to even: 4.00
        mine.update();
        QCOMPARE(c().scalar(QStringLiteral("SELECT total_pago FROM tbQuotas_Socios WHERE socio_id = 2")).toDouble(), 4.0);
    }

    void movingOffAChangedRowSavesIt()
    {
        addMovement(1, 2003, 1, 1, 1.0, 0.0);
        addMovement(1, 2003, 2, 1, 2.0, 0.0);
        Recordset rs;
        rs.open(QStringLiteral("SELECT * FROM tbQuotas_Movimentos ORDER BY mes"), c(), Cursor::Keyset, Lock::Optimistic);
        int moves = 0;
        rs.willMove = [&] { ++moves; };
        rs.setValue(QStringLiteral("pago"), 1.0);
        rs.moveNext();
        QCOMPARE(moves, 1);
        QCOMPARE(c().scalar(QStringLiteral("SELECT pago FROM tbQuotas_Movimentos WHERE mes = 1")).toDouble(), 1.0);
    }

    // An inner transaction that is not committed goes back to its savepoint.
    void aRolledBackTransactionLeavesNothing()
    {
        {
            Transaction tx(c());
            c().execute(QStringLiteral("INSERT INTO tbcontadores (quotas) VALUES (1)"));
            {
                Transaction inner(c());
                c().execute(QStringLiteral("INSERT INTO tbcontadores (quotas) VALUES (2)"));
            }
            tx.commit();
        }
        {
            Transaction tx(c());
            c().execute(QStringLiteral("INSERT INTO tbcontadores (quotas) VALUES (3)"));
        }
        QCOMPARE(c().scalar(QStringLiteral("SELECT SUM(quotas) FROM tbcontadores")).toInt() + c().transactionDepth(), 1);
    }
};

QTEST_GUILESS_MAIN(RecordsetTest)
#include "tst_recordset.moc"
