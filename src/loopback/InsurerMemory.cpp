#include "loopback/InsurerMemory.h"

#include "platform/RuntimeError.h"

#include <algorithm>
#include <tuple>

namespace kest::app {

using namespace Qt::StringLiterals;

namespace {

constexpr qint64 firstNumber = 600'000;  // six digits, like the network's own numbers
constexpr quint32 numberSpread = 300'000;

[[noreturn]] void fail(const QString& why)
{
    throw RuntimeError(TypeMismatch, why);
}

enum Fact : unsigned {
    DocumentFact = 1,
    RequestFact = 2,
    NetworkFact = 4,
    ClaimFact = 8,
    VehicleFact = 16,
    AuthorityFact = 32
};

/// The facts that a message requires, and those that the insurer makes up if they are unknown.
struct Completion {
    unsigned needed;
    unsigned given;
};

Completion completionOf(Act act)
{
    switch (act) {
        case Act::Request:
            return {0, RequestFact | ClaimFact};
        case Act::Respond:
            return {0, NetworkFact};
        case Act::Match:
            return {DocumentFact | ClaimFact, RequestFact | NetworkFact};
        case Act::Authorise:
            return {DocumentFact | RequestFact | NetworkFact | ClaimFact, AuthorityFact};
        case Act::Adjust:
            return {DocumentFact | RequestFact | NetworkFact, AuthorityFact};
        case Act::Revise:
        case Act::Cancel:
        case Act::Reinstate:
        case Act::BackOut:
            return {RequestFact, 0};
        case Act::Delete:
        case Act::Reject:
            return {NetworkFact, 0};
        case Act::Waive:
            return {DocumentFact, 0};
        case Act::Manual:
            return {VehicleFact, RequestFact | NetworkFact | ClaimFact};
        case Act::Marker:
            break;
    }
    return {0, 0};
}

}  // namespace

int InsurerMemory::documentArrived(const QuoteDocument& quote)
{
    Parameters& known = quotes[quote.key.fullReference()];
    const int count = known.value(u"documents"_s).toInt() + 1;
    known[u"documents"_s] = QString::number(count);
    if (!quote.request.isEmpty())
        known[u"request"_s] = quote.request;
    return count;
}

void InsurerMemory::setClaim(const QuoteKey& quote, const QString& claim)
{
    quotes[quote.fullReference()][u"claim"_s] = claim;
}

void InsurerMemory::setNetworkNumber(const QuoteKey& quote, const QString& number)
{
    quotes[quote.fullReference()][u"network"_s] = number;
}

bool InsurerMemory::knowsNetworkNumber(const QuoteKey& quote) const
{
    return quotes.value(quote.fullReference()).contains(u"network"_s);
}

QString InsurerMemory::requestOf(const QString& quoteNumber, const Documents& documents) const
{
    const QuoteKey mainQuote{quoteNumber};
    const QString remembered = quotes.value(mainQuote.fullReference()).value(u"request"_s);
    if (!remembered.isEmpty())
        return remembered;
    const std::optional<QuoteDocument> document = documents(mainQuote);
    return document ? document->request : QString();
}

Matter InsurerMemory::matterOf(const Step& step, const Documents& documents) const
{
    const auto told = [&](const QString& name) { return step.parameters.value(name); };
    Matter matter;
    if (const auto named = quoteNamed(told(u"quote"_s)))
        matter.quote = *named;
    if (const std::optional<QuoteDocument> document = documents(matter.quote))
        matter.document = *document;
    matter.request = told(u"request"_s);
    if (matter.request.isEmpty() && !matter.quote.number.isEmpty())
        matter.request = requestOf(matter.quote.number, documents);

    const Parameters quote = quotes.value(matter.quote.fullReference());
    const Parameters mainQuote = quotes.value(QuoteKey{matter.quote.number}.fullReference());
    const Parameters request = requests.value(matter.request);
    const auto firstOf = [](std::initializer_list<QString> texts) {
        const auto found = std::find_if(texts.begin(), texts.end(), [](const QString& t) { return !t.isEmpty(); });
        return found == texts.end() ? QString() : *found;
    };
    matter.claim = firstOf(
        {told(u"claim"_s), quote[u"claim"_s], mainQuote[u"claim"_s], request[u"claim"_s], matter.document.claim});
    matter.rego = firstOf({told(u"rego"_s), matter.document.rego, request[u"rego"_s]});
    matter.vehicle = firstOf({told(u"vehicle"_s), matter.document.vehicle, request[u"vehicle"_s]});
    matter.version = firstOf({told(u"version"_s), request[u"version"_s], matter.document.version});
    matter.network = firstOf({told(u"network"_s), quote[u"network"_s]});
    return matter;
}

void InsurerMemory::complete(const Step& step, Matter& matter, quint32 seed)
{
    if (step.act == Act::Request) {
        Dice chance = dice(seed);
        matter = {};
        matter.request = step.parameters.value(u"number"_s);
        matter.version = step.parameters.value(u"version"_s, u"1"_s);
        matter.claim = step.parameters.value(u"claim"_s);
        matter.rego = step.parameters.value(u"rego"_s, u"KST%1"_s.arg(100 + chance.below(900)));
        matter.vehicle = step.parameters.value(u"vehicle"_s, u"Corella Meridian"_s);
    } else if (step.act == Act::Respond) {
        matter.network = step.parameters.value(u"network"_s);  // each send gets a new number
    } else if (step.act == Act::Revise && !step.parameters.contains(u"version"_s)) {
        matter.version = QString::number(matter.version.toInt() + 1);
    }

    const auto [needed, given] = completionOf(step.act);
    if (needed & DocumentFact && matter.document.key.number.isEmpty())
        fail(u"the folder of sent quotes has no document of quote %1"_s.arg(matter.quote.reference()));
    const std::tuple<unsigned, QString&, QString, QString> facts[] = {
        {RequestFact, matter.request, u"the request"_s, u"request"_s},
        {NetworkFact, matter.network, u"the network's number of the quote"_s, u"network"_s},
        {ClaimFact, matter.claim, u"the claim"_s, u"claim"_s},
        {VehicleFact, matter.rego, u"the vehicle"_s, u"rego"_s},
        {AuthorityFact, matter.authorised, {}, {}},
    };
    for (const auto& [fact, value, what, parameter] : facts) {
        if (value.isEmpty() && needed & fact)
            fail(u"%1 is not known; give it with %2="_s.arg(what, parameter));
        if (value.isEmpty() && given & fact)
            value = QString::number(firstNumber + seed % numberSpread + ++numbers);
    }
}

void InsurerMemory::remember(const Step& step, const Matter& matter)
{
    const QString quote = matter.quote.fullReference();
    if (step.namesRequest()) {
        requests[matter.request] = {{u"claim"_s, matter.claim},
                                    {u"rego"_s, matter.rego},
                                    {u"vehicle"_s, matter.vehicle},
                                    {u"version"_s, matter.version}};
    }
    if (step.act == Act::Match)
        quotes[quote][u"request"_s] = matter.request;
    if (step.act == Act::Match || step.act == Act::Respond)
        quotes[quote][u"network"_s] = matter.network;
    if (step.act == Act::Revise)
        requests[matter.request][u"version"_s] = matter.version;
    if (step.act == Act::Revise || step.act == Act::Delete)
        quotes[quote].remove(u"network"_s);  // the shop sends the quote again and gets another number
}

}  // namespace kest::app
