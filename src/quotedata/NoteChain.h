// Reads and changes the note chain of a quote, a text that records the quote's life on the network.
#pragma once

#include <QString>

namespace kest {

// A chain is a text of notes separated by single blanks, newest first. A note is
//   "(" date " : " [status " "] subject [" - " detail] ")"
// with the day on which it was first added.

/// Changes the status and detail of every note of the subject; the notes keep their dates. If there is no such note, or
/// if `alwaysNew` is true, adds a new note with today's date at the front. Returns the new chain, also in `remarks`.
QString AddNote(const QString& subject, const QString& status, QString& remarks, const QString& detail, bool alwaysNew);

/// Adds a new note at the front. Returns the new chain, also in `remarks`.
QString AddNewNote(const QString& subject, const QString& status, QString& remarks, const QString& detail);

/// Returns the status of the first note of the subject, or an empty text if there is none.
QString GetNoteStatus(const QString& subject, const QString& remarks);

/// Returns the chain without the notes that contain the subject.
QString RemoveNote(const QString& subject, const QString& remarks);

}  // namespace kest
