#include "loopback/InsurerMessages.h"

#include "messages/Envelope.h"
#include "messages/MessageTypes.h"
#include "platform/values.h"

#include <map>

namespace kest::app {

using namespace Qt::StringLiterals;

namespace {

constexpr int daysToQuote = 2;
constexpr int daysToRepair = 14;

/// The code of a message and the name of its root element.
struct MessageHead {
    QLatin1StringView code;
    QLatin1StringView root;
};

MessageHead of(MessageCode code)
{
    const MessageType& type = messageType(code);
    return {type.text, type.root};
}

const MessageHead& headOf(Act act)
{
    static const std::map<Act, MessageHead> heads{
        {Act::Request, of(MessageCode::QREQ)},   {Act::Respond, {""_L1, "submitQuoteResponse"_L1}},
        {Act::Match, of(MessageCode::QMQR)},     {Act::Authorise, of(MessageCode::AUQT)},
        {Act::Adjust, of(MessageCode::ADQT)},    {Act::Revise, of(MessageCode::RRQT)},
        {Act::Delete, of(MessageCode::QTDL)},    {Act::Cancel, of(MessageCode::QRCN)},
        {Act::Reinstate, of(MessageCode::BCQR)}, {Act::Reject, of(MessageCode::ARES)},
        {Act::BackOut, of(MessageCode::BACA)},   {Act::Waive, of(MessageCode::EWAP)},
        {Act::Manual, of(MessageCode::MANQ)},    {Act::Marker, {"MDMSG"_L1, "mail"_L1}}};
    return heads.at(act);
}

/// Returns the values of a step's parameters, or random ones if the step does not have them.
class Told {
public:
    Told(const Step& step, Dice& dice) : parameters(step.parameters), chance(dice) {}

    QString operator()(const QString& name, const QStringList& otherwise) const
    {
        // even if unused, so that later choices stay the same
        const QString& madeUp = otherwise[chance.below(otherwise.size())];
        return parameters.value(name, madeUp);
    }

private:
    const Parameters& parameters;
    Dice& chance;
};

QString isoDate(const QDate& date)
{
    return date.toString(Qt::ISODate);
}

Parameters requestCustomer(const Step& step, const Told& told)
{
    if (step.parameters.contains(u"company"_s))
        return {{u"companyName"_s, step.parameters[u"company"_s]}};
    Parameters names;  // in separate statements: the order of random choices must be fixed
    names[u"title"_s] = told(u"title"_s, {u"Ms"_s, u"Mr"_s});
    names[u"firstName"_s] = told(u"firstname"_s, {u"Rowan"_s, u"Casey"_s, u"Alex"_s, u"Jordan"_s});
    names[u"surname"_s] = told(u"surname"_s, {u"Kestle"_s, u"Marchbank"_s, u"Tarrant"_s, u"Yelland"_s});
    return names;
}

void writeCustomer(const Branch& customer, const Parameters& names)
{
    if (names.contains(u"companyName"_s)) {
        customer.add("companyName", names[u"companyName"_s]);
        return;
    }
    for (const char* name : {"title", "firstName", "surname"})
        customer.add(name, names.value(QLatin1StringView(name)));
}

/// Returns the customer's name for the list, an element that an insurer fills for persons too.
QString corporateCustomer(const Parameters& names)
{
    const QStringList words{names.value(u"companyName"_s), names.value(u"title"_s), names.value(u"firstName"_s),
                            names.value(u"surname"_s)};
    return words.join(u' ').simplified();
}

void writeRequest(const Branch& request, const Step& step, const Matter& matter, Dice& dice, const QDate& today)
{
    const Told told(step, dice);
    const QString damage = told(u"damage"_s, {u"Rear bumper and boot lid"_s, u"Left front guard"_s, u"Right doors"_s});
    const Parameters customer = requestCustomer(step, told);
    request.add({{"quoteRequestNumber", always, matter.request},
                 {"quoteRequestVersionNumber", always, matter.version},
                 {"claimNumber", always, matter.claim},
                 {"claimDescription", always, u"Damage: "_s + damage},
                 {"claimManager", always, u"Robin Sayle"_s},
                 {"corporateCustomer", always, corporateCustomer(customer)}});
    writeCustomer(request.add("claimCustomer"), customer);
    request.add({{"vehicleRegistration", always, matter.rego},
                 {"vehicleDescription", always, matter.vehicle},
                 {"vehicleLocation", always, u"At the repairer"_s},
                 {"bayNumber", always, {}},
                 {"offsiteQuoting", always, u"false"_s},
                 {"extraQuoteInformationRequested", always,
                  step.parameters.value(u"extra"_s) == "yes"_L1 ? u"true"_s : u"false"_s},
                 {"quoteDueTime", always, isoDate(today.addDays(daysToQuote)) + u"T06:30:00.000Z"_s}});
    request.add("extraVehicleInformation")
        .add({{"make", always, matter.vehicle.section(u' ', 0, 0).toUpper()},
              {"yearOfManufacture", always, QString::number(today.year() - 1 - dice.below(8))},
              {"monthOfManufacture", always, QString::number(1 + dice.below(12))},
              {"bodyShape", always, u"Sedan"_s},
              {"transmissionType", always, dice.of(std::array{u"A"_s, u"M"_s})},
              {"numberOfCylinders", always, u"4"_s},
              {"vinChassis", always, u"6T1AA00W"_s + matter.request.rightJustified(9, u'0').right(9)},
              {"color", always, dice.of(std::array{u"BLUE"_s, u"SILV"_s, u"WHIT"_s, u"RED"_s})},
              {"paintType", always, dice.of(std::array{u"META"_s, u"SOLD"_s, u"CLER"_s})},
              {"odometer", always, QString::number(12000 + 10 * dice.below(14000))},
              {"fuelLevel", always, u"50"_s},
              {"damageDescription", always, damage},
              {"oldDamageDescription", always, u"None"_s}});
    request.add("instructions", step.parameters.value(u"instructions"_s, u"Please quote within two working days."_s));
    const Branch images = request.add("quoteRequestImageIds");
    for (int id = 1; id <= step.number(u"pictures"_s); ++id)
        images.add("quoteRequestImageId", QString::number(id));
}

Changes changesOf(const Step& step)
{
    return {step.number(u"change"_s), step.number(u"add"_s), step.number(u"delete"_s), step.number(u"sublet"_s)};
}

void writeAuthorised(const Branch& quote, const Step& step, const Matter& matter, Dice& dice, const QDate& today)
{
    const AssessedBody body = assessedBody(matter.document, changesOf(step), dice);
    quote.add({{"kestAuthorisedQuoteNumber", always, matter.authorised},
               {"authorityNumber", always, u"AU"_s + matter.authorised},
               {"quoteRequestNumber", always, matter.request},
               {"kestOriginalQuoteNumber", always, matter.network},
               {"claimNumber", always, matter.claim},
               {"claimManager", always, u"Robin Sayle"_s},
               {"corporateCustomer", always, corporateCustomer(matter.document.customer)}});
    writeCustomer(quote.add("authorisedQuoteClaimCustomer"), matter.document.customer);
    quote.add({{"vehicleRegistration", always, matter.rego},
               {"repairCompletionDate", always, isoDate(today.addDays(daysToRepair))}});
    quote.add("orlaContact")
        .add({{"name", always, step.parameters.value(u"assessor"_s, u"Morgan Lee Whitby"_s)},
              {"phone", always, u"03 5550 0061"_s},
              {"fax", always, u"03 5550 0062"_s}});
    quote.add({{"excess", always, step.parameters.value(u"excess"_s, u"0"_s)},
               {"customerContribution", always, step.parameters.value(u"contribution"_s, u"0"_s)},
               {"assessmentComment", always, step.parameters.value(u"comment"_s, u"Authorised as assessed."_s)},
               {"authorisedAmount", always, numberText(body.total())}});
    body.writeTo(quote.add("quoteBody"));
}

void writeAdjusted(const Branch& quote, const Step& step, const Matter& matter, Dice& dice)
{
    quote.add(
        {{"kestAdjustedQuoteNumber", always, matter.authorised},
         {"kestOriginalQuoteNumber", always, matter.network},
         {"quoteRequestNumber", always, matter.request},
         {"assessmentComment", always, step.parameters.value(u"comment"_s, u"Please see the suggested changes."_s)}});
    assessedBody(matter.document, changesOf(step), dice).writeTo(quote.add("quoteBody"));
}

/// Writes a quote that returns to the shop, with its request and its vehicle.
void writeQuote(const Branch& quote, const Matter& matter, const AssessedBody& body)
{
    quote.add({{"kestQuoteNumber", always, matter.network},
               filled("quoteRequestNumber", matter.request),  // an empty number would hold back other messages
               {"claimNumber", always, matter.claim},
               {"vehicleRegistration", always, matter.rego},
               {"vehicleDescription", always, matter.vehicle}});
    body.writeTo(quote.add("quoteBody"));
}

AssessedBody manualBodyOf(const Step& step, const Matter& matter, Dice& dice)
{
    const int counts[] = {step.number(u"labour"_s, 2), step.number(u"paint"_s, 1), step.number(u"parts"_s, 1),
                          step.number(u"sublet"_s)};
    const QString reference =
        matter.quote.number.isEmpty() ? u"MANQ"_s : matter.quote.fullReference();  // any word that is not a number
    return manualBody(reference, step.parameters.value(u"type"_s, u"R"_s), counts, dice);
}

void writeMarker(const Branch& mail, const Step& step, const Matter& matter)
{
    mail.add(
        {{"mailtype", always, u"MDMSG"_s},
         {"action", always, step.parameters.value(u"action"_s, u"DELDUPE"_s)},
         {"qtnno", always, matter.quote.number},
         {"subquote", always, matter.quote.subquote},
         {"rego", always, matter.rego},
         {"body", always,
          step.parameters.value(u"text"_s, u"Quote %1 was sent twice. The second document was not passed on."_s.arg(
                                               matter.quote.reference()))}});
}

void write(const Branch& root, const Step& step, const Matter& matter, Dice& dice, const QDate& today)
{
    const auto reason = [&](const QString& otherwise) { return step.parameters.value(u"reason"_s, otherwise); };
    switch (step.act) {
        case Act::Request:
            return writeRequest(root, step, matter, dice, today);
        case Act::Respond:
            return root.add({{"kestQuoteNumber", always, matter.network},
                             {"quoteSubmissionStatus", always, step.parameters.value(u"status"_s, u"Submitted"_s)}});
        case Act::Match:
        case Act::Waive:
            return writeQuote(root, matter, sameBody(matter.document));
        case Act::Authorise:
            return writeAuthorised(root, step, matter, dice, today);
        case Act::Adjust:
            return writeAdjusted(root, step, matter, dice);
        case Act::Revise:
            return root.add({{"quoteRequestNumber", always, matter.request},
                             {"quoteRequestVersionNumber", always, matter.version},
                             {"comments", always, reason(u"Please check the labour on the panels."_s)}});
        case Act::Delete:
            return root.add({{"kestQuoteNumber", always, matter.network},
                             {"reason", always, reason(u"Quoted on the wrong vehicle"_s)}});
        case Act::Cancel:
            return root.add({{"quoteRequestNumber", always, matter.request},
                             {"qrCancellationReason", always, reason(u"Claim withdrawn by the owner"_s)}});
        case Act::Reinstate:
        case Act::BackOut:
            return root.add("kestQuoteRequestNumber", matter.request);
        case Act::Reject:
            return root.add({{"kestOriginalQuoteNumber", always, matter.network},
                             filled("kestQuoteRequestNumber", matter.request),
                             {"reasonCode", always, reason(u"LABR"_s)}});
        case Act::Manual:
            return writeQuote(root, matter, manualBodyOf(step, matter, dice));
        case Act::Marker:
            return writeMarker(root, step, matter);
    }
}

}  // namespace

QString messageCode(Act act)
{
    return headOf(act).code;
}

QString messageText(const Step& step, const Matter& matter, Dice& dice, const QDate& today)
{
    xml::Document document;
    const MessageHead& head = headOf(step.act);
    const Branch root(document, head.root.data(), step.act == Act::Marker ? QString() : GetNamespaceURI());
    if (step.act != Act::Marker && step.act != Act::Respond)
        root.addOutside("messageType", head.code);
    write(root, step, matter, dice, today);
    return document.xml();
}

}  // namespace kest::app
