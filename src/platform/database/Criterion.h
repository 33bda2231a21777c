// Conditions for searching and filtering fetched rows.
#pragma once

#include "platform/database/Recordset.h"

#include <QList>
#include <QString>
#include <QVariant>

#include <optional>

namespace kest::db {

/// A condition for the value of a column.
struct Criterion {
    enum class Comparison { Equal, Unequal, Less, LessOrEqual, Greater, GreaterOrEqual, Like };

    QString column;
    Comparison comparison = Comparison::Equal;
    std::optional<QString> operand;  // if empty, the operand is NULL

    /// Returns true if a value of that kind meets the condition. Compares as the databases do: texts without case and
    /// trailing blanks, and numbers by their value, for which "" is 0, and a text that is not a number equals no
    /// number.
    bool matches(const QVariant& value, Kind kind) const;
};

/// Returns the conditions in a text, which must be joined by AND. Throws StatementFailed for any other text.
QList<Criterion> criteriaIn(const QString& text);

/// Returns a key that is the same for equal values, or nothing for a Null and for a value that equals no other.
std::optional<QString> equalityKey(const QVariant& value, Kind kind);

}  // namespace kest::db
