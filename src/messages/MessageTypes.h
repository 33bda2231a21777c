// The twelve messages of the network: their names, and how each identifies its quote.
#pragma once

#include <QString>

namespace kest {

/// The type codes.
enum class MessageCode { QREQ, QMQR, MANQ, QTDL, RRQT, QRCN, ADQT, AUQT, ARES, BACA, BCQR, EWAP };

/// Where the values of a message's row in the list come from.
enum class RowSource {
    None,  // the row shows an error
    Message,
    NetworkNumber,     // the quote with the network's number
    Request,           // the quotes of the request, newest first
    BackedOutRequest,  // the same, for the back-out of an assessment
};

/// How many rows a query must find. The first one is used.
enum class RowsNeeded { ExactlyOne, AtLeastOne };

/// How a message identifies the quote in the name of its file in the read folder.
enum class FileKey {
    None,
    RequestAndVersion,
    Request,
    Reference,
    NetworkNumber,
    DeletedQuote,  // the network's number of a quote that may no longer exist
};

/// A type of message.
struct MessageType {
    MessageCode code;
    QLatin1StringView text;  // the code as text: "QREQ"
    QLatin1StringView name;  // the display name
    QLatin1StringView root;  // the root element

    RowSource rowSource;
    QLatin1StringView rowKey;  // path of the element that the query searches for
    RowsNeeded rowsNeeded;

    FileKey fileKey;
    QLatin1StringView fileKeyPath;
};

/// Returns the type with that code.
const MessageType& messageType(MessageCode code);
/// Returns the type of a code in upper case, or null for any other text.
const MessageType* findMessageType(const QString& code);

inline constexpr QLatin1StringView unknownMessageType{"UNKNOWN - INVALID MESSAGE"};
/// Returns the display name of a type, or `unknownMessageType`.
QString messageTypeName(const QString& code);

}  // namespace kest
