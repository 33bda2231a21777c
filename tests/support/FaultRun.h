// Runs a load with each of its statements and file operations failing, and again without the fault.
#pragma once

#include "support/Load.h"

#include <functional>
#include <utility>
#include <vector>

namespace kest::test {

/// Why a second load does not end as if the first had never been disturbed, and a pattern that such cases meet: in
/// "first load: taken", its boxes, "second load: not taken", its boxes, and all that the shop holds in the end.
using KnownDifference = std::pair<const char*, const char*>;

/// Loads a message of the unread folder from the shop as it stands. Fails for each step whose fault ends otherwise and
/// in none of the known differences, and for each of those that never comes up.
void expectAsIfNeverDisturbed(const QString& message, const std::vector<KnownDifference>& known = {},
                              const char* script = "{}",
                              const std::function<bool(const QString& message)>& load = loadAsTheWindow);

}  // namespace kest::test
