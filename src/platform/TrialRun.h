// Tries work of a foreign library that a damaged file could keep from ending.
#pragma once

#include <functional>

namespace kest {

/// Runs the work in a copy of this process and returns true if it ends there within this time. Whatever the work
/// changes, its copy alone sees. If no copy can be made, returns true.
bool endsInTime(const std::function<void()>& work, int milliseconds);

}  // namespace kest
