// Translates statements from the dialect of SQL Server to that of another engine.
#pragma once

#include "platform/database/Dialect.h"
#include "platform/database/SelectList.h"
#include "platform/database/Shape.h"

#include <QList>
#include <QString>
#include <QStringList>

#include <optional>
#include <vector>

namespace kest::db {

/// A translated shape of a statement, which serves all statements of that shape.
struct Translated {
    /// What becomes of a value.
    struct Use {
        Kind comparedWith = Kind::Text;  // the kind of the column that it is compared with or assigned to
        bool isAssigned = false;
        bool isUnequal = false;  // compared by "<>"
    };

    QStringList pieces;                            // the text before each value, and that after the last
    std::vector<Use> uses;                         // of each value
    std::optional<QList<SelectedColumn>> columns;  // the columns of a query, as far as the statement shows them

    /// Returns the statement with these values. The text of literals is not changed, but a literal that is compared
    /// with a number column becomes a number: "''" is 0, and a text that is not a number equals no number.
    QString text(const QList<QString>& values, const Dialect& dialect) const;
};

/// Translates a shape. Throws StatementFailed if a second statement follows a ";".
Translated translated(const Shape& shape, const Dialect& dialect, Schema& schema);

}  // namespace kest::db
