// Opens the header, the lines and the notes of a quote.
#pragma once

#include "base/QuoteKey.h"
#include "platform/database/Recordset.h"

#include <optional>

namespace kest {

/// A quote in the host's tables. Opens each of its recordsets on `gConn` when it is first asked for. They can be
/// changed and updated. Throws RuntimeError if one can't be opened.
class Quote {
public:
    /// Refers to the quote with this key.
    explicit Quote(QuoteKey key);
    /// Refers to a quote that another statement has found. Its row is current in `header`, which is at eof() if there
    /// is none.
    explicit Quote(db::Recordset header);
    /// The same, but with the lines and notes of `key`.
    Quote(QuoteKey key, db::Recordset header);

    const QuoteKey& key() const { return quoteKey; }
    /// A blank number names no quote, even if a quote of the host has none.
    bool exists() { return !quoteKey.number.trimmed().isEmpty() && !header().eof(); }
    /// Returns true if the subquote is above 0.
    bool isSupplementary();

    db::Recordset& header();  // QUOTE1
    db::Recordset& lines();   // QUOTE2
    db::Recordset& notes();   // QUOTE3

    /// Returns the statement that openHeader() opens.
    static QString headerQuery(const QuoteKey& key);
    /// Opens the quotes that a number in a message leads to. A blank number leads to none: quotes of the host may have
    /// an empty number too, perhaps all of them.
    static db::Recordset openNumbered(const QString& number, const QString& select);
    /// Open the records of a quote directly.
    static db::Recordset openHeader(const QuoteKey& key);
    static db::Recordset openLines(const QuoteKey& key);
    static db::Recordset openNotes(const QuoteKey& key);

private:
    QuoteKey quoteKey;
    std::optional<db::Recordset> headerRow;
    std::optional<db::Recordset> lineRows;
    std::optional<db::Recordset> noteRow;
};

}  // namespace kest
