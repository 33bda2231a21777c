// The document object of the message code, over libxml2.
#pragma once

#include <QList>
#include <QMap>
#include <QString>

#include <memory>

struct _xmlNode;

namespace kest::xml {

enum class NodeType { Element = 1, Attribute = 2, Text = 3, CDataSection = 4, ProcessingInstruction = 7, Comment = 8 };

/// The two errors that the message code repairs; every other failure has another code.
constexpr quint32 BareAmpersand = 0xC00CE513;
constexpr quint32 SecondRoot = 0xC00CE555;

/// Why the last parse failed.
struct ParseError {
    quint32 errorCode = 0;  // 0: the last parse succeeded
    QString reason;
    QString srcText;  // the line that holds the error
    int line = 0;     // from 1
    int linePosition = 0;
};

/// An attribute or a namespace declaration.
struct Attribute {
    QString name;  // with its prefix; a namespace declaration is "xmlns" or "xmlns:prefix"
    QString value;
};

struct DocumentData;

/// A light reference to a node, valid until its document goes or loads another text; it outlives a move. A null node
/// answers `isNull`; anything else asked of it throws NoObject.
class Node {
public:
    Node() = default;

    bool isNull() const { return node == nullptr; }
    explicit operator bool() const { return node != nullptr; }
    bool operator==(const Node&) const = default;

    NodeType nodeType() const;
    /// With the prefix that the file gives; "#text", "#cdata-section" and "#comment" for those.
    QString nodeName() const;
    QString localName() const;
    QString namespaceURI() const;
    /// The text of all descendants, joined; a text node of white space only counts for nothing.
    QString text() const;
    /// The same as UTF-8; of an element with one text it refers to the document's own memory, and lives as long.
    QByteArray utf8() const;
    void setText(const QString& text);
    /// Without declaration and added white space.
    QString xml() const;
    /// Namespace declarations included, in document order.
    QList<Attribute> attributes() const;
    void setAttribute(const QString& name, const QString& value);

    Node parentNode() const;
    Node firstChild() const;
    Node lastChild() const;
    Node nextSibling() const;
    /// Text that is white space only is no node.
    QList<Node> childNodes() const;
    Node appendChild(Node child) const;
    Node insertBefore(Node child, Node reference) const;
    void removeChild(Node child) const;

    /// Null when nothing matches. The prefixes are those of the document's selection namespaces.
    Node selectSingleNode(const QString& path) const;
    QList<Node> selectNodes(const QString& path) const;
    /// The text at a path. `textOf` throws NoObject where nothing is, `textOrEmptyOf` gives the empty text.
    QString textOf(const QString& path) const;
    QString textOrEmptyOf(const QString& path) const;

private:
    friend class Document;
    friend struct DocumentData;
    Node(_xmlNode* n, DocumentData* d) : node(n), document(d) {}
    /// The node behind this one; throws NoObject for a null node.
    _xmlNode* required() const;

    _xmlNode* node = nullptr;
    DocumentData* document = nullptr;
};

/// One XML document. No DTD is accepted, and nothing outside the document is ever fetched. The limits bound what a
/// hostile text costs: beyond them the parse fails like any other.
class Document {
public:
    static constexpr qint64 maximumBytes = 256LL * 1024 * 1024;  // of the text, a byte for each character
    static constexpr int maximumDepth = 250;
    static constexpr int maximumNodes = 1'500'000;  // elements, attributes and their values, texts and others

    Document();
    ~Document();
    Document(Document&&) noexcept;
    Document& operator=(Document&&) noexcept;

    /// Prefixes for selections, to URIs. They hold for later parses too.
    void setSelectionNamespaces(const QMap<QString, QString>& prefixes);

    /// False leaves the document empty and `parseError` filled.
    bool loadXML(const QString& text);
    const ParseError& parseError() const;

    /// The root element, whatever stands before it; null for an empty document.
    Node documentElement() const;
    /// The same: what the message code calls the document's first child.
    Node firstChild() const { return documentElement(); }

    /// A node of this document that is not yet in the tree. `name` may carry a prefix, which is declared with
    /// `namespaceURI` where it is not in force yet; an empty URI is no namespace.
    Node createNode(NodeType type, const QString& name, const QString& namespaceURI = {});
    /// Puts the root of an empty document.
    Node appendChild(Node root);

    /// Relative paths begin at the root element.
    Node selectSingleNode(const QString& path) const;
    QList<Node> selectNodes(const QString& path) const;
    /// As Node::textOf and Node::textOrEmptyOf, from the root.
    QString textOf(const QString& path) const;
    QString textOrEmptyOf(const QString& path) const;

    /// Characters as themselves, not as references, except those that markup needs; characters that XML forbids are
    /// dropped.
    QString xml() const;

private:
    std::unique_ptr<DocumentData> data;
};

}  // namespace kest::xml
