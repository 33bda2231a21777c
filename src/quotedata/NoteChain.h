// The note chain of a quote: the text that carries the quote's life on the network.
#pragma once

#include <QString>

namespace kest {

// A chain is a text of notes separated by single blanks, newest first. A note is
//   "(" date " : " [status " "] subject [" - " detail] ")"
// with the day on which it was first made. The status of a quote is read back from the chain by a note's subject.

/// Changes every note of the subject in place, each keeping its date; where the chain has none, or with `alwaysNew`,
/// puts a new note of today in front. The new chain is the result, and stands in `remarks` too.
QString AddNote(const QString& subject, const QString& status, QString& remarks, const QString& detail, bool alwaysNew);

/// Puts a new note in front, whatever the chain holds.
QString AddNewNote(const QString& subject, const QString& status, QString& remarks, const QString& detail);

/// The status of the first note of the subject; empty where no note has it.
QString GetNoteStatus(const QString& subject, const QString& remarks);

/// The chain without the notes in which the subject occurs.
QString RemoveNote(const QString& subject, const QString& remarks);

}  // namespace kest
