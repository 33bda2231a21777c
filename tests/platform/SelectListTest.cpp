// Tests that the columns of a query are found from its text.
#include "platform/database/SelectList.h"
#include "support/Test.h"

using db::Kind;

struct FixedSchema final : db::Schema {
    const db::TableInfo* table(const QString& name) override
    {
        const auto found = tables.constFind(name.toUpper());
        return found == tables.cend() ? nullptr : &*found;
    }
    QString tableSpelling(const QString& name) override { return table(name) ? table(name)->name : QString(); }

private:
    const QMap<QString, db::TableInfo> tables{
        {u"LINE"_s, {u"LINE"_s, {{u"id"_s, Kind::WholeNumber}, {u"CODE"_s}, {u"day"_s, Kind::Date}}, {u"id"_s}}},
        {u"CAR"_s, {u"Car"_s, {{u"REGO"_s}, {u"CODE"_s}}, {u"REGO"_s}}}};
};

static QString told(const std::optional<QList<db::SelectedColumn>>& columns)
{
    if (!columns)
        return u"?"_s;
    QStringList words;
    for (const db::SelectedColumn& column : *columns) {
        words.append(column.table.isEmpty() ? u"-"_s : column.table + u'.' + column.name);
        if (column.base)
            words.last() += column.base->kind == Kind::Text   ? u":t"_s
                            : column.base->kind == Kind::Date ? u":d"_s
                                                              : u":n"_s;
    }
    return words.join(u' ');
}

TEST(SelectList, TellsWhereEachColumnCanBeChanged)
{
    FixedSchema schema;
    for (const auto& [statement, columns] : casesIn<2>("select-lists.txt"))
        EXPECT_EQ(told(db::selectedColumns(db::Tokens(statement), schema)), columns) << statement;
}
