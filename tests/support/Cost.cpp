#include "support/Cost.h"

#include "support/Test.h"

#include <malloc.h>

#include <ctime>

namespace kest::test {

/// Returns the most memory that this process has used since the last reset, in megabytes.
static double peakMemory()
{
    QFile status(u"/proc/self/status"_s);
    EXPECT_TRUE(status.open(QFile::ReadOnly));
    const QByteArray all = status.readAll();
    const qsizetype at = all.indexOf("VmHWM:") + 6;
    return all.sliced(at, all.indexOf(" kB", at) - at).trimmed().toDouble() / 1024;
}

static double milliseconds()
{
    return 1000.0 * double(std::clock()) / CLOCKS_PER_SEC;
}

Cost costOf(const std::function<void()>& step)
{
    ::malloc_trim(0);
    QFile references(u"/proc/self/clear_refs"_s);
    EXPECT_TRUE(references.open(QFile::WriteOnly | QFile::Unbuffered) && references.write("5") == 1);
    const double memory = peakMemory();
    const double time = milliseconds();
    step();
    return {milliseconds() - time, peakMemory() - memory};
}

}  // namespace kest::test
