// One condition of a search or a filter over fetched rows.
#pragma once

#include "platform/database/Recordset.h"

#include <QList>
#include <QString>
#include <QVariant>

#include <optional>

namespace kest::db {

struct Criterion {
    enum class Comparison { Equal, Unequal, Less, LessOrEqual, Greater, GreaterOrEqual, Like };

    QString column;
    Comparison comparison = Comparison::Equal;
    std::optional<QString> operand;  // none: NULL

    /// Whether a value of that kind meets the condition, by the rules of the databases: texts without regard to case
    /// and to trailing blanks, numbers by their value, where "" is 0 and a text that is no number equals no number.
    bool matches(const QVariant& value, Kind kind) const;
};

/// Conditions joined by AND. Throws StatementFailed for anything else.
QList<Criterion> criteriaIn(const QString& text);

/// What equal values have in common; none for a Null and for a value that equals nothing.
std::optional<QString> equalityKey(const QVariant& value, Kind kind);

}  // namespace kest::db
