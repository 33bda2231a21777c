#include "platform/database/Recordset.h"

#include "platform/RuntimeError.h"
#include "platform/database/Criterion.h"
#include "platform/database/Engine.h"
#include "platform/values.h"

#include <QHash>
#include <QMap>

#include <algorithm>
#include <cmath>
#include <numeric>
#include <optional>
#include <vector>

namespace kest::db {

using namespace Qt::StringLiterals;

namespace {

[[noreturn]] void failNoCurrentRow()
{
    throw RuntimeError(NoCurrentRow, u"Either BOF or EOF is True, or the current record has been deleted."_s);
}

[[noreturn]] void failRowChanged()
{
    throw RuntimeError(RowChanged,
                       u"Row cannot be located for updating. Some values may have been changed since it was "
                       "last read."_s);
}

qint64 asWholeNumber(const QVariant& value)
{
    if (value.typeId() == QMetaType::LongLong || value.typeId() == QMetaType::Int)
        return value.toLongLong();
    const double number = std::nearbyint(toDouble(value));
    if (std::abs(number) >= 9.2e18)
        throw RuntimeError(Overflow, u"Overflow"_s);
    return qint64(number);
}

/// A value as a column of that kind holds it; throws where it does not convert.
QVariant converted(const QVariant& value, Kind kind, int cutAt)
{
    if (value.isNull())
        return {};
    const bool flag = value.typeId() == QMetaType::Bool;
    switch (kind) {
        case Kind::Text:
        case Kind::LongText: {
            const QString text = toText(value);
            return cutAt > 0 ? text.left(cutAt) : text;
        }
        case Kind::WholeNumber:
            return flag ? qint64(value.toBool()) : asWholeNumber(value);
        case Kind::Number:
            return flag ? double(value.toBool()) : toDouble(value);
        case Kind::Flag:
            return flag ? value.toBool() : toBool(value);
        case Kind::Date:
            return toDate(value);
    }
    return value;
}

bool isExact(Kind kind)
{
    return kind != Kind::Number && kind != Kind::LongText;
}

/// The rows with one value, in their order.
using Bucket = std::vector<int>;
using Index = QHash<QString, Bucket>;

}  // namespace

struct Recordset::Data {
    enum class Pending { None, Change, Insert };

    ConnectionPtr connection;
    QString select;
    bool isOpen = false;
    bool declared = false;
    bool disconnected = false;

    QList<ResultColumn> columns;
    QHash<QString, int> columnNumbers;  // by the name in lower case; of two with one name the first
    std::vector<QVariant> values;       // row behind row, removed ones included
    std::vector<int> rows;              // those not removed
    std::vector<int> visible;           // those that the filter shows
    int position = 0;                   // among the visible ones; -1 before the first

    Pending pending = Pending::None;
    std::vector<QVariant> original;  // of the row with the pending change
    std::vector<bool> assigned;

    QList<Criterion> filter;
    QHash<int, Index> indexes;  // by column, made when a search first needs one

    void requireOpen() const
    {
        if (!isOpen)
            throw RuntimeError(ObjectClosed, u"Operation is not allowed when the object is closed."_s);
    }

    bool hasRow() const { return position >= 0 && position < int(visible.size()); }

    int row() const
    {
        requireOpen();
        if (!hasRow())
            failNoCurrentRow();
        return visible[size_t(position)];
    }

    QVariant& at(int row, int column) { return values[size_t(row) * size_t(columns.size()) + size_t(column)]; }

    int columnNumber(const QString& name) const
    {
        const auto found = columnNumbers.constFind(name.toLower());
        if (found == columnNumbers.constEnd())
            throw RuntimeError(NoSuchColumn,
                               u"Item cannot be found in the collection corresponding to the requested "
                               "name or ordinal: "_s +
                                   name);
        return *found;
    }

    Engine& engine() const
    {
        if (disconnected)
            throw RuntimeError(ObjectClosed, u"The rows live without a connection and can't be updated."_s);
        if (!connection)
            throw RuntimeError(NoObject, u"Object variable or With block variable not set"_s);
        return connection->engine();
    }

    void numberColumns();
    void fetch();
    void showFiltered();
    bool isShown(int row);

    const Index& indexOf(int column);
    void store(int row, int column, const QVariant& value);
    void beginChange();
    void forgetChange();
    void dropCurrentRow();

    QStringList changedTables();
    bool isChanged(int column);
    QString keyCondition(const TableInfo& table);
    int resultColumn(const QString& table, const QString& column) const;
    void checkLongTexts(const TableInfo& table, const QString& key);
    void writeChange(const QString& table);
    void writeInsert(const QString& table);
    void readBack(const TableInfo& table, const QVariant& identity);
    QString insertedRow(const TableInfo& table);
};

void Recordset::Data::numberColumns()
{
    columnNumbers.clear();
    for (int i = int(columns.size()) - 1; i >= 0; --i)
        columnNumbers.insert(columns[i].name.toLower(), i);
}

void Recordset::Data::fetch()
{
    Rows result = engine().select(select);
    const int count = result.count();
    columns = result.columns;
    values = std::move(result.values);
    numberColumns();
    forgetChange();
    indexes.clear();
    rows.resize(size_t(count));
    std::iota(rows.begin(), rows.end(), 0);
    isOpen = true;
    showFiltered();
}

bool Recordset::Data::isShown(int row)
{
    return std::all_of(filter.cbegin(), filter.cend(), [&](const Criterion& criterion) {
        const int column = columnNumber(criterion.column);
        return criterion.matches(at(row, column), columns[column].kind);
    });
}

void Recordset::Data::showFiltered()
{
    visible.clear();
    std::copy_if(rows.begin(), rows.end(), std::back_inserter(visible), [&](int row) { return isShown(row); });
    position = 0;
}

const Index& Recordset::Data::indexOf(int column)
{
    const auto known = indexes.constFind(column);
    if (known != indexes.constEnd())
        return *known;
    Index index;
    index.reserve(qsizetype(rows.size()));
    for (const int row : rows) {
        if (const auto key = equalityKey(at(row, column), columns[column].kind))
            index[*key].push_back(row);
    }
    return *indexes.insert(column, std::move(index));
}

/// The one place that changes a value, so that an index stays right.
void Recordset::Data::store(int row, int column, const QVariant& value)
{
    QVariant& held = at(row, column);
    const auto index = indexes.find(column);
    if (index != indexes.end()) {
        const Kind kind = columns[column].kind;
        if (const auto key = equalityKey(held, kind)) {
            Bucket& bucket = (*index)[*key];
            const auto place = std::lower_bound(bucket.begin(), bucket.end(), row);
            if (place != bucket.end() && *place == row)
                bucket.erase(place);
        }
        if (const auto key = equalityKey(value, kind)) {
            Bucket& bucket = (*index)[*key];
            bucket.insert(std::lower_bound(bucket.begin(), bucket.end(), row), row);
        }
    }
    held = value;
}

void Recordset::Data::beginChange()
{
    const int current = row();
    if (pending != Pending::None)
        return;
    pending = Pending::Change;
    original.assign(&at(current, 0), &at(current, 0) + columns.size());
    assigned.assign(size_t(columns.size()), false);
}

void Recordset::Data::forgetChange()
{
    pending = Pending::None;
    original.clear();
    assigned.clear();
}

void Recordset::Data::dropCurrentRow()
{
    const int dropped = row();
    for (int column = 0; column < columns.size(); ++column)
        store(dropped, column, {});
    rows.erase(std::lower_bound(rows.begin(), rows.end(), dropped));
    visible.erase(visible.begin() + position);
}

bool Recordset::Data::isChanged(int column)
{
    if (!assigned[size_t(column)])
        return false;
    if (pending == Pending::Insert)
        return true;
    const QVariant& before = original[size_t(column)];
    const QVariant& now = at(row(), column);
    return before.isNull() != now.isNull() || before.typeId() != now.typeId() || before != now;
}

QStringList Recordset::Data::changedTables()
{
    QStringList tables;
    for (int column = 0; column < columns.size(); ++column) {
        if (isChanged(column) && !tables.contains(columns[column].table))
            tables.append(columns[column].table);
    }
    return tables;
}

int Recordset::Data::resultColumn(const QString& table, const QString& name) const
{
    for (int i = 0; i < columns.size(); ++i) {
        if (columns[i].table == table && columns[i].name.compare(name, Qt::CaseInsensitive) == 0)
            return i;
    }
    return -1;
}

/// The condition for the current row in a table: its primary key, or all selected columns where the key is not there.
QString Recordset::Data::keyCondition(const TableInfo& table)
{
    const auto before = [&](int column) {
        return pending == Pending::Change ? original[size_t(column)] : at(row(), column);
    };
    QStringList conditions;
    for (const QString& name : table.key) {
        const int column = resultColumn(table.name, name);
        if (column < 0) {
            conditions.clear();
            break;
        }
        conditions.append(engine().holds(columns[column].name, columns[column].kind, before(column)));
    }
    if (conditions.isEmpty()) {
        for (int column = 0; column < columns.size(); ++column) {
            if (columns[column].table == table.name && isExact(columns[column].kind))
                conditions.append(engine().holds(columns[column].name, columns[column].kind, before(column)));
        }
    }
    if (conditions.isEmpty())
        throw RuntimeError(StatementFailed, u"The columns of the query don't tell a row of "_s + table.name);
    return conditions.join(u" AND "_s);
}

/// Long texts can't be compared by every engine in a condition, so the ones about to be written are read again.
void Recordset::Data::checkLongTexts(const TableInfo& table, const QString& key)
{
    QList<int> longTexts;
    QStringList names;
    for (int column = 0; column < columns.size(); ++column) {
        if (columns[column].table == table.name && columns[column].kind == Kind::LongText && isChanged(column)) {
            longTexts.append(column);
            names.append(engine().quoted(columns[column].name));
        }
    }
    if (longTexts.isEmpty())
        return;
    const Rows now = engine().selectNative(u"SELECT "_s + names.join(u", "_s) + u" FROM "_s +
                                           engine().quoted(table.name) + u" WHERE "_s + key);
    if (now.count() == 0)
        failRowChanged();
    for (qsizetype i = 0; i < longTexts.size(); ++i) {
        const QVariant& before = original[size_t(longTexts[i])];
        const QVariant& stored = now.values[size_t(i)];
        if (before.isNull() != stored.isNull() || before.toString() != stored.toString())
            failRowChanged();
    }
}

void Recordset::Data::writeChange(const QString& tableName)
{
    const TableInfo* table = engine().table(tableName);
    if (!table)
        throw RuntimeError(StatementFailed, u"There is no table "_s + tableName);
    const QString key = keyCondition(*table);
    QStringList assignments;
    QString condition = key;
    QList<int> written;
    for (int column = 0; column < columns.size(); ++column) {
        if (columns[column].table != tableName || !isChanged(column))
            continue;
        const QString& name = columns[column].name;
        const QVariant& before = original[size_t(column)];
        assignments.append(engine().quoted(name) + u'=' + engine().literal(at(row(), column)));
        if (isExact(columns[column].kind))
            condition += u" AND "_s + engine().holds(name, columns[column].kind, before);
        written.append(column);
    }
    checkLongTexts(*table, key);
    const qint64 hit = engine().executeNative(u"UPDATE "_s + engine().quoted(tableName) + u" SET "_s +
                                              assignments.join(u", "_s) + u" WHERE "_s + condition);
    if (hit == 0)
        failRowChanged();
    for (const int column : written)
        original[size_t(column)] = at(row(), column);
}

void Recordset::Data::writeInsert(const QString& tableName)
{
    const TableInfo* table = engine().table(tableName);
    if (!table)
        throw RuntimeError(StatementFailed, u"There is no table "_s + tableName);
    QStringList names;
    QStringList literals;
    for (int column = 0; column < columns.size(); ++column) {
        if (columns[column].table != tableName || !isChanged(column))
            continue;
        names.append(engine().quoted(columns[column].name));
        literals.append(engine().literal(at(row(), column)));
    }
    readBack(*table, engine().insert(*table, names, literals));
}

/// What the database itself put into the new row: its identity and the defaults of the columns that were not set.
void Recordset::Data::readBack(const TableInfo& table, const QVariant& identity)
{
    QList<int> wanted;
    QStringList names;
    for (int column = 0; column < columns.size(); ++column) {
        const TableColumn* base = columns[column].table == table.name ? table.column(columns[column].name) : nullptr;
        if (!base || assigned[size_t(column)])
            continue;
        if (base->identity) {
            store(row(), column, identity);
        } else if (base->hasDefault) {
            wanted.append(column);
            names.append(engine().quoted(base->name));
        }
    }
    if (wanted.isEmpty())
        return;
    const QString condition =
        identity.isNull() ? insertedRow(table) : engine().holds(table.identity()->name, Kind::WholeNumber, identity);
    const Rows stored = engine().selectNative(u"SELECT "_s + names.join(u", "_s) + u" FROM "_s +
                                              engine().quoted(table.name) + u" WHERE "_s + condition);
    for (qsizetype i = 0; stored.count() > 0 && i < wanted.size(); ++i)
        store(row(), wanted[i], stored.values[size_t(i)]);
}

/// A table without identity: the row with all the values that were set.
QString Recordset::Data::insertedRow(const TableInfo& table)
{
    QStringList conditions{u"1=1"_s};
    for (int column = 0; column < columns.size(); ++column) {
        if (columns[column].table == table.name && assigned[size_t(column)] && isExact(columns[column].kind))
            conditions.append(engine().holds(columns[column].name, columns[column].kind, at(row(), column)));
    }
    return conditions.join(u" AND "_s);
}

Recordset::Recordset() : data(std::make_unique<Data>()) {}

Recordset::Recordset(ConnectionPtr connection) : Recordset()
{
    data->connection = std::move(connection);
}

Recordset::~Recordset() = default;
Recordset::Recordset(Recordset&&) noexcept = default;
Recordset& Recordset::operator=(Recordset&&) noexcept = default;

void Recordset::open(const QString& select)
{
    close();
    data->select = select;
    data->fetch();
}

void Recordset::requery()
{
    update();
    data->requireOpen();
    if (!data->declared)
        data->fetch();
    else
        data->showFiltered();
}

void Recordset::close()
{
    auto fresh = std::make_unique<Data>();
    fresh->connection = data->connection;
    if (data->declared) {
        fresh->columns = data->columns;
        fresh->columnNumbers = data->columnNumbers;
        fresh->declared = true;
    }
    data = std::move(fresh);
}

bool Recordset::isOpen() const
{
    return data->isOpen;
}

void Recordset::disconnect()
{
    update();
    data->connection.reset();
    data->disconnected = !data->declared;
}

void Recordset::declare(const QString& name, Kind kind, int size)
{
    data->declared = true;
    data->columns.append({name, {}, kind, size});
    data->numberColumns();
}

void Recordset::openDeclared()
{
    data->isOpen = true;
}

bool Recordset::eof() const
{
    data->requireOpen();
    return data->position >= int(data->visible.size());
}

bool Recordset::bof() const
{
    data->requireOpen();
    return data->visible.empty() || data->position < 0;
}

int Recordset::recordCount() const
{
    data->requireOpen();
    return int(data->visible.size());
}

int Recordset::absolutePosition() const
{
    data->requireOpen();
    return data->hasRow() ? data->position + 1 : -1;
}

void Recordset::setAbsolutePosition(int position)
{
    update();
    if (position < 1 || position > recordCount())
        failNoCurrentRow();
    data->position = position - 1;
}

void Recordset::moveFirst()
{
    update();
    if (recordCount() == 0)
        failNoCurrentRow();
    data->position = 0;
}

void Recordset::moveNext()
{
    update();
    if (eof())
        failNoCurrentRow();
    ++data->position;
}

void Recordset::movePrevious()
{
    update();
    if (bof())
        failNoCurrentRow();
    --data->position;
}

void Recordset::moveLast()
{
    update();
    if (recordCount() == 0)
        failNoCurrentRow();
    data->position = recordCount() - 1;
}

void Recordset::find(const QString& text)
{
    update();
    data->requireOpen();
    const QList<Criterion> criteria = criteriaIn(text);
    if (criteria.size() != 1)
        throw RuntimeError(StatementFailed, u"A search takes one condition: "_s + text);
    const Criterion& criterion = criteria.first();
    const int column = data->columnNumber(criterion.column);
    const Kind columnKind = data->columns[column].kind;
    const std::vector<int>& visible = data->visible;
    const auto from = visible.begin() + std::clamp<qsizetype>(data->position, 0, qsizetype(visible.size()));
    auto hit = visible.end();
    if (criterion.comparison == Criterion::Comparison::Equal && criterion.operand) {
        const std::optional<QString> key = equalityKey(*criterion.operand, columnKind);
        if (key && from != visible.end()) {
            static const Bucket noRows;
            const Index& index = data->indexOf(column);
            const auto found = index.constFind(*key);
            const Bucket& bucket = found == index.constEnd() ? noRows : *found;
            for (auto row = std::lower_bound(bucket.begin(), bucket.end(), *from);
                 row != bucket.end() && hit == visible.end(); ++row) {
                const auto place = std::lower_bound(from, visible.end(), *row);
                if (place != visible.end() && *place == *row)
                    hit = place;
            }
        }
    } else {
        hit = std::find_if(from, visible.end(),
                           [&](int row) { return criterion.matches(data->at(row, column), columnKind); });
    }
    data->position = int(hit - visible.begin());
}

void Recordset::setFilter(const QString& text)
{
    update();
    data->requireOpen();
    const QList<Criterion> criteria = criteriaIn(text);
    for (const Criterion& criterion : criteria)
        data->columnNumber(criterion.column);  // an unknown name fails here, not at some later row
    data->filter = criteria;
    data->showFiltered();
}

QVariant Recordset::value(const QString& column) const
{
    const int row = data->row();
    return data->at(row, data->columnNumber(column));
}

QString Recordset::text(const QString& column) const
{
    return textOrEmpty(value(column));
}

bool Recordset::isNull(const QString& column) const
{
    return value(column).isNull();
}

void Recordset::set(const QString& name, const QVariant& value)
{
    const int row = data->row();
    const int column = data->columnNumber(name);
    const ResultColumn& described = data->columns[column];
    if (!data->declared && described.table.isEmpty())
        throw RuntimeError(StatementFailed, u"The column "_s + name + u" is worked out and can't be changed."_s);
    const QVariant stored = converted(value, described.kind, data->declared ? described.size : 0);
    if (!data->declared && described.kind == Kind::Text && described.size > 0 &&
        stored.toString().size() > described.size)
        throw RuntimeError(ValueTooLong, u"The text is too long for the column "_s + name + u"."_s);
    data->beginChange();
    data->assigned[size_t(column)] = true;
    data->store(row, column, stored);
}

void Recordset::addNew()
{
    update();
    data->requireOpen();
    const int row = data->columns.isEmpty() ? 0 : int(data->values.size()) / int(data->columns.size());
    data->values.resize(data->values.size() + size_t(data->columns.size()));
    data->rows.push_back(row);
    data->visible.push_back(row);
    data->position = int(data->visible.size()) - 1;
    data->beginChange();
    data->pending = Data::Pending::Insert;
}

void Recordset::update()
{
    if (data->pending == Data::Pending::None)
        return;
    if (!data->declared) {
        QStringList tables = data->changedTables();
        if (data->pending == Data::Pending::Insert) {
            if (tables.isEmpty() && !data->columns.isEmpty())
                tables.append(data->columns.first().table);
            for (const QString& table : tables)
                data->writeInsert(table);
        } else {
            for (const QString& table : tables)
                data->writeChange(table);
        }
    }
    data->forgetChange();
}

void Recordset::cancelUpdate()
{
    if (data->pending == Data::Pending::Insert) {
        data->dropCurrentRow();
    } else if (data->pending == Data::Pending::Change) {
        for (int column = 0; column < data->columns.size(); ++column)
            data->store(data->row(), column, data->original[size_t(column)]);
    }
    data->forgetChange();
}

void Recordset::remove()
{
    const int row = data->row();
    if (data->pending == Data::Pending::Insert)
        return cancelUpdate();
    if (!data->declared) {
        const TableInfo* table = data->columns.isEmpty() ? nullptr : data->engine().table(data->columns.first().table);
        if (!table)
            throw RuntimeError(StatementFailed, u"The query has no base table to delete from."_s);
        const QString condition = data->keyCondition(*table);
        if (data->engine().executeNative(u"DELETE FROM "_s + data->engine().quoted(table->name) + u" WHERE "_s +
                                         condition) == 0)
            failRowChanged();
    }
    Q_UNUSED(row);
    data->forgetChange();
    data->dropCurrentRow();
}

QStringList Recordset::columns() const
{
    QStringList names;
    for (const ResultColumn& column : std::as_const(data->columns))
        names.append(column.name);
    return names;
}

bool Recordset::hasColumn(const QString& column) const
{
    return data->columnNumbers.contains(column.toLower());
}

Kind Recordset::kind(const QString& column) const
{
    return data->columns[data->columnNumber(column)].kind;
}

int Recordset::size(const QString& column) const
{
    return data->columns[data->columnNumber(column)].size;
}

}  // namespace kest::db
