// The operation that this process works on: its row in KESTOperation, and the lock that shows others that its owner
// lives.
#pragma once

#include "base/Journal.h"
#include "platform/database/Recordset.h"
#include "platform/files/Lock.h"

#include <QJsonObject>
#include <QString>

#include <functional>
#include <memory>
#include <optional>

namespace kest::journal {

/// The operation, and what it needs to write its row.
struct Work {
    Kind kind = Kind::Load;
    QString file;
    QString hash;
    QString number;
    QString subquote;
    bool isNumberNew = false;  // since the last committed change
    QString lockName;
    std::unique_ptr<db::Lock> lock;
    std::unique_ptr<files::Lock> sign;  // of life, for other processes of the profile
    int generation = 0;                 // of the connection that has the lock
    QString serverSession;              // of that connection
    bool isLost = false;                // to another workstation
    std::optional<db::Recordset> row;   // of KESTOperation, until it is inserted
    qint64 id = 0;                      // 0 until its first change
    bool isCommitted = false;           // with that change
    State state = State::Open;
    bool isPointAhead = false;  // the next change is the last
    bool isPointPassed = false;
    std::function<void()> check;  // before the first change
    QJsonObject facts;

    /// A lost connection has lost the lock, too, so that another workstation may have settled the work. Throws
    /// RowChanged if it has. A question that fails is asked again at the next change.
    void requireOwner();

    /// Does what the operation's row needs before the transaction of its first change.
    void prepare();
    void insert();
    /// Takes back prepare() and insert().
    void forgetRow();
    void storeNumber();
    void storeFacts();
    void markPoint();
    void storeEnd(State end);
    /// Leaves a sign of life and, on a server, stores whose session has the lock, so that nobody takes it for the one
    /// that died.
    void own();

private:
    void leaveSign();
    void storeOwner();
    bool takeLock(int seconds);
    void takeLockAgain();
    bool isStillOpen();
};

/// Null while this process works on no operation.
extern std::unique_ptr<Work> work;

/// Returns true if the owner of an operation was a process of this profile that no longer lives.
bool isOwnerDead(const Entry& entry);

constexpr int sessionEnd = 5;  // seconds, in which a server notices that a session is gone

/// Returns the moment as the journal stores it.
QString now();

}  // namespace kest::journal
