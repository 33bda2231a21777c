#include "messages/Folders.h"

#include "base/Helpers.h"
#include "base/Journal.h"
#include "base/SharedVariables.h"
#include "base/modLoggerEx.h"
#include "messages/Envelope.h"
#include "messages/MessageTypes.h"
#include "platform/RuntimeError.h"
#include "platform/database/Sql.h"
#include "platform/files/Background.h"
#include "platform/files/files.h"
#include "platform/values.h"

#include <functional>
#include <limits>

using namespace Qt::StringLiterals;

namespace kest {
namespace {

QuoteKey newestOfRequest(const QString& request, const QString& version)
{
    if (request.trimmed().isEmpty())
        return {};
    db::Recordset quote(gConn);
    quote.open(version.isEmpty()
                   ? sql("SELECT * FROM QUOTE1 WHERE KESTQRNo='{}' ORDER BY rec_id DESC", request)
                   : sql("SELECT * FROM QUOTE1 WHERE KESTQRNo='{}' AND KESTQRVer='{}' ORDER BY rec_id DESC", request,
                         version));
    return quote.eof() ? QuoteKey() : QuoteKey::fromRow(quote);
}

QuoteKey lastOfNetworkNumber(const QString& number)
{
    if (number.trimmed().isEmpty())
        return {};
    db::Recordset quote(gConn);
    quote.open(sql("SELECT * FROM QUOTE1 WHERE KESTQuoteNo='{}'", number));
    if (quote.eof())
        return {};
    quote.moveLast();
    return QuoteKey::fromRow(quote);
}

QuoteKey quoteKeyIn(const xml::Document& message, const MessageType& type)
{
    const auto key = [&] { return message.textOf(type.fileKeyPath); };
    switch (type.fileKey) {
        case FileKey::None:
            return {};
        case FileKey::RequestAndVersion:
            return newestOfRequest(key(), message.textOf(u"//rootns:quoteRequestVersionNumber"_s));
        case FileKey::Request:
            return newestOfRequest(key(), {});
        case FileKey::Reference:
            return QuoteKey::fromReference(key());
        case FileKey::DeletedQuote:  // the quote is no longer in the database
            if (!gsDeletedQTNNO.isEmpty())
                return {gsDeletedQTNNO, gsDeletedSubquote};
            break;
        case FileKey::NetworkNumber:
            break;
    }
    return lastOfNetworkNumber(key());
}

// Returns the highest number that a message of this quote has among these names, or 0 if there is none. Throws if such
// a name has no valid number.
qint64 runningNumber(const QuoteKey& quote, const QStringList& names)
{
    constexpr qsizetype extension = 4;  // ".xml"
    qint64 largest = 0;
    for (const QString& name : names) {
        if (quote.begins(name))
            largest =
                qMax(largest, toInteger(name.chopped(qMin(extension, name.size())).mid(quote.filePrefix().size())));
    }
    return largest;
}

QString numberedName(const QuoteKey& quote, qint64 running)
{
    if (running == std::numeric_limits<qint16>::max())
        throw RuntimeError(Overflow, u"All running numbers of quote %1 are taken"_s.arg(quote.number));
    return quote.filePrefix() + QString::number(running + 1) + ".xml"_L1;
}

// Returns an empty text for a name that leads out of the folder: the quote number comes from a message.
QString plainOrNone(const QString& name)
{
    return files::isPlainName(name) ? name : QString();
}

/// A name in the read folder.
struct ReadName {
    QString name;
    files::Target target = files::Target::Unknown;
};

/// Returns the name of the quote's next message, or of its request. It is empty if it can't be determined.
ReadName nextName(const QuoteKey& quote, bool isQuoteRequest)
{
    ReadName next;
    attempt([&] {
        const QStringList names = files::list(gsReadPath, quote.number + u'*');
        const qint64 running = runningNumber(quote, names);
        next.name = plainOrNone(isQuoteRequest ? quote.number + ".xml"_L1 : numberedName(quote, running));
        if (!names.contains(next.name, Qt::CaseInsensitive))
            next.target = files::Target::Free;
    });
    return next;
}

/// Returns the name for the message of a file. Forgets the deleted quote, which only this name needs.
ReadName nextNameOf(const QString& path)
{
    MessageQuoteKey key;
    attempt([&] { key = GetMessageQuoteKey(files::read(path)); });
    gsDeletedQTNNO.clear();
    gsDeletedSubquote.clear();
    if (key.quote.number.isEmpty() || key.quote.subquote.isEmpty())
        return {};
    return nextName(key.quote, key.isQuoteRequest);
}

/// Returns true if a move of the file under that name may have begun.
bool isFreeFor(const QString& file, const QString& name)
{
    return !files::exists(gsReadPath + name) ||
           files::readBytes(gsReadPath + name) == files::readBytes(gsUnreadPath + file);
}

/// Returns the name under which an interrupted move began, or else a new one.
ReadName nameInReadFolder(const QString& file)
{
    const QString begun = journal::kept(u"newName"_s).toString();
    bool goesOn = false;
    attempt([&] { goesOn = files::isPlainName(begun) && isFreeFor(file, begun); });
    if (goesOn)
        return {begun};
    const ReadName next =
        gsMatchedQTNNO.isEmpty() ? nextNameOf(gsUnreadPath + file) : nextName(QuoteKey{gsMatchedQTNNO}, false);
    return next.name.isEmpty() ? ReadName{file} : next;
}

/// Ignores a failure like attempt(), but writes it to the error log.
bool attemptLogged(const std::function<void()>& step)
{
    return attempt([&] {
        try {
            step();
        } catch (const RuntimeError& error) {
            attempt([&] { logFailure(error, u"Folders.MoveMessage"_s); });
            throw;
        }
    });
}

}  // namespace

QString wordOf(MessageFolder folder)
{
    switch (folder) {
        case MessageFolder::Unread:
            return u"unread"_s;
        case MessageFolder::Read:
            return u"read"_s;
        case MessageFolder::Sent:
            break;
    }
    return u"sent"_s;
}

QString pathOf(MessageFolder folder)
{
    switch (folder) {
        case MessageFolder::Unread:
            return gsUnreadPath;
        case MessageFolder::Read:
            return gsReadPath;
        case MessageFolder::Sent:
            break;
    }
    return gsSentPath;
}

bool isBareName(const QString& file)
{
    return !file.isEmpty() && !file.contains(u'/') && !file.contains(u'\\');
}

void MoveMessage(const QString& file, const QString& action)
{
    if (action == "read"_L1 && isBareName(file) && files::exists(gsUnreadPath + file)) {
        const ReadName next = nameInReadFolder(file);
        // replace an older message of that name only after the copy exists, because the disk may be full
        const bool copied = attemptLogged([&] {
            journal::keep(u"newName"_s, next.name);  // first, so that an interrupted move ends under this name
            files::copy(gsUnreadPath + file, gsReadPath + next.name, next.target);
        });
        if (copied && files::exists(gsReadPath + next.name))
            attemptLogged([&] { files::remove(gsUnreadPath + file); });
    }
    gsMatchedQTNNO.clear();
}

bool isMoved(const QString& file)
{
    return files::folderExists(gsUnreadPath) && !files::exists(gsUnreadPath + file);
}

QString GetReadFileName(const QString& path)
{
    return nextNameOf(path).name;
}

QString GetMatchedFileName(const QString& quoteNumber)
{
    return nextName(QuoteKey{quoteNumber}, false).name;
}

MessageQuoteKey GetMessageQuoteKey(QString text)
{
    MessageQuoteKey key;
    attempt([&] {
        const SharedMessage message = sharedMessage(text);
        const MessageType* type = findMessageType(message->textOf(u"messageType"_s).toUpper());
        if (!type)
            return;
        key.quote = quoteKeyIn(*message, *type);
        key.isQuoteRequest = type->code == MessageCode::QREQ;
    });
    return key;
}

void DeleteFileByBatch(const QString& path)
{
    files::removeInBackground(path);
}

}  // namespace kest
