#include "utilities/FormatXML.h"

#include "messages/Envelope.h"
#include "platform/Prompt.h"
#include "platform/RuntimeError.h"
#include "platform/files/CodePage.h"
#include "platform/files/files.h"
#include "platform/xml/xml.h"

#include <QStringDecoder>

#include <optional>

using namespace Qt::StringLiterals;

namespace kest {

namespace {

constexpr auto lineEnd = "\r\n"_L1;
constexpr auto openingWrapper = "<request>"_L1;
constexpr auto closingWrapper = "</request>\r\n"_L1;

bool isCharacters(const xml::Node& node)
{
    return node.nodeType() == xml::NodeType::Text || node.nodeType() == xml::NodeType::CDataSection;
}

/// Appends a node and everything below it to `text`.
void FormatNode(QString& text, const xml::Node& node, qint16 level)
{
    const bool isElement = !isCharacters(node);  // comments and processing instructions are shown like elements
    const bool isCData = node.nodeType() == xml::NodeType::CDataSection;
    const QString indent(level, u'\t');

    if (isCData)
        text += "<![CDATA["_L1;
    if (isElement) {
        text += indent + u'<' + node.nodeName();
        if (node.nodeType() == xml::NodeType::Element) {
            for (const xml::Attribute& attribute : node.attributes())
                text += u' ' + attribute.name + "=\""_L1 + attribute.value + u'"';
        }
        text += u'>';
    }

    const QList<xml::Node> children = isElement ? node.childNodes() : QList<xml::Node>();
    const bool holdsElements = !children.isEmpty() && !isCharacters(children.first());
    if (children.isEmpty())
        text += node.text();
    if (holdsElements)
        text += lineEnd;
    for (const xml::Node& child : children)
        FormatNode(text, child, static_cast<qint16>(level + 1));

    if (isCData)
        text += "]]>"_L1;
    if (isElement) {
        if (holdsElements)
            text += indent;
        text += "</"_L1 + node.nodeName() + u'>' + lineEnd;
    }
}

/// Reads a file in the encoding of its byte order mark or, if it has none, in the code page.
QString textOfFile(const QString& fileName)
{
    const QByteArray bytes = files::readBytes(fileName);
    const std::optional<QStringConverter::Encoding> marked = QStringConverter::encodingForData(bytes);
    return marked ? QStringDecoder(*marked).decode(bytes) : files::fromCodePage(bytes);
}

/// Parses the text and repairs each of the two known faults once.
bool loadRepaired(xml::Document& document, QString text)
{
    if (document.loadXML(text))
        return true;
    if (document.parseError().errorCode == xml::SecondRoot) {
        text = wrappedInRequest(text);
        if (document.loadXML(text))
            return true;
    }
    return document.parseError().errorCode == xml::BareAmpersand && escapeAmpersands(text) && document.loadXML(text);
}

}  // namespace

QString FormatXML(const QString& fileName)
{
    if (!files::exists(fileName)) {
        desktop::msgBox(u"The file %1 is no longer there."_s.arg(fileName), desktop::Icon::Critical);
        return {};
    }
    xml::Document document;
    bool loaded = false;
    attempt([&] { loaded = loadRepaired(document, textOfFile(fileName)); });
    if (!loaded) {
        desktop::msgBox(u"Error loading XML - Corrupt file?"_s, desktop::Icon::Critical);
        return {};
    }
    QString text;
    FormatNode(text, document.documentElement(), 0);
    return text;
}

QString withMarkupCharacters(const QString& text)
{
    QString written = text;
    written.replace("&gt;"_L1, ">"_L1);
    written.replace("&lt;"_L1, "<"_L1);
    written.replace("&amp;"_L1, "&"_L1);
    return written;
}

QString withoutRequestWrapper(const QString& text)
{
    if (!text.startsWith(openingWrapper))
        return text;
    return text.mid(openingWrapper.size()).chopped(qMin(closingWrapper.size(), text.size() - openingWrapper.size()));
}

}  // namespace kest
