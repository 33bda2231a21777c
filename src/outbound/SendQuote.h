// The send of the open quote: whether it may go to the insurer, and everything that happens when it does.
#pragma once

#include "platform/database/Recordset.h"

namespace kest {

/// Sends the newest subquote of the quote in hand, or refuses it with one message. `quote` is the panel's record; it is
/// opened again, and stands afterwards on the row that was considered.
/// The quote total that was sent, 0 when the quote was not sent. Failures are thrown; a quote is locked only when its
/// document stands complete in the outgoing folder.
/// `sent` becomes true once the quote counts as sent, whatever fails behind it.
double SendQuote(db::Recordset& quote, bool* sent = nullptr);

}  // namespace kest
