#include "loopback/Transport.h"

#include "base/Helpers.h"
#include "platform/RuntimeError.h"
#include "platform/files/files.h"
#include "platform/xml/xml.h"

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
    result.carried.append({Carried::Direction::Out, name, u"Quote "_s + NormaliseQuoteRef(quote.reference())});
}

void Transport::begin(const QuoteDocument& quote, const QString& name)
{
    // the new document replaces the steps that remain for an earlier one of the quote
    known->dealings.removeIf([&](const Dealing& dealing) {
        return dealing.document.isEmpty() && dealing.facts.value(u"quote"_s) == quote.reference();
    });

    Parameters& memory = known->quotes[quote.reference()];
    const int time = memory.value(u"documents"_s).toInt() + 1;
    memory[u"documents"_s] = QString::number(time);
    if (!quote.request.isEmpty())
        memory[u"request"_s] = quote.request;

    const QString request = quote.request.isEmpty() ? requestOf(quote.quote) : quote.request;
    const Rule* rule = rules.ruleFor(quote.quote, quote.subquote, request, time);
    Dealing dealing = rule ? dealingOf(*rule) : Dealing();
    if (dealing.facts.contains(u"claim"_s))
        memory[u"claim"_s] = dealing.facts[u"claim"_s];
    dealing.facts[u"quote"_s] = quote.reference();
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

}  // namespace kest::app
