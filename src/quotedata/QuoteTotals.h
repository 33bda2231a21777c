// Calculates the section totals of a quote header from the lines.
#pragma once

#include "platform/database/Recordset.h"

namespace kest {

/// Stores the six totals and the change mark of a quote, calculated from all its lines. Deleted lines, lines that
/// another line replaces, and report items do not count. `lines` is at its end afterwards. If anything fails, such as a
/// Null quantity or rate, the quote keeps its totals, the reason is in the error log, and the result is false.
bool CalcQuoteTotals(db::Recordset& quote, db::Recordset& lines);

/// Does the same for a quote whose lines have authorised amounts: adds all labour to `TOTAL`, leaves the totals of the
/// single labour sections alone, and also fails if the hours are Null. Counts the lines from the current one on, so the
/// caller must move `lines` to the first.
bool CalcAuthorisedTotals(db::Recordset& quote, db::Recordset& lines);

/// Rounds the money and hours of all lines of a quote, then returns the result of CalcQuoteTotals(). Throws
/// RuntimeError if rounding fails.
bool RoundQuoteLines(db::Recordset& quote);

}  // namespace kest
