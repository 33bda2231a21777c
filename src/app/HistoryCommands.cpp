#include "app/HistoryCommands.h"

#include "base/History.h"
#include "platform/Prompt.h"
#include "platform/values.h"
#include "recovery/Undo.h"

#include <QJsonArray>
#include <QJsonObject>

namespace kest::app {

using namespace Qt::StringLiterals;

namespace {

QJsonValue jsonOf(const QVariant& value)
{
    return value.isNull() ? QJsonValue(QJsonValue::Null) : QJsonValue(toText(value));
}

QJsonObject jsonOf(const journal::RecordedChange& change)
{
    QJsonArray columns;
    for (const db::RowChange::Column& column : change.row.columns)
        columns.append(QJsonObject{
            {u"name"_s, column.name}, {u"before"_s, jsonOf(column.before)}, {u"after"_s, jsonOf(column.after)}});
    return {{u"table"_s, change.row.table},
            {u"change"_s, journal::wordOf(change.row.kind)},
            {u"quote"_s, change.number},
            {u"subquote"_s, change.subquote},
            {u"key"_s, journal::keyOf(change.row)},
            {u"takenBack"_s, change.isTakenBack},
            {u"columns"_s, columns}};
}

QString textOf(const journal::RecordedChange& change)
{
    QString text = u"  %1 %2"_s.arg(journal::wordOf(change.row.kind), change.row.table);
    if (const QString key = journal::keyOf(change.row); !key.isEmpty())
        text += u' ' + key;
    if (!change.number.isEmpty())
        text += u" (quote %1/%2)"_s.arg(change.number, change.subquote);
    text += change.isTakenBack ? u", taken back\n"_s : u"\n"_s;
    for (const QString& line : journal::linesOf(change.row))
        text += u"    "_s + line + u'\n';
    return text;
}

}  // namespace

Outcome history(const QStringList& arguments)
{
    QJsonArray operations;
    QString text;
    for (const journal::Entry& entry : journal::historyOf(arguments[0], arguments.value(1))) {
        text += u"%1  %2  %3  %4 (%5)\n"_s.arg(entry.started.toString(u"dd/MM/yyyy HH:mm:ss"_s))
                    .arg(entry.id)
                    .arg(entry.workstation, journal::titleOf(entry), entry.state);
        QJsonArray changes;
        for (const journal::RecordedChange& change : journal::changesOf(entry.id)) {
            changes.append(jsonOf(change));
            text += textOf(change);
        }
        operations.append(QJsonObject{{u"operation"_s, entry.id},
                                      {u"kind"_s, entry.kind},
                                      {u"state"_s, entry.state},
                                      {u"file"_s, entry.file},
                                      {u"workstation"_s, entry.workstation},
                                      {u"time"_s, entry.started.toString(Qt::ISODate)},
                                      {u"changes"_s, changes}});
    }
    if (operations.isEmpty())
        text = journal::isKept() ? u"Nothing is recorded for quote %1.\n"_s.arg(arguments[0])
                                 : u"This database keeps no journal.\n"_s;
    return {.fields = {{u"operations"_s, operations}}, .text = text};
}

Outcome undo(const QStringList& arguments)
{
    bool isNumber = false;
    const qint64 operation = arguments[0].toLongLong(&isNumber);
    if (!isNumber)
        return refused(u"undo takes the number of an operation, as history shows it"_s, Usage);
    const QStringList reasons = recovery::obstaclesToUndo(operation);
    if (!reasons.isEmpty())
        return refused(u"operation %1 can't be undone: "_s.arg(operation) + reasons.join(u' '), Refused);
    if (!desktop::ask(recovery::undoQuestion(operation), desktop::Icon::Exclamation, u"undo"_s, desktop::Answer::No))
        return {.exitCode = Refused};
    const recovery::Undone undone = recovery::undo(operation);
    return {.exitCode = undone.areRowsBack() ? Done : Refused,
            .fields = {{u"left"_s, QJsonArray::fromStringList(undone.told)}},
            .text = (QStringList(undone.sentence()) + undone.told).join(u' ') + u'\n'};
}

QJsonArray jsonOf(const QList<recovery::Settled>& operations)
{
    QJsonArray told;
    for (const recovery::Settled& settled : operations)
        told.append(QJsonObject{{u"operation"_s, settled.operation.id},
                                {u"kind"_s, settled.operation.kind},
                                {u"file"_s, settled.operation.file},
                                {u"outcome"_s, recovery::wordOf(settled.outcome)},
                                {u"left"_s, QJsonArray::fromStringList(settled.left)}});
    return told;
}

}  // namespace kest::app
