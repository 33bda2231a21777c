// The lines of a quote that the insurer changed, beside the shop's own: one walk for the two kinds of message.
#pragma once

#include "platform/database/Recordset.h"
#include "platform/xml/xml.h"

#include <QList>
#include <QString>
#include <QVariant>

#include <utility>

namespace kest {

enum class ComparisonOf { AuthorisedQuote, AdjustedQuote };

/// The fields that are the same on every row of a report.
using ComparisonHeader = QList<std::pair<QString, QVariant>>;

/// Those that need nothing but the message.
ComparisonHeader readHeader(const xml::Document& document, ComparisonOf comparison);
/// Puts the header on the row that was added last.
void setHeader(db::Recordset& table, const ComparisonHeader& header);

/// An empty comparison table, open.
db::Recordset openComparison(ComparisonOf comparison);
/// Adds a row to the table for each line of the message that is not as the shop's line of that number. With `Reprint`
/// the deleted ones are left out. `lines` are those of `quote`.
void addChangedLines(db::Recordset& table, const ComparisonHeader& header, const xml::Document& document,
                     const db::Recordset& quote, db::Recordset& lines, ComparisonOf comparison, bool Reprint);

/// Stands on the shop's line of that number; false where there is none.
bool findLine(db::Recordset& lines, const QString& number);

}  // namespace kest
