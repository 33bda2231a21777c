// Statements are pasted text: the one place that pastes values.
#pragma once

#include <QString>
#include <QVariant>

#include <initializer_list>

namespace kest::db {

/// Fills each "{}" of a statement or a criterion, in order. Inside single quotes a value is text (a Null is empty) and
/// its quotes are doubled; outside quotes it must be a number or a flag, and a Null is pasted as NULL, which finds no
/// row. Throws TypeMismatch for a value outside quotes that is no number.
QString pasted(const QString& statement, std::initializer_list<QVariant> values);

}  // namespace kest::db

namespace kest {

/// sql("SELECT * FROM QUOTE1 WHERE QTNNO='{}' AND SUBQUOTE={}", number, subquote)
template <class... Values>
QString sql(const char* statement, const Values&... values)
{
    return db::pasted(QString::fromLatin1(statement), {QVariant(values)...});
}

}  // namespace kest
