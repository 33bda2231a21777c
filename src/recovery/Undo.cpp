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
    for (const QJsonValue request : load.facts[u"withdrawn"_s].toArray())
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
        if (isInDebtors || !opened(sql("SELECT QTNNO FROM QUOTE1 WHERE QTNNO='{}' AND invoiced=1", number)).eof())
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

journal::Entry loadToUndo()
{
    return journal::entryOf(journal::kept(u"undoes"_s).toInteger());
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

QStringList undo(qint64 operation)
{
    const journal::Entry load = journal::entryOf(operation);
    const db::Lock alone(gConn, loadLock(load.file));
    const QStringList reasons =
        alone.isHeld() ? obstaclesToUndo(operation) : QStringList(u"Another workstation is loading its message."_s);
    if (!reasons.isEmpty())
        throw RuntimeError(RowChanged, reasons.join(u' '));
    journal::Operation work(journal::Kind::Undo, load.file, load.hash);
    journal::keep(u"undoes"_s, load.id);
    journal::openNow(load.number, load.subquote);
    const QStringList left = finishUndo(GetComputerName());
    work.end(isMessageToMove(GetComputerName()) ? journal::State::Unfinished : journal::State::Done);
    return left;
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
    const QStringList left = undo(operation);
    if (!left.isEmpty())
        tell(u"The load is undone."_s, left);
    return true;
}

QStringList finishUndo(const QString& workstation)
{
    const journal::Entry load = loadToUndo();
    QStringList left = takeBack(load.id, journal::record);
    removeDocuments(load);
    journal::setState(load.id, left.isEmpty() ? journal::State::TakenBack : journal::State::Interrupted);
    attempt([&] {
        try {
            if (isMessageRead(load) && !files::exists(gsUnreadPath + load.file))
                files::move(gsReadPath + readName(load), gsUnreadPath + load.file);
        } catch (const RuntimeError& error) {
            logFailure(error, u"Undo.finishUndo"_s);
            throw;
        }
    });
    if (isMessageToMove(workstation))
        left.append(u"Its message could not be moved yet; it is moved as soon as that is possible."_s);
    return left;
}

bool isMessageToMove(const QString& workstation)
{
    const journal::Entry load = loadToUndo();
    const bool isInSight = workstation == GetComputerName() && files::folderExists(gsReadPath);
    return isMessageRead(load) || (!isInSight && !isMessageUnread(load));
}

}  // namespace kest::recovery
