#include "platform/database/Change.h"

#include "platform/RuntimeError.h"
#include "platform/database/ColumnValues.h"
#include "platform/database/Dialect.h"
#include "platform/database/Session.h"
#include "platform/database/Tokens.h"

#include <QRegularExpression>

#include <algorithm>

namespace kest::db {

using namespace Qt::StringLiterals;

const RowChange::Column* RowChange::column(const QString& name) const
{
    const auto found = std::ranges::find_if(
        columns, [&](const Column& column) { return column.name.compare(name, Qt::CaseInsensitive) == 0; });
    return found == columns.end() ? nullptr : &*found;
}

Change::Change(Connection& connection, const QString& table, ChangeSteps steps)
    : connection_(connection), table_(table), observer_(connection.observerOf(table))
{
    const bool isAlone = steps == ChangeSteps::WriteOnly || connection.isInChange();
    if (!observer_ && isAlone)
        return;
    if (observer_)
        observer_->aboutToChange();
    connection_.session().begin();
    isOpen_ = true;
    connection_.setInChange(true);
}

Change::~Change()
{
    if (!isOpen_)
        return;
    connection_.setInChange(false);
    if (connection_.state() == 1)
        connection_.session().abandon();
    if (observer_)
        observer_->takenBack();
}

void Change::commit(const QList<RowChange>& rows)
{
    if (!isOpen_)
        return;
    if (observer_)
        observer_->changed(connection_, rows);
    connection_.session().commit();
    isOpen_ = false;
    connection_.setInChange(false);
    if (observer_)
        observer_->committed();
}

namespace {

QList<RowChange> rowsOf(ChangeKind kind, const TableInfo& table, const Rows& rows)
{
    QList<RowChange> changes;
    const size_t width = size_t(rows.columns.size());
    for (int row = 0; row < rows.count(); ++row) {
        RowChange change{kind, table.name, table.key, {}};
        for (size_t i = 0; i < width; ++i) {
            const ResultColumn& column = rows.columns[qsizetype(i)];
            if (const TableColumn* base = table.column(column.name); base && base->readOnly)
                continue;  // the database changes it by itself
            change.columns.append({column.name, column.kind, rows.values[size_t(row) * width + i], QVariant()});
            if (table.key.isEmpty() && column.kind != Kind::Number && column.kind != Kind::LongText)
                change.key.append(column.name);
        }
        changes.append(change);
    }
    return changes;
}

/// Puts the literals of "A='x', B=1" into the values after the change; the columns that stay have their values before.
void assign(QList<RowChange>& rows, const QString& assignments)
{
    static const QRegularExpression assignment(u"\\G\\s*(\\w+)\\s*=\\s*('(?:[^']|'')*'|[^,']+)\\s*(?:,|$)"_s);
    for (RowChange& row : rows)
        for (RowChange::Column& column : row.columns)
            column.after = column.before;
    qsizetype end = 0;
    for (const QRegularExpressionMatch& match : assignment.globalMatch(assignments)) {
        end = match.capturedEnd();
        const QString literal = match.captured(2).trimmed();
        const bool isText = literal.startsWith(u'\'');
        const bool isNull = literal.compare("NULL"_L1, Qt::CaseInsensitive) == 0;
        const QString text = isText ? literal.sliced(1, literal.size() - 2).replace(u"''"_s, u"'"_s) : literal;
        for (RowChange& row : rows)
            for (RowChange::Column& column : row.columns)
                if (column.name.compare(match.captured(1), Qt::CaseInsensitive) == 0)
                    column.after = isNull ? QVariant() : normalised(text, column.kind);
    }
    if (end != assignments.size())
        throw RuntimeError(StatementFailed, u"What this statement assigns can't be recorded: "_s + assignments);
}

/// Returns the first place of a word outside literals, or -1 if there is none.
qsizetype wordAt(const QString& statement, QStringView word)
{
    qsizetype place = 0;
    for (const Token& token : Tokens(statement)) {
        if (token.is(word))
            return place;
        place += token.text.size();
    }
    return -1;
}

}  // namespace

qint64 deleteRows(Connection& connection, const QString& table, const QString& condition)
{
    Change change(connection, table);
    Session& session = connection.session();
    const TableInfo* info = session.table(table);
    QList<RowChange> rows;
    if (change.isObserved() && info)
        rows = rowsOf(ChangeKind::Delete, *info, session.selectLocked(*info, condition));
    const qint64 hit =
        session.executeNative(u"DELETE FROM "_s + session.dialect().quoted(table) + u" WHERE "_s + condition);
    if (hit > 0)
        change.commit(rows);
    return hit;
}

std::optional<PastedChange> pastedChange(const QString& statement)
{
    static const QRegularExpression head(u"\\A\\s*(?:(DELETE)\\s+FROM|UPDATE)\\s+(\\w+)\\s*(SET\\s)?"_s,
                                         QRegularExpression::CaseInsensitiveOption);
    const QRegularExpressionMatch match = head.match(statement);
    if (!match.hasMatch())
        return {};
    const qsizetype where = wordAt(statement, u"WHERE");
    const qsizetype end = where < 0 ? statement.size() : where;
    PastedChange pasted;
    pasted.kind = match.captured(1).isEmpty() ? ChangeKind::Update : ChangeKind::Delete;
    pasted.table = match.captured(2);
    pasted.assignments = statement.sliced(match.capturedEnd(), end - match.capturedEnd()).trimmed();
    pasted.condition = where < 0 ? u"1=1"_s : statement.sliced(where + 5).trimmed();
    return pasted;
}

bool changesRows(const QString& statement)
{
    static const QRegularExpression head(u"\\A\\s*(INSERT|UPDATE|DELETE|MERGE|REPLACE|TRUNCATE)\\b"_s,
                                         QRegularExpression::CaseInsensitiveOption);
    return head.match(statement).hasMatch();
}

qint64 executeObserved(Connection& connection, const PastedChange& pasted, const QString& statement)
{
    Change change(connection, pasted.table);
    Session& session = connection.session();
    const TableInfo* info = session.table(pasted.table);
    if (!info)
        throw RuntimeError(StatementFailed, u"There is no table "_s + pasted.table);
    const QString condition = session.translatedCondition(pasted.table, pasted.condition);
    QList<RowChange> rows = rowsOf(pasted.kind, *info, session.selectLocked(*info, condition));
    if (pasted.kind == ChangeKind::Update)
        assign(rows, pasted.assignments);
    const qint64 hit = session.execute(statement);
    if (hit > 0)
        change.commit(rows);
    return hit;
}

}  // namespace kest::db
