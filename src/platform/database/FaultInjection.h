// Makes statements fail in tests.
#pragma once

#include "platform/RuntimeError.h"

#include <functional>

namespace kest::db {

/// Sets a function that is called before each statement of every connection. If it returns true, the statement is not
/// executed and fails with `number`: StatementFailed, or CannotOpen, which also closes the connection. An empty
/// function turns this off. The layer's own queries for the schema don't count.
void setStatementFault(std::function<bool()> fault, int number = StatementFailed);

}  // namespace kest::db
