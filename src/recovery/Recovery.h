// Settles work that was interrupted, for example by a killed process, a power cut or a lost server.
//
// Each operation happens exactly once: before its last update was committed, an interrupted load is taken back; after
// it, it is finished. A send is finished if its document was written. An undo is always finished.
#pragma once

#include "base/Journal.h"

#include <QList>
#include <QString>
#include <QStringList>

#include <functional>

namespace kest::recovery {

enum class Outcome { TakenBack, Finished, Left };

/// "taken back", "finished" or "left".
QString wordOf(Outcome outcome);

/// What became of an interrupted operation.
struct Settled {
    journal::Entry operation;
    Outcome outcome = Outcome::TakenBack;
    QStringList left;  // what could not be taken back, and what was not shown; a sentence each

    /// What to tell the user: what was interrupted, when, what became of it, and what to do.
    QString sentence() const;
};

/// Settles the interrupted operations whose owner is gone, and moves messages and sends pictures that still wait. Does
/// nothing while an operation is at work here. Never throws: what fails is in the error log and is tried again the next
/// time. Only a caller that has the lock for loads of a file names it in `lockedFile`.
void settle(const QString& lockedFile = {});

/// Returns what was settled since the last call.
QList<Settled> takeSettled();
/// Sets who hears of each operation as soon as it is settled, in addition to takeSettled().
void setReporter(std::function<void(const Settled&)> reporter);
/// If a person sees the windows, shows what was settled since the last call, a box for each operation.
void showSettled();

/// What an earlier load of a message has left.
enum class EarlierLoad {
    None,
    Complete,  // it was loaded, and only had to be moved
    Pending,   // it, or its undo, could not be settled
};
/// Settles the earlier loads of a message. The caller has the lock for loads of that file.
EarlierLoad settleLoadOf(const QString& file, const QString& hash);

/// The name of the lock that a load of a file has.
QString loadLock(const QString& file);

}  // namespace kest::recovery
