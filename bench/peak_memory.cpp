// The peak resident memory of one run inside the benchmark process. Linux
// keeps a high-water mark of the resident set (VmHWM) that writing 5 to
// /proc/self/clear_refs lowers to what is resident now.

#include "bench/benchmark.h"

#include <QFile>
#include <malloc.h>

namespace quotas::bench {

void startPeakMemory()
{
    malloc_trim(0);
    QFile reset(QStringLiteral("/proc/self/clear_refs"));
    if (reset.open(QIODevice::WriteOnly))
        reset.write("5");
}

qint64 peakMemoryBytes()
{
    QFile status(QStringLiteral("/proc/self/status"));
    if (!status.open(QIODevice::ReadOnly))
        return 0;
    for (const QByteArray& line : status.readAll().split('\n')) {
        if (line.startsWith("VmHWM:"))
            return line.mid(6).trimmed().split(' ').value(0).toLongLong() * 1024;
    }
    return 0;
}

}  // namespace quotas::bench
