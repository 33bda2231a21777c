// Parses texts within limits of size and depth, and gives the two repairable errors their codes.
#include "platform/xml/DocumentData.h"
#include "platform/xml/FaultInjection.h"

#include <QStringEncoder>

#include <libxml/SAX2.h>
#include <libxml/parser.h>
#include <libxml/parserInternals.h>

#include <algorithm>
#include <cstring>
#include <memory>
#include <optional>
#include <string_view>

using namespace Qt::StringLiterals;

namespace kest::xml {

namespace {

std::function<bool()> parseFault;

// Error codes for our own limits. Those of libxml2 are its numbers, added to `libraryErrors`.
constexpr quint32 TooLarge = 0xC00CEF01;
constexpr quint32 TooDeep = 0xC00CEF02;
constexpr quint32 TooManyAttributes = 0xC00CEF03;
constexpr quint32 TooManyNodes = 0xC00CEF06;
constexpr quint32 DtdRefused = 0xC00CEF04;
constexpr quint32 NulCharacter = 0xC00CEF05;
constexpr quint32 libraryErrors = 0xC00CE800;

// libxml2 compares all attributes of an element with each other, and each name with all namespaces in scope.
constexpr int mostAttributes = 500;
constexpr int mostNamespaces = 500;
constexpr auto tooManyAttributes = "An element has too many attributes."_L1;
constexpr qsizetype longestSource = 10000;  // the most characters of a line to show

/// The state of a parse. Only the first error counts.
struct Progress {
    const Source& source;
    xmlParserCtxtPtr parser = nullptr;
    QStringEncoder encoder{QStringEncoder::Utf8, QStringEncoder::Flag::Stateless};
    qsizetype fed = 0;  // how many characters libxml2 has been given
    int nodes = 0;
    bool hasBlank = false;  // whether there may be texts of white space only
    std::optional<ParseError> failure = {};
    int firstCode = 0;
    QHash<const xmlNode*, QByteArray> startTags = {};
};

/// Returns the source from a place on.
QByteArray utf8From(const Source& source, qsizetype place)
{
    return source.ascii.isEmpty() ? source.utf16.sliced(place).toUtf8() : source.ascii.sliced(place).toByteArray();
}

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

/// Returns true if the text after the root continues with an element.
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
    // any text is a valid namespace name
    const bool isNameOnly = error->code == XML_WAR_NS_URI || error->code == XML_WAR_NS_URI_RELATIVE;
    const bool counts = (error->level >= XML_ERR_ERROR || error->code == XML_NS_ERR_UNDEFINED_NAMESPACE) && !isNameOnly;
    if (!counts || !parser->_private)
        return;
    Progress& progress = progressOf(parser);
    if (error->code == XML_ERR_DOCUMENT_END && parser->input &&
        (!progress.failure || progress.firstCode == XML_ERR_RESERVED_XML_NAME)) {
        const QByteArray rest =
            QByteArray(reinterpret_cast<const char*>(parser->input->cur)) + utf8From(progress.source, progress.fed);
        if (isElementNext({rest.constData(), static_cast<size_t>(rest.size())})) {
            progress.failure.reset();
            fail(progress, parser, SecondRoot, u"There is more than one top-level element."_s);
        }
    }
    if (progress.failure)
        return;
    progress.firstCode = error->code;
    if (isBareAmpersand(*error))
        fail(progress, parser, BareAmpersand, u"An ampersand does not begin an entity reference."_s);
    else
        fail(progress, parser, libraryErrors + static_cast<quint32>(error->code),
             QString::fromUtf8(error->message).trimmed());
}

/// Ends the parse because of one of our limits.
void refuse(xmlParserCtxtPtr parser, quint32 code, const QString& reason)
{
    fail(progressOf(parser), parser, code, reason);
    xmlStopParser(parser);
}

void refuseDtd(void* userData, const xmlChar*, const xmlChar*, const xmlChar*)
{
    refuse(static_cast<xmlParserCtxtPtr>(userData), DtdRefused, u"A document type declaration is not accepted."_s);
}

/// Writes the next piece of the source to the buffer, in UTF-8, and returns its end.
char* nextPiece(Progress& progress, char* buffer, qsizetype length)
{
    constexpr int longestCharacter = 3;  // the most bytes of a UTF-16 unit in UTF-8
    const qsizetype rest = progress.source.size() - progress.fed;
    const qsizetype from = progress.fed;
    if (!progress.source.ascii.isEmpty()) {
        const QByteArrayView piece = progress.source.ascii.sliced(from, qMin(length, rest));
        progress.fed += piece.size();
        return std::copy(piece.begin(), piece.end(), buffer);
    }
    qsizetype count = qMin(length / longestCharacter, rest);
    if (count > 1 && progress.source.utf16[from + count - 1].isHighSurrogate())
        --count;
    progress.fed += count;
    return progress.encoder.appendToBuffer(buffer, progress.source.utf16.sliced(from, count));
}

/// Gives libxml2 the next piece of the text. Ends the text if the parse has failed or if a start tag exceeds the
/// limits, because libxml2 would read such a tag to its end before it calls `startElement`.
int feed(void* userData, char* buffer, int length)
{
    Progress& progress = *static_cast<Progress*>(userData);
    const xmlParserCtxtPtr parser = progress.parser;
    // Each attribute takes five places, and libxml2 doubles the number of places if all are in use.
    if (parser->maxatts > 2 * 5 * (mostAttributes + 2) || parser->nsNr > 2 * mostNamespaces)
        fail(progress, parser, TooManyAttributes, tooManyAttributes);
    if (progress.failure && progress.firstCode != XML_ERR_RESERVED_XML_NAME)
        return 0;
    return static_cast<int>(nextPiece(progress, buffer, length) - buffer);
}

void countNodes(xmlParserCtxtPtr parser, int count)
{
    progressOf(parser).nodes += count;
    if (progressOf(parser).nodes > Document::maximumNodes)
        refuse(parser, TooManyNodes, u"There are too many elements."_s);
}

void addText(void* userData, const xmlChar* text, int length)
{
    const auto parser = static_cast<xmlParserCtxtPtr>(userData);
    const xmlNode* const before = parser->node ? parser->node->last : nullptr;
    progressOf(parser).hasBlank |= length > 0 && isBlank(static_cast<char>(*text));
    xmlSAX2Characters(userData, text, length);
    if (parser->node && parser->node->last != before)
        countNodes(parser, 1);
}

/// Keeps neighbouring CDATA sections apart, which libxml2 would join.
void addCData(void* userData, const xmlChar* text, int length)
{
    const auto parser = static_cast<xmlParserCtxtPtr>(userData);
    xmlAddChild(parser->node, xmlNewCDataBlock(parser->myDoc, text, length));
    countNodes(parser, 1);
}

void addComment(void* userData, const xmlChar* text)
{
    xmlSAX2Comment(userData, text);
    countNodes(static_cast<xmlParserCtxtPtr>(userData), 1);
}

void addInstruction(void* userData, const xmlChar* target, const xmlChar* data)
{
    xmlSAX2ProcessingInstruction(userData, target, data);
    countNodes(static_cast<xmlParserCtxtPtr>(userData), 1);
}

/// Stores the start tag of an element in which a declaration comes after an attribute.
void keepAttributeOrder(xmlParserCtxtPtr parser)
{
    const auto* const begin = reinterpret_cast<const char*>(parser->input->base);
    const auto* const end = reinterpret_cast<const char*>(parser->input->cur);
    const auto* at = end;
    while (at > begin && *at != '<')  // a tag can't contain "<", not even in a value
        --at;
    const std::string_view tag(at, static_cast<size_t>(end - at));
    const std::vector<std::string_view> names = namesInStartTag(tag);
    const auto isDeclaration = [](std::string_view name) { return name == "xmlns" || name.starts_with("xmlns:"); };
    if (!std::is_partitioned(names.begin(), names.end(), isDeclaration))
        progressOf(parser).startTags.insert(parser->node, QByteArray(tag.data(), static_cast<qsizetype>(tag.size())));
}

void startElement(void* userData, const xmlChar* name, const xmlChar* prefix, const xmlChar* uri, int namespaceCount,
                  const xmlChar** namespaces, int attributeCount, int defaulted, const xmlChar** attributes)
{
    const auto parser = static_cast<xmlParserCtxtPtr>(userData);
    if (parser->nodeNr >= Document::maximumDepth)
        return refuse(parser, TooDeep, u"The elements are nested too deeply."_s);
    if (attributeCount > mostAttributes || parser->nsNr > 2 * mostNamespaces)
        return refuse(parser, TooManyAttributes, tooManyAttributes);
    xmlSAX2StartElementNs(userData, name, prefix, uri, namespaceCount, namespaces, attributeCount, defaulted,
                          attributes);
    if (namespaceCount > 0 && attributeCount > 0)
        keepAttributeOrder(parser);
    countNodes(parser, 1 + namespaceCount + 2 * attributeCount);  // because the value of an attribute is a node too
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

/// Returns the line of an error, or the part of a long line around it.
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

std::vector<std::string_view> namesInStartTag(std::string_view tag)
{
    std::vector<std::string_view> names;
    size_t at = 0;
    const auto skipName = [&] {
        while (at < tag.size() && !isBlank(tag[at]) && tag[at] != '=' && tag[at] != '/' && tag[at] != '>')
            ++at;
    };
    skipName();
    while (at < tag.size()) {
        while (at < tag.size() && isBlank(tag[at]))
            ++at;
        const size_t name = at;
        skipName();
        if (at == name)
            break;
        names.push_back(tag.substr(name, at - name));
        at = std::min(tag.find_first_of("\"'", at), tag.size() - 1);
        at = std::min(tag.find(tag[at], at + 1), tag.size() - 1) + 1;
    }
    return names;
}

void setParseFault(std::function<bool()> fault)
{
    parseFault = std::move(fault);
}

bool parse(DocumentData& data, const Source& source)
{
    data.clear();
    data.error = {};
    if (parseFault && parseFault()) {
        data.error = limitError(libraryErrors + XML_ERR_NO_MEMORY, u"A fault set by a test."_s);
        return false;
    }
    if (source.size() > Document::maximumBytes) {
        data.error = limitError(TooLarge, u"The text is too large."_s);
        return false;
    }
    if (source.utf16.contains(QChar(u'\0')) || source.ascii.contains('\0')) {  // libxml2 would end the text here
        data.error = limitError(NulCharacter, u"There is a character of the code 0."_s);
        return false;
    }

    const std::unique_ptr<xmlParserCtxt, decltype(&xmlFreeParserCtxt)> parser(xmlNewParserCtxt(), &xmlFreeParserCtxt);
    Q_CHECK_PTR(parser.get());
    Progress progress{source, parser.get()};
    parser->_private = &progress;
    parser->sax->serror = takeError;
    parser->sax->internalSubset = refuseDtd;
    parser->sax->startElementNs = startElement;
    parser->sax->characters = parser->sax->ignorableWhitespace = addText;
    parser->sax->cdataBlock = addCData;
    parser->sax->comment = addComment;
    parser->sax->processingInstruction = addInstruction;
    const xmlDocPtr document = xmlCtxtReadIO(parser.get(), feed, nullptr, &progress, nullptr, nullptr,
                                             XML_PARSE_HUGE | XML_PARSE_NONET | XML_PARSE_IGNORE_ENC);
    if (!progress.failure && (!document || !xmlDocGetRootElement(document)))
        fail(progress, parser.get(), libraryErrors + XML_ERR_DOCUMENT_EMPTY, u"There is no root element."_s);
    if (progress.failure) {
        xmlFreeDoc(document);
        data.error = *progress.failure;
        data.error.srcText = sourceText(source.toString(), data.error);
        return false;
    }
    if (progress.hasBlank)
        removeBlankTexts(document);
    data.take(document, std::move(progress.startTags));
    return true;
}

}  // namespace kest::xml
