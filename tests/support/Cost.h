// Measures the time and the memory of a step.
#pragma once

#include <QFile>

#include <gtest/gtest.h>
#include <malloc.h>

#include <ctime>

namespace kest::test {

#if defined(__SANITIZE_ADDRESS__) || defined(__clang__)  // clang only builds the fuzz targets, with sanitizers
constexpr bool memoryIsReal = false;                     // the sanitizer keeps released memory
constexpr double slowness = 10;
#elif defined(__OPTIMIZE__)
constexpr bool memoryIsReal = true;
constexpr double slowness = 1;
#else
constexpr bool memoryIsReal = true;
constexpr double slowness = 3;
#endif

/// What a step has used.
struct Cost {
    double milliseconds = 0;  // of the processor
    double megabytes = 0;     // the most that was used at a time
};

/// Returns the most memory that this process has used since the last reset, in megabytes.
inline double peakMemory()
{
    QFile status(QStringLiteral("/proc/self/status"));
    EXPECT_TRUE(status.open(QFile::ReadOnly));
    const QByteArray all = status.readAll();
    const qsizetype at = all.indexOf("VmHWM:") + 6;
    return all.sliced(at, all.indexOf(" kB", at) - at).trimmed().toDouble() / 1024;
}

template <class Step>
Cost costOf(Step&& step)
{
    ::malloc_trim(0);
    QFile references(QStringLiteral("/proc/self/clear_refs"));
    EXPECT_TRUE(references.open(QFile::WriteOnly | QFile::Unbuffered) && references.write("5") == 1);
    const double memory = peakMemory();
    const std::clock_t begin = std::clock();
    step();
    return {1000.0 * double(std::clock() - begin) / CLOCKS_PER_SEC, peakMemory() - memory};
}

}  // namespace kest::test
