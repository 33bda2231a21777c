// What a document holds behind its nodes, and the steps that the files of this folder share.
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

    /// Frees everything and starts an empty document.
    void clear();
    /// Takes a parsed document over.
    void take(xmlDocPtr parsed, QHash<const xmlNode*, QByteArray> tags);

    Node wrap(xmlNodePtr node) { return node ? Node(node, this) : Node(); }
    /// A namespace for nodes that were made here; it is declared when the document is written.
    xmlNsPtr namespaceFor(const QString& prefix, const QString& uri);

    /// Puts a node among the children of `parent`, in front of `before` or last.
    void link(xmlNodePtr parent, xmlNodePtr child, xmlNodePtr before);
    /// Takes a node out of the tree; it lives on as long as the document.
    void unlink(xmlNodePtr node);

    QList<Node> select(xmlNodePtr from, const QString& path, bool firstOnly);

    xmlDocPtr document = nullptr;
    ParseError error;
    QMap<QString, QString> prefixes;
    /// Of elements with a declaration after an attribute: the text that tells their order.
    QHash<const xmlNode*, QByteArray> startTags;

private:
    xmlXPathContextPtr selectionContext();
    void dropSelectionContext();
    void release();

    xmlXPathContextPtr context = nullptr;
    QMap<QString, QString> contextPrefixes;
    bool ordered = false;  // libxml2 knows the order of the elements, as long as the tree stays as it is
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

/// Text without the characters that XML forbids.
QString allowedText(const QString& text);
bool isBlankText(const xmlNode* node);
QString textOfNode(const xmlNode* node);
QString qualifiedName(const xmlNode* node);
QList<Attribute> attributesOf(const DocumentData& data, const xmlNode* element);

/// The names of a start tag's attributes, declarations among them, in the order of its text.
std::vector<std::string_view> namesInStartTag(std::string_view tag);

/// Parses into `data`; false leaves it empty with its error filled.
bool parse(DocumentData& data, const QString& text);
QString serialized(const DocumentData& data, const xmlNode* node);

}  // namespace kest::xml
