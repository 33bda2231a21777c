// XML documents for the message code, based on libxml2.
#pragma once

#include <QByteArrayView>
#include <QList>
#include <QMap>
#include <QString>

#include <memory>

struct _xmlNode;

namespace kest::xml {

enum class NodeType { Element = 1, Attribute = 2, Text = 3, CDataSection = 4, ProcessingInstruction = 7, Comment = 8 };

/// The two errors that the message code repairs. All other errors have other codes.
constexpr quint32 BareAmpersand = 0xC00CE513;
constexpr quint32 SecondRoot = 0xC00CE555;

/// Why the last parse failed.
struct ParseError {
    quint32 errorCode = 0;  // 0 if the last parse succeeded
    QString reason;
    QString srcText;  // the line with the error
    int line = 0;     // from 1
    int linePosition = 0;
};

/// An attribute or a namespace declaration.
struct Attribute {
    QString name;  // with its prefix; a namespace declaration is "xmlns" or "xmlns:prefix"
    QString value;
};

struct DocumentData;

/// A reference to a node. It is cheap to copy, and valid until its document is destroyed or loads another text, even if
/// the document is moved. All functions of a null node except isNull() throw NoObject.
class Node {
public:
    Node() = default;

    bool isNull() const { return node == nullptr; }
    explicit operator bool() const { return node != nullptr; }
    bool operator==(const Node&) const = default;

    NodeType nodeType() const;
    /// The name with its prefix, or "#text", "#cdata-section" or "#comment".
    QString nodeName() const;
    /// The joined text of all descendants. Text nodes with only white space are ignored.
    QString text() const;
    /// The text as UTF-8. If an element contains a single text, the result refers to the memory of the document and is
    /// valid as long as that.
    QByteArray utf8() const;
    /// Replaces the content by a text.
    void setText(const QString& text);
    /// The node as XML text, without a declaration and without added white space.
    QString xml() const;
    /// All attributes and namespace declarations in document order.
    QList<Attribute> attributes() const;

    Node firstChild() const;
    Node nextSibling() const;
    /// All children except texts with only white space.
    QList<Node> childNodes() const;
    /// Moves a node of the same document to the end of the children. Throws TypeMismatch if that is not possible.
    Node appendChild(Node child) const;

    /// Returns the first match, or null. Prefixes are those of the document's selection namespaces.
    Node selectSingleNode(const QString& path) const;
    QList<Node> selectNodes(const QString& path) const;
    /// The text of the first node at a path. If there is none, textOf() throws NoObject, and textOrEmptyOf() returns an
    /// empty text.
    QString textOf(const QString& path) const;
    QString textOrEmptyOf(const QString& path) const;

private:
    friend class Document;
    friend struct DocumentData;
    Node(_xmlNode* n, DocumentData* d) : node(n), document(d) {}
    /// Returns the node of libxml2. Throws NoObject for a null node.
    _xmlNode* required() const;

    _xmlNode* node = nullptr;
    DocumentData* document = nullptr;
};

/// An XML document. It accepts no DTD and never reads anything outside of the text. A text that exceeds one of the
/// limits can't be parsed, so that a hostile text costs little time and memory.
class Document {
public:
    static constexpr qint64 maximumBytes = 256LL * 1024 * 1024;  // of the text, with one byte for each character
    static constexpr int maximumDepth = 250;
    static constexpr int maximumNodes = 1'500'000;  // including attributes, their values and texts

    Document();
    ~Document();
    Document(Document&&) noexcept;
    Document& operator=(Document&&) noexcept;

    /// Sets the URIs of the prefixes in paths. They stay for later parses.
    void setSelectionNamespaces(const QMap<QString, QString>& prefixes);

    /// Parses a text. If it fails, returns false and sets parseError(); the document is then empty.
    bool loadXML(const QString& text);
    /// The same for a text that has only ASCII characters, which needs no conversion.
    bool loadAscii(QByteArrayView text);
    /// Returns the error of the last parse.
    const ParseError& parseError() const;

    /// Returns the root element, or null if the document is empty.
    Node documentElement() const;
    /// The same; the message code uses this name.
    Node firstChild() const { return documentElement(); }

    /// Creates a node that is not yet in the tree. `name` may have a prefix, which is declared with `namespaceURI` if
    /// necessary. An empty URI means no namespace.
    Node createNode(NodeType type, const QString& name, const QString& namespaceURI = {});
    /// Adds the root to an empty document.
    Node appendChild(Node root);

    /// Relative paths start at the root element.
    Node selectSingleNode(const QString& path) const;
    QList<Node> selectNodes(const QString& path) const;
    /// Like Node::textOf() and Node::textOrEmptyOf(), from the root element.
    QString textOf(const QString& path) const;
    QString textOrEmptyOf(const QString& path) const;

    /// Returns the document as XML text. Only characters with a meaning in XML are written as references, and
    /// characters that XML forbids are dropped.
    QString xml() const;

private:
    std::unique_ptr<DocumentData> data;
};

}  // namespace kest::xml
