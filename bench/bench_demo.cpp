// The cost of the set-up every other benchmark starts from: creating the
// schema and N demo members.

#include "bench/benchmark.h"
#include "schema/demo_data.h"
#include "support/test_database.h"

namespace quotas::bench {

namespace {

[[maybe_unused]] const bool registered = registerBenchmark(QStringLiteral("demo"), [](Context& c) {
    test::TestDatabase db(c.engine, true);
    const double seconds = timed([&] { addDemoMembers(db.connection(), c.members); });
    return QList<Figure>{{QStringLiteral("demo-members"), seconds, 0}};
});

}  // namespace

}  // namespace quotas::bench
