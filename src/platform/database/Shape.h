// Takes the values out of statements, so that those of one wording are translated and prepared only once.
#pragma once

#include <QList>
#include <QString>

namespace kest::db {

/// A statement without the values that are pasted into it.
struct Shape {
    QString text;           // with marks in place of the values
    QList<QString> values;  // as they are in the statement: literals with their quotes, and plain numbers

    // the marks in a shape that is to be translated
    static constexpr auto literalMark = u"''";
    static constexpr auto numberMark = u"0n";

    /// Keeps the patterns of LIKE, because their translation depends on their text.
    static Shape toTranslate(const QString& statement);
    /// Puts the parameter "?" in place of each value.
    static Shape toPrepare(const QString& statement);
};

}  // namespace kest::db
