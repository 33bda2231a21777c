// Operations that were interrupted, for example by a killed process, a power cut or a lost server.
#pragma once

#include "base/Journal.h"

#include <QList>
#include <QString>

namespace kest::journal {

/// Closes the open operations whose process or connection no longer exists, and logs each. What they have changed stays
/// as it is. Does nothing while an operation is at work here.
void findInterrupted();

/// Returns what was found since the last call.
QList<Entry> takeInterrupted();

/// Returns the sentence for the user: what was interrupted, when, and what to do.
QString interruptionOf(const Entry& entry);

}  // namespace kest::journal
