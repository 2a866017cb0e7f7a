// quotas-bench [--engine sqlite|postgresql|both] [--members 2000,20000] [--json] [NAME...]
// PostgreSQL runs use the server named by QUOTAS_TEST_PG_HOST, _PORT, _USER
// and _PASSWORD (scripts/bench.sh starts one with durable settings). With
// --json every figure is one JSON object on a line of its own, so that runs
// of different commits can be compared by a script.

#include "bench/benchmark.h"
#include "component/shared_objects.h"
#include "platform/errors.h"
#include "schema/demo_data.h"
#include "support/recording_progress.h"
#include "support/scripted_boxes.h"
#include "support/test_database.h"

#include <QApplication>
#include <QCommandLineParser>
#include <QJsonDocument>
#include <QJsonObject>
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

QString engineName(Engine e)
{
    return e == Engine::SQLite ? QStringLiteral("sqlite") : QStringLiteral("postgresql");
}

QString asText(const Figure& f, Engine e, int members)
{
    const auto orDash = [](bool known, double value, int decimals) {
        return known ? QString::number(value, 'f', decimals) : QStringLiteral("-");
    };
    return QStringLiteral("%1 %2 %3 %4 %5 %6 %7")
        .arg(f.what, -14)
        .arg(engineName(e), -11)
        .arg(members, 8)
        .arg(f.seconds, 9, 'f', 3)
        .arg(orDash(f.lowerBound > 0, f.lowerBound, 3), 10)
        .arg(orDash(f.lowerBound > 0, f.seconds / f.lowerBound, 1), 7)
        .arg(orDash(f.peakBytes > 0, double(f.peakBytes) / (1024 * 1024), 1), 9);
}

QString asJson(const Figure& f, Engine e, int members)
{
    QJsonObject o{{QStringLiteral("name"), f.what.trimmed()},
                  {QStringLiteral("engine"), engineName(e)},
                  {QStringLiteral("members"), members},
                  {QStringLiteral("seconds"), f.seconds}};
    o.insert(QStringLiteral("bound_seconds"), f.lowerBound > 0 ? QJsonValue(f.lowerBound) : QJsonValue());
    o.insert(QStringLiteral("ratio"), f.lowerBound > 0 ? QJsonValue(f.seconds / f.lowerBound) : QJsonValue());
    o.insert(QStringLiteral("peak_rss_bytes"), f.peakBytes > 0 ? QJsonValue(f.peakBytes) : QJsonValue());
    return QString::fromUtf8(QJsonDocument(o).toJson(QJsonDocument::Compact));
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
    parser.addOption({QStringLiteral("json"), QStringLiteral("One JSON object per figure instead of the table.")});
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
    const bool json = parser.isSet(QStringLiteral("json"));
    if (!json)
        bench::print(QStringLiteral("%1 %2 %3 %4 %5 %6 %7")
                         .arg(QStringLiteral("benchmark"), -14)
                         .arg(QStringLiteral("engine"), -11)
                         .arg(QStringLiteral("members"), 8)
                         .arg(QStringLiteral("run (s)"), 9)
                         .arg(QStringLiteral("bound (s)"), 10)
                         .arg(QStringLiteral("ratio"), 7)
                         .arg(QStringLiteral("peak (MB)"), 9));
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
                    for (const bench::Figure& f : found->second(context))
                        bench::print(json ? bench::asJson(f, e, n) : bench::asText(f, e, n));
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
