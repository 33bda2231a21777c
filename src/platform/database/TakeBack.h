// Takes recorded changes of rows back.
#pragma once

#include "platform/database/Change.h"

namespace kest::db {

/// Returns true if the row still holds what the change left there; after a deletion, if no row has its key.
bool stillHolds(Connection& connection, const RowChange& change);

/// A transaction that takes changes back, which no observer sees. It is rolled back unless it is committed.
class TakeBack {
public:
    explicit TakeBack(Connection& connection);
    ~TakeBack();
    TakeBack(const TakeBack&) = delete;
    TakeBack& operator=(const TakeBack&) = delete;

    /// Takes one change back: an inserted row is deleted, an updated one gets its old values, and a deleted one comes
    /// back with its identity, but without columns that the database fills or that no statement writes. Returns false
    /// and changes nothing if the row no longer holds what the change left there, or if another row has its key.
    bool undo(const RowChange& change);
    void commit();

private:
    Connection& connection_;
    bool isOpen_ = true;
};

}  // namespace kest::db
