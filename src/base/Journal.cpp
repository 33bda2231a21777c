#include "base/Journal.h"

#include "base/History.h"
#include "base/JournalRecorder.h"
#include "base/JournalWork.h"
#include "base/SharedVariables.h"
#include "platform/RuntimeError.h"
#include "platform/database/Sql.h"

#include <QCryptographicHash>
#include <QScopeGuard>

#include <array>
#include <exception>
#include <utility>

namespace kest::journal {

using namespace Qt::StringLiterals;

namespace {

constexpr std::array kindWords{"load"_L1, "send"_L1, "save"_L1, "response"_L1, "undo"_L1};
constexpr std::array stateWords{"open"_L1,       "unfinished"_L1,  "done"_L1,     "failed"_L1,
                                "taken back"_L1, "interrupted"_L1, "finished"_L1, "pruned"_L1};

std::shared_ptr<Recorder> recorder = std::make_shared<Recorder>();

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
    recorder->stop();
}

void watch(const db::ConnectionPtr& connection)
{
    unwatch();  // until the database has answered
    recorder->start(*connection);
    connection->setObserver(recorder);
}

bool isKept()
{
    return recorder->isKept();
}

int endDeadSession(const Entry& entry)
{
    if (!isOwnerDead(entry))
        return 0;
    attempt([&] { gConn->endSession(entry.serverSession, entry.lock); });
    return sessionEnd;
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
    auto resumed = std::make_unique<Work>();
    resumed->file = entry.file;
    resumed->hash = entry.hash;
    resumed->number = entry.number;
    resumed->subquote = entry.subquote;
    resumed->lockName = entry.lock;
    resumed->lock = std::move(lock);
    resumed->id = entry.id;
    resumed->isCommitted = true;
    resumed->state = entry.state == wordOf(State::Open) ? State::Open : State::Unfinished;
    resumed->facts = entry.facts;
    resumed->own();
    work = std::move(resumed);
    isOutermost = isResumed = true;
}

void Operation::beforeFirstChange(std::function<void()> check)
{
    if (isOutermost)
        work->check = std::move(check);
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
        work->requireOwner();
        work->storeEnd(state);
    });
    work.reset();
}

void passPoint(const std::function<void()>& lastUpdate, const QJsonObject& facts)
{
    if (!work || !recorder->isKept())
        return lastUpdate();
    if (work->id != 0)
        work->requireOwner();  // before the facts, which it may read again
    for (auto fact = facts.begin(); fact != facts.end(); ++fact)
        work->facts[fact.key()] = fact.value();
    work->isPointAhead = true;
    const auto end = qScopeGuard([] { work->isPointAhead = false; });
    lastUpdate();
    if (!work->isPointAhead || work->id == 0)
        return;
    work->requireOwner();  // the last update has changed nothing, so that nothing was recorded
    work->markPoint();
    work->isPointPassed = true;
}

void keep(const QString& fact, const QJsonValue& value)
{
    if (!work || !recorder->isKept())
        return;
    if (work->id != 0)
        work->requireOwner();  // before the fact, because it may read the facts again
    if (work->facts.value(fact) == value)
        return;
    work->facts[fact] = value;
    if (work->id == 0)
        return;
    work->storeFacts();
}

QJsonValue kept(const QString& fact)
{
    return work ? work->facts.value(fact) : QJsonValue(QJsonValue::Undefined);
}

void openNow(const QString& number, const QString& subquote)
{
    if (!work || !recorder->isKept())
        return;
    const bool isNew = work->number.isEmpty();
    if (isNew) {
        work->number = number;
        work->subquote = subquote;
    }
    if (work->id == 0) {
        recorder->openNow();
    } else if (isNew) {
        work->requireOwner();
        work->storeNumber();
    }
}

void record(const db::RowChange& change)
{
    if (work)
        recorder->record({change});
}

void setState(qint64 operation, State state)
{
    gConn->execute(sql("UPDATE KESTOperation SET State='{}' WHERE Operation={}", wordOf(state), operation));
}

}  // namespace kest::journal
