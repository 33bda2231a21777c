// Writes the pending change of a recordset to the base tables of its columns.
#include "platform/database/Change.h"
#include "platform/database/RecordsetData.h"

#include <QDateTime>

#include <algorithm>
#include <cmath>

namespace kest::db {

using namespace Qt::StringLiterals;

namespace {

[[noreturn]] void failRowChanged()
{
    throw RuntimeError(RowChanged,
                       u"Row cannot be located for updating. Some values may have been changed since it was "
                       "last read."_s);
}

/// Returns the condition that a column still has a value. A moment was read without what is finer than a millisecond.
QString holds(const Dialect& dialect, const ResultColumn& column, const QVariant& value)
{
    constexpr int digitsOfMilliseconds = 3;
    if (column.kind != Kind::Date || column.scale <= digitsOfMilliseconds || value.typeId() != QMetaType::QDateTime)
        return dialect.holds(column.name, column.kind, value);
    const QString name = dialect.quoted(column.name);
    return name + u">="_s + dialect.literal(value) + u" AND "_s + name + u'<' +
           dialect.literal(value.toDateTime().addMSecs(1));
}

/// The same, but an empty text for a floating-point number, and for an exact number with more digits than a double
/// holds.
QString held(const Dialect& dialect, const ResultColumn& column, const QVariant& value)
{
    constexpr double exactDigits = 1e15;
    if (column.kind != Kind::Number || (column.scale >= 0 && value.isNull()))
        return holds(dialect, column, value);
    if (column.scale < 0 || value.typeId() != QMetaType::Double ||
        std::abs(value.toDouble()) * std::pow(10, column.scale) >= exactDigits)
        return {};
    return dialect.quoted(column.name) + u'=' + QString::number(value.toDouble(), 'f', column.scale);
}

}  // namespace

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

/// Returns the condition for the current row in a table: its primary key, or all selected columns if the query does not
/// contain the key.
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
        conditions.append(holds(dialect(), columns[column], before(column)));
    }
    if (conditions.isEmpty()) {
        for (int column = 0; column < columns.size(); ++column) {
            if (columns[column].table == table.name && columns[column].kind != Kind::LongText)
                conditions.append(held(dialect(), columns[column], before(column)));
        }
        conditions.removeAll(QString());
    }
    if (conditions.isEmpty())
        throw RuntimeError(StatementFailed, u"The columns of the query don't identify a row of "_s + table.name);
    return conditions.join(u" AND "_s);
}

/// Returns the long texts that will be written and that the engine can't compare in a condition.
QList<int> Recordset::Data::uncomparedTexts(const TableInfo& table)
{
    QList<int> texts;
    for (int column = 0; column < columns.size(); ++column) {
        if (columns[column].table == table.name && columns[column].kind == Kind::LongText && isChanged(column) &&
            dialect().holds(columns[column].name, Kind::LongText, original[size_t(column)]).isEmpty())
            texts.append(column);
    }
    return texts;
}

/// Reads long texts again and compares them. The row stays locked until the transaction ends.
void Recordset::Data::checkTexts(const TableInfo& table, const QString& key, const QList<int>& texts)
{
    QList<ResultColumn> described;
    QStringList names;
    for (const int column : texts) {
        described.append(columns[column]);
        names.append(dialect().quoted(columns[column].name));
    }
    const Rows now =
        session().selectNative(u"SELECT "_s + names.join(u", "_s) + u" FROM "_s +
                                   QString(dialect().lockedTable).replace(u"%1"_s, dialect().quoted(table.name)) +
                                   u" WHERE "_s + key + dialect().lockedEnd,
                               described);
    if (now.count() == 0)
        failRowChanged();
    for (qsizetype i = 0; i < texts.size(); ++i) {
        const QVariant& before = original[size_t(texts[i])];
        const QVariant& stored = now.values[size_t(i)];
        if (before.isNull() != stored.isNull() || before.toString() != stored.toString())
            failRowChanged();
    }
}

void Recordset::Data::writeChange(const QString& tableName)
{
    const TableInfo* table = session().table(tableName);
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
        assignments.append(dialect().quoted(name) + u'=' + dialect().literal(at(row(), column)));
        if (const QString same = held(dialect(), columns[column], before); !same.isEmpty())
            condition += u" AND "_s + same;
        written.append(column);
    }
    const QList<int> texts = uncomparedTexts(*table);
    Change change(*connection, tableName, texts.isEmpty() ? ChangeSteps::WriteOnly : ChangeSteps::ReadAndWrite);
    if (!texts.isEmpty())
        checkTexts(*table, key, texts);
    const qint64 hit = session().executeNative(u"UPDATE "_s + dialect().quoted(tableName) + u" SET "_s +
                                               assignments.join(u", "_s) + u" WHERE "_s + condition);
    if (hit == 0)
        failRowChanged();
    QList<RowChange> recorded;
    if (change.isObserved())
        recorded.append(rowChange(*table, ChangeKind::Update, change.wantedColumns()));
    change.commit(recorded);
    for (const int column : written)
        original[size_t(column)] = at(row(), column);
}

void Recordset::Data::writeInsert(const QString& tableName)
{
    const TableInfo* table = session().table(tableName);
    if (!table)
        throw RuntimeError(StatementFailed, u"There is no table "_s + tableName);
    QStringList names;
    QStringList literals;
    for (int column = 0; column < columns.size(); ++column) {
        if (columns[column].table != tableName || !isChanged(column))
            continue;
        names.append(dialect().quoted(columns[column].name));
        literals.append(dialect().literal(at(row(), column)));
    }
    Change change(*connection, tableName);
    const QVariant identity = session().insert(*table, names, literals);
    for (int column = 0; column < columns.size(); ++column) {
        if (table->identity() && columns[column].table == tableName && columns[column].name == table->identity()->name)
            store(row(), column, identity);
    }
    if (change.isObserved())
        change.commit({rowChange(*table, ChangeKind::Insert, {})});
    readBack(*table, identity);
}

/// The current row as it is recorded, its identity filled in.
RowChange Recordset::Data::rowChange(const TableInfo& table, ChangeKind kind, const QStringList& wanted)
{
    const bool hasKey = !table.key.isEmpty() && std::ranges::all_of(table.key, [&](const QString& name) {
        return resultColumn(table.name, name) >= 0;
    });
    RowChange change{kind, table.name, hasKey ? table.key : QStringList(), {}};
    for (int column = 0; column < columns.size(); ++column) {
        const ResultColumn& described = columns[column];
        if (described.table != table.name)
            continue;
        const TableColumn* base = table.column(described.name);
        const bool isIdentity = base && base->identity;
        const bool isExact = described.kind != Kind::Number && described.kind != Kind::LongText;
        const bool isKey = hasKey ? table.key.contains(described.name, Qt::CaseInsensitive)
                                  : isExact && (kind == ChangeKind::Update || assigned[size_t(column)]);
        if (!isKey && !isIdentity && !isChanged(column) && !wanted.contains(described.name, Qt::CaseInsensitive))
            continue;
        if (isKey && !hasKey)
            change.key.append(described.name);
        change.columns.append({described.name, described.kind,
                               kind == ChangeKind::Insert ? QVariant() : original[size_t(column)], at(row(), column)});
    }
    return change;
}

/// Reads what the database has set in the new row: its identity, and the defaults of the columns without a value.
void Recordset::Data::readBack(const TableInfo& table, const QVariant& identity)
{
    QList<int> wanted;
    QList<ResultColumn> described;
    QStringList names;
    for (int column = 0; column < columns.size(); ++column) {
        const TableColumn* base = columns[column].table == table.name ? table.column(columns[column].name) : nullptr;
        if (!base || assigned[size_t(column)])
            continue;
        if (base->identity) {
            store(row(), column, identity);
        } else if (base->hasDefault) {
            wanted.append(column);
            described.append(columns[column]);
            names.append(dialect().quoted(base->name));
        }
    }
    if (wanted.isEmpty())
        return;
    const QString condition =
        identity.isNull() ? insertedRow(table) : dialect().holds(table.identity()->name, Kind::WholeNumber, identity);
    const Rows stored = session().selectNative(
        u"SELECT "_s + names.join(u", "_s) + u" FROM "_s + dialect().quoted(table.name) + u" WHERE "_s + condition,
        described);
    for (qsizetype i = 0; stored.count() > 0 && i < wanted.size(); ++i)
        store(row(), wanted[i], stored.values[size_t(i)]);
}

/// Finds a row in a table without an identity by all the values that were set.
QString Recordset::Data::insertedRow(const TableInfo& table)
{
    QStringList conditions{u"1=1"_s};
    for (int column = 0; column < columns.size(); ++column) {
        if (columns[column].table == table.name && assigned[size_t(column)] && columns[column].kind != Kind::LongText)
            conditions.append(held(dialect(), columns[column], at(row(), column)));
    }
    conditions.removeAll(QString());
    return conditions.join(u" AND "_s);
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
        const TableInfo* table = data->columns.isEmpty() ? nullptr : data->session().table(data->columns.first().table);
        if (!table)
            throw RuntimeError(StatementFailed, u"The query has no base table to delete from."_s);
        const QString condition = data->keyCondition(*table);
        if (deleteRows(*data->connection, table->name, condition) == 0)
            failRowChanged();
    }
    Q_UNUSED(row);
    data->forgetChange();
    data->dropCurrentRow();
}

}  // namespace kest::db
