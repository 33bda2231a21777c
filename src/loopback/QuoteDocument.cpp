#include "loopback/QuoteDocument.h"

#include "messages/Envelope.h"
#include "platform/RuntimeError.h"
#include "platform/xml/xml.h"

#include <algorithm>

namespace kest::app {

using namespace Qt::StringLiterals;

namespace {

constexpr int mostLines = 32767;  // in a document

xml::Document parsed(const QString& text)
{
    xml::Document document;
    if (!document.loadXML(wrappedInRequest(text)))
        throw RuntimeError(TypeMismatch, u"it is not XML: "_s + document.parseError().reason.simplified());
    return document;
}

/// Throws TypeMismatch if the number can't be part of a file name: an answer has it in its name, between two
/// underscores.
void checkNumber(const QString& number)
{
    const bool nameable = std::all_of(number.begin(), number.end(),
                                      [](QChar c) { return c.isLetterOrNumber() || c == u'-' || c == u' '; });
    if (number.isEmpty() || !nameable)
        throw RuntimeError(TypeMismatch,
                           u"\"%1\" is not a quote number that an answer can name"_s.arg(number.left(40)));
}

QList<BodyLine> linesOf(const xml::Document& document, const BodySection& section)
{
    QList<BodyLine> lines;
    const QString path = u"quoteBody/%1/*"_s.arg(QLatin1StringView(section.name));
    for (const xml::Node& node : document.selectNodes(path)) {
        BodyLine line{{}, node.textOrEmptyOf(u"quoteLineNumber"_s).toInt(), {}};
        for (const char* element : section.elements)
            line.values[QLatin1StringView(element)] = node.textOrEmptyOf(QLatin1StringView(element));
        lines.append(line);
    }
    return lines;
}

}  // namespace

const QList<BodySection>& bodySections()
{
    static const QList<BodySection> sections{
        {"labours", "labour", "labourTotal", {"labourType", "labourGroup", "labourDescription", "labourAmount"}},
        {"paints", "paint", "paintTotal", {"paintGroup", "paintWorkType", "paintDescription", "paintAmount"}},
        {"parts",
         "part",
         "partTotal",
         {"partNumber", "partType", "partDescription", "partQuantity", "partUnitPrice", "partAmount",
          "partMarkUpPercentage", "partMarkUpAmount"}},
        {"sublets",
         "sublet",
         nullptr,
         {"subletType", "subletDescription", "subletRepairer", "subletRepairerAddress", "subletRepairerPhone",
          "subletAuthorityNumber", "subletAuthorityDocument"}}};
    return sections;
}

QuoteDocument quoteDocument(const QString& text)
{
    const xml::Document document = parsed(text);
    const QString reference = document.textOrEmptyOf(u"quoteBody/quoteReference"_s);
    const auto named = quoteNamed(reference);
    if (!named)
        throw RuntimeError(TypeMismatch,
                           u"its quote reference \"%1\" is not NUMBER/SUBQUOTE with a subquote of one digit"_s.arg(
                               reference.left(40)));
    checkNumber(named->number);

    QuoteDocument quote;
    quote.key = *named;
    quote.request = document.textOrEmptyOf(u"quoteRequestNumber"_s);
    quote.version = document.textOrEmptyOf(u"quoteRequestVersionNumber"_s);
    quote.claim = document.textOrEmptyOf(u"claimNumber"_s);
    quote.rego = document.textOrEmptyOf(u"vehicleRegistration"_s);
    quote.vehicle = document.textOrEmptyOf(u"vehicleDescription"_s);
    quote.type = document.textOrEmptyOf(u"quoteBody/quoteType"_s);
    for (const QString& name : {u"companyName"_s, u"title"_s, u"firstName"_s, u"surname"_s})
        if (const xml::Node found = document.selectSingleNode(u"quoteClaimCustomer/"_s + name))
            quote.customer[name] = found.text();
    for (int section = 0; section < SectionCount; ++section)
        quote.lines[section] = linesOf(document, bodySections()[section]);
    for (const xml::Node& number : document.selectNodes(u"quoteBody//quoteLineNumber"_s))
        if (const int line = number.text().toInt(); line <= mostLines)
            quote.highestLine = std::max(quote.highestLine, line);
    return quote;
}

}  // namespace kest::app
