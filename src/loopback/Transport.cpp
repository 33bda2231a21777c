#include "loopback/Transport.h"

#include "base/Helpers.h"
#include "messages/Envelope.h"
#include "messages/MessageTypes.h"
#include "platform/RuntimeError.h"
#include "platform/files/CodePage.h"
#include "platform/files/files.h"
#include "platform/xml/xml.h"
#include "setup/DemoShop.h"

#include <QDateTime>
#include <QFileInfo>

#include <algorithm>

namespace kest::app {

using namespace Qt::StringLiterals;

namespace {

Dealing dealingOf(const Rule& rule)
{
    Dealing dealing;
    dealing.facts = rule.parameters;
    for (const Step& step : rule.steps)
        dealing.steps.append(step.text);
    dealing.origin = u"%1, line %2"_s.arg(Transport::rulesName).arg(rule.line);
    return dealing;
}

/// Returns where the next step comes from, such as "insurer.rules, line 7, quote 1004, waive".
QString nameOf(const Dealing& dealing)
{
    QStringList parts(dealing.origin);
    if (dealing.facts.contains(u"quote"_s))
        parts.append(u"quote "_s + NormaliseQuoteRef(dealing.facts[u"quote"_s]));
    parts.append(dealing.steps.first());
    parts.removeAll({});
    return parts.join(u", "_s);
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
            return !matter.quote.isMain();  // after a rejection, a main quote is closed
        default:
            return false;
    }
}

bool concernsWholeRequest(Act act)
{
    return act == Act::Revise || act == Act::Reinstate || act == Act::BackOut;
}

Photograph photographOf(const Matter& matter, int id, Dice& dice)
{
    static const std::array colours{QColor(52, 86, 160), QColor(190, 194, 200), QColor(150, 40, 44)};
    static const std::array views{u"whole side"_s, u"damage from the left"_s, u"damage from above"_s};
    return {matter.rego + u"  "_s + views[size_t(id - 1) % views.size()],
            colours[size_t(matter.request.right(1).toInt()) % colours.size()], (10 + dice.below(80)) / 100.0};
}

}  // namespace

Transport::Transport(TransportFolders all) : folders(std::move(all)) {}

Carry Transport::carry(const QDate& date)
{
    result = {};
    today = date;
    if (!tried(rulesName, stampOf(folders.own + rulesName), [&] { readRules(); }) ||
        !tried(stateName, stampOf(folders.own + stateName), [&] { readState(); }))
        return result;

    finishMoving();
    rememberAnswers();
    beginStarts();
    takeDocuments();
    for (qsizetype i = 0; i < known->dealings.size(); ++i)
        if (const Dealing& dealing = known->dealings[i]; !dealing.steps.isEmpty())
            tried(nameOf(dealing), {}, [&] { advance(i); });
    known->dealings.removeIf([](const Dealing& dealing) { return dealing.steps.isEmpty(); });
    tried(stateName, {}, [&] { save(); });
    return result;
}

/// Returns a text that changes when the file does.
QString Transport::stampOf(const QString& path)
{
    const QFileInfo file(files::systemPath(path));
    return QString::number(file.size()) + u' ' + file.lastModified().toString(Qt::ISODateWithMs);
}

bool Transport::tried(const QString& subject, const QString& stamp, const std::function<void()>& step)
{
    try {
        step();
        said.remove(subject);
        return true;
    } catch (const RuntimeError& error) {
        const QString told = stamp + error.description();
        if (said.value(subject) != told)
            for (const QString& why : error.description().split(u'\n'))
                result.faults.append(subject + u": "_s + why);
        said[subject] = told;
        return false;
    }
}

void Transport::readRules()
{
    const QString file = folders.own + rulesName;
    rules = files::exists(file) ? parsedRules(QString::fromUtf8(files::readBytes(file))) : InsurerRules();
}

/// Reads the state when it is not yet known. Deleting the state file resets the transport.
void Transport::readState()
{
    const QString file = folders.own + stateName;
    if (known && (stored.isEmpty() || files::exists(file)))
        return;
    known = files::exists(file) ? TransportState::parsed(files::readBytes(file)) : TransportState();
    stored.clear();
}

void Transport::save()
{
    const QByteArray text = known->text();
    if (text == stored)
        return;
    files::writeBytes(folders.own + stateName, text);
    stored = text;
}

void Transport::beginStarts()
{
    QStringList stated;  // a list, because a rule that is written twice is done twice
    for (const Rule& rule : rules.rules) {
        if (rule.occasion != Occasion::Start)
            continue;
        stated.append(rule.text());
        if (known->started.count(rule.text()) >= stated.count(rule.text()))
            continue;
        known->started.append(rule.text());
        known->dealings.append(dealingOf(rule));
    }
}

void Transport::takeDocuments()
{
    for (const QString& name : files::list(folders.unsent, u"*.xml"_s))
        tried(name, stampOf(folders.unsent + name), [&] {
            if (name.startsWith("I_"_L1))
                takeImage(name);
            else
                takeQuote(name);
        });
}

void Transport::takeQuote(const QString& name)
{
    const QuoteDocument quote = quoteDocument(files::read(folders.unsent + name));
    if (files::exists(folders.sent + name))
        throw RuntimeError(FileExists, u"a document of this name has already been sent"_s);
    const bool begun = std::any_of(known->dealings.begin(), known->dealings.end(),
                                   [&](const Dealing& dealing) { return dealing.document == name; });
    if (!begun) {
        begin(quote, name);
        save();  // before the document moves: if the program stops in between, the answer must not be lost
    }
    files::move(folders.unsent + name, folders.sent + name);
    result.carried.append({Carried::Direction::Out, name, u"Quote "_s + quote.key.reference()});
}

void Transport::begin(const QuoteDocument& quote, const QString& name)
{
    // the new document replaces the steps that remain for an earlier one of the quote
    known->dealings.removeIf([&](const Dealing& dealing) {
        return dealing.document.isEmpty() && dealing.facts.value(u"quote"_s) == quote.key.fullReference();
    });

    const int time = known->insurer.documentArrived(quote);
    const QString request = quote.request.isEmpty() ? requestOf(quote.key.number) : quote.request;
    const Rule* rule = rules.ruleFor(quote.key, request, time);
    Dealing dealing = rule ? dealingOf(*rule) : Dealing();
    if (dealing.facts.contains(u"claim"_s))
        known->insurer.setClaim(quote.key, dealing.facts[u"claim"_s]);
    dealing.facts[u"quote"_s] = quote.key.fullReference();
    dealing.document = name;
    if (dealing.steps.isEmpty() || parsedStep(dealing.steps.first()).act != Act::Respond)
        dealing.steps.prepend(u"respond wait=0"_s);  // the answer does not wait, even if the rule does
    known->dealings.append(dealing);
}

/// Moves a picture and its document together. If one of them is missing, the other waits.
void Transport::takeImage(const QString& name)
{
    const QString stem = name.chopped(3);
    const QStringList all = files::list(folders.unsent);
    const auto picture = std::find_if(all.begin(), all.end(), [&](const QString& file) {
        return file.compare(stem + u"jpg"_s, Qt::CaseInsensitive) == 0;
    });
    if (picture == all.end())
        return;
    xml::Document document;
    if (!document.loadXML(files::read(folders.unsent + name)))
        throw RuntimeError(TypeMismatch, u"it is not XML: "_s + document.parseError().reason.simplified());
    known->moving = {*picture, name};
    save();
    finishMoving();
}

void Transport::finishMoving()
{
    for (const QString& name : QStringList(known->moving)) {
        const bool moved = tried(name, stampOf(folders.unsent + name), [&] {
            if (!files::exists(folders.unsent + name))
                return;
            files::move(folders.unsent + name, folders.sent + name);
            result.carried.append({Carried::Direction::Out, name, u"Image"_s});
        });
        if (moved)
            known->moving.removeAll(name);
    }
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
    InsurerMemory& insurer = known->insurer;
    Matter matter = insurer.matterOf(step, documents());
    insurer.complete(step, matter, rules.seed);
    if (takesAnswersAway(step, matter))
        removeAnswers(step, matter);
    if (step.act == Act::Request)
        putPictures(step, matter);
    dealing.message = sendMessage(step, matter);
    insurer.remember(step, matter);
    if (step.namesRequest())
        dealing.facts[u"request"_s] = matter.request;
}

void Transport::put(const QString& name, const QByteArray& bytes, const QString& what)
{
    files::writeBytes(files::pathForWriting(folders.unread, name), bytes);
    result.carried.append({Carried::Direction::In, name, what});
}

void Transport::putPictures(const Step& step, const Matter& matter)
{
    Dice chance = known->insurer.dice(rules.seed);
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
    Dice chance = known->insurer.dice(rules.seed);
    const QByteArray bytes = files::toCodePage(messageText(step, matter, chance, today));
    if (step.act == Act::Respond) {
        const QString name =
            u"R_%1_%2_%3.xml"_s.arg(matter.quote.number, matter.quote.subquote, nameable(matter.network));
        put(name, bytes, u"Answer to quote "_s + matter.quote.reference());
        return {};
    }
    const QString code = messageCode(step.act);
    const QString about =
        matter.quote.number.isEmpty() ? u"request "_s + matter.request : u"quote "_s + matter.quote.reference();
    const QString type = step.act == Act::Marker ? u"Marker"_s : messageTypeName(code);
    QString name;
    do {
        // the list shows them in the order of sending, after messages whose names begin with a type
        name = u"WEB_%1_%2_%3.xml"_s.arg(++known->insurer.messages, 6, 10, QChar(u'0'))
                   .arg(code, nameable(about.section(u' ', 1)));
    } while (files::exists(folders.unread + name) && files::readBytes(folders.unread + name) != bytes);
    put(name, bytes, type + u", "_s + about);
    return name;
}

/// Remembers the network's numbers in answers that this transport has not sent, such as those of a new demo shop.
void Transport::rememberAnswers()
{
    for (const QString& file : files::list(folders.unread, u"R_*.xml"_s)) {
        const QuoteKey quote = QuoteKey::fromResponseName(file);
        if (quote.number.isEmpty() || quote.subquote.isEmpty() || known->insurer.knowsNetworkNumber(quote))
            continue;
        tried(file, stampOf(folders.unread + file), [&] {
            QString text = files::read(folders.unread + file);
            known->insurer.setNetworkNumber(quote, parsedMessage(text).textOf(u"rootns:kestQuoteNumber"_s));
        });
    }
}

void Transport::removeAnswers(const Step& step, const Matter& matter)
{
    for (const QString& file : files::list(folders.unread, u"R_*.xml"_s)) {
        const QuoteKey answered = QuoteKey::fromResponseName(file);
        if (answered == matter.quote ||
            (concernsWholeRequest(step.act) && requestOf(answered.number) == matter.request))
            files::remove(folders.unread + file);
    }
}

QString Transport::requestOf(const QString& quoteNumber) const
{
    return known->insurer.requestOf(quoteNumber, documents());
}

InsurerMemory::Documents Transport::documents() const
{
    return [this](const QuoteKey& quote) { return newestDocument(quote); };
}

std::optional<QuoteDocument> Transport::newestDocument(const QuoteKey& quote) const
{
    const QString start = quote.filePrefix();
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
