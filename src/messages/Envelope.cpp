#include "messages/Envelope.h"

#include "messages/MessageTypes.h"
#include "platform/RuntimeError.h"

using namespace Qt::StringLiterals;

namespace kest {
namespace {

constexpr QLatin1StringView networkDomain = "orla.example"_L1;  // every namespace of the network ends in this
constexpr QLatin1StringView schemaInstance = "xmlns:xsi=\"http://www.w3.org/2001/XMLSchema-instance\" "_L1;
constexpr int repairsAllowed = 3;
constexpr qsizetype mostKeptForLong = 1'000'000;  // characters; a second parse costs less than that much memory

struct LastMessage {
    QString text;
    SharedMessage document;  // null before the first
};
LastMessage lastMessage;
int keepers = 0;

/// Looks only at the quotation marks: a search of the whole text that ignores case is slower than the parser.
bool declaresSchemaInstance(QStringView text)
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
    if (first < 0 || declaresSchemaInstance(text))
        return text;
    text.insert(first, schemaInstance);
    return text;
}

bool isSameWhenPrepared(const QString& text)
{
    const qsizetype first = text.indexOf("xmlns"_L1);
    if (first < 0 || declaresSchemaInstance(text))
        return true;
    if (text.contains("xmlns:xsi"_L1))
        return false;  // the element that gets the declaration may already have one
    const QStringView before = QStringView(text).first(first);
    const QStringView tag = before.sliced(qMax(before.lastIndexOf(u'<'), 0));
    const bool isAttribute = tag.startsWith(u'<') && tag.back().isSpace() && !tag.contains(u'>') &&
                             !tag.contains(u'"') && !tag.contains(u'\'');
    return isAttribute && !before.contains("<!"_L1) && !before.contains("<?"_L1);
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
    text.replace(u'&', "&amp;"_L1);
    return true;
}

QString wrappedInRequest(const QString& text)
{
    return "<request>"_L1 + text + "</request>"_L1;
}

bool parseWithRepairs(xml::Document& document, QString& text)
{
    for (int repairs = 0; !document.loadXML(text); ++repairs) {
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
