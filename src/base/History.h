// What happened to a quote: the operations that changed it, and what each changed from what to what.
#pragma once

#include "base/Journal.h"
#include "platform/database/Change.h"

#include <QList>
#include <QString>

namespace kest::journal {

/// A row of KESTJournal: the change of one row of a table.
struct RecordedChange {
    qint64 entry = 0;
    QDateTime moment;
    QString number;  // of the quote that the row belongs to; empty for a car, a customer, a vendor
    QString subquote;
    db::RowChange row;
    bool isTakenBack = false;
};

/// Returns the operations that changed rows of a quote, newest first. An empty subquote means all subquotes.
QList<Entry> historyOf(const QString& number, const QString& subquote);
/// Returns an operation as it is now. Its id is 0 if there is none.
Entry entryOf(qint64 operation);
/// Returns the operations that are running, were interrupted, or have files that wait.
QList<Entry> pendingOperations();
/// Returns the loads of a message, under whatever name it came, after an operation.
QList<Entry> loadsOf(const QString& hash, qint64 after = 0);
/// Returns what an operation changed, in the order of the changes.
QList<RecordedChange> changesOf(qint64 operation);

/// What a change did to one column, as a person reads it: a value in quotation marks, or "(empty)". Long texts are
/// shortened to their difference.
struct ColumnStory {
    QString name;
    QString from;  // empty if the row is new
    QString to;    // empty if the row was deleted
};
/// Returns the columns that a change changed: of a new row what was filled in, of a deleted one what was lost.
QList<ColumnStory> columnsOf(const db::RowChange& row);
/// Returns the same as lines such as "excess: "250" -> "300"".
QStringList linesOf(const db::RowChange& row);
/// Returns "insert", "update" or "delete".
QString wordOf(db::ChangeKind kind);
/// Returns the key of a row, such as "QTNNO 1007, SUBQUOTE 0".
QString keyOf(const db::RowChange& row);

/// Returns a title such as "load of AUQT_1007.xml", "undo of the load of AUQT_1007.xml", "send" or "save in the
/// utilities".
QString titleOf(const Entry& entry);

/// Deletes operations that are older than the setting "JournalDays", but none that is open or unfinished, and no load
/// whose undo is. Deletes at most 1,000 rows at a time, the oldest first.
void prune();

}  // namespace kest::journal
