// Lets a test make a statement fail, to see what a routine leaves behind.
#pragma once

#include "platform/RuntimeError.h"

#include <functional>

namespace kest::db {

/// `fault` is asked before each statement of every connection; where it answers true the statement is not run and fails
/// with `number`: StatementFailed, or CannotOpen, after which the connection is closed. An empty function ends it.
/// What the layer asks about the schema itself is not counted.
void setStatementFault(std::function<bool()> fault, int number = StatementFailed);

}  // namespace kest::db
