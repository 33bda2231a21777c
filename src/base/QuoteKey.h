// Identifies a quote by its number and subquote.
#pragma once

#include <QString>

namespace kest {

namespace db {
class Recordset;
}

/// A quote's number and subquote, as text; subquote "0" is the main quote, a higher one a supplementary quote.
struct QuoteKey {
    QString number;
    QString subquote = QStringLiteral("0");

    /// Reads "1007" or "1007/2".
    static QuoteKey fromReference(const QString& reference);
    /// Reads the columns `QTNNO` and `Subquote` of the current row. A Null becomes an empty text.
    static QuoteKey fromRow(const db::Recordset& row);
    /// Reads the name of a submission response, which begins like "R_1007_2".
    static QuoteKey fromResponseName(const QString& fileName);

    bool isMain() const { return subquote == QLatin1StringView("0"); }
    /// Returns "1007", or "1007/2" for a supplementary quote.
    QString reference() const;
    /// Returns "1007/0" or "1007/2".
    QString fullReference() const { return number + u'/' + subquote; }
    /// Returns "1007.2_", with which the names of the quote's documents begin.
    QString filePrefix() const { return number + u'.' + subquote + u'_'; }
    /// Returns true if a file's name begins with the number, in any case, one more character, and the subquote.
    bool begins(const QString& fileName) const;

    bool operator==(const QuoteKey&) const = default;
};

}  // namespace kest
