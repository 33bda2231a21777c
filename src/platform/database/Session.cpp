#include "platform/database/Session.h"

#include "platform/RuntimeError.h"
#include "platform/Waiting.h"
#include "platform/database/ColumnValues.h"
#include "platform/database/FaultInjection.h"

#include <QRegularExpression>

#include <utility>

namespace kest::db {

using namespace Qt::StringLiterals;

namespace {

std::function<bool()> statementFault;
int statementFaultNumber = StatementFailed;

/// Asks the engine without holding up the windows.
template <class Question>
auto answered(const Question& question)
{
    decltype(question()) answer{};
    patiently(u"Waiting for the database..."_s, [&] { answer = question(); });
    return answer;
}

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

/// Returns the column of the schema whose values a column of the result shows, or null if the statement does not tell.
const TableColumn* baseOf(const std::optional<QList<SelectedColumn>>& selected, const Answer& answer, qsizetype column)
{
    if (!selected || selected->size() != answer.names.size())
        return nullptr;
    const SelectedColumn& shown = (*selected)[column];
    return isNamed(shown, answer.names[column]) && shown.base && !shown.base->readOnly ? &*shown.base : nullptr;
}

/// Returns the kind of the first value in a column of a result.
Kind kindOfFirst(const Answer& answer, qsizetype column)
{
    const size_t width = size_t(answer.names.size());
    for (size_t value = size_t(column); value < answer.values.size(); value += width) {
        if (!answer.values[value].isNull())
            return kindOfValue(answer.values[value]);
    }
    return Kind::Text;
}

/// Turns the values into those of the kinds of their columns.
void normalise(Rows& rows)
{
    const QList<ResultColumn>& columns = rows.columns;
    const size_t width = size_t(columns.size());
    for (size_t column = 0; column < width; ++column) {
        const Kind kind = columns[qsizetype(column)].kind;
        for (size_t i = column; i < rows.values.size(); i += width) {
            if (!isNormal(rows.values[i], kind))
                rows.values[i] = normalised(rows.values[i], kind);
        }
    }
}

/// Returns how to ask for a column so that its driver rounds nothing.
QString exactly(const Dialect& dialect, const TableColumn& column)
{
    constexpr int digitsOfMilliseconds = 3;
    if (column.kind == Kind::Date && column.scale > digitsOfMilliseconds)
        return dialect.exactDate;
    if (column.kind == Kind::Number && column.scale >= 0)
        return dialect.exactDecimal;
    return column.isSingle ? dialect.exactSingle : u"%1"_s;
}

}  // namespace

void setStatementFault(std::function<bool()> fault, int number)
{
    statementFault = std::move(fault);
    statementFaultNumber = number;
}

QHash<QString, int> columnNumbers(const QList<ResultColumn>& columns)
{
    QHash<QString, int> numbers;
    for (int i = int(columns.size()) - 1; i >= 0; --i) {
        numbers.insert(columns[i].name, i);
        numbers.insert(columns[i].name.toLower(), i);
    }
    return numbers;
}

Rows Session::select(const QString& statement)
{
    const Shape shape = Shape::toTranslate(statement);
    const QString text = translatedText(shape);
    checkFault();
    Answer answer = answered([&] { return engine_->run(text); });
    if (!fits(known(shape).statement.columns, answer.names))  // the host has changed the table
        forgetSchema();
    Known& query = known(shape);
    describe(query, answer);
    Rows rows{query.columns, query.columnNumbers, std::move(answer.values)};
    normalise(rows);
    return rows;
}

Session::Known& Session::known(const Shape& shape)
{
    constexpr qsizetype mostShapes = 1000;
    const auto found = knownShapes.find(shape.text);
    if (found != knownShapes.end())
        return *found;
    const Known fresh{translated(shape, dialect(), *this), {}, {}, false, {}};
    if (knownShapes.size() >= mostShapes)
        knownShapes.clear();
    return *knownShapes.insert(shape.text, fresh);
}

/// Describes the columns of a result. A column that the statement does not show, or shows differently, is read-only.
void Session::describe(Known& query, const Answer& answer)
{
    if (query.isDescribed && query.names == answer.names)
        return;
    query.names = answer.names;
    query.columns.clear();
    query.isDescribed = true;
    for (qsizetype i = 0; i < answer.names.size(); ++i) {
        ResultColumn column;
        column.name = answer.names[i];
        if (const TableColumn* base = baseOf(query.statement.columns, answer, i)) {
            column.table = (*query.statement.columns)[i].table;
            column.kind = base->kind;
            column.size = base->size;
            column.scale = base->scale;
        } else {
            column.kind = kindOfFirst(answer, i);
            query.isDescribed = false;
        }
        query.columns.append(column);
    }
    query.columnNumbers = columnNumbers(query.columns);
}

qint64 Session::execute(const QString& statement)
{
    static const QRegularExpression definition(u"\\A\\s*(CREATE|ALTER|DROP)\\b"_s,
                                               QRegularExpression::CaseInsensitiveOption);
    const qint64 hit = executeNative(translatedText(Shape::toTranslate(statement)));
    if (definition.match(statement).hasMatch())
        forgetSchema();
    return hit;
}

Rows Session::selectNative(const QString& statement, const QList<ResultColumn>& columns)
{
    checkFault();
    Rows rows{columns, {}, answered([&] { return engine_->run(statement); }).values};
    normalise(rows);
    return rows;
}

qint64 Session::executeNative(const QString& statement)
{
    checkFault();
    return answered([&] { return engine_->change(statement); });
}

QVariant Session::insert(const TableInfo& info, const QStringList& columns, const QStringList& literals)
{
    const QString values = columns.isEmpty()
                               ? dialect().defaultsOnly
                               : u'(' + columns.join(u", "_s) + u") VALUES ("_s + literals.join(u", "_s) + u')';
    const QString statement = u"INSERT INTO "_s + dialect().quoted(info.name) + u' ' + values;
    checkFault();
    const QVariant identity = answered([&] { return engine_->insert(statement); });
    if (!info.identity())
        return {};
    if (identity.isNull())
        throw RuntimeError(StatementFailed, u"The database has not told the number of the new row."_s);
    return identity.toLongLong();
}

QString Session::translatedCondition(const QString& table, const QString& condition)
{
    const QString head = u"SELECT * FROM "_s + table + u" WHERE "_s;
    const QString text = translatedText(Shape::toTranslate(head + condition));
    return text.sliced(text.indexOf(u" WHERE "_s) + 7);
}

Rows Session::selectLocked(const TableInfo& info, const QString& condition)
{
    QList<ResultColumn> columns;
    QStringList names;
    for (const TableColumn& column : info.columns) {
        columns.append({column.name, info.name, column.kind, column.size, column.scale});
        names.append(QString(exactly(dialect(), column)).replace(u"%1"_s, dialect().quoted(column.name)));
    }
    const QString statement = u"SELECT "_s + names.join(u", "_s) + u" FROM "_s +
                              QString(dialect().lockedTable).replace(u"%1"_s, dialect().quoted(info.name)) +
                              u" WHERE "_s + condition + dialect().lockedEnd;
    checkFault();
    Rows rows{columns, {}, answered([&] { return engine_->run(statement); }).values};
    for (size_t i = 0; i < rows.values.size(); ++i)
        rows.values[i] = exact(rows.values[i], info.columns[qsizetype(i) % info.columns.size()]);
    return rows;
}

void Session::begin()
{
    checkFault();
    answered([&] { return engine_->run(dialect().begin); });
}

void Session::commit()
{
    checkFault();
    answered([&] { return engine_->run(u"COMMIT"_s); });
}

void Session::rollback()
{
    checkFault();
    answered([&] { return engine_->run(dialect().rollback); });
}

void Session::abandon()
{
    if (!attempt([&] { rollback(); }))
        engine_->drop();
}

void Session::checkFault()
{
    workStep();
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
    knownShapes.clear();
    spellings.clear();
    tables.clear();
    spellingsKnown = false;
}

}  // namespace kest::db
