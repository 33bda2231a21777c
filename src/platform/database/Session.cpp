#include "platform/database/Session.h"

#include "platform/RuntimeError.h"
#include "platform/database/ColumnValues.h"
#include "platform/database/FaultInjection.h"
#include "platform/database/Statement.h"
#include "platform/database/Waiting.h"

#include <QRegularExpression>

#include <utility>

namespace kest::db {

using namespace Qt::StringLiterals;

namespace {

std::function<bool()> statementFault;
int statementFaultNumber = StatementFailed;

bool isNamed(const SelectedColumn& column, const QString& name)
{
    return column.name.isEmpty() || column.name.compare(name, Qt::CaseInsensitive) == 0;
}

/// Returns true if the columns of the statement agree with those of the result.
bool fits(const std::optional<QList<SelectedColumn>>& selected, const QStringList& names)
{
    if (!selected)
        return true;  // a statement without columns
    return std::equal(selected->begin(), selected->end(), names.begin(), names.end(), isNamed);
}

/// Returns the columns of a result. A column that the statement does not show, or shows differently, is read-only.
QList<ResultColumn> described(const std::optional<QList<SelectedColumn>>& selected, const Answer& answer)
{
    const bool known = selected && selected->size() == answer.names.size();
    QList<ResultColumn> columns;
    for (qsizetype i = 0; i < answer.names.size(); ++i) {
        ResultColumn column;
        column.name = answer.names[i];
        if (known && isNamed((*selected)[i], column.name) && (*selected)[i].base && !(*selected)[i].base->readOnly) {
            const TableColumn& base = *(*selected)[i].base;
            column.table = (*selected)[i].table;
            column.kind = base.kind;
            column.size = base.size;
            column.scale = base.scale;
        } else {  // the kind of its first value
            const size_t width = size_t(answer.names.size());
            for (size_t value = size_t(i); value < answer.values.size(); value += width) {
                if (answer.values[value].isNull())
                    continue;
                column.kind = kindOfValue(answer.values[value]);
                break;
            }
        }
        columns.append(column);
    }
    return columns;
}

Rows rowsOf(Answer answer, const QList<ResultColumn>& columns)
{
    Rows rows{columns, std::move(answer.values)};
    const size_t width = size_t(columns.size());
    for (size_t column = 0; column < width; ++column) {
        const Kind kind = columns[qsizetype(column)].kind;
        for (size_t i = column; i < rows.values.size(); i += width) {
            if (!isNormal(rows.values[i], kind))
                rows.values[i] = normalised(rows.values[i], kind);
        }
    }
    return rows;
}

}  // namespace

void setStatementFault(std::function<bool()> fault, int number)
{
    statementFault = std::move(fault);
    statementFaultNumber = number;
}

Rows Session::select(const QString& statement)
{
    Translated query = translated(statement, dialect(), *this);
    checkFault();
    Answer answer = engine_->run(query.text);
    if (!fits(query.columns, answer.names)) {  // the host has changed the table
        forgetSchema();
        query = translated(statement, dialect(), *this);
    }
    const QList<ResultColumn> columns = described(query.columns, answer);
    return rowsOf(std::move(answer), columns);
}

qint64 Session::execute(const QString& statement)
{
    static const QRegularExpression definition(u"\\A\\s*(CREATE|ALTER|DROP)\\b"_s,
                                               QRegularExpression::CaseInsensitiveOption);
    const qint64 hit = executeNative(translated(statement, dialect(), *this).text);
    if (definition.match(statement).hasMatch())
        forgetSchema();
    return hit;
}

Rows Session::selectNative(const QString& statement, const QList<ResultColumn>& columns)
{
    checkFault();
    return rowsOf(engine_->run(statement), columns);
}

qint64 Session::executeNative(const QString& statement)
{
    checkFault();
    return engine_->change(statement);
}

QVariant Session::insert(const TableInfo& info, const QStringList& columns, const QStringList& literals)
{
    const QString values = columns.isEmpty()
                               ? dialect().defaultsOnly
                               : u'(' + columns.join(u", "_s) + u") VALUES ("_s + literals.join(u", "_s) + u')';
    const QString statement = u"INSERT INTO "_s + dialect().quoted(info.name) + u' ' + values;
    if (!info.identity()) {
        executeNative(statement);
        return {};
    }
    checkFault();
    const QVariant identity = engine_->insert(statement);
    return identity.isNull() ? QVariant() : QVariant(identity.toLongLong());
}

QString Session::translatedCondition(const QString& table, const QString& condition)
{
    const QString head = u"SELECT * FROM "_s + table + u" WHERE "_s;
    const QString text = translated(head + condition, dialect(), *this).text;
    return text.sliced(text.indexOf(u" WHERE "_s) + 7);
}

Rows Session::selectLocked(const TableInfo& info, const QString& condition)
{
    QList<ResultColumn> columns;
    QStringList names;
    for (const TableColumn& column : info.columns) {
        columns.append({column.name, info.name, column.kind, column.size, column.scale});
        names.append(dialect().quoted(column.name));
    }
    return selectNative(u"SELECT "_s + names.join(u", "_s) + u" FROM "_s +
                            QString(dialect().lockedTable).replace(u"%1"_s, dialect().quoted(info.name)) +
                            u" WHERE "_s + condition + dialect().lockedEnd,
                        columns);
}

void Session::begin()
{
    engine_->run(dialect().begin);
}

void Session::commit()
{
    checkFault();
    engine_->run(u"COMMIT"_s);
}

void Session::rollback()
{
    engine_->run(u"ROLLBACK"_s);
}

void Session::checkFault()
{
    statementStep();
    if (!statementFault || !statementFault())
        return;
    if (statementFaultNumber == CannotOpen)
        engine_->drop();
    throw RuntimeError(statementFaultNumber, u"A fault set by a test."_s).withDatabaseCodes(u"0"_s, u"HY000"_s);
}

const TableInfo* Session::table(const QString& name)
{
    const QString key = name.toLower();
    const auto known = tables.constFind(key);
    if (known != tables.constEnd())
        return known->get();
    const QString spelling = tableSpelling(name);
    std::shared_ptr<TableInfo> read = spelling.isEmpty() ? nullptr : engine_->readTable(spelling);
    if (!read || read->columns.isEmpty())
        return nullptr;
    return tables.insert(key, read)->get();
}

QString Session::tableSpelling(const QString& name)
{
    if (!spellingsKnown) {
        for (const QString& table : engine_->tableNames())
            spellings.insert(table.toLower(), table);
        spellingsKnown = true;
    }
    return spellings.value(name.toLower());
}

void Session::forgetSchema()
{
    spellings.clear();
    tables.clear();
    spellingsKnown = false;
}

}  // namespace kest::db
