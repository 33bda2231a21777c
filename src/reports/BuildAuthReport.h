// Builds the table of report 730, which compares a quote with the insurer's version of it.
#pragma once

#include "platform/database/Recordset.h"
#include "platform/xml/xml.h"

#include <QString>

#include <optional>

namespace kest {

/// Returns the comparison for an authorised quote: one row for each line that the insurer changed, or a single row that
/// says that nothing changed. If `Reprint` is true, deleted lines are left out, because the quote no longer has them.
///
/// If the quote number is empty, sets it and the subquote to those of the message. Recomputes the totals of the quote
/// and adds a vendor for each unknown repairer of sublet work. If no quote matches or anything fails, shows a box and
/// returns nothing.
std::optional<db::Recordset> BuildAuthReport(const xml::Document& document, QString& quoteNumber, QString& subquote,
                                             bool Reprint);

/// Sets the quote's total and the item codes of the lines in all rows of the comparison. These are final only after the
/// message's lines have been loaded into the quote.
void finishAuthReport(db::Recordset& table, const db::Recordset& quote, db::Recordset& lines);

/// Fills the comparison for an adjusted quote. The table may stay empty, and the database is not changed. If no quote
/// matches, shows a box and returns false. Throws RuntimeError if a line fails; `table` keeps the rows before it.
bool fillAdjustedReport(db::Recordset& table, const xml::Document& document, bool Reprint);

}  // namespace kest
