// Builds statements. All values are pasted into statements here.
#pragma once

#include <QString>
#include <QVariant>

#include <initializer_list>

namespace kest::db {

/// Replaces each "{}" of a statement or criterion by the next value. In single quotes, a value is text with its quotes
/// doubled, and a Null is an empty text. Outside of quotes, it must be a number or a flag, and a Null becomes NULL,
/// which finds no row. Throws TypeMismatch for any other value outside of quotes.
QString pasted(const QString& statement, std::initializer_list<QVariant> values);

}  // namespace kest::db

namespace kest {

/// Returns a text as part of a pattern of LIKE that matches only itself: its "[", "%" and "_" are no wildcards, on any
/// engine. sql() doubles its quotes as in any other text.
QString likeText(const QString& text);

/// For example sql("SELECT * FROM QUOTE1 WHERE QTNNO='{}' AND SUBQUOTE={}", number, subquote).
template <class... Values>
QString sql(const char* statement, const Values&... values)
{
    return db::pasted(QString::fromLatin1(statement), {QVariant(values)...});
}

}  // namespace kest
