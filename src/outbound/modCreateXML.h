// Writes the documents of a quote to the outgoing folder, from which the transport program takes them.
#pragma once

#include "base/QuoteKey.h"
#include "platform/database/Recordset.h"

#include <QString>
#include <QStringList>

#include <optional>

namespace kest {

/// Writes the quote document and marks the quote as sent. Asks for the extra vehicle values if the insurer wants them.
/// `quote` keeps its current row. Returns the quote total, or 0 if the quote is refused, for which a box has been
/// shown.
double CreateQuoteXML(db::Recordset& quote);

/// Shows a critical box that says why a quote is not sent. Returns the total 0.
double refuseSend(const QString& message);

/// Writes a document and a copy of each photograph of the quote to the outgoing folder. Returns the names of those that
/// the quote's document counts and that are gone.
QStringList CreateImageXML(const QString& imagesPath, db::Recordset& quote);

/// Returns true if the send at work may have written its document, so that it has to be finished if it fails.
bool isDocumentAnnounced();

/// Goes on with the send of an interrupted operation: marks the quote as sent, unless `isMarked` says that this was
/// done or the insurer has acted on the quote since, and writes the pictures that are missing. Returns the names of
/// those that are gone. Returns nothing and changes nothing if the document was not written or the quote is gone.
std::optional<QStringList> finishSend(const QuoteKey& key, bool isMarked);

}  // namespace kest
