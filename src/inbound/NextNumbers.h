// Finds the numbers that a load needs: those of quotes, images, lines and documents, and item codes.
#pragma once

#include "platform/database/Connection.h"
#include "platform/database/Recordset.h"

#include <QString>
#include <QStringList>

#include <memory>

namespace kest {

/// Returns a quote number that no quote has: `given` if it has 2 to 8 characters and is free, otherwise one from the
/// shop's counter. If `valueOnly` is true, the number has no prefix and suffix, but the search still adds them. `quote`
/// is open afterwards, on an empty result.
QString NextQuoteNumber(const QString& given, const db::Recordset& cinfo, db::Recordset& quote, bool valueOnly);
/// Returns one more than the highest number of the quote's files among these names of the images folder.
int NextImageNumber(const QString& quoteNumber, const QStringList& images);

/// Locks out other workstations while this one searches for a free quote number and stores the quote. Throws
/// RuntimeError if another one holds the lock for too long.
std::unique_ptr<db::Lock> lockNewQuotes();

/// Returns the SEQ_NO of a line: `number` if it is above 0, otherwise the next one of the quote. Continues from the
/// last number that it returned for the same quote, because that line may not be stored yet.
qint64 NextLineNumber(qint64 number, const QString& qtnno, const QString& subquote);
/// Lets the next line number continue from the stored lines, after lines were taken back.
void forgetLineNumbers();
/// Returns an item code of the current line's category that no line has, or "999" if all are taken. Never throws.
/// `rsLines` keeps its position.
QString NextItemNo(db::Recordset& rsLines);
/// Returns a number for a line that has none, for the name of its document: one more than `highest` and than the last
/// digit of any document's name.
qint64 NextDocumentLine(qint64 highest);
/// Returns the path for the document of a line. If the line's number is taken, uses one above the highest of the quote.
/// Returns an empty text if the quote's number or subquote is empty.
QString NextDocumentName(const QString& qtnno, const QString& subquote, qint64 number);

}  // namespace kest
