// Translates statements from the dialect of SQL Server to that of another engine.
#pragma once

#include "platform/database/Dialect.h"
#include "platform/database/SelectList.h"

#include <QList>
#include <QString>

#include <optional>

namespace kest::db {

/// A translated statement.
struct Translated {
    QString text;
    std::optional<QList<SelectedColumn>> columns;  // the columns of a query, as far as the statement shows them
};

/// Translates a statement. The text of literals is not changed, but a literal that is compared with a number column
/// becomes a number: "''" is 0, and a text that is not a number equals no number. Throws StatementFailed if a second
/// statement follows a ";".
Translated translated(const QString& statement, const Dialect& dialect, Schema& schema);

}  // namespace kest::db
