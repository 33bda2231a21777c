// The road of a message into the quote tables: the one door, the loaders behind it, and what the loaders share.
#pragma once

#include "base/modDBAccess.h"
#include "platform/database/Recordset.h"
#include "platform/xml/xml.h"

#include <QString>
#include <QVariant>

#include <initializer_list>

namespace kest {

/// Takes one message into the quote tables.
///
/// `text` may come back changed: the schema-instance declaration put in, bare ampersands escaped.
/// True when the message was taken. False after a refusal, whose box has been shown, or after a failure, which stands
/// in the error log; the file stays unread, and the load can be tried again.
bool LoadXML(QString& text, const QString& fileName);

/// Takes in that the network has received a quote, named by the file as "R_" number "_" subquote. Each fill of the list
/// applies it again. A failure rises to the fill.
void LoadSubmissionResponse(QString& text, const QString& fileName);

// The loaders, one for each type of message, called by LoadXML alone. False after a refusal, whose box has been shown;
// failures rise. No load runs in a transaction: what was updated before a failure stays.

bool LoadQREQ(QString& text, const QString& fileName);
bool LoadQMQR(QString& text, const QString& fileName);
bool LoadEWAP(QString& text, const QString& fileName);
bool LoadMANQ(QString& text, const QString& fileName);
bool LoadQTDL(QString& text, const QString& fileName);
bool LoadRRQT(QString& text, const QString& fileName);
bool LoadQRCN(QString& text, const QString& fileName);
bool LoadBCQR(QString& text, const QString& fileName);
bool LoadADQT(QString& text, const QString& fileName);
bool LoadARES(QString& text, const QString& fileName);
bool LoadBACA(QString& text, const QString& fileName);
bool LoadAUQT(QString& text, const QString& fileName);  // traps its own failures

// The lines of a quote that comes back, for the loaders of authorised and of manual quotes.

/// Applies the lines of the message to those of the quote: `rsQuote` stands on the quote's row, `rsLines` holds all its
/// lines. False after a failure, which is in the error log; what was applied before it stays. A line that says to do
/// something unknown fails the body before any line is touched.
bool LoadQuoteBody(const db::Recordset& rsQuote, db::Recordset& rsLines, const xml::Document& message);
/// False, with the error log written, where `LoadQuoteBody` would touch no line.
bool checkQuoteBody(const xml::Document& message);
/// A line brought a document that authorises sublet work. Whoever shows the documents takes the mark away.
extern bool gbSubletDocumentArrived;

/// The SEQ_NO of a line: `number` where it is above 0, else the next one of the quote. It goes on from the number that
/// it gave the same quote last, since a line that was numbered may not be stored yet.
qint64 NextLineNumber(qint64 number, const QString& qtnno, const QString& subquote);
/// An item code of the current line's category that no line has; "999" where none is left. Never fails, and leaves
/// `rsLines` where it was.
QString NextItemNo(db::Recordset& rsLines);
/// The number of the documents' folder that a document of a line without number gives it: one above `highest` and above
/// the last digit of every document's name.
qint64 NextDocumentLine(qint64 highest);
/// Where a line's document is to lie: under the line's number, or above the quote's highest where that is taken. Empty
/// without number or subquote of the quote.
QString NextDocumentName(const QString& qtnno, const QString& subquote, qint64 number);

// What the loaders share.

/// A quote number that no quote has: `given` where it has 2 to 8 characters and is free, else one of the shop's
/// counter. With `valueOnly` the number comes without the shop's prefix and suffix, which the search still adds.
/// `quote` is left open on the last number tried, empty.
QString NextQuoteNumber(const QString& given, const db::Recordset& cinfo, db::Recordset& quote, bool valueOnly);
/// One more than the highest number among the quote's files in the images folder.
int NextImageNumber(const QString& quoteNumber);

/// Held from the search for a free number until the quote stands: two workstations that load at once find no number
/// free together. Fails where another one does not let go.
std::unique_ptr<db::Lock> lockNewQuotes();

struct Column {
    QLatin1StringView name;
    QVariant value;
};
/// Sets columns of the current row, in their order.
void fillColumn(db::Recordset& row, std::initializer_list<Column> columns);
/// Takes the totals and the host's overrides off a header that a load builds; the host has to look at the quote again.
void fillWithoutTotals(db::Recordset& quote);
/// Puts a car's colour in the spelling of the colour table, and empties one that is not in it.
void respellColour(db::Recordset& car, db::Recordset& colours);
/// The row of the long texts that belongs to the quote.
db::Recordset openNotes(const db::Recordset& quote);
/// True where a message's number leads to no quote. An empty one never does: quotes of the host's own may hold it.
bool isUnknown(const QString& number, const db::Recordset& quote);
/// Says with a critical box why a message is not taken; false.
bool refuse(const QString& text);
/// True for a subquote above 0.
bool isSupplementary(const db::Recordset& quote);
/// "123", or "123/2" for a supplementary quote.
QString quoteLabel(const db::Recordset& quote);

}  // namespace kest
