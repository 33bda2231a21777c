// The journal: what each operation changed in the quote database, so that every change of a quote can be explained.
//
// An operation is a load of a message, a send, a save in the utilities or a submission response. Its row in
// KESTOperation and the record of each changed row in KESTJournal are written in the transaction of the change that
// they belong to: both are there, or neither is. A database without these two tables works without a journal; the error
// log says so once.
#pragma once

#include "platform/database/Connection.h"

#include <QDateTime>
#include <QString>

#include <memory>

namespace kest::journal {

enum class Kind { Load, Send, Save, Response };

/// What became of an operation.
enum class State {
    Open,    // at work, or interrupted
    Done,    //
    Failed,  // refused, or ended by a failure; what it wrote stays
    Interrupted,
};

QString wordOf(Kind kind);
QString wordOf(State state);

/// A row of KESTOperation.
struct Entry {
    qint64 id = 0;
    QString kind;
    QString state;
    QString file;
    QString hash;
    QString number;  // of the quote, with its subquote; empty if none was changed
    QString subquote;
    QString workstation;
    QString lock;  // the name of the lock that its owner has
    QDateTime started;
};

/// Returns a hash that identifies the text of a message or document.
QString hashOf(const QString& text);

/// Makes the journal see the changes on the connection. Call it once the connection is open.
void watch(const db::ConnectionPtr& connection);

/// Returns true if the connection's database keeps a journal.
bool isKept();

/// Returns true while this process works on an operation.
bool isAtWork();

/// An operation, which lasts as long as the object. Within another operation it belongs to that one and does nothing
/// itself. Its row is written with its first change, so an operation that changes nothing writes nothing. If the object
/// is destroyed before end() was called, the operation has failed.
class Operation {
public:
    explicit Operation(Kind kind, const QString& file = {}, const QString& hash = {});
    ~Operation();
    Operation(const Operation&) = delete;
    Operation& operator=(const Operation&) = delete;

    /// Stores what became of it. If the connection is lost it stays open.
    void end(State state);

private:
    bool isOutermost = false;
};

}  // namespace kest::journal
