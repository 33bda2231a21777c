#include "messages/Envelope.h"

#include "messages/MessageTypes.h"
#include "platform/RuntimeError.h"
#include "platform/files/CodePage.h"

#include <string_view>

using namespace Qt::StringLiterals;

namespace kest {
namespace {

constexpr QLatin1StringView networkDomain = "orla.example"_L1;  // every namespace of the network ends in this
constexpr QLatin1StringView schemaInstance = "xmlns:xsi=\"http://www.w3.org/2001/XMLSchema-instance\" "_L1;
constexpr QLatin1StringView escapedAmpersand = "&amp;"_L1;
constexpr int repairsAllowed = 3;
constexpr qsizetype mostKeptForLong = 1'000'000;  // characters; a second parse costs less than that much memory

struct LastMessage {
    QString text;
    SharedMessage document;  // null before the first
};
LastMessage lastMessage;
int keepers = 0;

/// Looks only at the quotation marks: a search of the whole text that ignores case is slower than the parser.
template <class View>
bool declaresSchemaInstance(View text)
{
    const qsizetype toMark = schemaInstance.indexOf(u'"');
    for (qsizetype mark = text.indexOf(u'"', toMark); mark >= 0; mark = text.indexOf(u'"', mark + 1)) {
        if (text.sliced(mark - toMark).startsWith(schemaInstance, Qt::CaseInsensitive))
            return true;
    }
    return false;
}

}  // namespace

QString GetNamespaceURI()
{
    return "http://quote3.webservice."_L1 + networkDomain;
}

void SetupDocument(xml::Document& document)
{
    static const QMap<QString, QString> prefixes{
        {u"req"_s, GetNamespaceURI()},
        {u"p754"_s, GetNamespaceURI()},
        {u"soapenv"_s, u"http://schemas.xmlsoap.org/soap/envelope/"_s},
        {u"soapenc"_s, u"http://schemas.xmlsoap.org/soap/encoding/"_s},
        {u"rootns"_s, GetNamespaceURI()},
    };
    document.setSelectionNamespaces(prefixes);
}

QString AddXsiDeclaration(QString text)
{
    const qsizetype first = text.indexOf("xmlns"_L1);
    if (first < 0 || declaresSchemaInstance(QStringView(text)))
        return text;
    text.insert(first, schemaInstance);
    return text;
}

bool isSameWhenPrepared(QByteArrayView text)
{
    const std::string_view all(text.data(), static_cast<size_t>(text.size()));
    const size_t first = all.find("xmlns");
    if (first == all.npos || declaresSchemaInstance(QLatin1StringView(text)))
        return true;
    if (all.find("xmlns:xsi") != all.npos)
        return false;  // the element that gets the declaration may already have one
    const std::string_view before = all.substr(0, first);
    const size_t opening = before.rfind('<');
    if (opening == before.npos || before.find("<!") != before.npos || before.find("<?") != before.npos)
        return false;
    const std::string_view tag = before.substr(opening);
    const bool isAttribute = std::string_view(" \t\r\n").find(tag.back()) != std::string_view::npos;
    return isAttribute && tag.find_first_of(">\"'") == tag.npos;
}

QString GetMessageTypeName(QString& text)
{
    return GetMessageTypeName(parsedMessage(text));
}

QString GetMessageTypeName(const xml::Document& message)
{
    QString code;
    attempt([&] { code = message.textOf(u"messageType"_s).toUpper(); });
    return messageTypeName(code);
}

QString GetMarkerTypeName(QString& text)
{
    return GetMarkerTypeName(parsedMessage(text));
}

QString GetMarkerTypeName(const xml::Document& marker)
{
    QString mailType;
    QString action;
    attempt([&] { mailType = marker.textOf(u"mailtype"_s); });
    attempt([&] { action = marker.textOf(u"action"_s); });
    if (mailType != "MDMSG"_L1)
        return u"CORRUPT!"_s;
    return action == "DELDUPE"_L1 ? u"Quote Send Error"_s : QString(unknownMessageType);
}

bool isMarker(const xml::Document& message)
{
    const xml::Node first = message.firstChild().firstChild();
    return first && first.text() == "MDMSG"_L1;
}

bool escapeAmpersands(QString& text)
{
    if (text.size() + 4 * text.count(u'&') > xml::Document::maximumBytes)
        return false;
    text.replace(u'&', escapedAmpersand);
    return true;
}

bool escapeAmpersands(QByteArray& text)
{
    if (text.size() + 4 * text.count('&') > xml::Document::maximumBytes)
        return false;
    text.replace('&', escapedAmpersand);
    return true;
}

QString wrappedInRequest(const QString& text)
{
    return "<request>"_L1 + text + "</request>"_L1;
}

QByteArray wrappedInRequest(const QByteArray& text)
{
    return "<request>" + text + "</request>";
}

bool parseBytes(xml::Document& document, const QByteArray& text)
{
    return files::isAscii(text) ? document.loadAscii(text) : document.loadXML(files::fromCodePage(text));
}

bool parseWithRepairs(xml::Document& document, QByteArray& text)
{
    for (int repairs = 0; !parseBytes(document, text); ++repairs) {
        const quint32 error = document.parseError().errorCode;
        if (repairs == repairsAllowed)
            return false;
        if (error == xml::SecondRoot)
            text = wrappedInRequest(text);
        else if (error != xml::BareAmpersand || !escapeAmpersands(text))
            return false;
    }
    return true;
}

xml::Document parsedMessage(QString& text)
{
    xml::Document document;
    SetupDocument(document);
    text = AddXsiDeclaration(std::move(text));
    document.loadXML(text);
    return document;
}

SharedMessage sharedMessage(QString& text)
{
    text = AddXsiDeclaration(std::move(text));
    if (lastMessage.document && lastMessage.text == text)
        return lastMessage.document;
    const auto document = std::make_shared<const xml::Document>(parsedMessage(text));
    if (keepers > 0)
        lastMessage = {text, document};
    return document;
}

SharedMessage repairedMessage(QString& text)
{
    SharedMessage message = sharedMessage(text);
    if (message->parseError().errorCode == xml::BareAmpersand && escapeAmpersands(text))
        message = sharedMessage(text);
    return message;
}

KeptMessage::KeptMessage()
{
    ++keepers;
}

KeptMessage::~KeptMessage()
{
    if (--keepers == 0 || lastMessage.text.size() > mostKeptForLong)
        lastMessage = {};
}

}  // namespace kest
