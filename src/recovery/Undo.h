// Undoes a load that was complete, because somebody wants its message unread again.
#pragma once

#include "base/Journal.h"

#include <QStringList>

namespace kest::recovery {

/// Returns why an operation can't be undone, a sentence each, or nothing if it can be. Only a complete load can be
/// undone that is the newest operation on its quotes, that has moved no picture, deleted no request and exported no
/// job, and whose rows nobody has changed or invoiced since.
QStringList obstaclesToUndo(qint64 operation);

/// The question to ask before undo().
QString undoQuestion(qint64 operation);

/// Takes the changes of a load back as takeBack() does, and moves its message to the unread folder under its old name.
/// This is an operation of its own. If it is interrupted, it is finished later. Returns what was not done, a sentence
/// each. Throws RowChanged with the reasons if the operation can't be undone.
QStringList undo(qint64 operation);

/// Undoes a load if the user answers Yes. A box says why the load can't be undone, or what was not done. Returns true
/// if it was undone.
bool askAndUndo(qint64 operation);

/// Goes on with an undo inside its operation, which that workstation began.
QStringList finishUndo(const QString& workstation);
/// Returns true if the message of the load that is undone still has to be moved, or if that can't be seen from here. It
/// was in sight of the workstation that began the undo.
bool isMessageToMove(const QString& workstation);

}  // namespace kest::recovery
