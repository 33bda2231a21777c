// The insurer's side of the transport: what it knows about a quote, and the messages that it sends.
#include "base/Helpers.h"
#include "loopback/Transport.h"
#include "messages/Envelope.h"
#include "messages/MessageTypes.h"
#include "platform/RuntimeError.h"
#include "platform/files/files.h"
#include "setup/DemoShop.h"

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

QString keyOf(const QString& quote, const QString& subquote)
{
    return quote + u'/' + subquote;
}

/// Returns the quote and subquote that an answer is for, which the component takes from the file's name.
std::pair<QString, QString> answered(const QString& file)
{
    const qsizetype end = file.indexOf(u'_', 2);
    return end < 0 ? std::pair(QString(), QString()) : std::pair(file.sliced(2, end - 2), file.mid(end + 1, 1));
}

/// Returns the characters of a number that a file name may contain. Numbers come from documents and rules.
QString nameable(const QString& text)
{
    QString result;
    for (const QChar c : text.left(20))
        result += c.isLetterOrNumber() || c == u'-' ? c : u'.';
    return result;
}

/// Returns true if the old answer to the quote must be removed first, because the step returns the quote to the shop or
/// answers it again. At every fill, the component applies all answers in the folder and would lock the quote again.
bool takesAnswersAway(const Step& step, const Matter& matter)
{
    switch (step.act) {
        case Act::Respond:
        case Act::Revise:
        case Act::Delete:
        case Act::Reinstate:
        case Act::BackOut:
            return true;
        case Act::Reject:
            return matter.subquote != "0"_L1;  // after a rejection, a main quote is closed
        default:
            return false;
    }
}

bool concernsWholeRequest(Act act)
{
    return act == Act::Revise || act == Act::Reinstate || act == Act::BackOut;
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

Photograph photographOf(const Matter& matter, int id, Dice& dice)
{
    static const std::array colours{QColor(52, 86, 160), QColor(190, 194, 200), QColor(150, 40, 44)};
    static const std::array views{u"whole side"_s, u"damage from the left"_s, u"damage from above"_s};
    return {matter.rego + u"  "_s + views[size_t(id - 1) % views.size()],
            colours[size_t(matter.request.right(1).toInt()) % colours.size()], (10 + dice.below(80)) / 100.0};
}

}  // namespace

QString Transport::draw()
{
    return QString::number(firstNumber + rules.seed % numberSpread + ++known->numbers);
}

Dice Transport::dice() const
{
    return {rules.seed, quint32(known->messages)};
}

void Transport::advance(qsizetype index)
{
    Dealing dealing = known->dealings[index];
    if (!dealing.document.isEmpty() && !files::exists(folders.sent + dealing.document))
        return;  // it has not been sent yet
    if (!dealing.message.isEmpty() && files::exists(folders.unread + dealing.message))
        return;  // the shop has not dealt with it
    dealing.document.clear();

    Step step = parsedStep(dealing.steps.first());
    Parameters parameters = dealing.facts;
    parameters.insert(step.parameters);
    step.parameters = parameters;

    const TransportState before = *known;
    try {
        if (dealing.waited++ >= step.number(u"wait"_s)) {
            perform(step, dealing);
            dealing.steps.removeFirst();
            dealing.waited = 0;
        }
        known->dealings[index] = dealing;
        save();
    } catch (const RuntimeError&) {
        *known = before;  // so that the next attempt uses the same numbers
        throw;
    }
}

void Transport::perform(const Step& step, Dealing& dealing)
{
    Matter matter = matterOf(step);
    complete(step, matter);
    if (takesAnswersAway(step, matter))
        removeAnswers(step, matter);
    if (step.act == Act::Request)
        putPictures(step, matter);
    dealing.message = sendMessage(step, matter);
    remember(step, matter, dealing);
}

Matter Transport::matterOf(const Step& step) const
{
    const auto told = [&](const QString& name) { return step.parameters.value(name); };
    Matter matter;
    if (const auto named = quoteNamed(told(u"quote"_s)))
        std::tie(matter.quote, matter.subquote) = *named;
    const std::optional<QuoteDocument> document = newestDocument(matter.quote, matter.subquote);
    if (document)
        matter.document = *document;
    matter.request = told(u"request"_s);
    if (matter.request.isEmpty() && !matter.quote.isEmpty())
        matter.request = requestOf(matter.quote);

    const Parameters quote = known->quotes.value(keyOf(matter.quote, matter.subquote));
    const Parameters mainQuote = known->quotes.value(keyOf(matter.quote, u"0"_s));
    const Parameters request = known->requests.value(matter.request);
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

/// Fills in the unknown facts of a message. Throws RuntimeError if one is missing that the insurer can't make up.
void Transport::complete(const Step& step, Matter& matter)
{
    if (step.act == Act::Request) {
        Dice chance = dice();
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
    if (needed & DocumentFact && matter.document.quote.isEmpty())
        fail(u"the folder of sent quotes has no document of quote %1"_s.arg(matter.reference()));
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
            value = draw();
    }
}

void Transport::remember(const Step& step, const Matter& matter, Dealing& dealing)
{
    const QString quote = keyOf(matter.quote, matter.subquote);
    if (step.act == Act::Request || step.act == Act::Match || step.act == Act::Manual) {
        known->requests[matter.request] = {{u"claim"_s, matter.claim},
                                           {u"rego"_s, matter.rego},
                                           {u"vehicle"_s, matter.vehicle},
                                           {u"version"_s, matter.version}};
        dealing.facts[u"request"_s] = matter.request;
    }
    if (step.act == Act::Match)
        known->quotes[quote][u"request"_s] = matter.request;
    if (step.act == Act::Match || step.act == Act::Respond)
        known->quotes[quote][u"network"_s] = matter.network;
    if (step.act == Act::Revise)
        known->requests[matter.request][u"version"_s] = matter.version;
    if (step.act == Act::Revise || step.act == Act::Delete)
        known->quotes[quote].remove(u"network"_s);  // the shop sends the quote again and gets another number
}

void Transport::put(const QString& name, const QByteArray& bytes, const QString& what)
{
    files::writeBytes(files::pathForWriting(folders.unread, name), bytes);
    result.carried.append({Carried::Direction::In, name, what});
}

void Transport::putPictures(const Step& step, const Matter& matter)
{
    Dice chance = dice();
    for (int id = 1; id <= step.number(u"pictures"_s); ++id) {
        const QString stem = matter.request + u'_' + PadZeroLeft(QString::number(id), 3);
        const Photograph photograph = photographOf(matter, id, chance);
        put(stem + u".jpg"_s, jpegOf(photograph), u"Picture"_s);
        put(stem + u".txt"_s, files::toCodePage(photograph.caption), u"Description of a picture"_s);
    }
}

/// Sends the message of a step. Returns its file name, or an empty text for an answer, which the shop leaves in the
/// folder.
QString Transport::sendMessage(const Step& step, const Matter& matter)
{
    Dice chance = dice();
    const QByteArray bytes = files::toCodePage(messageText(step, matter, chance, today));
    if (step.act == Act::Respond) {
        const QString name = u"R_%1_%2_%3.xml"_s.arg(matter.quote, matter.subquote, nameable(matter.network));
        put(name, bytes, u"Answer to quote "_s + matter.reference());
        return {};
    }
    const QString code = messageCode(step.act);
    const QString about = matter.quote.isEmpty() ? u"request "_s + matter.request : u"quote "_s + matter.reference();
    const QString type = step.act == Act::Marker ? u"Marker"_s : messageTypeName(code);
    QString name;
    do {
        // the list shows them in the order of sending, after messages whose names begin with a type
        name = u"WEB_%1_%2_%3.xml"_s.arg(++known->messages, 6, 10, QChar(u'0'))
                   .arg(code, nameable(about.section(u' ', 1)));
    } while (files::exists(folders.unread + name) && files::readBytes(folders.unread + name) != bytes);
    put(name, bytes, type + u", "_s + about);
    return name;
}

/// Remembers the network's numbers in answers that this transport has not sent, such as those of a new demo shop.
void Transport::rememberAnswers()
{
    for (const QString& file : files::list(folders.unread, u"R_*.xml"_s)) {
        const auto [quote, subquote] = answered(file);
        if (quote.isEmpty() || known->quotes.value(keyOf(quote, subquote)).contains(u"network"_s))
            continue;
        tried(file, stampOf(folders.unread + file), [&] {
            QString text = files::read(folders.unread + file);
            known->quotes[keyOf(quote, subquote)][u"network"_s] =
                parsedMessage(text).textOf(u"rootns:kestQuoteNumber"_s);
        });
    }
}

QStringList Transport::answersOf(const QString& quote, const QString& subquote) const
{
    QStringList found;
    for (const QString& file : files::list(folders.unread, u"R_*.xml"_s))
        if (answered(file) == std::pair(quote, subquote))
            found.append(file);
    return found;
}

void Transport::removeAnswers(const Step& step, const Matter& matter)
{
    QStringList old = answersOf(matter.quote, matter.subquote);
    if (concernsWholeRequest(step.act))
        for (const QString& file : files::list(folders.unread, u"R_*.xml"_s))
            if (requestOf(answered(file).first) == matter.request)
                old.append(file);
    old.removeDuplicates();
    for (const QString& file : old)
        files::remove(folders.unread + file);
}

QString Transport::requestOf(const QString& quote) const
{
    const QString remembered = known->quotes.value(keyOf(quote, u"0"_s)).value(u"request"_s);
    if (!remembered.isEmpty())
        return remembered;
    const std::optional<QuoteDocument> document = newestDocument(quote, u"0"_s);
    return document ? document->request : QString();
}

std::optional<QuoteDocument> Transport::newestDocument(const QString& quote, const QString& subquote) const
{
    const QString start = quote + u'.' + subquote + u'_';
    QString newest;
    int highest = -1;
    for (const QString& file : files::list(folders.sent, u"*.xml"_s)) {
        const int number = file.sliced(0, file.size() - 4).mid(start.size()).toInt();
        if (file.startsWith(start, Qt::CaseInsensitive) && number > highest) {
            highest = number;
            newest = file;
        }
    }
    if (newest.isEmpty())
        return {};
    return quoteDocument(files::read(folders.sent + newest));
}

}  // namespace kest::app
