// Compares texts by the rule of all our databases: case and trailing blanks are ignored.
#pragma once

#include <QString>
#include <QStringView>

namespace kest::db {

/// Returns a key for a text. Two texts are equal in a database if and only if their keys are equal.
QString comparisonKey(QStringView text);
/// Compares the keys of two texts in code order. The result is negative, zero or positive.
int compareTexts(QStringView left, QStringView right);

/// Returns true if a text matches a pattern of LIKE with "%", "_" and "[...]". Case and trailing blanks are ignored.
/// There is no escape character. In brackets, "^" at the beginning excludes characters, and "-" between two characters
/// is a range.
bool isLike(QStringView text, QStringView pattern);

}  // namespace kest::db
