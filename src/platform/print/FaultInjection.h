// Makes printing fail in tests, as a printer that is gone would.
#pragma once

#include <functional>

namespace kest::report {

/// Sets a function that is called before pages are painted on paper or into a file. If it returns true, painting fails.
/// An empty function turns this off.
void setPrintFault(std::function<bool()> fault);

}  // namespace kest::report
