// The records that a quote document is made of, read once at its start.
#pragma once

#include "base/QuoteKey.h"
#include "platform/database/Recordset.h"

#include <QString>

namespace kest {

struct QuoteRows {
    explicit QuoteRows(db::Recordset& quoteRecord);

    db::Recordset& quote;
    QuoteKey key;
    db::Recordset car;
    db::Recordset customer;
    db::Recordset model;
    db::Recordset body;  // may hold no row: not every car has a known body
    db::Recordset notes;
    db::Recordset mainQuote;  // open for a supplementary quote only
};

/// A column without the blanks around it; a Null, and a column of a record without a row, is empty.
QString trimmed(const db::Recordset& record, const char* column);
/// A column as it stands; a Null is empty.
QString text(const db::Recordset& record, const char* column);

}  // namespace kest
