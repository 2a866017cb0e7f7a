#pragma once

#include "platform/dialect.h"

#include <QElapsedTimer>
#include <QList>
#include <QString>
#include <functional>

namespace quotas::test {
class TestDatabase;
}

namespace quotas::bench {

// One line of the report: a run and its set-based lower bound, in seconds.
struct Figure {
    QString what;
    double seconds = 0;
    double lowerBound = 0;  // 0 when there is none
};

struct Context {
    Engine engine;
    int members;
    // A fresh database with the schema and `members` demo members; each call
    // gives a new one, so a run and its lower bound start from the same state.
    std::function<std::unique_ptr<test::TestDatabase>()> freshDatabase;
};

using Benchmark = std::function<QList<Figure>(Context&)>;

// Registers a benchmark under a name (used to pick it on the command line).
bool registerBenchmark(const QString& name, Benchmark benchmark);

// Seconds taken by f.
template <typename F>
double timed(F&& f)
{
    QElapsedTimer t;
    t.start();
    f();
    return double(t.nsecsElapsed()) / 1e9;
}

}  // namespace quotas::bench
