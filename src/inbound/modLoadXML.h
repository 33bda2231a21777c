// Loads messages into the quote tables: the dispatcher, the loaders, and what they share.
#pragma once

#include "base/modDBAccess.h"
#include "platform/database/Recordset.h"
#include "platform/xml/xml.h"

#include <QString>
#include <QVariant>

#include <initializer_list>

namespace kest {

/// Loads a message into the quote tables.
///
/// Adds the schema-instance declaration to `text` and may escape bare ampersands in it. Returns true if the message was
/// loaded. Returns false after a refusal, for which a box has been shown, or after a failure, which is in the error
/// log. The file then stays unread, and the load can be repeated.
bool LoadXML(QString& text, const QString& fileName);

/// Marks a quote as received by the network. The file's name, "R_" number "_" subquote, names the quote. Every fill of
/// the list applies the response again. Throws RuntimeError if it fails.
void LoadSubmissionResponse(QString& text, const QString& fileName);

// The loaders, one for each type of message. Only LoadXML() calls them. They return false after a refusal, for which a
// box has been shown, and throw RuntimeError if they fail. No load runs in a transaction: updates before a failure
// stay.

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
bool LoadAUQT(QString& text, const QString& fileName);  // reports its failures itself and returns false

// The lines of authorised and manual quotes.

/// Applies the lines of the message to the quote. The quote's row must be current in `rsQuote`, and `rsLines` must
/// contain all its lines. Returns false after a failure, which is in the error log; lines that were applied before it
/// stay. An unknown change indicator fails before any line is changed.
bool LoadQuoteBody(const db::Recordset& rsQuote, db::Recordset& rsLines, const xml::Document& message);
/// Returns false, and writes to the error log, if LoadQuoteBody() would fail before it changes a line.
bool checkQuoteBody(const xml::Document& message);
/// True after a line came with a document that authorises sublet work. Set it to false when you show the documents.
extern bool gbSubletDocumentArrived;

/// Returns the SEQ_NO of a line: `number` if it is above 0, otherwise the next one of the quote. Continues from the
/// last number that it returned for the same quote, because that line may not be stored yet.
qint64 NextLineNumber(qint64 number, const QString& qtnno, const QString& subquote);
/// Returns an item code of the current line's category that no line has, or "999" if all are taken. Never throws.
/// `rsLines` keeps its position.
QString NextItemNo(db::Recordset& rsLines);
/// Returns a number for a line that has none, for the name of its document: one more than `highest` and than the last
/// digit of any document's name.
qint64 NextDocumentLine(qint64 highest);
/// Returns the path for the document of a line. If the line's number is taken, uses one above the highest of the quote.
/// Returns an empty text if the quote's number or subquote is empty.
QString NextDocumentName(const QString& qtnno, const QString& subquote, qint64 number);

// What the loaders share.

/// Returns a quote number that no quote has: `given` if it has 2 to 8 characters and is free, otherwise one from the
/// shop's counter. If `valueOnly` is true, the number has no prefix and suffix, but the search still adds them. `quote`
/// is open afterwards, on an empty result.
QString NextQuoteNumber(const QString& given, const db::Recordset& cinfo, db::Recordset& quote, bool valueOnly);
/// Returns one more than the highest number of the quote's files in the images folder.
int NextImageNumber(const QString& quoteNumber);

/// Locks out other workstations while this one searches for a free quote number and stores the quote. Throws
/// RuntimeError if another one holds the lock for too long.
std::unique_ptr<db::Lock> lockNewQuotes();

/// The name of a column and a value for it.
struct Column {
    QLatin1StringView name;
    QVariant value;
};
/// Sets columns of the current row in this order.
void fillColumn(db::Recordset& row, std::initializer_list<Column> columns);
/// Sets the totals and the host's overrides to 0, and marks the quote as changed for the host.
void fillWithoutTotals(db::Recordset& quote);
/// Changes a car's colour to the spelling of the colour table, or clears it if the table does not have the colour.
void respellColour(db::Recordset& car, db::Recordset& colours);
/// Opens the quote's row of long texts, which contains the notes.
db::Recordset openNotes(const db::Recordset& quote);
/// Returns true if a number in a message leads to no quote. An empty number is always unknown, because quotes of the
/// host may have an empty number too.
bool isUnknown(const QString& number, const db::Recordset& quote);
/// Shows a critical box that says why a message is refused. Returns false.
bool refuse(const QString& text);
/// Returns true if the subquote is above 0.
bool isSupplementary(const db::Recordset& quote);
/// Returns "123", or "123/2" for a supplementary quote.
QString quoteLabel(const db::Recordset& quote);

}  // namespace kest
