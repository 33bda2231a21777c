// The comparison of a quote with what the insurer made of it: the table behind report 730.
#pragma once

#include "platform/database/Recordset.h"
#include "platform/xml/xml.h"

#include <QString>

#include <optional>

namespace kest {

/// The comparison for an authorised quote, one row for each line that the insurer changed, or one row that says that
/// nothing changed. An empty quote number takes number and subquote from the message, and they come back filled.
/// With `Reprint` the lines that were deleted are left out: the quote no longer has them.
///
/// Recomputes the totals of the quote, and adds a vendor for each repairer of sublet work that the shop does not know.
/// Nothing after a box where no quote matches, or where anything fails.
std::optional<db::Recordset> BuildAuthReport(const xml::Document& document, QString& quoteNumber, QString& subquote,
                                             bool Reprint);

/// Puts the quote's total on all rows of the comparison, and on each the item code of its line: what is final only when
/// the message's lines are in the quote.
void finishAuthReport(db::Recordset& table, const db::Recordset& quote, db::Recordset& lines);

/// Fills the comparison for an adjusted quote, which may keep no row and changes nothing in the database. False after a
/// box where no quote matches; failures are thrown, and the rows until then stay.
bool fillAdjustedReport(db::Recordset& table, const xml::Document& document, bool Reprint);

}  // namespace kest
