#include "base/Journal.h"

#include "base/History.h"
#include "base/JournalRecord.h"
#include "base/SharedVariables.h"
#include "base/modDBAccess.h"
#include "base/modLoggerEx.h"
#include "platform/RuntimeError.h"
#include "platform/database/Change.h"
#include "platform/database/Sql.h"
#include "platform/files/Lock.h"
#include "platform/profile.h"
#include "platform/values.h"

#include <QCoreApplication>
#include <QCryptographicHash>
#include <QJsonDocument>
#include <QScopeGuard>
#include <QSet>
#include <QSysInfo>
#include <QUuid>

#include <array>
#include <exception>
#include <optional>
#include <utility>

namespace kest::journal {

using namespace Qt::StringLiterals;

namespace {

constexpr std::array kindWords{"load"_L1, "send"_L1, "save"_L1, "response"_L1, "undo"_L1};
constexpr std::array stateWords{"open"_L1,       "unfinished"_L1,  "done"_L1,    "failed"_L1,
                                "taken back"_L1, "interrupted"_L1, "finished"_L1};

/// The operation at work.
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
    QJsonObject facts;
};

std::unique_ptr<Work> work;

constexpr int sessionEnd = 5;  // seconds, in which a server notices that a session is gone

QString now()
{
    return QDateTime::currentDateTime().toString(u"yyyy-MM-ddTHH:mm:ss"_s);
}

/// Takes the lock that tells others that the owner of the work lives. Returns false if someone else has it.
bool takeLock(int seconds)
{
    work->lock.reset();  // first, because it may be that of a lost connection
    work->lock = std::make_unique<db::Lock>(gConn, work->lockName, seconds);
    work->serverSession = gConn->serverSession();
    return work->lock->isHeld();
}

/// Takes the lock of a lost connection again.
void takeLockAgain()
{
    const QString lostSession = work->serverSession;
    attempt([&] { gConn->endSession(lostSession, work->lockName); });  // or the server does so later
    if (takeLock(sessionEnd))
        return;
    work->serverSession = lostSession;
    throw RuntimeError(RowChanged, u"The connection was lost, and the lock of this work is not free yet."_s);
}

/// Returns false if another workstation has settled the work, or has begun to take it back. Otherwise notes what that
/// workstation has done, and the session that has the lock now.
bool isStillOpen()
{
    const db::Recordset row =
        opened(sql("SELECT State, Facts FROM KESTOperation WHERE Operation={} AND Operation NOT IN (SELECT Operation "
                   "FROM KESTJournal WHERE Operation={} AND Settled=1)",
                   work->id, work->id));
    if (row.eof() || row.text(u"State"_s) != wordOf(work->state))
        return false;
    const QJsonObject stored = QJsonDocument::fromJson(row.text(u"Facts"_s).toUtf8()).object();
    for (auto fact = stored.begin(); fact != stored.end(); ++fact)  // not all, because storing the last may have failed
        work->facts[fact.key()] = fact.value();
    if (!work->serverSession.isEmpty())
        gConn->execute(
            sql("UPDATE KESTOperation SET ServerSession='{}' WHERE Operation={}", work->serverSession, work->id));
    return true;
}

/// A lost connection has lost the lock, too, so that another workstation may have settled the work. A question that
/// fails is asked again at the next change.
void requireOwner()
{
    if (!work->isLost && gConn->generation() != work->generation) {
        takeLockAgain();
        work->isLost = !isStillOpen();
        work->generation = gConn->generation();
    }
    if (work->isLost)
        throw RuntimeError(RowChanged, u"This work was interrupted, and another workstation has settled it."_s);
}

QString signFile()
{
    return profile::root() + u"/operations.lock"_s;
}

/// Returns a text that only processes of this profile on this machine have.
QString place()
{
    return hashOf(QString::fromLatin1(QSysInfo::machineUniqueId()) + profile::root());
}

/// Does what the operation's row needs before the transaction of its first change.
void prepareOperation()
{
    work->lockName = u"operation "_s + QUuid::createUuid().toString(QUuid::WithoutBraces);
    if (!takeLock(0))
        throw RuntimeError(PermissionDenied, u"The database does not give the lock of this work."_s);
    work->generation = gConn->generation();
    if (!work->serverSession.isEmpty() &&
        attempt([] { work->sign = std::make_unique<files::Lock>(signFile(), work->lockName); }))
        work->facts[u"place"_s] = place();
    work->row = opened(u"SELECT * FROM KESTOperation WHERE Operation=0"_s);
}

void insertOperation()
{
    db::Recordset& row = *work->row;
    row.addNew();
    row.set(u"OperationKind"_s, wordOf(work->kind));
    row.set(u"State"_s, wordOf(State::Open));
    row.set(u"FileName"_s, work->file);
    row.set(u"FileHash"_s, work->hash);
    row.set(u"QTNNO"_s, work->number);
    row.set(u"Subquote"_s, work->subquote);
    row.set(u"Workstation"_s, GetComputerName());
    row.set(u"ProcessId"_s, QCoreApplication::applicationPid());
    row.set(u"ServerSession"_s, work->serverSession);
    row.set(u"LockName"_s, work->lockName);
    row.set(u"StartedAt"_s, now());
    row.set(u"PastPoint"_s, false);
    row.set(u"Facts"_s, asciiJson(work->facts));
    row.update();
    work->id = toLong(row.value(u"Operation"_s));
    work->row.reset();
}

/// Fails with "42501" if this user may not write what settling an operation writes. That a row can be inserted shows
/// with the first one.
void requireRights()
{
    for (const char* statement :
         {"UPDATE KESTOperation SET State=State WHERE Operation=0", "DELETE FROM KESTOperation WHERE Operation=0",
          "UPDATE KESTJournal SET Settled=Settled WHERE Entry=0", "DELETE FROM KESTJournal WHERE Entry=0"})
        gConn->execute(QString::fromLatin1(statement));
}

void storeNumber()
{
    gConn->execute(sql("UPDATE KESTOperation SET QTNNO='{}', Subquote='{}' WHERE Operation={}", work->number,
                       work->subquote, work->id));
}

void markPoint()
{
    gConn->execute(sql("UPDATE KESTOperation SET PastPoint=1, Facts='{}', QTNNO='{}', Subquote='{}' WHERE Operation={}",
                       asciiJson(work->facts), work->number, work->subquote, work->id));
}

/// Returns why the changes of this database can't be taken back, or an empty text if they can.
QString transactionFault(const db::Connection& connection)
{
    const QStringList without = connection.tablesWithoutTransactions();
    for (const QString& table :
         u"KESTOperation KESTJournal QUOTE1 QUOTE2 QUOTE3 CAR CUSTOMER VENDOR CINFO"_s.split(u' '))
        if (without.contains(table, Qt::CaseInsensitive))
            return u"The table %1 has no transactions"_s.arg(table);
    return {};
}

/// Writes to the error log why the database keeps no journal, once for each reason.
void tellNoJournal(const QString& why)
{
    static QSet<QString> reasons;
    if (reasons.contains(why))
        return;
    reasons.insert(why);
    const QString told = why + u": what changes a quote is not recorded, and interrupted work is not taken back."_s;
    attempt([&] { logFailure(RuntimeError(NoObject, told), u"Journal.watch"_s); });
}

class Recorder final : public db::ChangeObserver {
public:
    bool observes(const QString& table) const override
    {
        return work && isKept && !table.startsWith("KESTOperation"_L1, Qt::CaseInsensitive) &&
               !table.startsWith("KESTJournal"_L1, Qt::CaseInsensitive);
    }
    QStringList wantedColumns() const override { return {u"QTNNO"_s, u"Subquote"_s}; }
    void aboutToChange() override;
    void changed(db::Connection& connection, const QList<db::RowChange>& rows) override;
    void committed() override;
    void takenBack() override;

    bool isKept = false;
    bool hasRights = false;  // known for this connection

    /// Runs the first record of an operation. If the database forbids it, there is no journal from now on.
    template <class Step>
    void unlessForbidden(Step&& step);

private:
    void record(const QList<db::RowChange>& rows);
};

std::shared_ptr<Recorder> recorder = std::make_shared<Recorder>();

QVariant valueOf(const db::RowChange& row, const QString& name)
{
    const db::RowChange::Column* column = row.column(name);
    if (!column)
        return {};
    return row.kind == db::ChangeKind::Delete ? column->before : column->after;
}

void Recorder::aboutToChange()
{
    if (work->id != 0)
        return requireOwner();
    unlessForbidden([this] {
        if (!hasRights)
            requireRights();
        hasRights = true;
        prepareOperation();
    });
}

void Recorder::committed()
{
    work->isCommitted = true;
    work->isNumberNew = false;
    if (std::exchange(work->isPointAhead, false))
        work->isPointPassed = true;  // with this change
}

/// The operation's own row has gone with its first change.
void Recorder::takenBack()
{
    if (std::exchange(work->isNumberNew, false)) {
        work->number.clear();
        work->subquote.clear();
    }
    if (work->isCommitted)
        return;
    work->id = 0;
    work->row.reset();
    work->lock.reset();
    work->sign.reset();
}

template <class Step>
void Recorder::unlessForbidden(Step&& step)
{
    try {
        step();
    } catch (const RuntimeError& error) {
        if (work->isCommitted || error.sqlState() != "42501"_L1)
            throw;
        isKept = false;
        tellNoJournal(error.description());
        if (work->id != 0)  // only the other table is forbidden
            gConn->execute(sql("DELETE FROM KESTOperation WHERE Operation={}", work->id));
        takenBack();
    }
}

void Recorder::changed(db::Connection&, const QList<db::RowChange>& rows)
{
    if (isKept)
        unlessForbidden([&] { record(rows); });
}

void Recorder::record(const QList<db::RowChange>& rows)
{
    for (const db::RowChange& row : rows) {
        const QVariant number = valueOf(row, u"QTNNO"_s);
        if (work->number.isEmpty() && !number.isNull()) {
            work->number = toText(number);
            work->subquote = textOrEmpty(valueOf(row, u"Subquote"_s));
            work->isNumberNew = true;
        }
    }
    if (work->id == 0)
        insertOperation();
    else if (work->isNumberNew)
        storeNumber();
    const QString moment = now();
    for (const db::RowChange& row : rows) {
        const QVariant number = valueOf(row, u"QTNNO"_s);
        const QVariant subquote = valueOf(row, u"Subquote"_s);
        gConn->execute(
            sql("INSERT INTO KESTJournal (Operation, ChangedAt, TableName, QTNNO, Subquote, RowData, "
                "Settled) VALUES ({}, '{}', '{}', '{}', '{}', '{}', 0)",
                work->id, moment, row.table, textOrEmpty(number), textOrEmpty(subquote), textOf(row)));
    }
    if (work->isPointAhead)
        markPoint();
}

}  // namespace

QString wordOf(Kind kind)
{
    return kindWords[size_t(kind)];
}

QString wordOf(State state)
{
    return stateWords[size_t(state)];
}

QString hashOf(const QString& text)
{
    return hashOf(text.toUtf8());
}

QString hashOf(const QByteArray& bytes)
{
    return QString::fromLatin1(QCryptographicHash::hash(bytes, QCryptographicHash::Sha256).toHex());
}

void unwatch()
{
    recorder->isKept = false;
    recorder->hasRights = false;
}

void watch(const db::ConnectionPtr& connection)
{
    unwatch();  // until the database has answered
    const bool hasTables = connection->hasTable(u"KESTOperation"_s) && connection->hasTable(u"KESTJournal"_s);
    const QString fault = hasTables ? transactionFault(*connection) : u"The database has no tables for the journal"_s;
    recorder->isKept = fault.isEmpty();
    connection->setObserver(recorder);
    if (!recorder->isKept)
        tellNoJournal(fault);
}

int endDeadSession(const Entry& entry)
{
    if (entry.serverSession.isEmpty() || entry.facts[u"place"_s] != place() ||
        !files::Lock(signFile(), entry.lock).isHeld())
        return 0;
    attempt([&] { gConn->endSession(entry.serverSession, entry.lock); });
    return sessionEnd;
}

bool isKept()
{
    return recorder->isKept;
}

bool isAtWork()
{
    return work != nullptr;
}

Operation::Operation(Kind kind, const QString& file, const QString& hash)
{
    if (work)
        return;
    isOutermost = true;
    work = std::make_unique<Work>();
    work->kind = kind;
    work->file = file;
    work->hash = hash;
}

Operation::Operation(Entry& entry, int patience)
{
    if (work)
        return;
    auto lock = std::make_unique<db::Lock>(gConn, entry.lock, patience);
    const QString stateBefore = entry.state;
    if (!lock->isHeld())
        return;
    entry = entryOf(entry.id);
    if (entry.state != stateBefore)
        return;
    isOutermost = isResumed = true;
    work = std::make_unique<Work>();
    work->file = entry.file;
    work->hash = entry.hash;
    work->number = entry.number;
    work->subquote = entry.subquote;
    work->lockName = entry.lock;
    work->lock = std::move(lock);
    work->generation = gConn->generation();
    work->serverSession = gConn->serverSession();
    work->id = entry.id;
    work->isCommitted = true;
    work->state = entry.state == wordOf(State::Open) ? State::Open : State::Unfinished;
    work->facts = entry.facts;
}

Operation::~Operation()
{
    if (!isOutermost)
        return;
    // an unattended command that stops at a window has not failed: the rest is done later
    const bool isToFinish = work && work->isPointPassed && std::uncaught_exceptions() > 0;
    if (isResumed || isToFinish)
        work.reset();
    else
        end(State::Failed);
}

void Operation::end(State state)
{
    if (!isOutermost || !work)
        return;
    attempt([&] {  // without a connection it stays open
        if (work->id == 0)
            return;
        requireOwner();
        gConn->execute(sql("UPDATE KESTOperation SET State='{}', EndedAt='{}' WHERE Operation={}", wordOf(state), now(),
                           work->id));
    });
    work.reset();
}

void passPoint(const std::function<void()>& lastUpdate, const QJsonObject& facts)
{
    if (!work || !recorder->isKept)
        return lastUpdate();
    if (work->id != 0)
        requireOwner();  // before the facts, which it may read again
    for (auto fact = facts.begin(); fact != facts.end(); ++fact)
        work->facts[fact.key()] = fact.value();
    work->isPointAhead = true;
    const auto end = qScopeGuard([] { work->isPointAhead = false; });
    lastUpdate();
    if (!work->isPointAhead || work->id == 0)
        return;
    requireOwner();  // the last update has changed nothing, so that nothing was recorded
    markPoint();
    work->isPointPassed = true;
}

void keep(const QString& fact, const QJsonValue& value)
{
    if (!work || !recorder->isKept)
        return;
    if (work->id != 0)
        requireOwner();  // before the fact, because it may read the facts again
    if (work->facts.value(fact) == value)
        return;
    work->facts[fact] = value;
    if (work->id == 0)
        return;
    gConn->execute(sql("UPDATE KESTOperation SET Facts='{}' WHERE Operation={}", asciiJson(work->facts), work->id));
}

QJsonValue kept(const QString& fact)
{
    return work ? work->facts.value(fact) : QJsonValue(QJsonValue::Undefined);
}

void openNow(const QString& number, const QString& subquote)
{
    if (!work || !recorder->isKept)
        return;
    const bool isNew = work->number.isEmpty();
    if (isNew) {
        work->number = number;
        work->subquote = subquote;
    }
    if (work->id == 0) {
        recorder->aboutToChange();
        if (!recorder->isKept)
            return;
        recorder->unlessForbidden([] {
            insertOperation();
            work->isCommitted = true;
        });
    } else if (isNew) {
        requireOwner();
        storeNumber();
    }
}

void record(const db::RowChange& change)
{
    if (work && recorder->isKept)
        recorder->changed(*gConn, {change});
}

void setState(qint64 operation, State state)
{
    gConn->execute(sql("UPDATE KESTOperation SET State='{}' WHERE Operation={}", wordOf(state), operation));
}

}  // namespace kest::journal
