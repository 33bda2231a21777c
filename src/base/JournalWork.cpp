#include "base/JournalWork.h"

#include "base/JournalRecord.h"
#include "base/SharedVariables.h"
#include "base/modDBAccess.h"
#include "platform/RuntimeError.h"
#include "platform/database/Sql.h"
#include "platform/files/files.h"
#include "platform/profile.h"
#include "platform/values.h"

#include <QCoreApplication>
#include <QDateTime>
#include <QFileInfo>
#include <QJsonDocument>
#include <QSysInfo>
#include <QUuid>

namespace kest::journal {

using namespace Qt::StringLiterals;

std::unique_ptr<Work> work;

namespace {

QString signFile()
{
    return profile::root() + u"/operations.lock"_s;
}

QString machine()
{
    const QByteArray id = QSysInfo::machineUniqueId();
    return id.isEmpty() ? GetComputerName() : QString::fromLatin1(id);
}

/// Returns a text that only processes of this profile on this machine have.
QString place()
{
    return hashOf(machine() + profile::root());
}

/// Returns a text that only workstations with this machine's own folders have, or an empty one if a folder is away.
QString folders()
{
    QString paths;
    for (const QString& folder : {gsUnreadPath, gsReadPath, gsImagesPath}) {
        // profiles may share folders by links
        const QString place = QFileInfo(files::systemPath(folder)).canonicalFilePath();
        if (place.isEmpty())
            return {};
        paths += u'\n' + place;
    }
    return hashOf(machine() + paths);
}

}  // namespace

QString now()
{
    return QDateTime::currentDateTime().toString(u"yyyy-MM-ddTHH:mm:ss"_s);
}

bool isOwnerDead(const Entry& entry)
{
    return !entry.serverSession.isEmpty() && entry.facts[u"place"_s] == place() &&
           files::Lock(signFile(), entry.lock).isHeld();
}

bool isOfThisWorkstation(const Entry& entry)
{
    const QJsonValue known = entry.facts[u"folders"_s];
    return known.isUndefined() ? entry.workstation == GetComputerName() : known == folders();
}

/// Takes the lock that shows others that the owner of the work lives. Returns false if someone else has it.
bool Work::takeLock(int seconds)
{
    lock.reset();  // first, because it may be that of a lost connection
    lock = std::make_unique<db::Lock>(gConn, lockName, seconds);
    serverSession = gConn->serverSession();
    return lock->isHeld();
}

/// Takes the lock of a lost connection again.
void Work::takeLockAgain()
{
    const QString lostSession = serverSession;
    if (lostSession != gConn->serverSession())  // otherwise it is this one, which has the lock from the last try
        attempt([&] { gConn->endSession(lostSession, lockName); });  // or the server does so later
    if (takeLock(sessionEnd))
        return;
    serverSession = lostSession;
    throw RuntimeError(RowChanged, u"The connection was lost, and the lock of this work is not free yet."_s);
}

/// Returns false if another workstation has settled the work, or has begun to take it back. Otherwise notes what that
/// workstation has done, and the session that has the lock now.
bool Work::isStillOpen()
{
    const db::Recordset stored =
        opened(sql("SELECT State, Facts FROM KESTOperation WHERE Operation={} AND Operation NOT IN (SELECT Operation "
                   "FROM KESTJournal WHERE Operation={} AND Settled=1)",
                   id, id));
    if (stored.eof() || stored.text(u"State"_s) != wordOf(state))
        return false;
    const QJsonObject known = QJsonDocument::fromJson(stored.text(u"Facts"_s).toUtf8()).object();
    for (auto fact = known.begin(); fact != known.end(); ++fact)  // not all, because storing the last may have failed
        facts[fact.key()] = fact.value();
    storeOwner();
    return true;
}

void Work::leaveSign()
{
    if (!serverSession.isEmpty() && attempt([this] { sign = std::make_unique<files::Lock>(signFile(), lockName); }))
        facts[u"place"_s] = place();
    else
        facts.remove(u"place"_s);
}

void Work::storeOwner()
{
    if (!serverSession.isEmpty())
        gConn->execute(sql("UPDATE KESTOperation SET ServerSession='{}', Facts='{}' WHERE Operation={}", serverSession,
                           asciiJson(facts), id));
}

void Work::own()
{
    generation = gConn->generation();
    serverSession = gConn->serverSession();
    leaveSign();
    storeOwner();
}

void Work::requireOwner()
{
    if (!isLost && gConn->generation() != generation) {
        takeLockAgain();
        isLost = !isStillOpen();
        generation = gConn->generation();
    }
    if (isLost)
        throw RuntimeError(RowChanged, u"This work was interrupted, and another workstation has settled it."_s);
}

void Work::prepare()
{
    if (check)
        check();
    lockName = u"operation "_s + QUuid::createUuid().toString(QUuid::WithoutBraces);
    if (!takeLock(0))
        throw RuntimeError(PermissionDenied, u"The database does not give the lock of this work."_s);
    generation = gConn->generation();
    leaveSign();
    if (const QString own = folders(); !own.isEmpty())  // otherwise the name of the workstation decides
        facts[u"folders"_s] = own;
    row = opened(u"SELECT * FROM KESTOperation WHERE Operation=0"_s);
}

void Work::insert()
{
    row->addNew();
    row->set(u"OperationKind"_s, wordOf(kind));
    row->set(u"State"_s, wordOf(State::Open));
    row->set(u"FileName"_s, file);
    row->set(u"FileHash"_s, hash);
    row->set(u"QTNNO"_s, number);
    row->set(u"Subquote"_s, subquote);
    row->set(u"Workstation"_s, GetComputerName());
    row->set(u"ProcessId"_s, QCoreApplication::applicationPid());
    row->set(u"ServerSession"_s, serverSession);
    row->set(u"LockName"_s, lockName);
    row->set(u"StartedAt"_s, now());
    row->set(u"PastPoint"_s, false);
    row->set(u"Facts"_s, asciiJson(facts));
    row->update();
    id = toLong(row->value(u"Operation"_s));
    row.reset();
}

void Work::forgetRow()
{
    id = 0;
    row.reset();
    lock.reset();
    sign.reset();
}

void Work::storeNumber()
{
    gConn->execute(sql("UPDATE KESTOperation SET QTNNO='{}', Subquote='{}' WHERE Operation={}", number, subquote, id));
}

void Work::storeFacts()
{
    gConn->execute(sql("UPDATE KESTOperation SET Facts='{}' WHERE Operation={}", asciiJson(facts), id));
}

void Work::markPoint()
{
    gConn->execute(sql("UPDATE KESTOperation SET PastPoint=1, Facts='{}', QTNNO='{}', Subquote='{}' WHERE Operation={}",
                       asciiJson(facts), number, subquote, id));
}

void Work::storeEnd(State end)
{
    gConn->execute(sql("UPDATE KESTOperation SET State='{}', EndedAt='{}' WHERE Operation={}", wordOf(end), now(), id));
}

}  // namespace kest::journal
