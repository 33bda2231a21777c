// The section totals of a quote header, worked out from its lines.
#pragma once

#include "platform/database/Recordset.h"

namespace kest {

/// Writes the six totals and the change mark of a quote from all its lines, and updates the quote. Lines that are
/// deleted, replaced by another line or report items count nothing. `lines` is left at its end.
/// A failure, as a Null quantity or rate, ends it in silence and the quote keeps the totals that it had.
void CalcQuoteTotals(db::Recordset& quote, db::Recordset& lines);

/// The same for a quote whose lines carry authorised amounts: all labour goes into `TOTAL`, the totals of the single
/// labour sections stay as they are, and a Null in the hours is a failure too. `lines` that stand at their end count
/// nothing: the caller hands them over on a line.
void CalcAuthorisedTotals(db::Recordset& quote, db::Recordset& lines);

/// Rounds the stored money and hours of all lines of a quote, then runs `CalcQuoteTotals`. Failures are thrown.
void RoundQuoteLines(db::Recordset& quote);

}  // namespace kest
