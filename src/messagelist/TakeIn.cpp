#include "messagelist/TakeIn.h"

#include "base/SharedVariables.h"
#include "messages/Envelope.h"
#include "messages/MessageTypes.h"
#include "platform/Prompt.h"
#include "platform/RuntimeError.h"
#include "platform/files/files.h"
#include "quotedata/Quote.h"

#include <QFileInfo>
#include <QSet>

#include <algorithm>
#include <optional>

using namespace Qt::StringLiterals;

namespace kest {
namespace {

constexpr qsizetype refusalsSaid = 10;  // more would make the box taller than the screen

enum class FileKind { Picture, Description, Message };

/// Thrown if a file is not taken in.
struct NotTaken {
    QString why;
};

// A file that is not a response, or whose quote no longer exists, would make every fill of the list fail.
void checkResponse(const xml::Document& document, const QString& name)
{
    if (document.textOrEmptyOf(u"rootns:kestQuoteNumber"_s).isEmpty() ||
        document.textOrEmptyOf(u"rootns:quoteSubmissionStatus"_s).isEmpty())
        throw NotTaken{u"it is not a response of the network"_s};
    if (!Quote(QuoteKey::fromResponseName(name)).exists())
        throw NotTaken{u"the quote that it answers does not exist"_s};
}

void checkMessage(const QString& path, const QString& name)
{
    if (files::size(path) > xml::Document::maximumBytes)
        throw NotTaken{u"it is too large for a message"_s};
    QByteArray text = files::readBytes(path);
    xml::Document document;
    SetupDocument(document);
    if (!parseWithRepairs(document, text))
        throw NotTaken{u"it can't be read as XML"_s};
    if (name.startsWith("R_"_L1))
        return checkResponse(document, name);
    const bool isNetworkMessage = !name.contains("MDMSG"_L1) && GetMessageTypeName(document) != unknownMessageType;
    if (!isNetworkMessage && !isMarker(document))
        throw NotTaken{u"it is not a message of the network"_s};
}

FileKind kindOf(const QString& path, const QString& name)
{
    if (files::folderExists(path))
        throw NotTaken{u"it is a folder"_s};
    if (!files::isPlainName(name) || !files::exists(path))
        throw NotTaken{u"there is no such file"_s};
    if (QFileInfo(path).canonicalPath() == QFileInfo(files::systemPath(gsUnreadPath)).canonicalFilePath())
        throw NotTaken{u"it is already in the unread folder"_s};
    if (name.endsWith("xml"_L1)) {
        checkMessage(path, name);
        return FileKind::Message;
    }
    if (name.endsWith(".xml"_L1, Qt::CaseInsensitive))
        throw NotTaken{u"the name of a message must end in \"xml\" in lower case"_s};
    const bool isPicture = files::matches(name, u"*.jpg"_s);
    if (!isPicture && !files::matches(name, u"*.txt"_s))
        throw NotTaken{u"it is not a message, a picture (.jpg) or a description (.txt)"_s};
    if (!files::matches(name, u"?*_???*.???"_s))
        throw NotTaken{u"its name must be like that of a request's picture, such as 20551_001.jpg"_s};
    return isPicture ? FileKind::Picture : FileKind::Description;
}

/// The names in the unread folder. Lists the folder once for many files.
class UnreadNames {
public:
    bool contains(const QString& name)
    {
        if (!folded) {
            folded.emplace();
            for (const QString& found : files::list(gsUnreadPath))
                add(found);
        }
        return folded->contains(name.toCaseFolded());
    }
    void add(const QString& name) { folded->insert(name.toCaseFolded()); }
    /// Lets the next question list the folder again.
    void forget() { folded.reset(); }

private:
    std::optional<QSet<QString>> folded;
};

/// Copies a file into the unread folder. Returns false if the user does not want to replace the one of that name.
bool copyUnlessKept(const QString& path, const QString& name, UnreadNames& unread)
{
    const QString target = files::pathForWriting(gsUnreadPath, name);
    if (!unread.contains(name)) {
        files::copy(path, target, files::Target::Free);
        unread.add(name);
        return true;
    }
    unread.forget();  // the question may stay open for long
    if (!desktop::ask(name + " is already in the unread folder. Replace it?"_L1, desktop::Icon::Question, {},
                      desktop::Answer::No))
        return false;
    files::copy(path, target);
    return true;
}

struct Brought {
    QString path;
    QString name;
    FileKind kind;
};

QString counted(int count, const QString& one)
{
    return QString::number(count) + u' ' + one + (count == 1 ? QString() : u"s"_s);
}

}  // namespace

QString TakenIn::summary() const
{
    QStringList parts;
    for (const auto& [count, one] :
         {std::pair(messages, u"message"_s), {pictures, u"picture"_s}, {descriptions, u"description"_s}})
        if (count > 0)
            parts.append(counted(count, one));
    return parts.isEmpty() ? u"Nothing was taken in."_s : "Taken in: "_L1 + parts.join(", "_L1) + u'.';
}

QString TakenIn::refusals() const
{
    QStringList lines = refused.first(qMin(refusalsSaid, refused.size()));
    if (refused.size() > refusalsSaid)
        lines.append(u"and %1 more"_s.arg(refused.size() - refusalsSaid));
    return "Not taken in:\n"_L1 + lines.join(u'\n');
}

TakenIn takeInFiles(const QList<QUrl>& urls, const std::function<void(qint64 done, qint64 total)>& progress)
{
    TakenIn result;
    const auto unlessRefused = [&](const QString& name, const auto& step) {
        try {
            step();
        } catch (const NotTaken& refusal) {
            result.refused.append(name + ": "_L1 + refusal.why);
        } catch (const RuntimeError& error) {
            result.refused.append(name + ": "_L1 + error.description());
        }
    };

    QList<Brought> brought;
    for (const QUrl& url : urls) {
        const QString path = url.toLocalFile();
        const QString name = QFileInfo(path).fileName();
        unlessRefused(url.isLocalFile() && !name.isEmpty() ? name : url.toDisplayString(), [&] {
            if (!url.isLocalFile())
                throw NotTaken{u"it is not on this computer"_s};
            brought.append({path, name, kindOf(path, name)});
        });
    }
    // pictures first: a message that is listed before its pictures arrive is held back, or loaded without them
    std::ranges::stable_sort(brought, {}, &Brought::kind);

    qint64 done = 0;
    UnreadNames unread;
    for (const Brought& file : std::as_const(brought)) {
        unlessRefused(file.name, [&] {
            if (!copyUnlessKept(file.path, file.name, unread))
                return;
            ++(file.kind == FileKind::Message   ? result.messages
               : file.kind == FileKind::Picture ? result.pictures
                                                : result.descriptions);
            if (file.kind == FileKind::Message && !file.name.startsWith("R_"_L1))
                result.toList.append(file.name);
        });
        if (progress)
            progress(++done, brought.size());
    }
    return result;
}

}  // namespace kest
