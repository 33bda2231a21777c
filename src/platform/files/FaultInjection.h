// Makes file operations fail in tests, as a full disk or a locked file would.
#pragma once

#include <functional>

namespace kest::files {

/// Sets a function that is called before each step that can fail: a file is opened, read, written, cut, given its mode,
/// flushed, renamed or removed, a folder is listed or made. If it returns true, the step fails with FileInputOutput. An
/// empty function turns this off.
void setFault(std::function<bool()> fault);

}  // namespace kest::files
