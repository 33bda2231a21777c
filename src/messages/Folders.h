// The life of a message file: its name after a load, and the moves between folders.
#pragma once

#include "base/QuoteKey.h"

#include <QString>

namespace kest {

/// True for the name of a file without a folder. A name that the transport chose may hold what a path would split.
bool isBareName(const QString& file);

/// Moves a file of the unread folder to the read folder under its new name; any action but "read" moves nothing.
/// Never fails: a copy that failed leaves the message in place. Forgets `gsMatchedQTNNO`.
void MoveMessage(const QString& file, const QString& action);

/// The name that a loaded message takes in the read folder; empty when no name can be made. Forgets the deleted quote.
QString GetReadFileName(const QString& path);
/// The same for a quote number known beforehand, subquote 0.
QString GetMatchedFileName(const QString& quoteNumber);

struct MessageQuoteKey {
    QuoteKey quote;  // without a number if the message reaches no quote
    bool isQuoteRequest = false;
};
MessageQuoteKey GetMessageQuoteKey(const QString& text);

/// Deletes a file that may still be held open by the process that wrote it, again and again in the background.
void DeleteFileByBatch(const QString& path);

}  // namespace kest
