#include "recovery/TakeBack.h"

#include "base/History.h"
#include "base/SharedVariables.h"
#include "base/modDBAccess.h"
#include "inbound/NextNumbers.h"
#include "platform/RuntimeError.h"
#include "platform/database/ColumnValues.h"
#include "platform/database/Sql.h"
#include "platform/database/TakeBack.h"
#include "platform/values.h"

#include <QHash>
#include <QSet>

#include <algorithm>
#include <utility>

namespace kest::recovery {

using namespace Qt::StringLiterals;

namespace {

/// All that an operation did to one row, as one change.
struct RowHistory {
    db::RowChange net;
    QString number;  // of its quote
    QString subquote;
    QList<qint64> entries;  // of the journal
    bool isGone = false;    // inserted and deleted again

    QString quote() const { return number + u'/' + subquote; }
    bool isNew() const { return net.kind == db::ChangeKind::Insert; }
    bool isOf(QLatin1StringView table) const { return net.table.compare(table, Qt::CaseInsensitive) == 0; }
    bool isNewQuote() const { return isNew() && isOf("QUOTE1"_L1); }
};

enum class Moment { Before, After };

/// Returns a text that no other row has at that moment.
QString identityOf(const db::RowChange& row, Moment moment)
{
    QStringList parts(row.table.toLower());
    for (const QString& name : row.key) {
        const db::RowChange::Column* column = row.column(name);
        const QVariant value =
            !column ? QVariant()
                    : db::normalised(moment == Moment::Before ? column->before : column->after, column->kind);
        parts.append(name.toLower() + u'=' + (value.isNull() ? u"NULL"_s : u'\'' + toText(value)));
    }
    return parts.join(u'\n');
}

/// Puts an older change of the same row in front.
void putBefore(RowHistory& row, const db::RowChange& older)
{
    row.isGone = older.kind == db::ChangeKind::Insert && row.net.kind == db::ChangeKind::Delete;
    if (older.kind == db::ChangeKind::Insert)
        row.net.kind = db::ChangeKind::Insert;
    for (const db::RowChange::Column& column : older.columns) {
        const auto same = std::ranges::find_if(row.net.columns, [&](const db::RowChange::Column& known) {
            return known.name.compare(column.name, Qt::CaseInsensitive) == 0;
        });
        if (same == row.net.columns.end())
            row.net.columns.append(column);
        else
            same->before = column.before;
    }
}

/// Returns the rows that an operation changed and that are not taken back yet, the one changed last first, but a new
/// quote after its lines and notes.
QList<RowHistory> rowsOf(qint64 operation)
{
    QList<RowHistory> rows;
    QHash<QString, qsizetype> known;  // by what the row was before the changes read so far
    const QList<journal::RecordedChange> changes = journal::changesOf(operation);
    for (auto change = changes.crbegin(); change != changes.crend(); ++change) {
        if (change->isTakenBack)
            continue;
        qsizetype row =
            change->row.kind == db::ChangeKind::Delete ? -1 : known.value(identityOf(change->row, Moment::After), -1);
        if (row < 0) {
            row = rows.size();
            rows.append({change->row, change->number, change->subquote, {}});
        } else {
            known.remove(identityOf(change->row, Moment::After));
            putBefore(rows[row], change->row);
        }
        rows[row].entries.append(change->entry);
        if (change->row.kind != db::ChangeKind::Insert)
            known.insert(identityOf(change->row, Moment::Before), row);
    }
    rows.removeIf([](const RowHistory& row) { return row.isGone; });
    std::stable_partition(rows.begin(), rows.end(), [](const RowHistory& row) { return !row.isNewQuote(); });
    return rows;
}

/// Returns true for what others may use already.
bool stays(const RowHistory& row)
{
    return row.isOf("CINFO"_L1) ||
           (row.isNew() && (row.isOf("CAR"_L1) || row.isOf("CUSTOMER"_L1) || row.isOf("VENDOR"_L1)));
}

QString nameOf(const db::RowChange& row)
{
    return u"The row of %1 with %2"_s.arg(row.table, journal::keyOf(row));
}

/// Returns true if a quote has more lines and notes than these, or an invoice.
bool hasMore(const RowHistory& quote, qsizetype lines, qsizetype notes)
{
    const auto count = [&](const char* select) {
        return opened(sql(select, quote.number, quote.subquote)).recordCount();
    };
    if (count("SELECT QTNNO FROM QUOTE2 WHERE QTNNO='{}' AND SUBQUOTE='{}'") > lines ||
        count("SELECT QTNNO FROM QUOTE3 WHERE QTNNO='{}' AND SUBQUOTE='{}'") > notes)
        return true;
    const bool isMain = quote.subquote == "0"_L1;  // invoices name the main quote only
    return isMain && gConn->hasTable(u"DEBTOR"_s) &&
           !opened(sql("SELECT QTNNO FROM DEBTOR WHERE QTNNO='{}'", quote.number)).eof();
}

/// Returns the new quotes of the operation that someone else works on already.
QSet<QString> quotesInUse(const QList<RowHistory>& rows)
{
    QSet<QString> inUse;
    for (const RowHistory& quote : rows) {
        if (!quote.isNewQuote())
            continue;
        const auto own = [&](QLatin1StringView table) {
            return std::ranges::count_if(rows, [&](const RowHistory& row) {
                return row.isNew() && row.isOf(table) && row.quote() == quote.quote();
            });
        };
        if (hasMore(quote, own("QUOTE2"_L1), own("QUOTE3"_L1)))
            inUse.insert(quote.quote());
    }
    return inUse;
}

/// Returns the registration that an operation has given to a known car, or an empty text if it changed at most its
/// case.
QString givenRego(const RowHistory& row)
{
    const db::RowChange::Column* rego =
        row.isOf("CAR"_L1) && row.net.kind == db::ChangeKind::Update ? row.net.column(u"REGO"_s) : nullptr;
    const bool isNew = rego && textOrEmpty(rego->before).compare(textOrEmpty(rego->after), Qt::CaseInsensitive) != 0;
    return isNew ? textOrEmpty(rego->after) : QString();
}

/// Returns true if a quote has that registration that the operation has not changed.
bool hasOtherQuote(const QList<RowHistory>& rows, const QString& rego)
{
    for (db::Recordset quotes = opened(sql("SELECT QTNNO, Subquote FROM QUOTE1 WHERE REGO='{}'", rego)); !quotes.eof();
         quotes.moveNext()) {
        const QString found = quotes.text(u"QTNNO"_s) + u'/' + quotes.text(u"Subquote"_s);
        if (std::ranges::none_of(rows,
                                 [&](const RowHistory& row) { return row.isOf("QUOTE1"_L1) && row.quote() == found; }))
            return true;
    }
    return false;
}

/// Returns the new registrations that cars keep, because other quotes would have no car without them.
QStringList keptRegos(const QList<RowHistory>& rows)
{
    QStringList kept;
    const auto isNewlyKept = [&](const RowHistory& car) {
        const QString rego = givenRego(car);
        const bool isReturned = std::ranges::any_of(rows, [&](const RowHistory& other) {
            const QString given = givenRego(other);
            return !given.isEmpty() && !kept.contains(given, Qt::CaseInsensitive) &&
                   textOrEmpty(other.net.column(u"REGO"_s)->before).compare(rego, Qt::CaseInsensitive) == 0;
        });  // to the car that has made way for this one
        return !rego.isEmpty() && !kept.contains(rego, Qt::CaseInsensitive) && !isReturned && hasOtherQuote(rows, rego);
    };
    // a car that keeps its registration returns none, so that the next may have to keep its own
    for (auto car = std::ranges::find_if(rows, isNewlyKept); car != rows.end();
         car = std::ranges::find_if(rows, isNewlyKept))
        kept.append(givenRego(*car));
    return kept;
}

/// Leaves a column of an updated row as it is if it now has one of these values.
void leaveColumn(RowHistory& row, QLatin1StringView name, const std::function<bool(const QVariant& now)>& isLeft)
{
    if (row.net.kind == db::ChangeKind::Update)
        row.net.columns.removeIf([&](const db::RowChange::Column& column) {
            return column.name.compare(name, Qt::CaseInsensitive) == 0 && isLeft(column.after);
        });
}

bool changesNothing(const RowHistory& row)
{
    return row.net.kind == db::ChangeKind::Update &&
           std::ranges::all_of(row.net.columns, [](const db::RowChange::Column& column) {
               return column.before == column.after && column.before.isNull() == column.after.isNull();
           });
}

/// What is taken back of an operation.
struct Plan {
    QList<RowHistory> rows;
    QStringList left;  // what is not, a sentence each
};

Plan planOf(qint64 operation)
{
    Plan plan{rowsOf(operation), {}};
    const QSet<QString> inUse = quotesInUse(plan.rows);
    for (const QString& quote : inUse)
        plan.left.append(u"Quote %1 has lines, notes or an invoice from elsewhere and stays."_s.arg(quote));
    const QStringList regos = keptRegos(plan.rows);
    for (const QString& rego : regos)
        plan.left.append(u"Other quotes have the registration %1 by now, so its car keeps it."_s.arg(rego));
    const auto isKept = [&](const QVariant& rego) { return regos.contains(textOrEmpty(rego), Qt::CaseInsensitive); };
    plan.rows.removeIf(
        [&](const RowHistory& row) { return stays(row) || inUse.contains(row.quote()) || isKept(givenRego(row)); });
    for (RowHistory& row : plan.rows) {
        if (row.isOf("QUOTE1"_L1))
            leaveColumn(row, "REGO"_L1, isKept);
        if (row.isOf("CAR"_L1))  // other loads may count on the mark
            leaveColumn(row, "KEST"_L1, [](const QVariant&) { return true; });
    }
    plan.rows.removeIf(changesNothing);
    return plan;
}

/// Returns a sentence for each row that `undo` refuses.
template <class Undo>
QStringList refused(const QList<RowHistory>& rows, Undo&& undo)
{
    QStringList left;
    for (const RowHistory& row : rows)
        if (!undo(row))
            left.append(nameOf(row.net) + u" was changed by someone else and stays as it is."_s);
    return left;
}

/// Throws RowChanged if another workstation has taken one of the rows back meanwhile.
void markTakenBack(const QList<qint64>& entries)
{
    if (entries.isEmpty())
        return;
    QStringList numbers;
    for (const qint64 entry : entries)
        numbers.append(sql("{}", entry));
    const qint64 hit = gConn->execute(sql("UPDATE KESTJournal SET Settled=1 WHERE Settled=0 AND Entry IN (") +
                                      numbers.join(u", "_s) + u')');
    if (hit != entries.size())
        throw RuntimeError(RowChanged, u"Another workstation is taking this work back."_s);
}

/// Returns the change that takes another one back.
db::RowChange reversed(db::RowChange change)
{
    if (change.kind != db::ChangeKind::Update)
        change.kind = change.kind == db::ChangeKind::Insert ? db::ChangeKind::Delete : db::ChangeKind::Insert;
    for (db::RowChange::Column& column : change.columns)
        std::swap(column.before, column.after);
    return change;
}

using Record = std::function<void(const db::RowChange&)>;

QStringList takeBackTogether(db::TakeBack& together, const QList<RowHistory>& rows, const Record& record)
{
    QList<qint64> taken;
    const QStringList left = refused(rows, [&](const RowHistory& row) {
        if ((row.isNewQuote() && hasMore(row, 0, 0)) || !together.undo(row.net))
            return false;
        if (record)
            record(reversed(row.net));
        taken += row.entries;
        return true;
    });
    markTakenBack(taken);
    return left;
}

}  // namespace

QStringList takeBack(qint64 operation, const std::function<void(const db::RowChange&)>& record,
                     const std::function<bool()>& mayBegin)
{
    constexpr qsizetype together = 100;  // rows in a transaction, because each commit waits for the disk
    const Plan plan = planOf(operation);
    forgetLineNumbers();
    QStringList left = plan.left;
    for (qsizetype first = 0; first < plan.rows.size(); first += together) {
        db::TakeBack transaction(*gConn);
        if (first == 0 && mayBegin && !mayBegin())
            return {};
        left += takeBackTogether(transaction, plan.rows.mid(first, together), record);
        transaction.commit();
    }
    return left;
}

QStringList obstaclesTo(qint64 operation)
{
    const Plan plan = planOf(operation);
    return plan.left + refused(plan.rows, [](const RowHistory& row) { return db::stillHolds(*gConn, row.net); });
}

}  // namespace kest::recovery
