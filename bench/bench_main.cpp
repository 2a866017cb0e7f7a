// quotas-bench [--engine sqlite|postgresql|both] [--members 2000,20000] [NAME...]
// PostgreSQL runs use the server named by QUOTAS_TEST_PG_HOST, _PORT, _USER
// and _PASSWORD (scripts/bench.sh starts one with durable settings).

#include "bench/benchmark.h"
#include "component/shared_objects.h"
#include "platform/errors.h"
#include "schema/demo_data.h"
#include "support/recording_progress.h"
#include "support/scripted_boxes.h"
#include "support/test_database.h"

#include <QApplication>
#include <QCommandLineParser>
#include <cstdio>
#include <map>

namespace quotas::bench {

namespace {

std::map<QString, Benchmark>& benchmarks()
{
    static std::map<QString, Benchmark> all;
    return all;
}

void print(const QString& line)
{
    std::fputs((line + u'\n').toUtf8().constData(), stdout);
    std::fflush(stdout);
}

}  // namespace

bool registerBenchmark(const QString& name, Benchmark benchmark)
{
    benchmarks()[name] = std::move(benchmark);
    return true;
}

}  // namespace quotas::bench

int main(int argc, char** argv)
{
    using namespace quotas;
    if (qEnvironmentVariableIsEmpty("QT_QPA_PLATFORM"))
        qputenv("QT_QPA_PLATFORM", "offscreen");
    QApplication app(argc, argv);
    QCommandLineParser parser;
    parser.addHelpOption();
    parser.addOption({QStringLiteral("engine"), QStringLiteral("sqlite, postgresql or both."), QStringLiteral("ENGINE"),
                      QStringLiteral("both")});
    parser.addOption({QStringLiteral("members"), QStringLiteral("Comma-separated member counts."), QStringLiteral("N,N"),
                      QStringLiteral("2000,20000")});
    parser.addPositionalArgument(QStringLiteral("name"), QStringLiteral("Benchmarks to run (all by default)."));
    parser.process(app);

    QList<Engine> engines;
    const QString engine = parser.value(QStringLiteral("engine"));
    if (engine != QStringLiteral("postgresql"))
        engines << Engine::SQLite;
    if (engine != QStringLiteral("sqlite"))
        engines << Engine::PostgreSQL;
    QList<int> counts;
    for (const QString& n : parser.value(QStringLiteral("members")).split(u',', Qt::SkipEmptyParts))
        counts << n.toInt();
    QStringList names = parser.positionalArguments();
    if (names.isEmpty()) {
        for (const auto& [name, unused] : bench::benchmarks())
            names << name;
    }

    test::ScriptedBoxes boxes;  // runs talk to nobody
    test::RecordingProgress::install();
    bench::print(QStringLiteral("%1 %2 %3 %4 %5 %6")
                     .arg(QStringLiteral("benchmark"), -14)
                     .arg(QStringLiteral("engine"), -11)
                     .arg(QStringLiteral("members"), 8)
                     .arg(QStringLiteral("run (s)"), 9)
                     .arg(QStringLiteral("bound (s)"), 10)
                     .arg(QStringLiteral("ratio"), 7));
    int status = 0;
    for (const QString& name : names) {
        const auto found = bench::benchmarks().find(name);
        if (found == bench::benchmarks().end()) {
            std::fprintf(stderr, "unknown benchmark %s\n", qPrintable(name));
            status = 2;
            continue;
        }
        for (const Engine e : engines) {
            for (const int n : counts) {
                bench::Context context{e, n, [e, n] {
                                           auto db = std::make_unique<test::TestDatabase>(e, true);
                                           addDemoMembers(db->connection(), n);
                                           return db;
                                       }};
                try {
                    for (const bench::Figure& f : found->second(context)) {
                        bench::print(QStringLiteral("%1 %2 %3 %4 %5 %6")
                                         .arg(f.what, -14)
                                         .arg(e == Engine::SQLite ? QStringLiteral("sqlite") : QStringLiteral("postgresql"), -11)
                                         .arg(n, 8)
                                         .arg(f.seconds, 9, 'f', 3)
                                         .arg(f.lowerBound > 0 ? QString::number(f.lowerBound, 'f', 3) : QStringLiteral("-"), 10)
                                         .arg(f.lowerBound > 0 ? QString::number(f.seconds / f.lowerBound, 'f', 1) : QStringLiteral("-"), 7));
                    }
                } catch (const QuotasError& error) {
                    std::fprintf(stderr, "%s: %s\n", qPrintable(name), qPrintable(error.message()));
                    status = 1;
                }
                releaseShared();
            }
        }
    }
    return status;
}
