// Prepares and parses the texts of message files, and names their types.
#pragma once

#include "platform/xml/xml.h"

#include <QMap>
#include <QString>

#include <memory>

namespace kest {

/// Returns the namespace of the elements of messages and of the outgoing quote document.
QString GetNamespaceURI();
/// Registers the namespace prefix that our XPath expressions use.
void SetupDocument(xml::Document& document);
/// Inserts the schema-instance declaration before the first "xmlns" of the text. Returns the text unchanged if it has
/// no "xmlns", or if it already has the declaration in exactly this wording.
QString AddXsiDeclaration(QString text);
/// Returns true if the text, in the code page, gives the same document before and after AddXsiDeclaration(), so that it
/// needs no second parse. Returns false in doubt.
bool isSameWhenPrepared(QByteArrayView text);

/// Returns the display name of a network message. Adds the schema-instance declaration to `text`. Never throws.
QString GetMessageTypeName(QString& text);
/// Returns the display name of a message that has already been parsed.
QString GetMessageTypeName(const xml::Document& message);
/// Returns the display name of a marker message. Adds the schema-instance declaration to `text`. Never throws.
QString GetMarkerTypeName(QString& text);
/// Returns the display name of a marker message that has already been parsed.
QString GetMarkerTypeName(const xml::Document& marker);
/// Returns true if the message is a marker, by its content and not by its file name.
bool isMarker(const xml::Document& message);

/// Replaces every "&" with "&amp;", even those of entities. The text can become five times as long; if it would be too
/// long to parse, returns false and leaves it unchanged.
bool escapeAmpersands(QString& text);
bool escapeAmpersands(QByteArray& text);
/// Returns the text between "<request>" and "</request>".
QString wrappedInRequest(const QString& text);
QByteArray wrappedInRequest(const QByteArray& text);

/// Parses a text in the code page. Converts it only if it has characters other than ASCII.
bool parseBytes(xml::Document& document, const QByteArray& text);
/// Parses a text in the code page. If necessary, makes one or both of the two repairs in `text`. Returns false if the
/// text is still unreadable.
bool parseWithRepairs(xml::Document& document, QByteArray& text);
/// Adds the schema-instance declaration to `text` and parses it. The caller must check `parseError` of the result.
xml::Document parsedMessage(QString& text);

/// A parsed message that several routines read and none changes.
using SharedMessage = std::shared_ptr<const xml::Document>;
/// Does the same as parsedMessage(), but returns the document of the last call if a KeptMessage exists and the text is
/// the same.
SharedMessage sharedMessage(QString& text);
/// Does the same, but escapes the ampersands of `text` first if a bare one makes it unreadable.
SharedMessage repairedMessage(QString& text);

/// While an object exists, the last document of sharedMessage() is kept, because the steps of a load read the same text
/// one after the other. It is not kept longer, because a message can contain documents of many megabytes. A long text
/// is kept only until the first object is destroyed.
class KeptMessage {
public:
    KeptMessage();
    ~KeptMessage();
    Q_DISABLE_COPY_MOVE(KeptMessage)
};

}  // namespace kest
