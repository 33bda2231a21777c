// Reads the records that a quote document needs.
#pragma once

#include "base/QuoteKey.h"
#include "platform/database/Recordset.h"

#include <QString>

namespace kest {

/// The records of a quote, read once.
struct QuoteRows {
    /// Reads the records. Throws RuntimeError if there is no car.
    explicit QuoteRows(db::Recordset& quoteRecord);
    /// Throws RuntimeError if the customer or the notes row is missing.
    void requireAll() const;

    db::Recordset& quote;
    QuoteKey key;
    db::Recordset car;
    db::Recordset customer;
    db::Recordset model;
    db::Recordset body;  // may be empty: not every car has a known body
    db::Recordset notes;
    db::Recordset mainQuote;  // open only for a supplementary quote
};

/// Returns a column without the blanks around it, or an empty text if it is Null or there is no current row.
QString trimmed(const db::Recordset& record, const char* column);
/// Returns a column unchanged, or an empty text if it is Null.
QString text(const db::Recordset& record, const char* column);

}  // namespace kest
