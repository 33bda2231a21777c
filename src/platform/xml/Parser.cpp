#include "platform/xml/DocumentData.h"

#include <libxml/SAX2.h>
#include <libxml/parser.h>
#include <libxml/parserInternals.h>

#include <cstring>
#include <memory>
#include <optional>
#include <string_view>

using namespace Qt::StringLiterals;

namespace kest::xml {

namespace {

// Failures of our own limits; the library's own stand above `libraryErrors` by their number.
constexpr quint32 TooLarge = 0xC00CEF01;
constexpr quint32 TooDeep = 0xC00CEF02;
constexpr quint32 TooManyAttributes = 0xC00CEF03;
constexpr quint32 DtdRefused = 0xC00CEF04;
constexpr quint32 NulCharacter = 0xC00CEF05;
constexpr quint32 libraryErrors = 0xC00CE800;

constexpr int mostAttributes = 5000;        // of one element: the library compares each with each
constexpr qsizetype longestSource = 10000;  // characters of a line that are shown

/// What one parse has met so far; the first failure decides.
struct Progress {
    std::optional<ParseError> failure;
    int firstCode = 0;
    QHash<const xmlNode*, QStringList> attributeOrders;
};

Progress& progressOf(xmlParserCtxtPtr parser)
{
    return *static_cast<Progress*>(parser->_private);
}

bool isBlank(char c)
{
    return c == ' ' || c == '\t' || c == '\n' || c == '\r';
}

bool isNameStart(char c)
{
    return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || c == '_' || c == ':' || (c & 0x80);
}

/// True where the text behind the root goes on with an element.
bool isElementNext(std::string_view rest)
{
    constexpr std::pair<std::string_view, std::string_view> passedOver[] = {
        {"<!--", "-->"}, {"<?", "?>"}, {"<![CDATA[", "]]>"}};
    while (true) {
        while (!rest.empty() && isBlank(rest.front()))
            rest.remove_prefix(1);
        bool passed = false;
        for (const auto& [opening, closing] : passedOver) {
            const size_t end = rest.starts_with(opening) ? rest.find(closing, opening.size()) : rest.npos;
            if (end == rest.npos)
                continue;
            rest.remove_prefix(end + closing.size());
            passed = true;
        }
        if (!passed)
            return rest.size() > 1 && rest[0] == '<' && isNameStart(rest[1]);
    }
}

bool isBareAmpersand(const xmlError& error)
{
    if (error.code == XML_ERR_ENTITYREF_SEMICOL_MISSING)
        return true;
    return error.code == XML_ERR_NAME_REQUIRED && error.message && std::strstr(error.message, "xmlParseEntityRef");
}

void fail(Progress& progress, xmlParserCtxtPtr parser, quint32 code, const QString& reason)
{
    if (progress.failure)
        return;
    ParseError failure;
    failure.errorCode = code;
    failure.reason = reason;
    if (parser->input) {
        failure.line = parser->input->line;
        failure.linePosition = parser->input->col;
    }
    progress.failure = failure;
}

void takeError(void* userData, xmlErrorPtr error)
{
    const auto parser = static_cast<xmlParserCtxtPtr>(userData);
    const bool isNameOnly = error->code == XML_WAR_NS_URI || error->code == XML_WAR_NS_URI_RELATIVE;  // any text is one
    const bool counts = (error->level >= XML_ERR_ERROR || error->code == XML_NS_ERR_UNDEFINED_NAMESPACE) && !isNameOnly;
    if (!counts || !parser->_private)
        return;
    Progress& progress = progressOf(parser);
    if (error->code == XML_ERR_DOCUMENT_END && parser->input &&
        (!progress.failure || progress.firstCode == XML_ERR_RESERVED_XML_NAME)) {
        const auto* at = reinterpret_cast<const char*>(parser->input->cur);
        const auto* end = reinterpret_cast<const char*>(parser->input->end);
        if (at && isElementNext({at, static_cast<size_t>(end - at)})) {
            progress.failure.reset();
            fail(progress, parser, SecondRoot, u"There is more than one top-level element."_s);
        }
    }
    if (progress.failure)
        return;
    progress.firstCode = error->code;
    if (isBareAmpersand(*error))
        fail(progress, parser, BareAmpersand, u"An ampersand begins no entity reference."_s);
    else
        fail(progress, parser, libraryErrors + static_cast<quint32>(error->code),
             QString::fromUtf8(error->message).trimmed());
}

void refuseDtd(void* userData, const xmlChar*, const xmlChar*, const xmlChar*)
{
    const auto parser = static_cast<xmlParserCtxtPtr>(userData);
    fail(progressOf(parser), parser, DtdRefused, u"A document type declaration is not accepted."_s);
    xmlStopParser(parser);
}

/// The names of a start tag's attributes, declarations among them, as they stand in the text before `end`.
QStringList namesInStartTag(const char* begin, const char* end)
{
    const char* at = end;
    while (at > begin && *at != '<')  // no "<" can stand inside a tag, not even in a value
        --at;
    QStringList names;
    const auto skipName = [&] {
        while (at < end && !isBlank(*at) && *at != '=' && *at != '/' && *at != '>')
            ++at;
    };
    skipName();
    while (at < end) {
        while (at < end && isBlank(*at))
            ++at;
        const char* const name = at;
        skipName();
        names.append(QString::fromUtf8(name, at - name));
        while (at < end && *at != '"' && *at != '\'')
            ++at;
        const char quote = at < end ? *at++ : '"';
        while (at < end && *at != quote)
            ++at;
        ++at;
    }
    return names;
}

void startElement(void* userData, const xmlChar* name, const xmlChar* prefix, const xmlChar* uri, int namespaceCount,
                  const xmlChar** namespaces, int attributeCount, int defaulted, const xmlChar** attributes)
{
    const auto parser = static_cast<xmlParserCtxtPtr>(userData);
    Progress& progress = progressOf(parser);
    if (parser->nodeNr >= Document::maximumDepth) {
        fail(progress, parser, TooDeep, u"The elements are nested too deeply."_s);
        xmlStopParser(parser);
        return;
    }
    xmlSAX2StartElementNs(userData, name, prefix, uri, namespaceCount, namespaces, attributeCount, defaulted,
                          attributes);
    if (namespaceCount > 0 && attributeCount > 0 && parser->node && parser->input)
        progress.attributeOrders.insert(parser->node,
                                        namesInStartTag(reinterpret_cast<const char*>(parser->input->base),
                                                        reinterpret_cast<const char*>(parser->input->cur)));
}

/// True when some tag has so many attributes that comparing each with each would take minutes.
bool hasTooManyAttributes(std::string_view text)
{
    size_t at = 0;
    while ((at = text.find('<', at)) != text.npos) {
        const std::string_view rest = text.substr(at);
        if (rest.starts_with("<!--") || rest.starts_with("<![CDATA[")) {
            at = text.find(rest[2] == '-' ? "-->" : "]]>", at);
            if (at == text.npos)
                return false;
            continue;
        }
        int count = 0;
        for (++at; at < text.size() && text[at] != '>' && text[at] != '<'; ++at) {
            if (text[at] == '=' && ++count > mostAttributes)
                return true;
            if (text[at] == '"' || text[at] == '\'')
                at = std::min(text.find(text[at], at + 1), text.size() - 1);
        }
    }
    return false;
}

void removeBlankTexts(xmlDocPtr document)
{
    xmlNodePtr at = document->children;
    while (at) {
        xmlNodePtr next = at->type == XML_ELEMENT_NODE ? at->children : nullptr;
        for (xmlNodePtr from = at; !next && from; from = from->parent)
            next = from->next;
        if (isBlankText(at)) {
            xmlUnlinkNode(at);
            xmlFreeNode(at);
        }
        at = next;
    }
}

/// The line of an error, or the part of it around the error.
QString sourceText(const QString& text, const ParseError& failure)
{
    qsizetype start = 0;
    for (int line = 1; line < failure.line; ++line) {
        const qsizetype end = text.indexOf(u'\n', start);
        if (end < 0)
            break;
        start = end + 1;
    }
    qsizetype end = text.indexOf(u'\n', start);
    if (end < 0)
        end = text.size();
    if (end - start > longestSource) {
        start = qBound(start, start + failure.linePosition - longestSource / 2, end - longestSource);
        end = start + longestSource;
    }
    QString line = text.sliced(start, end - start);
    if (line.endsWith(u'\r'))
        line.chop(1);
    return line;
}

ParseError limitError(quint32 code, const QString& reason)
{
    ParseError error;
    error.errorCode = code;
    error.reason = reason;
    return error;
}

}  // namespace

bool parse(DocumentData& data, const QString& text)
{
    data.clear();
    data.error = {};
    const QByteArray bytes = text.size() > Document::maximumBytes ? QByteArray() : text.toUtf8();
    if (text.size() > Document::maximumBytes || bytes.size() > Document::maximumBytes) {
        data.error = limitError(TooLarge, u"The text is too large."_s);
        return false;
    }
    if (hasTooManyAttributes({bytes.constData(), static_cast<size_t>(bytes.size())})) {
        data.error = limitError(TooManyAttributes, u"An element has too many attributes."_s);
        return false;
    }

    if (text.contains(QChar(u'\0'))) {  // the library would take it for the end of the text
        data.error = limitError(NulCharacter, u"There is a character of the code 0."_s);
        return false;
    }

    Progress progress;
    const std::unique_ptr<xmlParserCtxt, decltype(&xmlFreeParserCtxt)> parser(xmlNewParserCtxt(), &xmlFreeParserCtxt);
    Q_CHECK_PTR(parser.get());
    parser->_private = &progress;
    parser->sax->serror = takeError;
    parser->sax->internalSubset = refuseDtd;
    parser->sax->startElementNs = startElement;
    const xmlDocPtr document = xmlCtxtReadMemory(parser.get(), bytes.constData(), static_cast<int>(bytes.size()),
                                                 nullptr, "UTF-8", XML_PARSE_HUGE | XML_PARSE_NONET);
    if (!progress.failure && (!document || !xmlDocGetRootElement(document)))
        fail(progress, parser.get(), libraryErrors + XML_ERR_DOCUMENT_EMPTY, u"There is no root element."_s);
    if (progress.failure) {
        xmlFreeDoc(document);
        data.error = *progress.failure;
        data.error.srcText = sourceText(text, data.error);
        return false;
    }
    removeBlankTexts(document);
    data.take(document, std::move(progress.attributeOrders));
    return true;
}

}  // namespace kest::xml
