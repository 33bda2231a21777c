// Compares the lines of an authorised or adjusted quote with the shop's own.
#pragma once

#include "platform/database/Recordset.h"
#include "platform/xml/xml.h"

#include <QList>
#include <QString>
#include <QVariant>

#include <utility>

namespace kest {

/// The kind of quote that the insurer has sent.
enum class ComparisonOf { AuthorisedQuote, AdjustedQuote };

/// Names and values of the fields that are the same on every row of a report.
using ComparisonHeader = QList<std::pair<QString, QVariant>>;

/// Returns those header fields that depend only on the message.
ComparisonHeader readHeader(const xml::Document& document, ComparisonOf comparison);
/// Sets the header fields in the current row.
void setHeader(db::Recordset& table, const ComparisonHeader& header);

/// Opens an empty comparison table.
db::Recordset openComparison(ComparisonOf comparison);
/// Adds a row for each line of the message that differs from the shop's line of the same number. `lines` are those of
/// `quote`. If `Reprint` is true, deleted lines are left out.
void addChangedLines(db::Recordset& table, const ComparisonHeader& header, const xml::Document& document,
                     const db::Recordset& quote, db::Recordset& lines, ComparisonOf comparison, bool Reprint);

/// Makes the shop's line of that number the current row. Returns false if there is none.
bool findLine(db::Recordset& lines, const QString& number);

}  // namespace kest
