#include "platform/script/Script.h"

#include "platform/RuntimeError.h"
#include "platform/desktop/Programs.h"
#include "platform/script/Gestures.h"
#include "platform/script/Refusal.h"

#include <QScopeGuard>

#include <cstdio>

namespace kest::desktop {

using namespace Qt::StringLiterals;

namespace {

[[noreturn]] void wrongForm(const QString& place, const QString& what)
{
    throw RuntimeError(TypeMismatch, u"The script is wrong at %1: %2"_s.arg(place, what));
}

void allowKeys(const QJsonObject& object, const QStringList& allowed, const QString& place)
{
    for (const QString& key : object.keys())
        if (!allowed.contains(key))
            wrongForm(place, u"\"%1\" is unknown here"_s.arg(key));
}

QString word(Icon icon)
{
    switch (icon) {
        case Icon::Information:
            return u"information"_s;
        case Icon::Question:
            return u"question"_s;
        case Icon::Exclamation:
            return u"exclamation"_s;
        case Icon::Critical:
            return u"critical"_s;
        case Icon::None:
            break;
    }
    return u"none"_s;
}

QString word(Answer answer)
{
    return answer == Answer::Ok ? u"ok"_s : answer == Answer::Yes ? u"yes"_s : u"no"_s;
}

Answer answerOf(const QString& word, const Box& box)
{
    const bool isQuestion = box.buttons == Buttons::YesNo;
    if (isQuestion && word == u"yes")
        return Answer::Yes;
    if (isQuestion && word == u"no")
        return Answer::No;
    if (!isQuestion && word == u"ok")
        return Answer::Ok;
    throw NeedsAnswer(u"the script answers \"%1\", which this box does not offer: %2"_s.arg(word, box.text));
}

template <class Replies>
auto replyTo(const Replies& replies, const QString& text)
{
    return std::ranges::find_if(replies, [&](const auto& reply) { return text.contains(reply.text); });
}

void print(const Box& box)
{
    const QString title = box.title.isEmpty() ? defaultTitle() : box.title;
    const QString line = u"[%1] %2: %3\n"_s.arg(word(box.icon), title, box.text);
    std::fputs(line.toLocal8Bit().constData(), stderr);
}

}  // namespace

Script::Script(const QJsonObject& script)
    : boxReplies(parseReplies(script, u"boxes"_s)), inputReplies(parseReplies(script, u"inputs"_s))
{
    allowKeys(script, {u"boxes"_s, u"inputs"_s, u"windows"_s}, u"the top"_s);
    for (const Reply& reply : std::as_const(boxReplies))
        if (!QStringList{u"ok"_s, u"yes"_s, u"no"_s}.contains(reply.answer))
            wrongForm(u"boxes"_s, u"an answer is \"ok\", \"yes\" or \"no\", not \"%1\""_s.arg(reply.answer));
    const QJsonValue windows = script.value(u"windows"_s);
    if (!windows.isUndefined() && !windows.isObject())
        wrongForm(u"windows"_s, u"an object of window names is needed"_s);
    parseWindows(windows.toObject());
}

QList<Script::Reply> Script::parseReplies(const QJsonObject& script, const QString& key)
{
    const QJsonValue list = script.value(key);
    if (!list.isUndefined() && !list.isArray())
        wrongForm(key, u"a list is needed"_s);
    QList<Reply> replies;
    for (const QJsonValue entry : list.toArray()) {
        const QJsonObject reply = entry.toObject();
        if (!reply.value(u"text"_s).isString() || !reply.value(u"answer"_s).isString())
            wrongForm(key, u"each entry has a \"text\" and an \"answer\""_s);
        allowKeys(reply, {u"text"_s, u"answer"_s}, key);
        replies.append({reply.value(u"text"_s).toString(), reply.value(u"answer"_s).toString()});
    }
    return replies;
}

void Script::parseWindows(const QJsonObject& windows)
{
    for (const QString& name : windows.keys()) {
        const QJsonArray list = windows.value(name).toArray();
        if (list.isEmpty())
            wrongForm(name, u"a list of visits is needed"_s);
        for (const QJsonValue entry : list) {
            if (!entry.isArray())
                wrongForm(name, u"a visit is a list of steps"_s);
            Visit visit;
            for (const QJsonValue step : entry.toArray())
                visit.append(parseStep(step, u"The script is wrong at %1, visit %2, step %3"_s.arg(name)
                                                 .arg(visits[name].size() + 1)
                                                 .arg(visit.size() + 1)));
            visits[name].append(visit);
        }
    }
}

void Script::recordAndClose(const QString& windowName)
{
    recordedAndClosed.insert(windowName);
}

Answer Script::box(const Box& box)
{
    throwKept();
    print(box);
    const auto reply = replyTo(boxReplies, box.text);
    const Answer answer = reply == boxReplies.end() ? box.defaultAnswer : answerOf(reply->answer, box);
    record_.boxes.append(QJsonObject{{u"icon"_s, word(box.icon)},
                                     {u"title"_s, box.title},
                                     {u"text"_s, box.text},
                                     {u"buttons"_s, box.buttons == Buttons::YesNo ? u"yesno"_s : u"ok"_s},
                                     {u"default"_s, word(box.defaultAnswer)},
                                     {u"answer"_s, word(answer)}});
    return answer;
}

QString Script::input(const Input& input)
{
    throwKept();
    const auto reply = replyTo(inputReplies, input.prompt);
    const QString answer = reply == inputReplies.end() ? QString() : reply->answer;
    record_.inputs.append(QJsonObject{{u"title"_s, input.title}, {u"prompt"_s, input.prompt}, {u"answer"_s, answer}});
    return answer;
}

void Script::start(const QString& path)
{
    throwKept();
    startDetached(path);
}

bool Script::drive(QDialog& window)
{
    const QString name = window.objectName();
    if (!visits.contains(name) && !recordedAndClosed.contains(name))
        throw NeedsAnswer(u"the window %1 was to be shown, and the script has no visit for it"_s.arg(name));

    const auto hide = qScopeGuard([&window] { window.hide(); });
    window.setModal(true);
    window.show();
    gestures::activate(window);
    throwKept();
    if (visits.contains(name))
        carryOut(window, nextVisit(name));
    if (window.isVisible())
        window.close();
    throwKept();
    if (window.isVisible())
        throw NeedsAnswer(u"the window %1 was still open after its last step and refused to close"_s.arg(name));
    return true;
}

const Script::Visit& Script::nextVisit(const QString& window)
{
    const QList<Visit>& all = *visits.constFind(window);
    const qsizetype showing = showings[window]++;
    return all[std::min(showing, all.size() - 1)];
}

void Script::carryOut(QDialog& window, const Visit& visit)
{
    for (qsizetype at = 0; at < visit.size(); ++at) {
        gestures::activate(window);
        throwKept();
        try {
            const QJsonObject reading = visit[at].run(window);
            if (!reading.isEmpty())
                record_.reads.append(reading);
        } catch (const Refusal& refusal) {
            throwKept();
            throw NeedsAnswer(
                u"%1, step %2 %3: %4"_s.arg(window.objectName()).arg(at + 1).arg(visit[at].description, refusal.why));
        }
        gestures::settle();
        throwKept();
    }
}

void useScript(std::shared_ptr<Script> script)
{
    setAnswerer(script);
    setWindowDriver(std::move(script));
}

Script* currentScript()
{
    return dynamic_cast<Script*>(answerer().get());
}

}  // namespace kest::desktop
