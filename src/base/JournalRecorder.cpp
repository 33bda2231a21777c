#include "base/JournalRecorder.h"

#include "base/JournalRecord.h"
#include "base/JournalWork.h"
#include "base/SharedVariables.h"
#include "base/modLoggerEx.h"
#include "platform/RuntimeError.h"
#include "platform/database/Sql.h"
#include "platform/values.h"

#include <QSet>

#include <utility>

namespace kest::journal {

using namespace Qt::StringLiterals;

namespace {

constexpr qsizetype recordsAtOnce = 100;  // in one statement

/// Fails with "42501" if this user may not write what settling an operation writes. That a row can be inserted shows
/// with the first one.
void requireRights()
{
    for (const char* statement :
         {"UPDATE KESTOperation SET State=State WHERE Operation=0", "DELETE FROM KESTOperation WHERE Operation=0",
          "UPDATE KESTJournal SET Settled=Settled WHERE Entry=0", "DELETE FROM KESTJournal WHERE Entry=0"})
        gConn->execute(QString::fromLatin1(statement));
}

/// Returns why the changes of this database can't be taken back, or an empty text if they can.
QString transactionFault(const db::Connection& connection)
{
    const QStringList without = connection.tablesWithoutTransactions(
        u"KESTOperation KESTJournal QUOTE1 QUOTE2 QUOTE3 CAR CUSTOMER VENDOR CINFO"_s.split(u' '));
    return without.isEmpty() ? QString() : u"The table %1 has no transactions"_s.arg(without.first());
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

void insert(const QStringList& records)
{
    gConn->execute(
        sql("INSERT INTO KESTJournal (Operation, ChangedAt, TableName, QTNNO, Subquote, RowData, Settled) VALUES ") +
        records.join(u", "_s));
}

QVariant valueOf(const db::RowChange& row, const QString& name)
{
    const db::RowChange::Column* column = row.column(name);
    if (!column)
        return {};
    return row.kind == db::ChangeKind::Delete ? column->before : column->after;
}

}  // namespace

void Recorder::start(const db::Connection& connection)
{
    const bool hasTables = connection.hasTable(u"KESTOperation"_s) && connection.hasTable(u"KESTJournal"_s);
    const QString fault = hasTables ? transactionFault(connection) : u"The database has no tables for the journal"_s;
    isKept_ = fault.isEmpty();
    if (!isKept_)
        tellNoJournal(fault);
}

void Recorder::stop()
{
    isKept_ = false;
    hasRights_ = false;
}

bool Recorder::observes(const QString& table) const
{
    return work && isKept_ && !table.startsWith("KESTOperation"_L1, Qt::CaseInsensitive) &&
           !table.startsWith("KESTJournal"_L1, Qt::CaseInsensitive);
}

QStringList Recorder::wantedColumns() const
{
    return {u"QTNNO"_s, u"Subquote"_s};
}

void Recorder::aboutToChange()
{
    if (work->id != 0)
        return work->requireOwner();
    unlessForbidden([this] {
        if (!hasRights_)
            requireRights();
        hasRights_ = true;
        work->prepare();
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
    work->forgetRow();
}

/// Runs the first record of an operation. If the database forbids it, there is no journal from now on.
void Recorder::unlessForbidden(const std::function<void()>& step)
{
    try {
        step();
    } catch (const RuntimeError& error) {
        if (work->isCommitted || error.sqlState() != "42501"_L1)
            throw;
        isKept_ = false;
        tellNoJournal(error.description());
        if (work->id != 0)  // only the other table is forbidden
            gConn->execute(sql("DELETE FROM KESTOperation WHERE Operation={}", work->id));
        takenBack();
    }
}

void Recorder::changed(db::Connection&, const QList<db::RowChange>& rows)
{
    record(rows);
}

void Recorder::record(const QList<db::RowChange>& rows)
{
    if (isKept_)
        unlessForbidden([&] { write(rows); });
}

void Recorder::openNow()
{
    aboutToChange();
    if (!isKept_)
        return;
    unlessForbidden([] {
        work->insert();
        work->isCommitted = true;
    });
}

void Recorder::write(const QList<db::RowChange>& rows)
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
        work->insert();
    else if (work->isNumberNew)
        work->storeNumber();
    const QString moment = now();
    QStringList records;
    for (const db::RowChange& row : rows) {
        records.append(sql("({}, '{}', '{}', '{}', '{}', '{}', 0)", work->id, moment, row.table,
                           textOrEmpty(valueOf(row, u"QTNNO"_s)), textOrEmpty(valueOf(row, u"Subquote"_s)),
                           textOf(row)));
        if (records.size() == recordsAtOnce)
            insert(std::exchange(records, {}));
    }
    if (!records.isEmpty())
        insert(records);
    if (work->isPointAhead)
        work->markPoint();
}

}  // namespace kest::journal
