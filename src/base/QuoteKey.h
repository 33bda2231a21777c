// Which quote: its number and its subquote.
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

    /// From "1007" or "1007/2".
    static QuoteKey fromReference(const QString& reference);
    /// From the current row of a query that gives `QTNNO` and `Subquote`; a Null is empty.
    static QuoteKey fromRow(const db::Recordset& row);
    /// From the name of a submission response, "R_1007_2" and anything after that.
    static QuoteKey fromResponseName(const QString& fileName);

    bool isMain() const { return subquote == QLatin1StringView("0"); }
    /// "1007", or "1007/2" for a supplementary quote.
    QString reference() const;
    /// "1007/0", "1007/2".
    QString fullReference() const { return number + u'/' + subquote; }
    /// "1007.2_": what the names of the quote's documents begin with.
    QString filePrefix() const { return number + u'.' + subquote + u'_'; }
    /// True if a file's name is the number, in any case, one more character, and the subquote.
    bool begins(const QString& fileName) const;

    bool operator==(const QuoteKey&) const = default;
};

}  // namespace kest
