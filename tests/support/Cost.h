// Measures the time and the memory of a step.
#pragma once

#include <functional>

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

Cost costOf(const std::function<void()>& step);

}  // namespace kest::test
