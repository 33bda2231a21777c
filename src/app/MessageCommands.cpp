#include "app/MessageCommands.h"

#include "base/SharedVariables.h"
#include "messagelist/frmMessageList.h"
#include "messages/Folders.h"
#include "outbound/SendQuote.h"
#include "platform/desktop/Window.h"
#include "platform/files/files.h"
#include "platform/script/Script.h"
#include "shell/eKEST.h"
#include "utilities/FormatXML.h"

#include <QJsonArray>
#include <QLabel>
#include <QPushButton>

#include <algorithm>
#include <optional>

namespace kest::app {

using namespace Qt::StringLiterals;

namespace {

QString rowsAsText(const QList<ListedMessage>& rows)
{
    QString text;
    for (const ListedMessage& message : rows) {
        text += message.file;
        for (const QString& cell : message.row)
            text += u'\t' + cell.simplified();
        text += u'\n';
    }
    return text;
}

QJsonArray rowsAsJson(const QList<ListedMessage>& rows)
{
    static const QString names[] = {u"type"_s, u"rego"_s, u"claim"_s, u"customer"_s, u"quote"_s, u"vehicle"_s};
    QJsonArray array;
    for (const ListedMessage& message : rows) {
        QJsonObject object{{u"file"_s, message.file}};
        for (size_t i = 0; i < message.row.size(); ++i)
            object.insert(names[i], message.row[i]);
        array.append(object);
    }
    return array;
}

std::optional<MessageFolder> folderNamed(const QString& name)
{
    const auto found = std::ranges::find(messageFolders, name, wordOf);
    return found == std::end(messageFolders) ? std::nullopt : std::optional(*found);
}

QJsonArray boxesShown()
{
    return desktop::currentScript()->record().boxes;
}

/// Returns true if a box has been shown since then, not counting boxes that every fill of the list shows again.
bool hasTold(const QJsonArray& before)
{
    const QJsonArray boxes = boxesShown();
    return std::any_of(boxes.begin() + before.size(), boxes.end(),
                       [&](const QJsonValue& box) { return !before.contains(box); });
}

/// Returns the exit code after a click that was refused or failed. If no box has said why, prints a line that does.
int notDone(const frmMessageList& window, const QString& buttonName, const QString& file, const QJsonArray& boxesBefore)
{
    if (hasTold(boxesBefore))
        return Refused;
    const auto* button = window.findChild<QPushButton*>(buttonName);
    const QString caption = u'"' + button->text().remove(u'&') + u'"';
    if (!isBareName(file))
        return refused(file + u" is not the name of a file in the folder"_s, Refused).exitCode;
    if (!button->isEnabled())
        return refused(caption + u" is disabled for "_s + file, Refused).exitCode;
    return refused(caption + u" does nothing with "_s + file, Refused).exitCode;
}

/// Adds why the fill of the list has ended early or values are missing, if so.
Outcome unlessFailed(const frmMessageList& window, Outcome outcome)
{
    if (!window.failure().isEmpty()) {
        outcome.exitCode = refused(window.failure(), Refused).exitCode;
        outcome.fields[u"failure"_s] = window.failure();
    }
    return outcome;
}

}  // namespace

Outcome list(const QStringList& arguments)
{
    const std::optional<MessageFolder> folder = folderNamed(arguments[0]);
    const bool filtered = arguments.size() == 3 && arguments[1] == u"--filter"_s;
    if (!folder || (arguments.size() > 1 && !filtered))
        return refused(u"list takes unread, read or sent, and --filter TEXT"_s, Usage);

    frmMessageList window;
    window.openUnread();
    if (*folder != MessageFolder::Unread) {
        if (filtered)
            desktop::currentScript()->answerInputs(arguments[2]);
        window.chooseFolder(*folder);
        if (filtered && gsListFilter != arguments[2])
            window.updateFilter(arguments[2]);
    }
    return unlessFailed(window,
                        {.fields = {{u"rows"_s, rowsAsJson(window.rows())}}, .text = rowsAsText(window.rows())});
}

Outcome held(const QStringList&)
{
    frmMessageList window;
    window.openUnread();
    QJsonArray messages;
    QString text;
    for (const HeldMessage& message : window.heldMessages()) {
        messages.append(QJsonObject{{u"file"_s, message.file},
                                    {u"type"_s, message.type},
                                    {u"waitsFor"_s, message.waitsFor},
                                    {u"since"_s, message.since.toString(Qt::ISODate)}});
        text += message.file + u'\t' + message.type + u'\t' + message.sinceText() + u'\t' + message.waitsFor + u'\n';
    }
    return unlessFailed(window, {.fields = {{u"held"_s, messages}}, .text = text});
}

Outcome load(const QStringList& arguments)
{
    frmMessageList window;
    window.openUnread();
    const QJsonArray boxes = boxesShown();
    const bool loaded = window.loadFile(arguments[0]);
    if (loaded && files::exists(gsUnreadPath + arguments[0]))
        say(u"kest2: "_s + window.findChild<QLabel*>(u"lblStatus"_s)->text() + u'\n', stderr);
    return {.exitCode = loaded ? Done : notDone(window, u"cmdProcess"_s, arguments[0], boxes),
            .fields = {{u"rows"_s, rowsAsJson(window.rows())}}};
}

Outcome reprint(const QStringList& arguments)
{
    frmMessageList window;
    window.openUnread();
    window.chooseFolder(MessageFolder::Read);
    const QJsonArray boxes = boxesShown();
    const bool printed = window.reprintFile(arguments[0]);
    return {.exitCode = printed ? Done : notDone(window, u"cmdPrint"_s, arguments[0], boxes)};
}

Outcome view(const QStringList& arguments)
{
    const std::optional<MessageFolder> folder = folderNamed(arguments[0]);
    if (!folder)
        return refused(u"view takes unread, read or sent, and a file"_s, Usage);
    if (!isBareName(arguments[1]))
        return refused(arguments[1] + u" is not the name of a file in the folder"_s, Refused);
    const QJsonArray boxes = boxesShown();
    const QString text = FormatXML(pathOf(*folder) + arguments[1]);
    if (text.isEmpty() && !hasTold(boxes))
        return refused(arguments[1] + u" can't be read"_s, Refused);
    return {.exitCode = text.isEmpty() ? Refused : Done, .fields = {{u"text"_s, text}}, .text = text};
}

Outcome send(const QStringList& arguments)
{
    openHostQuote(arguments[0], arguments.value(1, u"0"_s));
    bool sent = false;
    desktop::guarded(u"frmKEST.cmdOK_Click"_s, [&] { SendQuote(*grsQuote, &sent); });
    desktop::throwKept();
    return {.exitCode = sent ? Done : Refused};
}

}  // namespace kest::app
