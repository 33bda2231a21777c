// Documents: their root, new nodes, and the memory that they share.
#include "platform/RuntimeError.h"
#include "platform/xml/DocumentData.h"

#include <libxml/parser.h>

using namespace Qt::StringLiterals;

namespace kest::xml {

namespace {

bool isAncestorOrSelf(const xmlNode* candidate, const xmlNode* node)
{
    for (; node; node = node->parent) {
        if (node == candidate)
            return true;
    }
    return false;
}

}  // namespace

DocumentData::DocumentData()
{
    xmlInitParser();
    clear();
}

DocumentData::~DocumentData()
{
    release();
}

void DocumentData::release()
{
    dropSelectionContext();
    for (xmlNodePtr node : std::as_const(loose))
        xmlFreeNode(node);
    loose.clear();
    xmlFreeDoc(document);
    document = nullptr;
    for (xmlNsPtr made : namespaces)
        xmlFreeNs(made);
    namespaces.clear();
    startTags.clear();
}

void DocumentData::clear()
{
    release();
    document = xmlNewDoc(reinterpret_cast<const xmlChar*>("1.0"));
    Q_CHECK_PTR(document);
}

void DocumentData::take(xmlDocPtr parsed, QHash<const xmlNode*, QByteArray> tags)
{
    release();
    document = parsed;
    startTags = std::move(tags);
}

xmlNsPtr DocumentData::namespaceFor(const QString& prefix, const QString& uri)
{
    const QByteArray prefixBytes = prefix.toUtf8();
    const QByteArray uriBytes = uri.toUtf8();
    const xmlChar* const wantedPrefix = prefix.isEmpty() ? nullptr : toXml(prefixBytes);
    for (xmlNsPtr made : namespaces) {
        if (xmlStrEqual(made->prefix, wantedPrefix) && xmlStrEqual(made->href, toXml(uriBytes)))
            return made;
    }
    namespaces.push_back(xmlNewNs(nullptr, toXml(uriBytes), wantedPrefix));
    return namespaces.back();
}

void DocumentData::link(xmlNodePtr parent, xmlNodePtr child)
{
    // not with libxml2's own functions, which join neighbouring texts and free the given node
    if (isAncestorOrSelf(child, parent))
        throw RuntimeError(TypeMismatch, u"A node can't be below itself"_s);
    unlink(child);
    loose.remove(child);
    child->parent = parent;
    child->prev = parent->last;
    (child->prev ? child->prev->next : parent->children) = child;
    parent->last = child;
}

void DocumentData::unlink(xmlNodePtr node)
{
    xmlUnlinkNode(node);
    loose.insert(node);
    ordered = false;
}

Document::Document() : data(std::make_unique<DocumentData>()) {}

Document::~Document() = default;

Document::Document(Document&& other) noexcept : Document()
{
    data.swap(other.data);
}

Document& Document::operator=(Document&& other) noexcept
{
    data.swap(other.data);
    return *this;
}

void Document::setSelectionNamespaces(const QMap<QString, QString>& prefixes)
{
    if (prefixes == data->prefixes)
        return;
    data->prefixes = prefixes;
    data->uris.clear();
    for (auto prefix = prefixes.cbegin(); prefix != prefixes.cend(); ++prefix)
        data->uris.insert(prefix.key(), prefix.value().toUtf8());
}

bool Document::loadXML(const QString& text)
{
    return parse(*data, {.utf16 = text});
}

bool Document::loadAscii(QByteArrayView text)
{
    return parse(*data, {.ascii = text});
}

const ParseError& Document::parseError() const
{
    return data->error;
}

Node Document::documentElement() const
{
    return data->wrap(xmlDocGetRootElement(data->document));
}

Node Document::createNode(NodeType type, const QString& name, const QString& namespaceURI)
{
    const QByteArray whole = name.toUtf8();
    const bool named = type == NodeType::Element || type == NodeType::ProcessingInstruction;
    if (type == NodeType::Attribute || (named && xmlValidateQName(toXml(whole), 0) != 0))
        throw RuntimeError(TypeMismatch, u"No node can be created with the name "_s + name);

    xmlNodePtr node = nullptr;
    switch (type) {
        case NodeType::Text:
            node = xmlNewDocText(data->document, nullptr);
            break;
        case NodeType::CDataSection:
            node = xmlNewCDataBlock(data->document, nullptr, 0);
            break;
        case NodeType::Comment:
            node = xmlNewDocComment(data->document, nullptr);
            break;
        case NodeType::ProcessingInstruction:
            node = xmlNewDocPI(data->document, toXml(whole), nullptr);
            break;
        default: {
            const qsizetype colon = name.indexOf(u':');
            node = xmlNewDocNode(data->document, nullptr, toXml(name.sliced(colon + 1).toUtf8()), nullptr);
            if (!namespaceURI.isEmpty())
                node->ns = data->namespaceFor(colon < 0 ? QString() : name.first(colon), namespaceURI);
            else if (colon >= 0) {
                xmlFreeNode(node);
                throw RuntimeError(TypeMismatch, u"The prefix has no namespace: "_s + name);
            }
        }
    }
    Q_CHECK_PTR(node);
    data->unlink(node);
    return data->wrap(node);
}

Node Document::appendChild(Node root)
{
    const xmlNodePtr node = root.required();
    if (root.document != data.get())
        throw RuntimeError(TypeMismatch, u"The node belongs to another document"_s);
    if (node->type == XML_ELEMENT_NODE && xmlDocGetRootElement(data->document))
        throw RuntimeError(TypeMismatch, u"The document already has a root"_s);
    data->link(reinterpret_cast<xmlNodePtr>(data->document), node);
    return root;
}

Node Document::selectSingleNode(const QString& path) const
{
    const Node root = documentElement();
    return root ? root.selectSingleNode(path) : Node();
}

QList<Node> Document::selectNodes(const QString& path) const
{
    const Node root = documentElement();
    return root ? root.selectNodes(path) : QList<Node>();
}

QString Document::textOf(const QString& path) const
{
    return documentElement().textOf(path);
}

QString Document::textOrEmptyOf(const QString& path) const
{
    const Node found = selectSingleNode(path);
    return found ? found.text() : QString();
}

QString Document::xml() const
{
    QString text;
    for (const xmlNode* node = data->document->children; node; node = node->next)
        text += serialized(*data, node);
    return text;
}

}  // namespace kest::xml
