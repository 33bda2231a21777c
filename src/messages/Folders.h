// Names message files after a load and moves them to the read folder.
#pragma once

#include "base/QuoteKey.h"

#include <QString>

namespace kest {

/// The folders whose messages can be listed.
enum class MessageFolder { Unread, Read, Sent };
inline constexpr MessageFolder messageFolders[] = {MessageFolder::Unread, MessageFolder::Read, MessageFolder::Sent};

/// Returns "unread", "read" or "sent".
QString wordOf(MessageFolder folder);
/// Returns the path of a folder, such as `gsUnreadPath`.
QString pathOf(MessageFolder folder);

/// Returns true if `file` is the name of a file without a folder. The transport chooses the name, so it may contain a
/// path separator.
bool isBareName(const QString& file);

/// Moves a file of the unread folder to the read folder under its new name, if `action` is "read". Clears
/// `gsMatchedQTNNO`. Never throws: if the copy fails, the message stays in the unread folder.
void MoveMessage(const QString& file, const QString& action);

/// Returns true if the file is no longer in the unread folder, which can be seen.
bool isMoved(const QString& file);

/// Returns the name of a loaded message in the read folder, or an empty text if it can't be determined. Clears
/// `gsDeletedQTNNO` and `gsDeletedSubquote`.
QString GetReadFileName(const QString& path);
/// Returns that name for a known quote number with the subquote 0.
QString GetMatchedFileName(const QString& quoteNumber);

/// The quote that a message is about.
struct MessageQuoteKey {
    QuoteKey quote;  // has no number if the message names no quote
    bool isQuoteRequest = false;
};
/// Returns the quote that a message is about.
MessageQuoteKey GetMessageQuoteKey(QString text);

/// Deletes a file that another process may still have open: retries in the background.
void DeleteFileByBatch(const QString& path);

}  // namespace kest
