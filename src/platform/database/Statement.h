// Statements are written in the dialect of SQL Server; this turns one into the dialect of the engine that answers.
#pragma once

#include "platform/database/Dialect.h"
#include "platform/database/SelectList.h"

#include <QList>
#include <QString>

#include <optional>

namespace kest::db {

struct Translated {
    QString text;
    std::optional<QList<SelectedColumn>> columns;  // of a query, as far as the statement tells them
};

/// Throws StatementFailed if a second statement follows a ";". Nothing inside a literal is touched, but a literal that
/// is compared with a number column becomes the number that it means: "''" is 0, and a text that is no number equals no
/// number.
Translated translated(const QString& statement, const Dialect& dialect, Schema& schema);

}  // namespace kest::db
