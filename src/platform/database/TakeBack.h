// Takes a recorded change of a row back.
#pragma once

#include "platform/database/Change.h"

#include <functional>

namespace kest::db {

/// Returns true if the row still holds what the change left there; after a deletion, if no row has its key.
bool stillHolds(Connection& connection, const RowChange& change);

/// Takes one change back: an inserted row is deleted, an updated one gets its old values, and a deleted one comes back
/// with its identity, but without columns that the database fills or that no statement writes. `record` runs in the
/// same transaction. Returns false and changes nothing if the row no longer holds what the change left there. No
/// observer sees it.
bool takeBack(Connection& connection, const RowChange& change, const std::function<void()>& record);

}  // namespace kest::db
