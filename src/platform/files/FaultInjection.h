// Makes file operations fail in tests, as a full disk or a locked file would.
#pragma once

#include <functional>

namespace kest::files {

/// Sets a function that is called before each read, write, append, copy, move and removal of a file. If it returns
/// true, the operation fails with FileInputOutput. An empty function turns this off.
void setFault(std::function<bool()> fault);

}  // namespace kest::files
