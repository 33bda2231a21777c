#include "messagelist/Summary.h"

#include "base/Helpers.h"
#include "base/SharedVariables.h"
#include "base/modDBAccess.h"
#include "messages/Envelope.h"
#include "messages/Folders.h"
#include "platform/Prompt.h"
#include "platform/RuntimeError.h"
#include "platform/files/CodePage.h"
#include "platform/files/files.h"

#include <QFileInfo>

#include <algorithm>
#include <map>
#include <utility>

using namespace Qt::StringLiterals;

namespace kest {
namespace {

constexpr qsizetype unaskedFiles = 25;      // for a folder with more files the user is asked for a filter
constexpr qsizetype shortestSentText = 30;  // characters, including the wrapping element

void settleFilter(MessageFolder folder, qsizetype fileCount, const FillHooks& hooks)
{
    if (folder == MessageFolder::Unread) {
        gsListFilter.clear();
        return;
    }
    if (!gsListFilter.isEmpty() || fileCount <= unaskedFiles || gbFilterAsked)
        return;
    gsListFilter =
        desktop::inputBox(u"Enter a Quote Number to search by (Leave blank for all quotes)"_s, u"View KEST Messages"_s);
    EnsureConnection();  // it may have been lost while the box was open
    if (hooks.filterAsked)
        hooks.filterAsked(gsListFilter);
    gbFilterAsked = true;
}

void reportUnreadable(const QString& file)
{
    desktop::msgBox("Message "_L1 + file + " unreadable, Please contact MarlinDesk Support."_L1,
                    desktop::Icon::Critical);
    EnsureConnection();  // it may have been lost while the box was open
}

// Returns the number by which only one message of a request is listed, or null if the message has none.
xml::Node requestNumberOf(const xml::Node& root)
{
    const xml::Node number = root.selectSingleNode(u"rootns:quoteRequestNumber"_s);
    return number ? number : root.selectSingleNode(u"rootns:kestQuoteRequestNumber"_s);
}

// Returns the names of the pictures that a request names, without the ids that are empty.
QStringList picturesOf(const xml::Document& message)
{
    const xml::Node root = message.documentElement();
    QStringList names;
    for (const xml::Node& id : root.selectNodes(u"rootns:quoteRequestImageIds/*"_s))
        if (const QString number = id.text(); !number.isEmpty())
            names.append(root.textOrEmptyOf(u"rootns:quoteRequestNumber"_s) + u'_' + PadZeroLeft(number, 3) +
                         ".jpg"_L1);
    return names;
}

QString missingPictures(const xml::Document& message, const QSet<QString>& unread)
{
    QStringList names = picturesOf(message);
    const bool isNamed = !names.isEmpty();
    names.removeIf([&](const QString& name) { return unread.contains(name.toCaseFolded()); });
    return isNamed ? (names.size() == 1 ? u"the picture "_s : u"the pictures "_s) + names.join(u", "_s)
                   : u"pictures that the request does not name"_s;
}

// Whether a message waits for an earlier one of its request.
struct Precedence {
    bool isHeld = true;     // and stays so if something fails
    QString earlier;        // the file of the earlier message, or empty if there is none
    QString displacedType;  // the type of the earlier message, if this one, a manual quote, has taken its place
};

Precedence precedenceOf(const xml::Document& message, QList<ListedMessage>& listed, const QString& file)
{
    Precedence result;
    attempt([&] {
        const xml::Node number = requestNumberOf(message.documentElement());
        const QString request = number ? number.text() : QString();
        const bool isNamed = !request.trimmed().isEmpty();
        result.earlier = isNamed ? gdicQuoteRequests.value(request) : QString();
        result.isHeld = isNamed && gdicQuoteRequests.contains(request) && message.textOf(u"messageType"_s) != "MANQ"_L1;
        if (!isNamed || result.isHeld)
            return;
        const auto displaced =
            result.earlier.isEmpty() ? listed.end() : std::ranges::find(listed, result.earlier, &ListedMessage::file);
        if (displaced != listed.end()) {
            result.displacedType = displaced->row[0];
            listed.erase(displaced);
        }
        gdicQuoteRequests.insert(request, file);
    });
    return result;
}

// Fills the list once. All files share one document, so that memory holds only one parsed file at a time.
class Fill {
public:
    Fill(MessageFolder chosenFolder, const QStringList& files, const FillHooks& fillHooks)
        : folder(chosenFolder), hooks(fillHooks)
    {
        SetupDocument(document);
        if (folder == MessageFolder::Unread) {
            for (const QString& file : files)
                unread.insert(file.toCaseFolded());
        }
    }

    void take(const QString& file);
    /// Adds what the rows take from their quotes, after all files.
    void finish();

    QList<ListedMessage> listed;

private:
    bool parse(const QString& path);
    const xml::Document& prepared();
    bool isHeldUnread(const QString& file);
    void hold(const QString& file, const QString& type, const QString& waitsFor) const;

    std::map<QString, StartedRow> started;  // by the file
    QByteArray text;                        // of the current file, in the code page
    xml::Document document;                 // the parsed text
    xml::Document reparsed;
    MessageFolder folder;
    QSet<QString> unread;  // names with their case folded; empty in other folders
    const FillHooks& hooks;
};

void Fill::take(const QString& file)
{
    if (!parse(gsCurFolder + file)) {
        reportUnreadable(file);
    } else if (folder == MessageFolder::Sent) {
        listed.append({file, GetMessageRow(prepared(), u"SENT"_s)});
    } else if (file.startsWith("R_"_L1)) {
        QString response = files::fromCodePage(text);
        hooks.submissionResponse(response, file);
    } else if (file.contains("MDMSG"_L1)) {
        if (isMarker(document)) {
            const xml::Document& marker = prepared();
            listed.append({file, GetMarkerRow(marker, GetMarkerTypeName(marker))});
        } else {
            hold(file, u"Note"_s, u"nothing: it is a note, which is never listed"_s);
        }
    } else if (!isHeldUnread(file)) {
        const xml::Document& message = prepared();
        const StartedRow& row = started[file] = startMessageRow(message, GetMessageTypeName(message));
        listed.append({file, row.row});
    }
}

void Fill::finish()
{
    QList<StartedRow*> rows;
    for (const ListedMessage& message : listed)
        if (const auto found = started.find(message.file); found != started.end())
            rows.append(&found->second);
    finishMessageRows(rows);
    for (ListedMessage& message : listed)
        if (const auto found = started.find(message.file); found != started.end())
            message.row = found->second.row;
}

bool Fill::isHeldUnread(const QString& file)
{
    if (folder != MessageFolder::Unread) {
        IsHeldBehindEarlier(document, listed, file);
        return false;
    }
    if (!AllImagesPresent(document, unread)) {
        hold(file, GetMessageTypeName(document), missingPictures(document, unread));
        return true;
    }
    const Precedence precedence = precedenceOf(document, listed, file);
    const QString& earlier = precedence.earlier;
    if (precedence.isHeld)
        hold(file, GetMessageTypeName(document),
             earlier.isEmpty() ? u"a request number that can be read"_s : earlier + u", which must be loaded first"_s);
    else if (!earlier.isEmpty())
        hold(earlier, precedence.displacedType, file + u", which must be loaded first"_s);
    return precedence.isHeld;
}

void Fill::hold(const QString& file, const QString& type, const QString& waitsFor) const
{
    if (hooks.held && folder == MessageFolder::Unread)
        hooks.held({file, type, waitsFor, QFileInfo(files::systemPath(gsCurFolder + file)).lastModified()});
}

bool Fill::parse(const QString& path)
{
    text = files::readStart(path, xml::Document::maximumBytes + 1);
    if (text.size() > xml::Document::maximumBytes)
        return false;
    if (folder != MessageFolder::Sent)
        return parseWithRepairs(document, text);
    if (!escapeAmpersands(text))
        return false;
    text = wrappedInRequest(text);
    return parseBytes(document, text) && text.size() >= shortestSentText;
}

// Returns the document with the schema-instance declaration added, from which rows are read. The declaration can make a
// text unreadable. Parses a second time only if the result would differ.
const xml::Document& Fill::prepared()
{
    if (isSameWhenPrepared(text))
        return document;
    QString whole = files::fromCodePage(text);
    reparsed = parsedMessage(whole);
    return reparsed;
}

}  // namespace

QList<ListedMessage> BuildMessageList(MessageFolder folder, const FillHooks& hooks)
{
    gsCurFolder = pathOf(folder);
    gsListFolder = gsCurFolder;
    gdicQuoteRequests.clear();
    if (!files::folderExists(gsCurFolder))
        throw RuntimeError(PathNotFound, gsCurFolder + ": the folder does not exist"_L1);
    const QStringList names = files::list(gsCurFolder);
    settleFilter(folder, names.size(), hooks);

    const KeptNames keptNames;
    Fill fill(folder, names, hooks);
    qint64 done = 0;
    for (const QString& file : names) {
        if (file.endsWith("xml"_L1) && file.contains(gsListFilter) && isBareName(file)) {
            try {
                fill.take(file);
            } catch (const RuntimeError& error) {
                const bool isNamed = error.description().startsWith(file);
                // the transport or another workstation may have taken the file since the folder was listed
                if (files::exists(gsCurFolder + file))
                    throw RuntimeError(error.number(), (isNamed ? QString() : file + ": "_L1) + error.description(),
                                       error.source());
            }
        }
        if (hooks.progress && !hooks.progress(++done, names.size()))
            break;
    }
    fill.finish();
    return std::move(fill.listed);
}

bool AllImagesPresent(const xml::Document& message, const QSet<QString>& unread)
{
    const QStringList names = picturesOf(message);
    if (names.isEmpty())  // a list of empty ids is never complete
        return !message.documentElement().selectSingleNode(u"rootns:quoteRequestImageIds/*"_s);
    return std::ranges::all_of(names, [&](const QString& name) { return unread.contains(name.toCaseFolded()); });
}

bool IsHeldBehindEarlier(const xml::Document& message, QList<ListedMessage>& listed, const QString& file)
{
    return precedenceOf(message, listed, file).isHeld;
}

}  // namespace kest
