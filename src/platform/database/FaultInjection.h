// Makes statements fail in tests.
#pragma once

#include "platform/RuntimeError.h"

#include <functional>

namespace kest::db {

/// Sets a function that is called before each statement of every connection, also those that begin and end a
/// transaction. If it returns true, the statement is not executed and fails with `number`: StatementFailed, or
/// CannotOpen, which also closes the connection. An empty function turns this off. The layer's own queries for the
/// schema don't count.
void setStatementFault(std::function<bool()> fault, int number = StatementFailed);

/// Sets a function that is called before each connection is opened, and before it is asked whether it still answers. If
/// it returns true, the server does not answer. An empty function turns this off.
void setConnectionFault(std::function<bool()> fault);

}  // namespace kest::db
