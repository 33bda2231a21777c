// Checks and sends the open quote.
#pragma once

#include "platform/database/Recordset.h"

namespace kest {

/// Sends the newest subquote of the open quote, or shows a box that says why it can't be sent. `quote` is the panel's
/// recordset, which is opened again and is then on the row of that subquote.
///
/// Returns the quote total, or 0 if the quote was not sent. Throws RuntimeError if something fails. The quote is locked
/// only after its document is complete in the outgoing folder; then `sent` becomes true, even if a later step fails.
double SendQuote(db::Recordset& quote, bool* sent = nullptr);

}  // namespace kest
