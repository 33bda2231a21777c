// The twelve messages of the network: what each is called, and how it leads to its quote.
#pragma once

#include <QString>

namespace kest {

enum class MessageCode { QREQ, QMQR, MANQ, QTDL, RRQT, QRCN, ADQT, AUQT, ARES, BACA, BCQR, EWAP };

/// What a message's row in the list is drawn from.
enum class RowSource {
    None,  // it is listed as an error
    Message,
    NetworkNumber,     // the quote of the network's number
    Request,           // the quotes of the request, newest first
    BackedOutRequest,  // the same, of an assessment that is taken back
};

/// How many rows a look-up has to find. Of several the first is used.
enum class RowsNeeded { ExactlyOne, AtLeastOne };

/// What leads to the quote that a read message's file is named after.
enum class FileKey {
    None,
    RequestAndVersion,
    Request,
    Reference,
    NetworkNumber,
    DeletedQuote,  // the network's number of a quote that may be gone by now
};

struct MessageType {
    MessageCode code;
    QLatin1StringView text;  // of the code: "QREQ"
    QLatin1StringView name;  // as a person reads it
    QLatin1StringView root;  // element of the message

    RowSource rowSource;
    QLatin1StringView rowKey;  // path of the element whose text the source is looked up by
    RowsNeeded rowsNeeded;

    FileKey fileKey;
    QLatin1StringView fileKeyPath;
};

const MessageType& messageType(MessageCode code);
/// Returns the type of a code in upper case, or null for any other text.
const MessageType* findMessageType(const QString& code);

inline constexpr QLatin1StringView unknownMessageType{"UNKNOWN - INVALID MESSAGE"};
/// Returns the name of that type, or `unknownMessageType`.
QString messageTypeName(const QString& code);

}  // namespace kest
