// The journal: what each operation changed in the quote database, so that every change of a quote can be explained, and
// interrupted work can be taken back or finished.
//
// An operation is a load of a message, its undo, a send, a save in the utilities or a submission response. Its row in
// KESTOperation and the record of each changed row in KESTJournal are written in the transaction of the change that
// they belong to: both are there, or neither is. A database without these two tables works without a journal; the error
// log says so once.
#pragma once

#include "platform/database/Connection.h"

#include <QDateTime>
#include <QJsonObject>
#include <QString>

#include <functional>
#include <memory>

namespace kest::db {
struct RowChange;
}

namespace kest::journal {

enum class Kind { Load, Send, Save, Response, Undo };

/// What became of an operation.
enum class State {
    Open,        // at work, or interrupted
    Unfinished,  // the tables are complete; a message waits to be moved, or pictures wait to be sent
    Done,
    Failed,       // refused, or ended by a failure; what it wrote stays
    TakenBack,    // interrupted, and its changes taken back
    Interrupted,  // interrupted, and not all of its changes could be taken back
    Finished,     // interrupted, and finished later
    Pruned,       // so old that it is being deleted, so that some of its records may be gone
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
    QString lock;           // the name of the lock that its owner has
    QString serverSession;  // of its owner; empty on the embedded engine
    QDateTime started;
    bool pastPoint = false;  // its last update was committed, so it is finished and not taken back
    QJsonObject facts;       // what finishing it needs
};

/// Returns a hash that identifies the text of a message, or the bytes of a document.
QString hashOf(const QString& text);
QString hashOf(const QByteArray& bytes);

/// Makes the journal see the changes on the connection, which must be open. Throws if the database does not say whether
/// it has a journal.
void watch(const db::ConnectionPtr& connection);
/// Keeps no journal until watch() is called again.
void unwatch();

/// If the owner of an operation was a process of this profile that no longer lives, ends its session on the server,
/// which could hold its locks for hours. Returns in how many seconds its locks are free.
int endDeadSession(const Entry& entry);

/// Returns true if the operation began in this workstation's folders. Another workstation or profile may have folders
/// of its own, with what its operation has left.
bool isOfThisWorkstation(const Entry& entry);

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
    /// Goes on with interrupted work, which `entry` then describes as it is now. It stays open if it is not ended.
    /// Waits so many seconds for the owner's lock.
    Operation(Entry& entry, int patience);
    ~Operation();
    Operation(const Operation&) = delete;
    Operation& operator=(const Operation&) = delete;

    /// Sets what is called before the operation's first change. If it throws, nothing is changed.
    void beforeFirstChange(std::function<void()> check);
    /// Returns false if the interrupted work has an owner who is at work on it, or was settled meanwhile.
    bool isOwner() const { return isOutermost; }
    /// Stores what became of it. If the connection is lost it stays open.
    void end(State state);

private:
    bool isOutermost = false;
    bool isResumed = false;
};

// These do nothing outside of an operation. They throw RowChanged if another workstation has settled this operation
// after its connection was lost.

/// Runs the last update of an operation. Once that is committed, an interrupted operation is finished and no longer
/// taken back; the facts that finishing it needs are committed with it.
void passPoint(const std::function<void()>& lastUpdate, const QJsonObject& facts = {});
/// Commits a fact that finishing the operation needs, or leaves it to the first change.
void keep(const QString& fact, const QJsonValue& value);
/// Returns a fact that was kept, also before the operation was interrupted.
QJsonValue kept(const QString& fact);
/// Opens the operation without a change, for one that goes on with a file, and names its quote.
void openNow(const QString& number, const QString& subquote);
/// Records a change that the connection does not show because it takes another one back. Call it in the transaction of
/// the change, after openNow().
void record(const db::RowChange& change);

/// Stores what became of another operation.
void setState(qint64 operation, State state);

}  // namespace kest::journal
