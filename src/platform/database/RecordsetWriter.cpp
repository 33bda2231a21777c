#include "platform/database/RecordsetWriter.h"

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

/// Returns the condition that a column still has a value.
QString holds(const Dialect& dialect, const ResultColumn& column, const QVariant& value)
{
    return dialect.holds(column.name, column.kind, value, column.scale);
}

/// The same, but an empty text for a floating-point number, and for an exact number with more digits than a double
/// holds. A database rounds 9.555 up to two digits, though its double is a little less.
QString held(const Dialect& dialect, const ResultColumn& column, const QVariant& value)
{
    constexpr double exactDigits = 1e14;
    constexpr double roundedUp = 1 + 1e-15;
    if (column.kind != Kind::Number || (column.scale >= 0 && value.isNull()))
        return holds(dialect, column, value);
    if (column.scale < 0 || value.typeId() != QMetaType::Double ||
        std::abs(value.toDouble()) * std::pow(10, column.scale) >= exactDigits)
        return {};
    return dialect.quoted(column.name) + u'=' + QString::number(value.toDouble() * roundedUp, 'f', column.scale);
}

}  // namespace

void Recordset::Data::Writer::write()
{
    QStringList tables = changedTables();
    const bool isInsert = data.pending == Pending::Insert;
    if (isInsert && tables.isEmpty() && !data.columns.isEmpty())
        tables.append(data.columns.first().table);
    for (const QString& table : tables)
        isInsert ? writeInsert(table) : writeChange(table);
}

void Recordset::Data::Writer::remove()
{
    const TableInfo* table = data.columns.isEmpty() ? nullptr : data.session().table(data.columns.first().table);
    if (!table)
        throw RuntimeError(StatementFailed, u"The query has no base table to delete from."_s);
    if (deleteRows(*data.connection, table->name, keyCondition(*table)) == 0)
        failRowChanged();
}

bool Recordset::Data::Writer::isChanged(int column)
{
    if (!data.assigned[size_t(column)])
        return false;
    if (data.pending == Pending::Insert)
        return true;
    const QVariant& before = data.original[size_t(column)];
    const QVariant& now = data.at(data.row(), column);
    return before.isNull() != now.isNull() || before.typeId() != now.typeId() || before != now;
}

QStringList Recordset::Data::Writer::changedTables()
{
    QStringList tables;
    for (int column = 0; column < data.columns.size(); ++column) {
        if (isChanged(column) && !tables.contains(data.columns.at(column).table))
            tables.append(data.columns.at(column).table);
    }
    return tables;
}

int Recordset::Data::Writer::resultColumn(const QString& table, const QString& name) const
{
    for (int i = 0; i < data.columns.size(); ++i) {
        if (data.columns.at(i).table == table && data.columns.at(i).name.compare(name, Qt::CaseInsensitive) == 0)
            return i;
    }
    return -1;
}

/// Returns the condition for the current row in a table: its primary key, or all selected columns if the query
/// does not contain the key.
QString Recordset::Data::Writer::keyCondition(const TableInfo& table)
{
    const auto before = [&](int column) {
        return data.pending == Pending::Change ? data.original[size_t(column)] : data.at(data.row(), column);
    };
    QStringList conditions;
    for (const QString& name : table.key) {
        const int column = resultColumn(table.name, name);
        if (column < 0) {
            conditions.clear();
            break;
        }
        conditions.append(holds(data.dialect(), data.columns.at(column), before(column)));
    }
    if (conditions.isEmpty()) {
        for (int column = 0; column < data.columns.size(); ++column) {
            if (data.columns.at(column).table == table.name && data.columns.at(column).kind != Kind::LongText)
                conditions.append(held(data.dialect(), data.columns.at(column), before(column)));
        }
        conditions.removeAll(QString());
    }
    if (conditions.isEmpty())
        throw RuntimeError(StatementFailed, u"The columns of the query don't identify a row of "_s + table.name);
    return conditions.join(u" AND "_s);
}

/// Returns the long texts that will be written and that the engine can't compare in a condition.
QList<int> Recordset::Data::Writer::uncomparedTexts(const TableInfo& table)
{
    QList<int> texts;
    for (int column = 0; column < data.columns.size(); ++column) {
        if (isChanged(column) && data.columns.at(column).table == table.name &&
            data.columns.at(column).kind == Kind::LongText &&
            data.dialect().holds(data.columns.at(column).name, Kind::LongText, data.original[size_t(column)]).isEmpty())
            texts.append(column);
    }
    return texts;
}

/// Reads long texts again and compares them. The row stays locked until the transaction ends.
void Recordset::Data::Writer::checkTexts(const TableInfo& table, const QString& key, const QList<int>& texts)
{
    QList<ResultColumn> described;
    QStringList names;
    for (const int column : texts) {
        described.append(data.columns.at(column));
        names.append(data.dialect().quoted(data.columns.at(column).name));
    }
    const Rows now = data.session().selectNative(
        u"SELECT "_s + names.join(u", "_s) + u" FROM "_s +
            QString(data.dialect().lockedTable).replace(u"%1"_s, data.dialect().quoted(table.name)) + u" WHERE "_s +
            key + data.dialect().lockedEnd,
        described);
    if (now.count() == 0)
        failRowChanged();
    for (qsizetype i = 0; i < texts.size(); ++i) {
        const QVariant& before = data.original[size_t(texts[i])];
        const QVariant& stored = now.values[size_t(i)];
        if (before.isNull() != stored.isNull() || before.toString() != stored.toString())
            failRowChanged();
    }
}

void Recordset::Data::Writer::writeChange(const QString& tableName)
{
    const TableInfo* table = data.session().table(tableName);
    if (!table)
        throw RuntimeError(StatementFailed, u"There is no table "_s + tableName);
    const QString key = keyCondition(*table);
    QStringList assignments;
    QString condition = key;
    QList<int> written;
    for (int column = 0; column < data.columns.size(); ++column) {
        if (!isChanged(column) || data.columns.at(column).table != tableName)
            continue;
        const QString& name = data.columns.at(column).name;
        const QVariant& before = data.original[size_t(column)];
        assignments.append(data.dialect().quoted(name) + u'=' + data.dialect().literal(data.at(data.row(), column)));
        if (const QString same = held(data.dialect(), data.columns.at(column), before); !same.isEmpty())
            condition += u" AND "_s + same;
        written.append(column);
    }
    const QList<int> texts = uncomparedTexts(*table);
    Change change(*data.connection, tableName, texts.isEmpty() ? ChangeSteps::WriteOnly : ChangeSteps::ReadAndWrite);
    if (!texts.isEmpty())
        checkTexts(*table, key, texts);
    const qint64 hit = data.session().executeNative(u"UPDATE "_s + data.dialect().quoted(tableName) + u" SET "_s +
                                                    assignments.join(u", "_s) + u" WHERE "_s + condition);
    if (hit == 0)
        failRowChanged();
    QList<RowChange> recorded;
    if (change.isObserved())
        recorded.append(rowChange(*table, ChangeKind::Update, change.wantedColumns()));
    change.commit(recorded);
    for (const int column : written)
        data.original[size_t(column)] = data.at(data.row(), column);
}

void Recordset::Data::Writer::writeInsert(const QString& tableName)
{
    const TableInfo* table = data.session().table(tableName);
    if (!table)
        throw RuntimeError(StatementFailed, u"There is no table "_s + tableName);
    QStringList names;
    QStringList literals;
    for (int column = 0; column < data.columns.size(); ++column) {
        if (!isChanged(column) || data.columns.at(column).table != tableName)
            continue;
        names.append(data.dialect().quoted(data.columns.at(column).name));
        literals.append(data.dialect().literal(data.at(data.row(), column)));
    }
    Change change(*data.connection, tableName);
    const QVariant identity = data.session().insert(*table, names, literals);
    for (int column = 0; column < data.columns.size(); ++column) {
        if (table->identity() && data.columns.at(column).table == tableName &&
            data.columns.at(column).name == table->identity()->name)
            data.store(data.row(), column, identity);
    }
    if (change.isObserved())
        change.commit({rowChange(*table, ChangeKind::Insert, {})});
    readBack(*table, identity);
}

/// The current row as it is recorded, its identity filled in.
RowChange Recordset::Data::Writer::rowChange(const TableInfo& table, ChangeKind kind, const QStringList& wanted)
{
    const bool hasKey = !table.key.isEmpty() && std::ranges::all_of(table.key, [&](const QString& name) {
        return resultColumn(table.name, name) >= 0;
    });
    const TableColumn* const identity = table.identity();
    RowChange change{kind, table.name, hasKey ? table.key : QStringList(), {}};
    for (int column = 0; column < data.columns.size(); ++column) {
        const ResultColumn& described = data.columns.at(column);
        if (described.table != table.name)
            continue;
        const bool isIdentity = identity && described.name.compare(identity->name, Qt::CaseInsensitive) == 0;
        const bool isExact = described.kind != Kind::Number && described.kind != Kind::LongText;
        const bool isKey = hasKey ? table.key.contains(described.name, Qt::CaseInsensitive)
                                  : isExact && (kind == ChangeKind::Update || data.assigned[size_t(column)]);
        if (!isKey && !isIdentity && !isChanged(column) && !wanted.contains(described.name, Qt::CaseInsensitive))
            continue;
        if (isKey && !hasKey)
            change.key.append(described.name);
        change.columns.append({described.name, described.kind,
                               kind == ChangeKind::Insert ? QVariant() : data.original[size_t(column)],
                               data.at(data.row(), column)});
    }
    return change;
}

/// Stores what the database has set in the new row: its identity, and the defaults of the columns without a value. Asks
/// the database only for defaults that the schema does not tell.
void Recordset::Data::Writer::readBack(const TableInfo& table, const QVariant& identity)
{
    QList<int> wanted;
    QList<ResultColumn> described;
    QStringList names;
    for (const TableColumn& base : table.columns) {
        const int column = base.identity || base.hasDefault ? resultColumn(table.name, base.name) : -1;
        if (column < 0 || data.assigned[size_t(column)])
            continue;
        if (base.identity) {
            data.store(data.row(), column, identity);
        } else if (!base.fixedDefault.isNull()) {
            data.store(data.row(), column, base.fixedDefault);
        } else {
            wanted.append(column);
            described.append(data.columns.at(column));
            names.append(data.dialect().quoted(base.name));
        }
    }
    if (wanted.isEmpty())
        return;
    const QString condition = identity.isNull()
                                  ? insertedRow(table)
                                  : data.dialect().holds(table.identity()->name, Kind::WholeNumber, identity);
    const Rows stored = data.session().selectNative(
        u"SELECT "_s + names.join(u", "_s) + u" FROM "_s + data.dialect().quoted(table.name) + u" WHERE "_s + condition,
        described);
    for (qsizetype i = 0; stored.count() > 0 && i < wanted.size(); ++i)
        data.store(data.row(), wanted[i], stored.values[size_t(i)]);
}

/// Finds a row in a table without an identity by all the values that were set.
QString Recordset::Data::Writer::insertedRow(const TableInfo& table)
{
    QStringList conditions{u"1=1"_s};
    for (int column = 0; column < data.columns.size(); ++column) {
        if (data.assigned[size_t(column)] && data.columns.at(column).table == table.name &&
            data.columns.at(column).kind != Kind::LongText)
            conditions.append(held(data.dialect(), data.columns.at(column), data.at(data.row(), column)));
    }
    conditions.removeAll(QString());
    return conditions.join(u" AND "_s);
}

}  // namespace kest::db
