// Takes back what an operation changed.
#pragma once

#include "platform/database/Change.h"

#include <QStringList>

#include <functional>

namespace kest::recovery {

/// Takes the changes of an operation back, the newest row first, some rows in a transaction. A row goes back whole, and
/// only if it still holds what the operation wrote last. New cars, customers and vendors, the counter of quotes and the
/// mark of a car stay, because other loads may use them. A new quote that has lines, notes or an invoice from elsewhere
/// stays with all its rows, and so does the new registration of a car that other quotes have. Can be interrupted and
/// run again. Returns what could not be taken back, a sentence each. `record` gets the change that takes a row back, in
/// its transaction. `mayBegin` is asked in the first transaction; if it says no, nothing is taken back.
QStringList takeBack(qint64 operation, const std::function<void(const db::RowChange&)>& record = {},
                     const std::function<bool()>& mayBegin = {});

/// Returns what takeBack() could not take back, a sentence each, and changes nothing.
QStringList obstaclesTo(qint64 operation);

}  // namespace kest::recovery
