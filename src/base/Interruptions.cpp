#include "base/Interruptions.h"

#include "base/History.h"
#include "base/SharedVariables.h"
#include "base/modDBAccess.h"
#include "base/modLoggerEx.h"
#include "platform/RuntimeError.h"
#include "platform/database/Sql.h"

#include <utility>

namespace kest::journal {

using namespace Qt::StringLiterals;

namespace {

QList<Entry> foundSince;

/// Returns true for one caller only, if several look at the same time.
bool closeIfGone(const Entry& entry)
{
    const db::Lock lock(gConn, entry.lock);  // its owner has it as long as it lives
    return lock.isHeld() &&
           gConn->execute(sql("UPDATE KESTOperation SET State='{}', EndedAt='{}' WHERE Operation={} "
                              "AND State='open'",
                              wordOf(State::Interrupted),
                              QDateTime::currentDateTime().toString(u"yyyy-MM-ddTHH:mm:ss"_s), entry.id)) == 1;
}

}  // namespace

void findInterrupted()
{
    if (isAtWork())
        return;
    for (const Entry& entry : openOperations()) {
        if (!closeIfGone(entry))
            continue;
        foundSince.append(entry);
        attempt(
            [&] { logFailure(RuntimeError(RowChanged, interruptionOf(entry)), u"Interruptions.findInterrupted"_s); });
    }
}

QList<Entry> takeInterrupted()
{
    return std::exchange(foundSince, {});
}

QString interruptionOf(const Entry& entry)
{
    const QString head = u"The %1 was interrupted on %2 at %3."_s.arg(
        titleOf(entry), entry.started.toString(u"dd/MM/yyyy"_s), entry.started.toString(u"HH:mm"_s));
    const QString quote = entry.number.isEmpty() ? QString() : u" Check quote %1"_s.arg(entry.number);
    if (entry.kind == wordOf(Kind::Load))
        return head +
               (quote.isEmpty() ? u" Load the message again."_s : quote + u" before you load the message again."_s);
    if (entry.kind == wordOf(Kind::Send))
        return head + quote + u" before you send it again."_s;
    return head + quote + u'.';
}

}  // namespace kest::journal
