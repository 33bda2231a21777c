// Makes a file operation fail on purpose, so that a test sees what a full disk or a locked file leaves behind.
#pragma once

#include <functional>

namespace kest::files {

/// Asked before each read, write, append, copy, move and removal of a file; true makes it fail as FileInputOutput.
/// An empty function takes it away.
void setFault(std::function<bool()> fault);

}  // namespace kest::files
