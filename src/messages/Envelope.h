// What a message file is: its text made ready for the parser, its type codes and their display names.
#pragma once

#include "platform/xml/xml.h"

#include <QMap>
#include <QString>

namespace kest {

/// The namespace of every element path, and of the outgoing quote document.
QString GetNamespaceURI();
/// Prepares a document for the paths of this system, whose prefix is "rootns".
void SetupDocument(xml::Document& document);
/// The text with the schema-instance declaration before its first "xmlns"; unchanged where there is none, or where it
/// is declared in the very wording of the insert.
QString AddXsiDeclaration(const QString& text);
/// True where a document parsed from the bare text and one parsed from the prepared text hold the same, so that a
/// parse can be spared. In doubt false.
bool isSameWhenPrepared(const QString& text);

/// The display name of a type code in upper case, or "UNKNOWN - INVALID MESSAGE".
QString messageTypeName(const QString& code);
/// The display name of a network message. Changes `text` to the prepared one; never fails.
QString GetMessageTypeName(QString& text);
/// The same, of a message that was parsed before.
QString GetMessageTypeName(const xml::Document& message);
/// The display name of a marker message. Changes `text` to the prepared one; never fails.
QString GetMarkerTypeName(QString& text);
QString GetMarkerTypeName(const xml::Document& marker);
/// True for a marker message, whatever its file's name.
bool isMarker(const xml::Document& message);

/// Every "&" becomes "&amp;", those of entities included. False, and nothing changes, where the outcome would be longer
/// than a parse takes: it can be five times as long.
bool escapeAmpersands(QString& text);
/// The text between "<request>" and "</request>".
QString wrappedInRequest(const QString& text);

/// Parses a text into the document, at need after the two repairs, which change `text`. False where it stays
/// unreadable.
bool parseWithRepairs(xml::Document& document, QString& text);
/// A prepared text parsed for the message code's paths: SetupDocument, AddXsiDeclaration, loadXML. `text` comes back
/// prepared. The caller asks `parseError`.
xml::Document parsedMessage(QString& text);

}  // namespace kest
