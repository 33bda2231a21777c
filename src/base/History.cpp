#include "base/History.h"

#include "base/JournalRecord.h"
#include "base/ModRegistry.h"
#include "base/SharedVariables.h"
#include "base/modDBAccess.h"
#include "platform/RuntimeError.h"
#include "platform/database/ColumnValues.h"
#include "platform/database/Sql.h"
#include "platform/values.h"

#include <QJsonDocument>
#include <QSet>

#include <algorithm>

namespace kest::journal {

using namespace Qt::StringLiterals;

namespace {

constexpr int prunedAtOnce = 1000;  // rows
constexpr int lookedAt = 100;       // operations

Entry entryAt(const db::Recordset& row)
{
    Entry entry;
    entry.id = toLong(row.value(u"Operation"_s));
    entry.kind = row.text(u"OperationKind"_s);
    entry.state = row.text(u"State"_s);
    entry.file = row.text(u"FileName"_s);
    entry.hash = row.text(u"FileHash"_s);
    entry.number = row.text(u"QTNNO"_s);
    entry.subquote = row.text(u"Subquote"_s);
    entry.workstation = row.text(u"Workstation"_s);
    entry.lock = row.text(u"LockName"_s);
    entry.serverSession = row.text(u"ServerSession"_s);
    entry.started = row.value(u"StartedAt"_s).toDateTime();
    entry.pastPoint = isTrue(row.value(u"PastPoint"_s));
    entry.facts = QJsonDocument::fromJson(row.text(u"Facts"_s).toUtf8()).object();
    return entry;
}

QList<Entry> entries(const QString& select)
{
    QList<Entry> found;
    if (!isKept())
        return found;
    for (db::Recordset rows = opened(select); !rows.eof(); rows.moveNext())
        found.append(entryAt(rows));
    return found;
}

/// Returns for how many days operations are kept.
int daysKept()
{
    constexpr int usual = 90;
    double days = 0;
    attempt([&] {
        days =
            toDouble(GetRegSetting(u"wirra32"_s, u"frmsplash"_s, u"JournalDays"_s, QString::number(usual), CopyUp::No));
    });
    return days >= 1 && days < 36500 ? int(days) : usual;
}

QString shown(const QVariant& value)
{
    return value.isNull() ? u"(empty)"_s : u'"' + toText(value).replace(u"\r\n"_s, u" "_s) + u'"';
}

/// The part of a long text in which it differs from the other, with the start and the end that both share left out.
QString difference(const QString& text, const QString& other)
{
    constexpr qsizetype shortText = 80;  // characters
    if (text.size() <= shortText && other.size() <= shortText)
        return text;
    const auto [left, otherLeft] = std::mismatch(text.begin(), text.end(), other.begin(), other.end());
    const qsizetype start = left - text.begin();
    qsizetype end = 0;
    const qsizetype most = std::min(text.size(), other.size()) - start;
    while (end < most && text[text.size() - 1 - end] == other[other.size() - 1 - end])
        ++end;
    QString part = text.mid(start, text.size() - start - end);
    if (start > 0)
        part.prepend(u"..."_s);
    if (end > 0)
        part.append(u"..."_s);
    return part;
}

}  // namespace

QList<Entry> historyOf(const QString& number, const QString& subquote)
{
    return entries(
        subquote.isEmpty()
            ? sql("SELECT * FROM KESTOperation WHERE Operation IN (SELECT Operation FROM KESTJournal WHERE QTNNO='{}') "
                  "ORDER BY Operation DESC",
                  number)
            : sql("SELECT * FROM KESTOperation WHERE Operation IN (SELECT Operation FROM KESTJournal WHERE QTNNO='{}' "
                  "AND Subquote='{}') ORDER BY Operation DESC",
                  number, subquote));
}

Entry entryOf(qint64 operation)
{
    return entries(sql("SELECT * FROM KESTOperation WHERE Operation={}", operation)).value(0);
}

QList<Entry> pendingOperations()
{
    return entries(u"SELECT * FROM KESTOperation WHERE State IN ('open', 'unfinished') ORDER BY Operation"_s);
}

QList<Entry> loadsOf(const QString& hash, qint64 after)
{
    return entries(
        sql("SELECT * FROM KESTOperation WHERE Operation>{} AND OperationKind='load' AND FileHash='{}'", after, hash));
}

QList<RecordedChange> changesOf(qint64 operation)
{
    QList<RecordedChange> changes;
    if (!isKept())
        return changes;
    for (db::Recordset rows = opened(sql("SELECT * FROM KESTJournal WHERE Operation={} ORDER BY Entry", operation));
         !rows.eof(); rows.moveNext())
        changes.append({toLong(rows.value(u"Entry"_s)), rows.value(u"ChangedAt"_s).toDateTime(), rows.text(u"QTNNO"_s),
                        rows.text(u"Subquote"_s), changeIn(rows.text(u"RowData"_s)),
                        toLong(rows.value(u"Settled"_s)) != 0});
    return changes;
}

QList<ColumnStory> columnsOf(const db::RowChange& row)
{
    QList<ColumnStory> told;
    for (const db::RowChange::Column& column : row.columns) {
        const QVariant before = db::normalised(column.before, column.kind);
        const QVariant after = db::normalised(column.after, column.kind);
        if (before.isNull() == after.isNull() && before == after)
            continue;
        if (row.kind == db::ChangeKind::Insert)
            told.append({column.name, {}, shown(after)});
        else if (row.kind == db::ChangeKind::Delete)
            told.append({column.name, shown(before), {}});
        else if (column.kind == db::Kind::LongText && !before.isNull() && !after.isNull())
            told.append({column.name, shown(difference(toText(before), toText(after))),
                         shown(difference(toText(after), toText(before)))});
        else
            told.append({column.name, shown(before), shown(after)});
    }
    return told;
}

QStringList linesOf(const db::RowChange& row)
{
    QStringList lines;
    for (const ColumnStory& column : columnsOf(row)) {
        QStringList values{column.from, column.to};
        values.removeAll(QString());
        lines.append(column.name + u": "_s + values.join(u" -> "_s));
    }
    return lines;
}

QString wordOf(db::ChangeKind kind)
{
    return kind == db::ChangeKind::Insert ? u"insert"_s : kind == db::ChangeKind::Delete ? u"delete"_s : u"update"_s;
}

QString keyOf(const db::RowChange& row)
{
    QStringList key;
    for (const QString& name : row.key)
        if (const db::RowChange::Column* column = row.column(name))
            key.append(name + u' ' + textOrEmpty(row.kind == db::ChangeKind::Delete ? column->before : column->after));
    return key.join(u", "_s);
}

QString titleOf(const Entry& entry)
{
    if (entry.kind == wordOf(Kind::Load))
        return u"load of "_s + entry.file;
    if (entry.kind == wordOf(Kind::Undo))
        return u"undo of the load of "_s + entry.file;
    if (entry.kind == wordOf(Kind::Save))
        return u"save in the utilities"_s;
    if (entry.kind == wordOf(Kind::Response))
        return u"response "_s + entry.file;
    return entry.kind;
}

void prune()
{
    if (!isKept())
        return;
    const QDateTime limit = QDateTime::currentDateTime().addDays(-daysKept());
    QSet<qint64> inUse;
    for (const Entry& pending : pendingOperations())
        inUse.insert(pending.facts[u"undoes"_s].toInteger());
    // Looks at the first ones only: a search for old ones among all would take longer with each operation that is kept.
    // They begin with the oldest, unless the clock of a workstation is wrong.
    db::Recordset first = opened(sql(
        "SELECT TOP {} Operation, StartedAt FROM KESTOperation WHERE State<>'open' AND State<>'unfinished' ORDER BY "
        "Operation",
        lookedAt));
    qint64 room = prunedAtOnce;
    for (; room > 0 && !first.eof(); first.moveNext()) {
        const QDateTime started = first.value(u"StartedAt"_s).toDateTime();
        const QVariant operation = first.value(u"Operation"_s);
        if (!started.isValid() || started >= limit || inUse.contains(toLong(operation)))
            continue;
        setState(toLong(operation), State::Pruned);  // first: nobody may undo what is left of it
        db::Recordset rows =
            opened(sql("SELECT TOP {} Entry FROM KESTJournal WHERE Operation={} ORDER BY Entry", room, operation));
        if (!rows.eof()) {
            rows.moveLast();
            gConn->execute(
                sql("DELETE FROM KESTJournal WHERE Operation={} AND Entry<={}", operation, rows.value(u"Entry"_s)));
        }
        room -= rows.recordCount();
        if (room > 0)  // all of its records are gone
            gConn->execute(sql("DELETE FROM KESTOperation WHERE Operation={}", operation));
        --room;
    }
}

}  // namespace kest::journal
