// Finds out from the statement and the schema where the columns of a query come from. Drivers say this only in part or
// not at all.
#pragma once

#include "platform/database/Schema.h"
#include "platform/database/Tokens.h"

#include <QList>
#include <QString>

#include <optional>

namespace kest::db {

/// A column of the select list.
struct SelectedColumn {
    QString name;   // its name in the result; empty if the database invents one
    QString table;  // the table in which it can be changed, in the schema's spelling; empty if it is read-only
    std::optional<TableColumn> base;  // the column whose values it shows; empty for an expression
};

/// Returns the columns of a SELECT. Returns nothing if the statement is not a SELECT from tables, or if the number of
/// its columns is unknown.
std::optional<QList<SelectedColumn>> selectedColumns(const Tokens& tokens, Schema& schema);

}  // namespace kest::db
