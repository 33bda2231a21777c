#include "platform/database/Recordset.h"

#include "platform/database/RecordsetWriter.h"
#include "platform/values.h"

#include <algorithm>
#include <cmath>
#include <numeric>
#include <optional>

namespace kest::db {

using namespace Qt::StringLiterals;

void failNoCurrentRow()
{
    throw RuntimeError(NoCurrentRow, u"Either BOF or EOF is True, or the current record has been deleted."_s);
}

namespace {

qint64 asWholeNumber(const QVariant& value)
{
    if (value.typeId() == QMetaType::LongLong || value.typeId() == QMetaType::Int)
        return value.toLongLong();
    const double number = std::nearbyint(toDouble(value));
    if (std::abs(number) >= 9.2e18)
        throw RuntimeError(Overflow, u"Overflow"_s);
    return qint64(number);
}

/// Converts a value to the kind of a column. Throws TypeMismatch if it can't be converted.
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

}  // namespace

void Recordset::Data::fetch()
{
    Rows result = session().select(select);
    const int count = result.count();
    columns = result.columns;
    columnNumbers = result.columnNumbers;
    values = std::move(result.values);
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
        return criterion.matches(at(row, column), columns.at(column).kind);
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
        if (const auto key = equalityKey(at(row, column), columns.at(column).kind))
            index[*key].push_back(row);
    }
    return *indexes.insert(column, index);
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

/// Changes a value and updates the indexes. All changes are made here.
void Recordset::Data::store(int row, int column, const QVariant& value)
{
    QVariant& held = at(row, column);
    const auto index = indexes.find(column);
    if (index != indexes.end()) {
        const Kind kind = columns.at(column).kind;
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
    data->columnNumbers = columnNumbers(data->columns);
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

void Recordset::moveLast()
{
    update();
    if (recordCount() == 0)
        failNoCurrentRow();
    data->position = recordCount() - 1;
}

/// Makes the next row whose column has that key the current row. Without a key, no row matches.
void Recordset::Data::findKey(int column, const std::optional<QString>& key)
{
    const auto from = visible.begin() + std::clamp<qsizetype>(position, 0, qsizetype(visible.size()));
    static const Bucket noRows;
    auto hit = visible.end();
    if (key && from != visible.end()) {
        const Index& index = indexOf(column);
        const auto found = index.constFind(*key);
        const Bucket& bucket = found == index.constEnd() ? noRows : *found;
        for (auto row = std::lower_bound(bucket.begin(), bucket.end(), *from);
             row != bucket.end() && hit == visible.end(); ++row) {
            const auto place = std::lower_bound(from, visible.end(), *row);
            if (place != visible.end() && *place == *row)
                hit = place;
        }
    }
    position = int(hit - visible.begin());
}

void Recordset::find(const QString& column, const QVariant& value)
{
    update();
    data->requireOpen();
    const int number = data->columnNumber(column);
    data->findKey(number, equalityKey(value, data->columns.at(number).kind));
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
    const Kind kind = data->columns.at(column).kind;
    if (criterion.comparison == Criterion::Comparison::Equal && criterion.operand)
        return data->findKey(column, equalityKey(*criterion.operand, kind));
    const std::vector<int>& visible = data->visible;
    const auto from = visible.begin() + std::clamp<qsizetype>(data->position, 0, qsizetype(visible.size()));
    const auto hit =
        std::find_if(from, visible.end(), [&](int row) { return criterion.matches(data->at(row, column), kind); });
    data->position = int(hit - visible.begin());
}

void Recordset::setFilter(const QString& text)
{
    update();
    data->requireOpen();
    const QList<Criterion> criteria = criteriaIn(text);
    for (const Criterion& criterion : criteria)
        data->columnNumber(criterion.column);  // an unknown name must fail here and not at a later row
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
    const ResultColumn& described = data->columns.at(column);
    if (!data->declared && described.table.isEmpty())
        throw RuntimeError(StatementFailed, u"The column "_s + name + u" can't be changed."_s);
    const QVariant stored = converted(value, described.kind, data->declared ? described.size : 0);
    if (!data->declared && described.kind == Kind::Text && described.size > 0 &&
        stored.toString().size() > described.size)
        throw RuntimeError(ValueTooLong, u"The text is too long for the column "_s + name + u"."_s);
    data->beginChange();
    data->assigned[size_t(column)] = true;
    data->store(row, column, stored);
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
    return data->columnNumbers.contains(column) || data->columnNumbers.contains(column.toLower());
}

Kind Recordset::kind(const QString& column) const
{
    return data->columns.at(data->columnNumber(column)).kind;
}

int Recordset::size(const QString& column) const
{
    return data->columns.at(data->columnNumber(column)).size;
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
    if (!data->declared)
        Data::Writer(*data).write();
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
    data->row();  // throws if there is none
    if (data->pending == Data::Pending::Insert)
        return cancelUpdate();
    if (!data->declared)
        Data::Writer(*data).remove();
    data->forgetChange();
    data->dropCurrentRow();
}

}  // namespace kest::db
