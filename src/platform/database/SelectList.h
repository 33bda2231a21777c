// Where the columns of a query come from, by the statement and the schema: drivers tell it in part, or not at all.
#pragma once

#include "platform/database/Schema.h"
#include "platform/database/Tokens.h"

#include <QList>
#include <QString>

#include <optional>

namespace kest::db {

/// A column of the select list.
struct SelectedColumn {
    QString name;                     // as the result names it; empty if the database makes a name up
    QString table;                    // where it can be changed, in the schema's spelling; empty: read only
    std::optional<TableColumn> base;  // whose values it shows; none for an expression
};

/// None if the statement is no SELECT from tables, or if it can't be said how many columns it gives.
std::optional<QList<SelectedColumn>> selectedColumns(const Tokens& tokens, Schema& schema);

}  // namespace kest::db
