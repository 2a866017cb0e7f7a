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
    qint64 peakBytes = 0;   // the process's peak resident memory during the run; 0 when not taken
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

// Peak resident memory of the process from startPeakMemory() on. The set-up's
// freed memory is handed back to the system first, so the figure is the
// program and its libraries plus what the run holds at its highest.
void startPeakMemory();
qint64 peakMemoryBytes();

// A run timed, with its peak memory.
template <typename F>
Figure measured(const QString& what, F&& f)
{
    startPeakMemory();
    Figure figure{what, timed(std::forward<F>(f))};
    figure.peakBytes = peakMemoryBytes();
    return figure;
}

}  // namespace quotas::bench
