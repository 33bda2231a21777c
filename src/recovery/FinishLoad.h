// Goes on with a load that was interrupted after its last update, and removes what one has left that is taken back.
#pragma once

#include "base/Journal.h"

#include <QStringList>

namespace kest::recovery {

/// Does the rest of a load inside its operation: pictures, counter, export and file move. Returns what was not done, a
/// sentence each: a window that was not shown, a job that JobLink has in part, a message that is gone.
QStringList finishLoad(const journal::Entry& entry);

/// Returns true if the message is still in the unread folder, unchanged, or if that can't be seen from here.
bool stillWaits(const journal::Entry& entry);

/// Returns true if the folder has that message.
bool isThere(const QString& folder, const QString& file, const QString& hash);

/// Removes the documents of sublet work that a load has written. Returns which could not be removed, a sentence each.
QStringList removeDocuments(const journal::Entry& entry);

}  // namespace kest::recovery
