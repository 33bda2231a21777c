#include "recovery/Undo.h"

#include "base/History.h"
#include "base/SharedVariables.h"
#include "base/modDBAccess.h"
#include "base/modLoggerEx.h"
#include "platform/Prompt.h"
#include "platform/RuntimeError.h"
#include "platform/database/Sql.h"
#include "platform/files/files.h"
#include "platform/values.h"
#include "recovery/FinishLoad.h"
#include "recovery/Recovery.h"
#include "recovery/TakeBack.h"

#include <QJsonArray>

#include <algorithm>

namespace kest::recovery {

using namespace Qt::StringLiterals;

namespace {

bool isIn(const journal::Entry& entry, journal::State state)
{
    return entry.state == journal::wordOf(state);
}

QString readName(const journal::Entry& load)
{
    return load.facts[u"newName"_s].toString();
}

bool isMessageRead(const journal::Entry& load)
{
    return isThere(gsReadPath, readName(load), load.hash);
}

bool isMessageUnread(const journal::Entry& load)
{
    return isThere(gsUnreadPath, load.file, load.hash);
}

QStringList obstaclesOfFiles(const journal::Entry& load)
{
    QStringList reasons;
    if (load.facts.contains(u"job"_s))
        reasons.append(u"It has exported job %1 to JobLink."_s.arg(load.facts[u"job"_s].toInteger()));
    for (const auto& fact : load.facts)
        if (fact.toString().endsWith(".jpg"_L1, Qt::CaseInsensitive))
            reasons.append(u"It has moved the picture %1."_s.arg(fact.toString()));
    for (const journal::Entry& attempted : journal::loadsOf(load.hash))  // also by a load of it that was refused
        for (const QJsonValue request : attempted.facts[u"withdrawn"_s].toArray())
            reasons.append(u"It has deleted the waiting request %1."_s.arg(request.toString()));
    if (!isMessageRead(load))
        reasons.append(u"Its message is no longer among the read messages."_s);
    if (files::exists(gsUnreadPath + load.file))
        reasons.append(u"Another %1 is among the unread messages."_s.arg(load.file));
    return reasons;
}

/// Returns the numbers of the quotes that a load has changed.
QStringList numbersOf(const journal::Entry& load)
{
    QStringList numbers;
    for (const journal::RecordedChange& change : journal::changesOf(load.id))
        if (!change.number.isEmpty() && !numbers.contains(change.number))
            numbers.append(change.number);
    return numbers;
}

/// Returns a sentence for each quote that the host has invoiced. It may do so without a change of what the load wrote.
QStringList invoices(const journal::Entry& load)
{
    QStringList reasons;
    for (const QString& number : numbersOf(load)) {
        const bool isInDebtors =
            gConn->hasTable(u"DEBTOR"_s) && !opened(sql("SELECT QTNNO FROM DEBTOR WHERE QTNNO='{}'", number)).eof();
        if (isInDebtors || !opened(sql("SELECT QTNNO FROM QUOTE1 WHERE QTNNO='{}' AND invoiced<>0", number)).eof())
            reasons.append(u"Quote %1 is invoiced."_s.arg(number));
    }
    return reasons;
}

/// Returns the newer operations on the quotes of a load that are not taken back, a sentence for each quote.
QStringList newerOperations(const journal::Entry& load)
{
    QStringList reasons;
    for (const QString& number : numbersOf(load)) {
        for (const journal::Entry& other : journal::historyOf(number, {})) {
            if (isIn(other, journal::State::TakenBack) || other.kind == journal::wordOf(journal::Kind::Undo))
                continue;
            if (other.id != load.id)
                reasons.append(u"It is not the newest operation on quote %1: the %2 was later."_s.arg(
                    number, journal::titleOf(other)));
            break;
        }
    }
    return reasons;
}

/// Returns true if the message of a load can be seen from here if it is still read.
bool isInSight(const journal::Entry& load, bool isOwn)
{
    return (isOwn && files::folderExists(gsReadPath)) || isMessageRead(load) || isMessageUnread(load);
}

/// Takes the rows of a load back and removes its documents. Throws PathNotFound if that can't be decided here.
Undone takeRowsBack(const journal::Entry& load, bool isOwn)
{
    const QList<journal::RecordedChange> changes = journal::changesOf(load.id);
    const bool isBegun =
        std::ranges::any_of(changes, [](const journal::RecordedChange& change) { return change.isTakenBack; });
    if (!isBegun && !isInSight(load, isOwn))
        throw RuntimeError(PathNotFound, u"Its message is not in sight here."_s);
    QStringList reasons;
    const auto mayBegin = [&] {  // others may have worked since the last check
        reasons = isBegun ? newerOperations(load) : obstaclesToUndo(load.id);
        return reasons.isEmpty();
    };
    QStringList left = takeBack(load.id, journal::record, mayBegin);
    if (!reasons.isEmpty() && !isBegun)
        return {journal::State::Failed, reasons};
    left += reasons;
    const QStringList documents = reasons.isEmpty() ? removeDocuments(load) : QStringList();
    const Undone undone{left.isEmpty() ? journal::State::Done : journal::State::Interrupted, left + documents};
    if (!undone.areRowsBack())
        journal::keep(u"left"_s, QJsonArray::fromStringList(undone.told));
    journal::setState(load.id, left.isEmpty() ? journal::State::TakenBack : journal::State::Interrupted);
    return undone;
}

/// Returns true if somebody has put the message of a load back, under whatever name, and loaded it again.
bool isLoadedAgain(const journal::Entry& load)
{
    return std::ranges::any_of(journal::loadsOf(load.hash, load.id),
                               [](const journal::Entry& other) { return !isIn(other, journal::State::TakenBack); });
}

/// Moves the message of a load to the unread folder. Returns false if that is not possible yet.
bool moveMessageBack(const journal::Entry& load, bool isOwn)
{
    if (isLoadedAgain(load))
        return true;
    if (!isMessageRead(load))
        return isInSight(load, isOwn);
    journal::keep(u"isMoving"_s, true);  // throws if another workstation goes on with this undo
    return attempt([&] {
        try {
            if (files::exists(gsUnreadPath + load.file) && !isMessageUnread(load))
                throw RuntimeError(PermissionDenied, u"Another %1 is among the unread messages."_s.arg(load.file));
            files::move(gsReadPath + readName(load), gsUnreadPath + load.file);
        } catch (const RuntimeError& error) {
            logFailure(error, u"Undo.finishUndo"_s);
            throw;
        }
    });
}

}  // namespace

QStringList obstaclesToUndo(qint64 operation)
{
    const journal::Entry load = journal::entryOf(operation);
    if (load.id == 0)
        return {u"There is no operation %1."_s.arg(operation)};
    if (load.kind != journal::wordOf(journal::Kind::Load))
        return {u"Operation %1 is no load."_s.arg(operation)};
    if (isIn(load, journal::State::Pruned))
        return {u"It is so old that a part of what it changed is no longer recorded."_s};
    if (!isIn(load, journal::State::Done) && !isIn(load, journal::State::Finished))
        return {u"The state of the load is \"%1\"."_s.arg(load.state)};
    const QStringList newer = newerOperations(load);  // which explain changed rows, too
    return newer.isEmpty() ? obstaclesOfFiles(load) + invoices(load) + obstaclesTo(operation) : newer;
}

QString undoQuestion(qint64 operation)
{
    const journal::Entry load = journal::entryOf(operation);
    return u"Undo the %1 of %2? All that it changed goes back to what it was, and its message to the unread "
           "messages."_s.arg(journal::titleOf(load), load.started.toString(u"dd/MM/yyyy HH:mm"_s));
}

QString Undone::sentence() const
{
    return areRowsBack() ? u"The load is undone."_s
                         : u"The load is undone only in part, so its message stays read; check the quote."_s;
}

Undone undo(qint64 operation)
{
    const journal::Entry load = journal::entryOf(operation);
    const db::Lock alone(gConn, loadLock(load.file));
    const auto refuse = [](const QStringList& reasons) {
        if (!reasons.isEmpty())
            throw RuntimeError(RowChanged, reasons.join(u' '));
    };
    refuse(alone.isHeld() ? obstaclesToUndo(operation) : QStringList(u"Another workstation is loading its message."_s));
    journal::Operation work(journal::Kind::Undo, load.file, load.hash);
    journal::keep(u"undoes"_s, load.id);
    journal::openNow(load.number, load.subquote);
    Undone undone;
    try {
        undone = finishUndo(true);
    } catch (const RuntimeError& error) {
        work.end(journal::State::Open);  // so that it is finished later
        throw RuntimeError(error.number(),
                           error.description() + u" The undo is finished as soon as that is possible."_s);
    }
    work.end(undone.state);
    if (undone.state == journal::State::Failed)
        refuse(undone.told);
    return undone;
}

bool askAndUndo(qint64 operation)
{
    const QString title = u"Undo"_s;
    const auto tell = [&](const QString& what, const QStringList& sentences) {
        desktop::msgBox(what + u"\r\n\r\n"_s + sentences.join(u"\r\n"_s), desktop::Icon::Exclamation, title);
    };
    const QStringList reasons = obstaclesToUndo(operation);
    if (!reasons.isEmpty()) {
        tell(u"Operation %1 can't be undone."_s.arg(operation), reasons);
        return false;
    }
    if (!desktop::ask(undoQuestion(operation), desktop::Icon::Exclamation, title, desktop::Answer::No))
        return false;
    EnsureConnection();  // the question may have been open for hours
    const Undone undone = undo(operation);
    if (!undone.told.isEmpty())
        tell(undone.sentence(), undone.told);
    return true;
}

Undone finishUndo(bool isOwn)
{
    const journal::Entry load = journal::entryOf(journal::kept(u"undoes"_s).toInteger());
    if (isIn(load, journal::State::Interrupted))
        return {journal::State::Interrupted, journal::kept(u"left"_s).toVariant().toStringList()};
    Undone undone;
    if (!isIn(load, journal::State::TakenBack))
        undone = takeRowsBack(load, isOwn);
    if (undone.areRowsBack() && !moveMessageBack(load, isOwn)) {
        undone.state = journal::State::Unfinished;
        undone.told.append(u"Its message could not be moved yet; it is moved as soon as that is possible."_s);
    }
    return undone;
}

}  // namespace kest::recovery
