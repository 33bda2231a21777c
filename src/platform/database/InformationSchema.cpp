#include "platform/database/InformationSchema.h"

#include "platform/database/ColumnValues.h"

namespace kest::db {

using namespace Qt::StringLiterals;

namespace {

constexpr int longestText = 65535;  // the length of longer texts is not checked

QString textOf(const QVariant& value)
{
    return normalised(value, Kind::Text).toString();
}

/// Returns the seconds to which a column of that type rounds a date.
int stepOf(const QString& type)
{
    if (type.compare("smalldatetime"_L1, Qt::CaseInsensitive) == 0)
        return secondsOfMinute;
    return type.compare("date"_L1, Qt::CaseInsensitive) == 0 ? secondsOfDay : 1;
}

TableColumn columnOf(const QVariant* row, const InformationSchemaTerms& terms)
{
    TableColumn column;
    const QString type = textOf(row[1]);
    column.name = textOf(row[0]);
    column.kind = kindOfType(type);
    column.step = stepOf(type);
    column.isSingle = type.compare(terms.single, Qt::CaseInsensitive) == 0;
    column.isText = !type.contains("BLOB"_L1, Qt::CaseInsensitive) && !type.contains("BINARY"_L1, Qt::CaseInsensitive);
    column.readOnly = type == InformationSchemaTerms::readOnly;
    column.size = column.kind == Kind::Text && row[2].toLongLong() <= longestText ? row[2].toInt() : 0;
    column.hasDefault = !row[3].isNull() && textOf(row[3]) != u"NULL"_s;
    if (column.hasDefault)
        column.fixedDefault = fixedDefault(textOf(row[3]), column.kind);
    column.identity = row[4].toInt() == 1;
    static const QStringList exactTypes{u"decimal"_s, u"numeric"_s, u"money"_s, u"smallmoney"_s};
    if (exactTypes.contains(type, Qt::CaseInsensitive) && !row[5].isNull())
        column.scale = row[5].toInt();
    if (column.kind == Kind::Date && !row[6].isNull())
        column.scale = row[6].toInt();
    return column;
}

}  // namespace

QStringList tableNamesOf(Engine& engine, const InformationSchemaTerms& terms)
{
    QStringList names;
    for (const QVariant& name :
         engine.run(u"SELECT TABLE_NAME FROM INFORMATION_SCHEMA.TABLES WHERE "_s + terms.ofDatabase).values)
        names.append(textOf(name));
    return names;
}

std::unique_ptr<TableInfo> tableOf(Engine& engine, const InformationSchemaTerms& terms, const QString& name)
{
    auto info = std::make_unique<TableInfo>();
    info->name = name;
    const QString ofTable = u"TABLE_NAME="_s + engine.dialect().literal(name) + u" AND "_s + terms.ofDatabase;
    const Answer columns =
        engine.run(u"SELECT COLUMN_NAME, "_s + terms.type + u", CHARACTER_MAXIMUM_LENGTH, COLUMN_DEFAULT, "_s +
                   terms.identity + u", NUMERIC_SCALE, DATETIME_PRECISION FROM INFORMATION_SCHEMA.COLUMNS WHERE "_s +
                   ofTable + u" ORDER BY ORDINAL_POSITION"_s);
    for (size_t i = 0; i < columns.values.size(); i += size_t(columns.names.size()))
        info->columns.append(columnOf(&columns.values[i], terms));
    const Answer key = engine.run(
        u"SELECT COLUMN_NAME FROM INFORMATION_SCHEMA.KEY_COLUMN_USAGE WHERE "_s + ofTable +
        u" AND CONSTRAINT_NAME IN (SELECT CONSTRAINT_NAME FROM INFORMATION_SCHEMA.TABLE_CONSTRAINTS WHERE "_s +
        ofTable + u" AND CONSTRAINT_TYPE='PRIMARY KEY') ORDER BY ORDINAL_POSITION"_s);
    for (const QVariant& column : key.values)
        info->key.append(textOf(column));
    return info;
}

}  // namespace kest::db
