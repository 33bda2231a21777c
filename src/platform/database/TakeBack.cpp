#include "platform/database/TakeBack.h"

#include "platform/RuntimeError.h"
#include "platform/database/ColumnValues.h"
#include "platform/database/Dialect.h"
#include "platform/database/Session.h"

#include <QDateTime>
#include <QScopeGuard>

#include <algorithm>
#include <cmath>

namespace kest::db {

using namespace Qt::StringLiterals;

namespace {

/// The condition for the row that a change left, or took away.
QString rowCondition(const Dialect& dialect, const TableInfo& table, const RowChange& change)
{
    QStringList conditions;
    for (const RowChange::Column& column : change.columns) {
        if (!change.key.contains(column.name, Qt::CaseInsensitive))
            continue;
        const QVariant& value = change.kind == ChangeKind::Delete ? column.before : column.after;
        const TableColumn* base = table.column(column.name);
        const QString held = dialect.holds(column.name, column.kind, value, base ? base->scale : 0);
        if (!held.isEmpty())
            conditions.append(held);
    }
    if (conditions.isEmpty())
        throw RuntimeError(StatementFailed, u"What is recorded does not identify a row of "_s + change.table);
    return conditions.join(u" AND "_s);
}

QString withoutBlanksAtEnd(QString text)
{
    while (text.endsWith(u' '))
        text.chop(1);
    return text;
}

bool isSameMoment(const QDateTime& now, const QDateTime& written, int step)
{
    constexpr qint64 cut = 1000;  // milliseconds, if the column has none
    if (step == secondsOfDay)
        return now.date() == written.date();
    return std::abs(now.msecsTo(written)) < std::max<qint64>(cut, step * cut / 2 + 1);
}

/// Returns true if the database has stored one value as the other: it may round a number or a time, and pad a text.
bool isStoredAs(const QVariant& stored, const QVariant& recorded, const TableColumn& column)
{
    constexpr double lastDigits = 1e-14;
    const QVariant now = normalised(stored, column.kind);
    const QVariant written = normalised(recorded, column.kind);
    if (now.isNull() || written.isNull() || now.typeId() != written.typeId())
        return now.isNull() && written.isNull();
    switch (column.kind) {
        case Kind::Number:
            if (column.isSingle)
                return float(now.toDouble()) == float(written.toDouble());
            return std::abs(now.toDouble() - written.toDouble()) <=
                   (column.scale < 0 ? std::abs(written.toDouble()) * lastDigits : 0.51 * std::pow(10, -column.scale));
        case Kind::Date:
            if (now.typeId() != QMetaType::QDateTime)
                return now == written;
            return isSameMoment(now.toDateTime(), written.toDateTime(), column.step);
        case Kind::Text:
            return withoutBlanksAtEnd(now.toString()) == withoutBlanksAtEnd(written.toString());
        default:
            return now == written;
    }
}

bool holds(const TableInfo& table, const RowChange& change, const Rows& rows)
{
    if (change.kind == ChangeKind::Delete)
        return rows.count() == 0;
    if (rows.count() != 1)
        return false;
    for (qsizetype i = 0; i < rows.columns.size(); ++i) {
        const TableColumn& base = table.columns[i];
        const QVariant& now = rows.values[size_t(i)];
        if (base.readOnly)
            continue;
        if (const RowChange::Column* column = change.column(base.name)) {
            if (!isStoredAs(now, column->after, base))
                return false;
        } else if (change.kind == ChangeKind::Insert) {
            const bool isKnown = !base.hasDefault || !base.fixedDefault.isNull();
            if (isKnown && !isStoredAs(now, base.fixedDefault, base))
                return false;  // a column to which the new row gave no value has got one since
        }
    }
    return true;
}

QString tableOf(const Session& session, const RowChange& change)
{
    return session.dialect().quoted(change.table);
}

qint64 restoreValues(Session& session, const TableInfo& table, const RowChange& change)
{
    const Dialect& dialect = session.dialect();
    QStringList assignments;
    for (const RowChange::Column& column : change.columns)
        if (column.before != column.after || column.before.isNull() != column.after.isNull())
            assignments.append(dialect.quoted(column.name) + u'=' + dialect.literal(column.before));
    if (assignments.isEmpty())
        return 1;
    return session.executeNative(u"UPDATE "_s + tableOf(session, change) + u" SET "_s + assignments.join(u", "_s) +
                                 u" WHERE "_s + rowCondition(dialect, table, change));
}

qint64 restoreRow(Session& session, const TableInfo& table, const RowChange& change)
{
    const Dialect& dialect = session.dialect();
    QStringList names;
    QStringList literals;
    for (const RowChange::Column& column : change.columns) {
        const TableColumn* base = table.column(column.name);
        if (!base || base->readOnly)
            continue;
        names.append(dialect.quoted(column.name));
        literals.append(dialect.literal(column.before));
    }
    const bool isSwitched = table.identity() && !dialect.identityInsert.isEmpty();
    const auto allowIdentity = [&](const QString& onOrOff) {
        session.executeNative(QString(dialect.identityInsert).replace(u"%1"_s, tableOf(session, change)) + onOrOff);
    };
    if (isSwitched)
        allowIdentity(u"ON"_s);
    const auto off = qScopeGuard([&] {  // after a failure too: with it on, other inserts into the table fail
        if (isSwitched && !attempt([&] { allowIdentity(u"OFF"_s); }))
            session.engine().drop();
    });
    return session.executeNative(u"INSERT INTO "_s + tableOf(session, change) + u" ("_s + names.join(u", "_s) +
                                 u") VALUES ("_s + literals.join(u", "_s) + u')');
}

void restore(Session& session, const TableInfo& table, const RowChange& change)
{
    qint64 hit = 0;
    switch (change.kind) {
        case ChangeKind::Insert:
            hit = session.executeNative(u"DELETE FROM "_s + tableOf(session, change) + u" WHERE "_s +
                                        rowCondition(session.dialect(), table, change));
            break;
        case ChangeKind::Update:
            hit = restoreValues(session, table, change);
            break;
        case ChangeKind::Delete:
            hit = restoreRow(session, table, change);
            break;
    }
    if (hit != 1)
        throw RuntimeError(RowChanged, u"A row of %1 could not be restored."_s.arg(change.table));
}

}  // namespace

bool stillHolds(Connection& connection, const RowChange& change)
{
    Session& session = connection.session();
    const TableInfo* table = session.table(change.table);
    return table &&
           holds(*table, change, session.selectLocked(*table, rowCondition(session.dialect(), *table, change)));
}

TakeBack::TakeBack(Connection& connection) : connection_(connection)
{
    connection_.session().begin();
    connection_.setInChange(true);
}

TakeBack::~TakeBack()
{
    connection_.setInChange(false);
    if (isOpen_ && connection_.state() == 1)
        connection_.session().abandon();
}

bool TakeBack::undo(const RowChange& change)
{
    if (!stillHolds(connection_, change))
        return false;
    Session& session = connection_.session();
    try {
        restore(session, *session.table(change.table), change);
        return true;
    } catch (const RuntimeError& error) {
        if (error.sqlState().startsWith("23"_L1))
            return false;
        throw;
    }
}

void TakeBack::commit()
{
    connection_.session().commit();
    isOpen_ = false;
}

}  // namespace kest::db
