#include "loopback/TransportState.h"

#include "platform/RuntimeError.h"

#include <QJsonArray>
#include <QJsonDocument>
#include <QJsonObject>

namespace kest::app {

using namespace Qt::StringLiterals;

namespace {

QJsonObject toJson(const Parameters& parameters)
{
    QJsonObject object;
    for (auto parameter = parameters.begin(); parameter != parameters.end(); ++parameter)
        object[parameter.key()] = parameter.value();
    return object;
}

Parameters parametersOf(const QJsonValue& value)
{
    Parameters parameters;
    const QJsonObject object = value.toObject();
    for (auto entry = object.begin(); entry != object.end(); ++entry)
        parameters[entry.key()] = entry.value().toString();
    return parameters;
}

QJsonObject toJson(const QMap<QString, Parameters>& entries)
{
    QJsonObject object;
    for (auto entry = entries.begin(); entry != entries.end(); ++entry)
        object[entry.key()] = toJson(entry.value());
    return object;
}

QMap<QString, Parameters> entriesOf(const QJsonValue& value)
{
    QMap<QString, Parameters> entries;
    const QJsonObject object = value.toObject();
    for (auto entry = object.begin(); entry != object.end(); ++entry)
        entries[entry.key()] = parametersOf(entry.value());
    return entries;
}

QStringList textsOf(const QJsonValue& value)
{
    QStringList texts;
    for (const QJsonValue text : value.toArray())
        texts.append(text.toString());
    return texts;
}

QJsonObject toJson(const Dealing& dealing)
{
    return {{u"facts"_s, toJson(dealing.facts)}, {u"steps"_s, QJsonArray::fromStringList(dealing.steps)},
            {u"origin"_s, dealing.origin},       {u"waited"_s, dealing.waited},
            {u"document"_s, dealing.document},   {u"message"_s, dealing.message}};
}

Dealing dealingOf(const QJsonValue& value)
{
    return {parametersOf(value[u"facts"]), textsOf(value[u"steps"]),      value[u"origin"].toString(),
            value[u"waited"].toInt(),      value[u"document"].toString(), value[u"message"].toString()};
}

}  // namespace

TransportState TransportState::parsed(const QByteArray& text)
{
    const QJsonDocument document = QJsonDocument::fromJson(text);
    if (!document.isObject())
        throw RuntimeError(TypeMismatch, u"it can't be read; delete it to start again"_s);
    TransportState state;
    state.insurer.numbers = document[u"numbers"].toInteger();
    state.insurer.messages = document[u"messages"].toInteger();
    state.moving = textsOf(document[u"moving"]);
    state.started = textsOf(document[u"started"]);
    state.insurer.quotes = entriesOf(document[u"quotes"]);
    state.insurer.requests = entriesOf(document[u"requests"]);
    for (const QJsonValue dealing : document[u"dealings"].toArray())
        state.dealings.append(dealingOf(dealing));
    return state;
}

QByteArray TransportState::text() const
{
    QJsonArray ahead;
    for (const Dealing& dealing : dealings)
        ahead.append(toJson(dealing));
    const QJsonObject object{{u"numbers"_s, insurer.numbers},
                             {u"messages"_s, insurer.messages},
                             {u"moving"_s, QJsonArray::fromStringList(moving)},
                             {u"started"_s, QJsonArray::fromStringList(started)},
                             {u"quotes"_s, toJson(insurer.quotes)},
                             {u"requests"_s, toJson(insurer.requests)},
                             {u"dealings"_s, ahead}};
    return QJsonDocument(object).toJson();
}

}  // namespace kest::app
