#include "platform/database/SelectList.h"

#include <algorithm>

namespace kest::db {

using namespace Qt::StringLiterals;

namespace {

using Index = Tokens::Index;

struct Item {
    Index first;
    Index last;
};

class SelectList {
public:
    SelectList(const Tokens& statement, Schema& known) : tokens(statement), schema(known) {}

    std::optional<QList<SelectedColumn>> columns()
    {
        const Index select = tokens.next(-1);
        if (!tokens.isAt(select, u"SELECT"))
            return std::nullopt;
        readItems(select);
        if (tables.isEmpty())
            return std::nullopt;
        for (const Item& item : items) {
            if (!take(item))
                return std::nullopt;
        }
        return result;
    }

private:
    /// Splits the statement at the commas and keywords outside of parentheses.
    void readItems(Index select)
    {
        Index i = afterTop(tokens.next(select));
        Item item{i, Tokens::none};
        bool inList = true;
        int depth = 0;
        for (; i != Tokens::none; i = tokens.next(i)) {
            const Token& token = tokens.at(i);
            if (depth == 0 && !inList && token.is(u"(") && isPlaceOfTable(tokens.previous(i)))
                isComplete = false;
            depth += int(token.is(u"(")) - int(token.is(u")"));
            if (depth <= 0 && inList && (token.is(u",") || token.is(u"FROM"))) {
                items.append(item);
                item = {tokens.next(i), Tokens::none};
                inList = token.is(u",");
            } else {
                item.last = i;
            }
            if (depth == 0 && namesTables(token))
                tables += tablesAfter(tokens, i);
            else if (depth == 0 && (token.is(u"GROUP") || token.is(u"UNION") || token.is(u"DISTINCT")))
                canChange = false;
        }
    }

    Index afterTop(Index i)
    {
        if (tokens.isAt(i, u"DISTINCT") || tokens.isAt(i, u"ALL")) {
            canChange = canChange && tokens.isAt(i, u"ALL");
            i = tokens.next(i);
        }
        return tokens.isAt(i, u"TOP") ? tokens.next(tokens.next(i)) : i;
    }

    /// Returns true if a table, or a query in parentheses, follows.
    bool isPlaceOfTable(Index i) const { return tokens.isAt(i, u",") || namesTables(tokens.at(i)); }

    /// Adds the columns of an item. Returns false if their number is unknown.
    bool take(const Item& item)
    {
        if (item.last == Tokens::none)
            return false;
        if (tokens.isAt(item.last, u"*") && (item.first == item.last || tokens.isAt(tokens.previous(item.last), u".")))
            return takeAll(item);
        SelectedColumn column;
        Index first = item.first;
        Index last = item.last;
        bool renamed = false;
        const Index beforeName = last == first ? Tokens::none : tokens.previous(last);
        if (tokens.isAt(beforeName, u"AS")) {
            column.name = tokens.at(last).name();
            last = tokens.previous(beforeName);
            renamed = true;
        }
        const bool worked = isWorkedOut(first, last);
        if (const NamedTable* table = tableOf(first, last)) {
            const TableInfo* info = schema.table(table->table);
            column.base = *info->column(tokens.at(last).name());
            if (!renamed && !worked)
                column.name = column.base->name;
            if (!renamed && !worked && isChangeable(*table))
                column.table = info->name;
        }
        result.append(column);
        return true;
    }

    /// Returns true for MAX(column) and MIN(column), whose results are values of the column, and sets `first` and
    /// `last` to its name.
    bool isWorkedOut(Index& first, Index& last) const
    {
        if (!(tokens.isAt(first, u"MAX") || tokens.isAt(first, u"MIN")) || !tokens.isAt(tokens.next(first), u"(") ||
            !tokens.isAt(last, u")"))
            return false;
        first = tokens.next(tokens.next(first));
        last = tokens.previous(last);
        return true;
    }

    bool takeAll(const Item& item)
    {
        const bool ofOne = item.first != item.last;
        bool isKnown = false;
        for (const NamedTable& table : std::as_const(tables)) {
            if (ofOne && !table.answersTo(tokens.at(item.first).name()))
                continue;
            const TableInfo* info = schema.table(table.table);
            if (!info)
                return false;
            isKnown = true;
            for (const TableColumn& column : info->columns)
                result.append({column.name, isChangeable(table) ? info->name : QString(), column});
        }
        return isKnown && (ofOne || isComplete);
    }

    /// Returns the table of "column" or "table.column", or null for anything else.
    const NamedTable* tableOf(Index first, Index last)
    {
        if (!tokens.at(last).isIdentifier())
            return nullptr;
        const QString column = tokens.at(last).name();
        const bool qualified = first != last;
        if (qualified && (!tokens.at(first).isIdentifier() || !tokens.isAt(tokens.next(first), u".") ||
                          tokens.next(tokens.next(first)) != last))
            return nullptr;
        const NamedTable* found = nullptr;
        for (const NamedTable& table : std::as_const(tables)) {
            if (qualified && !table.answersTo(tokens.at(first).name()))
                continue;
            const TableInfo* info = schema.table(table.table);
            if (!info || !info->column(column))
                continue;
            if (found)
                return nullptr;
            found = &table;
        }
        return qualified || isComplete ? found : nullptr;
    }

    /// Returns false for a table that occurs twice, because the key might be that of the other row.
    bool isChangeable(const NamedTable& table) const
    {
        return canChange && std::count_if(tables.begin(), tables.end(), [&](const NamedTable& other) {
                                return other.table.compare(table.table, Qt::CaseInsensitive) == 0;
                            }) == 1;
    }

    const Tokens& tokens;
    Schema& schema;
    QList<Item> items;
    QList<NamedTable> tables;
    bool isComplete = true;
    bool canChange = true;
    QList<SelectedColumn> result;
};

}  // namespace

std::optional<QList<SelectedColumn>> selectedColumns(const Tokens& tokens, Schema& schema)
{
    return SelectList(tokens, schema).columns();
}

}  // namespace kest::db
