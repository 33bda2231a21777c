// How texts compare in every database: without regard to case and to trailing blanks.
#pragma once

#include <QString>
#include <QStringView>

namespace kest::db {

/// Two texts are equal in a database exactly when their keys are.
QString comparisonKey(QStringView text);
/// Negative, zero or positive, as the keys compare in code order.
int compareTexts(QStringView left, QStringView right);

/// LIKE with "%", "_" and "[...]", without regard to case and to trailing blanks. There is no escape character; in
/// brackets "^" in front excludes and "-" between two characters is a range.
bool isLike(QStringView text, QStringView pattern);

}  // namespace kest::db
