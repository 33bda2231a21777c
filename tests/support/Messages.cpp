#include "support/Messages.h"

#include "messages/Envelope.h"

namespace kest::test {

using namespace Qt::StringLiterals;

Message::Message(const Text& type, const Text& rootName, Fields fields) : code(type), root{rootName, {}, {}}
{
    for (const auto& [path, value] : fields)
        set(path, value);
}

Message::Element* Message::childOf(Element& parent, const QString& name)
{
    for (Element& child : parent.children)
        if (child.name == name)
            return &child;
    return nullptr;
}

Message::Element& Message::at(const QString& path)
{
    Element* element = &root;
    for (const QString& name : path.split(u'/')) {
        Element* child = childOf(*element, name);
        if (!child) {
            element->children.push_back({name, {}, {}});
            child = &element->children.back();
        }
        element = child;
    }
    return *element;
}

bool Message::has(const QString& path)
{
    return childOf(root, path) != nullptr;
}

Message& Message::set(const Text& path, const Text& text)
{
    at(path).text = text;
    return *this;
}

Message& Message::setFirst(std::initializer_list<Text> paths, const Text& text)
{
    for (const Text& path : paths)
        if (has(path))
            return set(path, text);
    return set(*paths.begin(), text);
}

Message& Message::without(const Text& path)
{
    const QString whole = path;
    const qsizetype cut = whole.lastIndexOf(u'/');
    Element& parent = cut < 0 ? root : at(whole.left(cut));
    const QString name = whole.mid(cut + 1);
    std::erase_if(parent.children, [&](const Element& child) { return child.name == name; });
    return *this;
}

Message& Message::images(std::initializer_list<Text> ids)
{
    Element& list = at(u"quoteRequestImageIds"_s);
    list.children.clear();
    for (const Text& id : ids)
        list.children.push_back({u"quoteRequestImageId"_s, id, {}});
    return *this;
}

Message& Message::line(const Text& section, const Text& element, int number, const Text& indicator, Fields defaults,
                       Fields fields)
{
    Element line{element, {}, {}};
    if (!QString(indicator).isEmpty())
        line.children.push_back({u"quoteLineChangeIndicator"_s, indicator, {}});
    line.children.push_back({u"quoteLineNumber"_s, QString::number(number), {}});
    if (QString(indicator) != u"D"_s)
        for (const auto& [name, value] : defaults)
            line.children.push_back({name, value, {}});
    for (const auto& [name, value] : fields) {
        if (Element* child = childOf(line, name))
            child->text = value;
        else
            line.children.push_back({name, value, {}});
    }
    at(u"quoteBody/"_s + section).children.push_back(line);
    return *this;
}

Message& Message::labour(int number, const Text& indicator, Fields fields)
{
    return line("labours", "labour", number, indicator,
                {{"labourType", "RR"}, {"labourDescription", "Front bumper bar"}, {"labourAmount", "100"}}, fields);
}

Message& Message::part(int number, const Text& indicator, Fields fields)
{
    return line("parts", "part", number, indicator,
                {{"partNumber", "52119-7K220"},
                 {"partType", "NEW"},
                 {"partDescription", "Front bumper cover"},
                 {"partQuantity", "1"},
                 {"partUnitPrice", "200"},
                 {"partAmount", "200"},
                 {"partMarkUpPercentage", "25"},
                 {"partMarkUpAmount", "50"}},
                fields);
}

Message& Message::paint(int number, const Text& indicator, Fields fields)
{
    return line("paints", "paint", number, indicator,
                {{"paintWorkType", "PAIN"}, {"paintDescription", "Front bumper"}, {"paintAmount", "150"}}, fields);
}

Message& Message::sublet(int number, const Text& indicator, Fields fields)
{
    return line("sublets", "sublet", number, indicator,
                {{"subletType", "WHAL"},
                 {"subletDescription", "Four wheel alignment"},
                 {"subletRepairer", "Straightline Alignment"},
                 {"subletRepairerAddress", "8 Foundry Lane"},
                 {"subletRepairerPhone", "03 5550 1010"}},
                fields);
}

void Message::write(const Element& element, const QString& prefix, QString& out)
{
    out += u'<' + prefix + element.name + u'>' + element.text.toHtmlEscaped();
    for (const Element& child : element.children)
        write(child, prefix, out);
    out += u"</"_s + prefix + element.name + u'>';
}

QString Message::text() const
{
    const QString prefix = u"p754:"_s;
    QString out = u"<%1%2 xmlns:p754=\"%3\">"_s.arg(prefix, root.name, GetNamespaceURI());
    if (!code.isEmpty())
        out += u"<messageType>%1</messageType>"_s.arg(code);
    for (const Element& child : root.children)
        write(child, prefix, out);
    return out + u"</%1%2>"_s.arg(prefix, root.name);
}

Message quoteRequest(const Text& request)
{
    Message message("QREQ", "getQuoteRequestResponse",
                    {{"quoteRequestNumber", request},
                     {"quoteRequestVersionNumber", "1"},
                     {"claimNumber", "7700001"},
                     {"claimDescription", "Reversed into a bollard"},
                     {"claimManager", "Robin Sayle"},
                     {"corporateCustomer", ""},
                     {"claimCustomer/title", "Mr"},
                     {"claimCustomer/firstName", "Alex"},
                     {"claimCustomer/surname", "Tarrant"},
                     {"vehicleRegistration", "XYZ789"},
                     {"vehicleDescription", "Corella Meridian sedan"},
                     {"vehicleLocation", "At the shop"},
                     {"bayNumber", "3"},
                     {"offsiteQuoting", "false"},
                     {"extraQuoteInformationRequested", "true"},
                     {"quoteDueTime", "2008-03-26T06:30:00.000Z"},
                     {"instructions", "Quote from photographs"}});
    for (const auto& [name, value] : Fields{{"make", "CORELLA"},
                                            {"yearOfManufacture", "2004"},
                                            {"monthOfManufacture", "7"},
                                            {"bodyShape", "Sedan"},
                                            {"transmissionType", "A"},
                                            {"numberOfCylinders", "4"},
                                            {"vinChassis", "6T1TESTVIN0000001"},
                                            {"color", "BLUE"},
                                            {"paintType", "META"},
                                            {"odometer", "84200"},
                                            {"fuelLevel", "50"},
                                            {"damageDescription", "Rear bumper"},
                                            {"oldDamageDescription", "None"}})
        message.set("extraVehicleInformation/" + QString(name).toStdString(), value);
    return message;
}

namespace {

void setTotals(Message& message)
{
    for (const char* total : {"labourTotal", "paintTotal", "partTotal", "partMarkUpTotal", "gst", "quoteTotal"})
        message.set(std::string("quoteBody/") + total, "0");
}

/// The root that quotes share which come back with their request and their vehicle.
Message quoteResponse(const Text& code, const Text& reference)
{
    return Message(code, "getQuoteResponse",
                   {{"kestQuoteNumber", "KQ1"},
                    {"quoteRequestNumber", "QR1"},
                    {"claimNumber", "7700001"},
                    {"vehicleRegistration", "ABC123"},
                    {"vehicleDescription", "Corella Meridian sedan"},
                    {"quoteBody/quoteReference", reference},
                    {"quoteBody/quoteType", "R"}});
}

}  // namespace

Message quoteMatch(const Text& reference)
{
    return quoteResponse("QMQR", reference);
}

Message manualQuote(const Text& reference)
{
    Message message = quoteResponse("MANQ", reference);
    setTotals(message);
    return message;
}

Message excessWaiver(const Text& reference)
{
    return quoteResponse("EWAP", reference);
}

Message quoteDeletion(const Text& quoteNumber)
{
    return Message("QTDL", "getQuoteDeletionResponse", {{"kestQuoteNumber", quoteNumber}, {"reason", "Sent twice"}});
}

Message revisionRequest(const Text& request)
{
    return Message(
        "RRQT", "getReqForRevQteResponse",
        {{"quoteRequestNumber", request}, {"quoteRequestVersionNumber", "2"}, {"comments", "Add the grille"}});
}

Message cancellation(const Text& request)
{
    return Message("QRCN", "getQRCancellationResponse",
                   {{"quoteRequestNumber", request}, {"qrCancellationReason", "Claim withdrawn"}});
}

Message cancellationBackout(const Text& request)
{
    return Message("BCQR", "getBackoutCancelledQRResponse", {{"kestQuoteRequestNumber", request}});
}

Message adjustedQuote(const Text& reference)
{
    Message message("ADQT", "getAdjustedQuoteResponse",
                    {{"kestAdjustedQuoteNumber", "KJ1"},
                     {"kestOriginalQuoteNumber", "KQ1"},
                     {"quoteRequestNumber", "QR1"},
                     {"assessmentComment", "Repair the bumper"},
                     {"quoteBody/quoteReference", reference},
                     {"quoteBody/quoteType", "R"}});
    setTotals(message);
    return message;
}

Message authorisedQuote(const Text& reference)
{
    Message message("AUQT", "getAuthorisedQuoteResponse",
                    {{"kestAuthorisedQuoteNumber", "KA1"},
                     {"authorityNumber", "AU55001"},
                     {"quoteRequestNumber", "QR1"},
                     {"kestOriginalQuoteNumber", "KQ1"},
                     {"claimNumber", "7700001"},
                     {"claimManager", "Robin Sayle"},
                     {"corporateCustomer", ""},
                     {"authorisedQuoteClaimCustomer/title", "Ms"},
                     {"authorisedQuoteClaimCustomer/firstName", "Kim"},
                     {"authorisedQuoteClaimCustomer/surname", "Holloway"},
                     {"vehicleRegistration", "ABC123"},
                     {"repairCompletionDate", "2008-04-11"},
                     {"orlaContact/name", "Morgan Lee Whitby"},
                     {"orlaContact/phone", "03 5550 2020"},
                     {"orlaContact/fax", "03 5550 2021"},
                     {"excess", "0"},
                     {"customerContribution", "0"},
                     {"assessmentComment", "Authorised as assessed"},
                     {"authorisedAmount", "1000"},
                     {"quoteBody/quoteReference", reference},
                     {"quoteBody/quoteType", "R"}});
    setTotals(message);
    return message;
}

Message assessmentResult(const Text& quoteNumber)
{
    return Message(
        "ARES", "getAssmntResultResponse",
        {{"kestOriginalQuoteNumber", quoteNumber}, {"kestQuoteRequestNumber", "QR1"}, {"reasonCode", "LABR"}});
}

Message assessmentBackout(const Text& request)
{
    return Message("BACA", "getBackoutAssmntResponse", {{"kestQuoteRequestNumber", request}});
}

Message submissionResponse(const Text& quoteNumber, const Text& status)
{
    return Message("", "submitQuoteResponse", {{"kestQuoteNumber", quoteNumber}, {"quoteSubmissionStatus", status}});
}

QString marker(const Text& quoteNumber, const Text& subquote, const Text& action)
{
    return u"<mail><mailtype>MDMSG</mailtype><action>%3</action><qtnno>%1</qtnno><subquote>%2</subquote>"
           "<rego>ABC123</rego><body>Quote %1 was sent twice.</body></mail>"_s.arg(QString(quoteNumber),
                                                                                   QString(subquote), QString(action));
}

QString sentDocument(const Text& reference)
{
    return u"<quoteRequestNumber>QR1</quoteRequestNumber><quoteRequestVersionNumber>1</quoteRequestVersionNumber>"
           "<quotationSoftware>MarlinDesk</quotationSoftware><quoteClaimCustomer><title>Ms</title>"
           "<firstName>Kim</firstName><surname>Holloway</surname></quoteClaimCustomer>"
           "<vehicleRegistration>ABC123</vehicleRegistration>"
           "<vehicleDescription>CORELLA MERIDIAN GL</vehicleDescription>"
           "<quoteBody><quoteReference>%1</quoteReference><quoteType>R</quoteType></quoteBody>"
           "<imageCount>0</imageCount>"_s.arg(QString(reference));
}

}  // namespace kest::test
