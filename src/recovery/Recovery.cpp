#include "recovery/Recovery.h"

#include "base/History.h"
#include "base/SharedVariables.h"
#include "base/modDBAccess.h"
#include "base/modLoggerEx.h"
#include "outbound/modCreateXML.h"
#include "platform/Prompt.h"
#include "platform/RuntimeError.h"
#include "recovery/FinishLoad.h"
#include "recovery/TakeBack.h"
#include "recovery/Undo.h"

#include <QJsonArray>
#include <QSet>

#include <algorithm>
#include <optional>
#include <utility>

namespace kest::recovery {

using namespace Qt::StringLiterals;

namespace {

constexpr auto source = "Recovery.settle"_L1;

QList<Settled> settledSince;
std::function<void(const Settled&)> settledReporter;

bool isOf(const journal::Entry& entry, journal::Kind kind)
{
    return entry.kind == journal::wordOf(kind);
}

bool isOfFile(const journal::Entry& entry, const QString& file)
{
    return entry.file.compare(file, Qt::CaseInsensitive) == 0;
}

bool isLoadOf(const journal::Entry& entry, const QString& file)
{
    return isOf(entry, journal::Kind::Load) && isOfFile(entry, file);
}

bool isUnfinished(const journal::Entry& entry)
{
    return entry.state == journal::wordOf(journal::State::Unfinished);
}

bool isTakenBack(const journal::Entry& entry)
{
    return !entry.pastPoint && !isUnfinished(entry) &&
           (isOf(entry, journal::Kind::Load) || isOf(entry, journal::Kind::Save) ||
            isOf(entry, journal::Kind::Response));
}

/// Puts the operations that are to be taken back first, newest first: an older one may find its row again only after a
/// newer one is gone.
QList<journal::Entry> inOrder(QList<journal::Entry> pending)
{
    const auto others = std::stable_partition(pending.begin(), pending.end(), isTakenBack);
    std::reverse(pending.begin(), others);
    return pending;
}

QSet<QString> loggedFailures;  // since work was last settled without one

/// Logs a failure once, not at each fill.
void logOnce(const RuntimeError& error)
{
    if (loggedFailures.contains(error.description()))
        return;
    loggedFailures.insert(error.description());
    logFailure(error, source);
}

/// Returns false if the step failed. `what` is what could not be done.
template <class Step>
bool attemptAndLog(const QString& what, Step&& step)
{
    return attempt([&] {
        try {
            step();
        } catch (const RuntimeError& error) {
            logOnce(RuntimeError(error.number(), what + error.description()));
            throw;
        }
    });
}

void tell(Settled settled)
{
    attempt([&] { logFailure(RuntimeError(RowChanged, settled.sentence()), source); });
    if (settledReporter)
        settledReporter(settled);
    settledSince.append(std::move(settled));
}

void settleSend(const journal::Entry& entry, journal::Operation& operation)
{
    const std::optional<QStringList> gone = finishSend({entry.number, entry.subquote}, entry.pastPoint);
    if (!journal::isOfThisWorkstation(entry) && (!gone || !gone->isEmpty()))
        return;  // that workstation may have another folder, with the document or the pictures
    const bool isKnown = isUnfinished(entry) && entry.pastPoint;  // the user has seen what could not be written
    operation.end(!gone ? journal::State::Failed : isKnown ? journal::State::Done : journal::State::Finished);
    QStringList left;
    for (const QString& picture : gone.value_or(QStringList()))
        left.append(u"Its picture %1 is gone and was not sent."_s.arg(picture));
    if (!isKnown || !left.isEmpty())
        tell({entry, gone ? Outcome::Finished : Outcome::TakenBack, left});
}

/// Ends an operation whose tables are complete. It stays unfinished until its message is moved.
void endComplete(const journal::Entry& entry, journal::Operation& operation, bool isMoved, const QStringList& left)
{
    if (isUnfinished(entry)) {
        if (!isMoved)
            return;
        QStringList news = left;  // such as a report that nobody saw, if the message was out of sight before
        for (const QJsonValue sentence : journal::kept(u"told"_s).toArray())
            news.removeAll(sentence.toString());
        operation.end(journal::State::Done);
        if (!news.isEmpty())
            tell({entry, Outcome::Finished, news});
        return;
    }
    if (!isMoved)
        journal::keep(u"told"_s, QJsonArray::fromStringList(left));
    operation.end(isMoved ? journal::State::Finished : journal::State::Unfinished);
    tell({entry, Outcome::Finished, left});
}

void settleComplete(const journal::Entry& entry, journal::Operation& operation)
{
    if (!isOf(entry, journal::Kind::Load))
        return endComplete(entry, operation, true, {});
    const QStringList left = finishLoad(entry);
    endComplete(entry, operation, !stillWaits(entry), left);
}

void settleIncomplete(const journal::Entry& entry, journal::Operation& operation)
{
    const QStringList left = takeBack(entry.id);
    const bool isBack = left.isEmpty();
    const QStringList documents = removeDocuments(entry);
    operation.end(isBack ? journal::State::TakenBack : journal::State::Interrupted);
    tell({entry, isBack ? Outcome::TakenBack : Outcome::Left, left + documents});
}

void settleUndo(const journal::Entry& entry, journal::Operation& operation)
{
    const Undone undone = finishUndo(journal::isOfThisWorkstation(entry));
    if (undone.areRowsBack())
        return endComplete(entry, operation, undone.state == journal::State::Done, undone.told);
    operation.end(undone.state);
    tell({entry, undone.state == journal::State::Failed ? Outcome::TakenBack : Outcome::Left, undone.told});
}

void settleAlone(journal::Entry entry, const QString& lockedFile)
{
    const int patience = journal::endDeadSession(entry);
    // nobody may load the message meanwhile
    std::optional<db::Lock> load;
    const bool hasMessage = isOf(entry, journal::Kind::Load) || isOf(entry, journal::Kind::Undo);
    if (hasMessage && !isOfFile(entry, lockedFile))
        if (!load.emplace(gConn, loadLock(entry.file), patience).isHeld())
            return;
    journal::Operation operation(entry, patience);
    if (!operation.isOwner())
        return;
    if (isOf(entry, journal::Kind::Send))
        settleSend(entry, operation);
    else if (isOf(entry, journal::Kind::Undo))
        settleUndo(entry, operation);
    else if (entry.pastPoint)
        settleComplete(entry, operation);
    else
        settleIncomplete(entry, operation);
}

}  // namespace

QString wordOf(Outcome outcome)
{
    switch (outcome) {
        case Outcome::TakenBack:
            return u"taken back"_s;
        case Outcome::Finished:
            return u"finished"_s;
        case Outcome::Left:
            break;
    }
    return u"left"_s;
}

QString Settled::sentence() const
{
    const QString ofQuote = operation.number.isEmpty() ? QString() : u" of quote %1"_s.arg(operation.number);
    const bool isLoad = isOf(operation, journal::Kind::Load);
    const bool isSend = isOf(operation, journal::Kind::Send);
    const QString head = u"The %1 was interrupted on %2 at %3. "_s.arg(
        journal::titleOf(operation) + (isSend ? ofQuote : QString()), operation.started.toString(u"dd/MM/yyyy"_s),
        operation.started.toString(u"HH:mm"_s));
    QString tail;
    if (outcome == Outcome::Finished)
        tail = u"It has been finished."_s;
    else if (isSend)
        tail = u"The quote was not sent; send it again."_s;
    else if (outcome == Outcome::Left)
        tail = u"Not all of it could be taken back; check the quote%1."_s.arg(
            operation.number.isEmpty() ? QString() : u' ' + operation.number);
    else if (isOf(operation, journal::Kind::Undo))
        tail = u"The load was not undone."_s;
    else
        tail = isLoad ? u"It has been taken back; load the message again."_s : u"It has been taken back."_s;
    return (QStringList(head + tail) + left).join(u' ');
}

void settle(const QString& lockedFile)
{
    if (journal::isAtWork() || !journal::isKept())
        return;
    QList<journal::Entry> pending;
    bool isAllSettled =
        attemptAndLog(u"Interrupted work could not be looked for: "_s, [&] { pending = journal::pendingOperations(); });
    for (const journal::Entry& entry : inOrder(pending))
        isAllSettled &= attemptAndLog(u"The %1 could not be settled yet: "_s.arg(journal::titleOf(entry)),
                                      [&] { settleAlone(entry, lockedFile); });
    if (isAllSettled)
        loggedFailures.clear();
}

QList<Settled> takeSettled()
{
    return std::exchange(settledSince, {});
}

void setReporter(std::function<void(const Settled&)> reporter)
{
    settledReporter = std::move(reporter);
}

void showSettled()
{
    if (!desktop::isPersonPresent())
        return;
    for (const Settled& operation : takeSettled())
        desktop::msgBox(operation.sentence(), desktop::Icon::Exclamation);
}

EarlierLoad settleLoadOf(const QString& file, const QString& hash)
{
    if (!journal::isKept())
        return EarlierLoad::None;
    const QList<journal::Entry> pending = journal::pendingOperations();
    if (pending.isEmpty())
        return EarlierLoad::None;
    bool isComplete = false;
    for (const journal::Entry& entry : pending)
        isComplete =
            isComplete || (isLoadOf(entry, file) && entry.hash == hash && (entry.pastPoint || isUnfinished(entry)));
    settle(file);
    const auto isPending = [&](const journal::Entry& entry) {
        return !isUnfinished(entry) &&
               (isLoadOf(entry, file) || (isOf(entry, journal::Kind::Undo) && entry.hash == hash));
    };
    if (std::ranges::any_of(journal::pendingOperations(), isPending))
        return EarlierLoad::Pending;
    return isComplete ? EarlierLoad::Complete : EarlierLoad::None;
}

QString loadLock(const QString& file)
{
    return u"load "_s + file.toUpper();
}

}  // namespace kest::recovery
