// The data of a document, and functions that the files of this folder share.
#pragma once

#include "platform/xml/xml.h"

#include <QHash>
#include <QSet>

#include <libxml/tree.h>
#include <libxml/xpath.h>

#include <string_view>
#include <vector>

namespace kest::xml {

/// A document of libxml2, and what this layer knows about it.
struct DocumentData {
    DocumentData();
    ~DocumentData();
    DocumentData(const DocumentData&) = delete;
    DocumentData& operator=(const DocumentData&) = delete;

    /// Deletes all nodes. The document is empty afterwards.
    void clear();
    /// Takes ownership of a parsed document.
    void take(xmlDocPtr parsed, QHash<const xmlNode*, QByteArray> tags);

    Node wrap(xmlNodePtr node) { return node ? Node(node, this) : Node(); }
    /// Returns a namespace for a created node. It is declared when the document is written.
    xmlNsPtr namespaceFor(const QString& prefix, const QString& uri);

    /// Adds a node to the end of the children of `parent`.
    void link(xmlNodePtr parent, xmlNodePtr child);
    /// Removes a node from the tree. It lives as long as the document.
    void unlink(xmlNodePtr node);

    QList<Node> select(xmlNodePtr from, const QString& path);
    Node selectFirst(xmlNodePtr from, const QString& path);

    xmlDocPtr document = nullptr;
    ParseError error;
    QMap<QString, QString> prefixes;
    QMap<QString, QByteArray> uris;  // of the prefixes, in UTF-8
    /// The start tags of elements in which a declaration comes after an attribute. They tell the order.
    QHash<const xmlNode*, QByteArray> startTags;

private:
    xmlXPathContextPtr selectionContext();
    void dropSelectionContext();
    void release();

    xmlXPathContextPtr context = nullptr;
    QMap<QString, QString> contextPrefixes;
    bool ordered = false;  // true if libxml2 has numbered the elements; a change of the tree resets it
    QSet<xmlNodePtr> loose;
    std::vector<xmlNsPtr> namespaces;
};

inline QString fromXml(const xmlChar* text)
{
    return QString::fromUtf8(reinterpret_cast<const char*>(text));
}

inline const xmlChar* toXml(const QByteArray& utf8)
{
    return reinterpret_cast<const xmlChar*>(utf8.constData());
}

/// Returns the text without the characters that XML forbids.
QString allowedText(const QString& text);
bool isBlankText(const xmlNode* node);
QString textOfNode(const xmlNode* node);
/// Returns the name with its prefix.
QString qualifiedName(const xmlNode* node);
QList<Attribute> attributesOf(const DocumentData& data, const xmlNode* element);

/// Returns the names of the attributes and declarations in a start tag, in their order.
std::vector<std::string_view> namesInStartTag(std::string_view tag);

/// A text to parse: one of the two, the other is empty.
struct Source {
    QStringView utf16 = {};
    QByteArrayView ascii = {};

    qsizetype size() const { return qMax(utf16.size(), ascii.size()); }
    QString toString() const { return ascii.isEmpty() ? utf16.toString() : QString::fromLatin1(ascii); }
};

/// Parses a text into `data`. If it fails, returns false and sets the error; `data` is then empty.
bool parse(DocumentData& data, const Source& source);
/// Returns a node as XML text.
QString serialized(const DocumentData& data, const xmlNode* node);

}  // namespace kest::xml
