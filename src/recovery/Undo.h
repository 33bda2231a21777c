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

/// What became of an undo.
struct Undone {
    /// Done; Unfinished if only its message waits to be moved; Interrupted if rows have stayed, and its message, too;
    /// or Failed if it was refused.
    journal::State state = journal::State::Done;
    QStringList told;  // what was not done, or why it was refused, a sentence each

    bool areRowsBack() const { return state == journal::State::Done || state == journal::State::Unfinished; }
    /// "The load is undone.", or that it is so only in part.
    QString sentence() const;
};

/// Takes the changes of a load back as takeBack() does, and moves its message to the unread folder under its old name.
/// This is an operation of its own. If it is interrupted or fails, it is finished later. Throws RowChanged with the
/// reasons if the operation can't be undone.
Undone undo(qint64 operation);

/// Undoes a load if the user answers Yes. A box says why the load can't be undone, or what was not done. Returns true
/// if it was undone.
bool askAndUndo(qint64 operation);

/// Goes on with an undo inside its operation. It may be refused as long as no row is back. If another workstation began
/// it (not `isOwn`), its message waits to be moved also if it can't be seen from here.
Undone finishUndo(bool isOwn);

}  // namespace kest::recovery
