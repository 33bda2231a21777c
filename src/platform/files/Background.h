// Deletes files that another process may still have open.
#pragma once

#include <QString>

namespace kest::files {

/// Deletes a file. If that fails, retries every 100 ms while a window is open.
void removeInBackground(const QString& path);
/// Waits for these deletions. Returns true if all files are gone. The profile remembers those that still exist.
bool waitForBackground(int milliseconds);
/// Continues the deletions that an earlier process has left, except for files that have changed since.
void resumeRemovals();

}  // namespace kest::files
