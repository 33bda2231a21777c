// Nodes: their names, texts, children and attributes.
#include "platform/RuntimeError.h"
#include "platform/xml/DocumentData.h"

#include <algorithm>

using namespace Qt::StringLiterals;

namespace kest::xml {

namespace {

/// Returns the next of these siblings that counts as a node.
xmlNodePtr counting(xmlNodePtr node)
{
    while (node && isBlankText(node))
        node = node->next;
    return node;
}

bool hasContentOfItsOwn(const xmlNode* node)
{
    return node->type == XML_TEXT_NODE || node->type == XML_CDATA_SECTION_NODE || node->type == XML_COMMENT_NODE ||
           node->type == XML_PI_NODE;
}

}  // namespace

QString allowedText(const QString& text)
{
    const auto isPair = [&](qsizetype i) {
        return text[i].isHighSurrogate() && i + 1 < text.size() && text[i + 1].isLowSurrogate();
    };
    const auto isAllowed = [](char16_t c) {
        return c >= 0x20 ? c <= 0xD7FF || (c >= 0xE000 && c <= 0xFFFD) : c == u'\t' || c == u'\n' || c == u'\r';
    };
    qsizetype i = 0;
    while (i < text.size() && isAllowed(text[i].unicode()))
        ++i;
    if (i == text.size())
        return text;
    QString allowed = text.first(i);
    for (; i < text.size(); ++i) {
        if (isPair(i)) {
            allowed += QStringView(text).sliced(i, 2);
            ++i;
        } else if (isAllowed(text[i].unicode())) {
            allowed += text[i];
        }
    }
    return allowed;
}

bool isBlankText(const xmlNode* node)
{
    if (node->type != XML_TEXT_NODE)
        return false;
    const xmlChar* c = node->content;
    while (c && (*c == ' ' || *c == '\t' || *c == '\n' || *c == '\r'))
        ++c;
    return !c || *c == 0;
}

QString textOfNode(const xmlNode* node)
{
    if (hasContentOfItsOwn(node))
        return fromXml(node->content);
    QString text;
    const xmlNode* at = node->children;
    while (at) {
        const bool isText = at->type == XML_CDATA_SECTION_NODE || (at->type == XML_TEXT_NODE && !isBlankText(at)) ||
                            (at->type == XML_TEXT_NODE && node->type == XML_ATTRIBUTE_NODE);
        if (isText)
            text += fromXml(at->content);
        if (at->type == XML_ELEMENT_NODE && at->children) {
            at = at->children;
            continue;
        }
        while (at != node && !at->next)
            at = at->parent;
        if (at == node)
            break;
        at = at->next;
    }
    return text;
}

QString qualifiedName(const xmlNode* node)
{
    const QString name = fromXml(node->name);
    return node->ns && node->ns->prefix ? fromXml(node->ns->prefix) + u':' + name : name;
}

QList<Attribute> attributesOf(const DocumentData& data, const xmlNode* element)
{
    QList<Attribute> attributes;
    if (element->type != XML_ELEMENT_NODE)
        return attributes;
    for (const xmlNs* declared = element->nsDef; declared; declared = declared->next) {
        const QString name = declared->prefix ? u"xmlns:"_s + fromXml(declared->prefix) : u"xmlns"_s;
        attributes.append({name, fromXml(declared->href)});
    }
    for (const xmlAttr* attribute = element->properties; attribute; attribute = attribute->next) {
        const auto* node = reinterpret_cast<const xmlNode*>(attribute);
        attributes.append({qualifiedName(node), textOfNode(node)});
    }
    if (const auto tag = data.startTags.constFind(element); tag != data.startTags.cend()) {
        QHash<QString, qsizetype> places;
        for (const std::string_view name : namesInStartTag({tag->constData(), static_cast<size_t>(tag->size())}))
            places.insert(QString::fromUtf8(name.data(), static_cast<qsizetype>(name.size())), places.size());
        const auto place = [&](const Attribute& attribute) {
            return places.value(attribute.name, places.size());  // attributes that were added later come last
        };
        std::stable_sort(attributes.begin(), attributes.end(),
                         [&](const Attribute& a, const Attribute& b) { return place(a) < place(b); });
    }
    return attributes;
}

xmlNodePtr Node::required() const
{
    if (!node)
        throw RuntimeError(NoObject, u"Object variable not set"_s);
    return node;
}

NodeType Node::nodeType() const
{
    return static_cast<NodeType>(required()->type);
}

QString Node::nodeName() const
{
    switch (required()->type) {
        case XML_TEXT_NODE:
            return u"#text"_s;
        case XML_CDATA_SECTION_NODE:
            return u"#cdata-section"_s;
        case XML_COMMENT_NODE:
            return u"#comment"_s;
        case XML_PI_NODE:
            return fromXml(node->name);
        default:
            return qualifiedName(node);
    }
}

QString Node::text() const
{
    return textOfNode(required());
}

QByteArray Node::utf8() const
{
    const xmlNode* const only = required()->children;
    const bool isOneText = only && !only->next && !isBlankText(only) &&
                           (only->type == XML_TEXT_NODE || only->type == XML_CDATA_SECTION_NODE);
    return isOneText ? QByteArray::fromRawData(reinterpret_cast<const char*>(only->content), xmlStrlen(only->content))
                     : text().toUtf8();
}

void Node::setText(const QString& text)
{
    const QByteArray allowed = allowedText(text).toUtf8();
    if (hasContentOfItsOwn(required())) {
        xmlNodeSetContent(node, nullptr);
        xmlNodeAddContentLen(node, toXml(allowed), static_cast<int>(allowed.size()));
        return;
    }
    while (node->children)
        document->unlink(node->children);
    if (!allowed.isEmpty())
        document->link(node, xmlNewDocText(node->doc, toXml(allowed)));
}

QString Node::xml() const
{
    const xmlNode* const self = required();
    return serialized(*document, self);
}

QList<Attribute> Node::attributes() const
{
    required();
    return attributesOf(*document, node);
}

Node Node::firstChild() const
{
    return hasContentOfItsOwn(required()) ? Node() : document->wrap(counting(node->children));
}

Node Node::nextSibling() const
{
    const xmlNodePtr next = required()->next;
    return document->wrap(counting(next));
}

QList<Node> Node::childNodes() const
{
    QList<Node> children;
    for (Node child = firstChild(); child; child = child.nextSibling())
        children.append(child);
    return children;
}

Node Node::appendChild(Node child) const
{
    if (required()->type != XML_ELEMENT_NODE || child.required()->type == XML_ATTRIBUTE_NODE ||
        child.document != document)
        throw RuntimeError(TypeMismatch, u"The node can't be added here"_s);
    document->link(node, child.node);
    return child;
}

Node Node::selectSingleNode(const QString& path) const
{
    const xmlNodePtr from = required();  // first, because a null node has no document
    return document->selectFirst(from, path);
}

QList<Node> Node::selectNodes(const QString& path) const
{
    const xmlNodePtr from = required();
    return document->select(from, path);
}

QString Node::textOf(const QString& path) const
{
    const Node found = selectSingleNode(path);
    if (!found)
        throw RuntimeError(NoObject, u"Object variable not set: "_s + path);
    return found.text();
}

QString Node::textOrEmptyOf(const QString& path) const
{
    const Node found = selectSingleNode(path);
    return found ? found.text() : QString();
}

}  // namespace kest::xml
