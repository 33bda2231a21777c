// Writes documents without a declaration and without added white space.
#include "platform/xml/DocumentData.h"

using namespace Qt::StringLiterals;

namespace kest::xml {

namespace {

struct Binding {
    QString prefix;
    QString uri;
};

enum class Place { Text, Attribute };

void appendEscaped(QString& out, const QString& text, Place place)
{
    const bool inAttribute = place == Place::Attribute;
    for (const QChar c : text) {
        switch (c.unicode()) {
            case u'&':
                out += "&amp;"_L1;
                break;
            case u'<':
                out += "&lt;"_L1;
                break;
            case u'>':
                out += "&gt;"_L1;
                break;
            case u'"':
                out += inAttribute ? u"&quot;"_s : u"\""_s;
                break;
            case u'\t':
            case u'\n':
            case u'\r':
                if (inAttribute)
                    out += u"&#"_s + QString::number(c.unicode()) + u';';  // a parser would read it as a blank
                else
                    out += c;
                break;
            default:
                out += c;
        }
    }
}

/// Writes a node and its descendants without recursion. Declares each namespace if it is not yet in scope.
class Writer {
public:
    explicit Writer(const DocumentData& source) : data(source) {}

    QString write(const xmlNode* top)
    {
        const xmlNode* at = top;
        while (true) {
            open(at);
            if (at->type == XML_ELEMENT_NODE && at->children) {
                at = at->children;
                continue;
            }
            while (at != top && !at->next) {
                at = at->parent;
                close(at);
            }
            if (at == top)
                return out;
            at = at->next;
        }
    }

private:
    void open(const xmlNode* node)
    {
        switch (node->type) {
            case XML_ELEMENT_NODE:
                openElement(node);
                break;
            case XML_TEXT_NODE:
                appendEscaped(out, allowedText(fromXml(node->content)), Place::Text);
                break;
            case XML_CDATA_SECTION_NODE:
                out += u"<![CDATA["_s + fromXml(node->content).replace("]]>"_L1, "]]]]><![CDATA[>"_L1) + u"]]>"_s;
                break;
            case XML_COMMENT_NODE:
                out += u"<!--"_s + commentText(fromXml(node->content)) + u"-->"_s;
                break;
            case XML_PI_NODE:
                out +=
                    u"<?"_s + fromXml(node->name) + u' ' + fromXml(node->content).replace("?>"_L1, "? >"_L1) + u"?>"_s;
                break;
            case XML_ATTRIBUTE_NODE:
                out += qualifiedName(node) + u"=\""_s;
                appendEscaped(out, textOfNode(node), Place::Attribute);
                out += u'"';
                break;
            default:
                break;
        }
    }

    static QString commentText(QString text)
    {
        while (text.contains("--"_L1))
            text.replace("--"_L1, "- -"_L1);
        return text.endsWith(u'-') ? text + u' ' : text;
    }

    void openElement(const xmlNode* element)
    {
        scopes.append(bindings.size());
        const QList<Attribute> attributes = attributesOf(data, element);
        for (const xmlNs* declared = element->nsDef; declared; declared = declared->next)
            bindings.append({fromXml(declared->prefix), fromXml(declared->href)});

        out += u'<' + qualifiedName(element);
        declare(element->ns);
        for (const xmlAttr* attribute = element->properties; attribute; attribute = attribute->next)
            if (attribute->ns)  // only an element can need the declaration of no namespace
                declare(attribute->ns);
        for (const Attribute& attribute : attributes)
            appendAttribute(attribute.name, attribute.value);
        if (element->children) {
            out += u'>';
        } else {
            out += "/>"_L1;
            bindings.resize(scopes.takeLast());
        }
    }

    /// Declares a namespace if it is not in scope. Null is no namespace.
    void declare(const xmlNs* needed)
    {
        const QString prefix = needed ? fromXml(needed->prefix) : QString();
        const QString uri = needed ? fromXml(needed->href) : QString();
        if (prefix == "xml"_L1 || inForce(prefix) == uri)
            return;
        bindings.append({prefix, uri});
        appendAttribute(prefix.isEmpty() ? u"xmlns"_s : u"xmlns:"_s + prefix, uri);
    }

    QString inForce(const QString& prefix) const
    {
        for (auto binding = bindings.crbegin(); binding != bindings.crend(); ++binding) {
            if (binding->prefix == prefix)
                return binding->uri;
        }
        return {};
    }

    void appendAttribute(const QString& name, const QString& value)
    {
        out += u' ' + name + u"=\""_s;
        appendEscaped(out, value, Place::Attribute);
        out += u'"';
    }

    void close(const xmlNode* element)
    {
        out += u"</"_s + qualifiedName(element) + u'>';
        bindings.resize(scopes.takeLast());
    }

    const DocumentData& data;
    QString out;
    QList<Binding> bindings;  // in scope at this point, the innermost last
    QList<qsizetype> scopes;  // for each open element, how many bindings there were before it
};

}  // namespace

QString serialized(const DocumentData& data, const xmlNode* node)
{
    return Writer(data).write(node);
}

}  // namespace kest::xml
