// The road of a message into the quote tables: the one door, the loaders behind it, and what the loaders share.
#pragma once

#include "platform/database/Recordset.h"
#include "shell/modDBAccess.h"

#include <QString>

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
bool LoadQTDL(QString& text, const QString& fileName);
bool LoadRRQT(QString& text, const QString& fileName);
bool LoadQRCN(QString& text, const QString& fileName);
bool LoadBCQR(QString& text, const QString& fileName);
bool LoadADQT(QString& text, const QString& fileName);
bool LoadARES(QString& text, const QString& fileName);
bool LoadBACA(QString& text, const QString& fileName);

// What the loaders share.

/// A quote number that no quote has: `given` where it has 2 to 8 characters and is free, else one of the shop's
/// counter. With `valueOnly` the number comes without the shop's prefix and suffix, which the search still adds.
/// `quote` is left open on the last number tried, empty.
QString NextQuoteNumber(const QString& given, const db::Recordset& cinfo, db::Recordset& quote, bool valueOnly);
/// One more than the highest number among the quote's files in the images folder.
int NextImageNumber(const QString& quoteNumber);

/// The row of the long texts that belongs to the quote.
db::Recordset OpenNotes(const db::Recordset& quote);
/// Says with a critical box why a message is not taken; false.
bool Refuse(const QString& text);
/// True for a subquote above 0.
bool IsSupplementary(const db::Recordset& quote);
/// "123", or "123/2" for a supplementary quote.
QString QuoteLabel(const db::Recordset& quote);

}  // namespace kest
