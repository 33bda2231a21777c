// Applies the lines of authorised and manual quotes to a quote.
#pragma once

#include "platform/database/Recordset.h"
#include "platform/xml/xml.h"

namespace kest {

/// Applies the lines of the message to the quote. The quote's row must be current in `rsQuote`, and `rsLines` must
/// contain all its lines. Returns false after a failure, which is in the error log; lines that were applied before it
/// stay. An unknown change indicator fails before any line is changed.
bool LoadQuoteBody(const db::Recordset& rsQuote, db::Recordset& rsLines, const xml::Document& message);
/// Returns false, and writes to the error log, if LoadQuoteBody() would fail before it changes a line.
bool checkQuoteBody(const xml::Document& message);
/// True after a line came with a document that authorises sublet work. Set it to false when you show the documents.
extern bool gbSubletDocumentArrived;

}  // namespace kest
