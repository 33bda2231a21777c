#include "recovery/FinishLoad.h"

#include "base/SharedVariables.h"
#include "inbound/Finishing.h"
#include "jobexport/WriteQuote.h"
#include "messages/Envelope.h"
#include "messages/Folders.h"
#include "messages/MessageTypes.h"
#include "platform/RuntimeError.h"
#include "platform/files/files.h"

#include <QJsonArray>

namespace kest::recovery {

using namespace Qt::StringLiterals;

namespace {

/// Returns the message if it still waits as it was when it was loaded, otherwise an empty text.
QString waitingText(const journal::Entry& entry)
{
    return isThere(gsUnreadPath, entry.file, entry.hash) ? files::read(gsUnreadPath + entry.file) : QString();
}

/// Returns true if the message was moved, or if it has gone from a folder that this workstation shares with the one
/// that loaded it.
bool isGone(const journal::Entry& entry)
{
    if (!files::folderExists(gsUnreadPath) || isThere(gsUnreadPath, entry.file, entry.hash))
        return false;
    return journal::isOfThisWorkstation(entry) ||
           isThere(gsReadPath, journal::kept(u"newName"_s).toString(), entry.hash);
}

const MessageType* typeOf(QString& text)
{
    const SharedMessage message = repairedMessage(text);
    return findMessageType(message->textOf(u"messageType"_s).toUpper());
}

/// Exports an authorised quote if that has not begun.
QStringList finishExport(const journal::Entry& entry)
{
    const QJsonValue job = journal::kept(u"job"_s);
    if (job.isUndefined() && !journal::kept(u"isExportTried"_s).toBool()) {
        WriteQuote(entry.number, entry.subquote);
        journal::keep(u"isExportTried"_s, true);  // or each fill would try again until the message is moved
    } else if (!job.isUndefined() && !isJobComplete(job.toInteger())) {
        return {u"JobLink may have only a part of job %1: check it there."_s.arg(job.toInteger())};
    }
    return {};
}

bool hasReport(MessageCode type)
{
    return type == MessageCode::QREQ || type == MessageCode::ADQT ||
           (type == MessageCode::AUQT && journal::kept(u"hasReport"_s).toBool());
}

/// Returns which windows the load has not shown, a sentence each.
QStringList notShown(const MessageType& type)
{
    QStringList windows;
    if (hasReport(type.code) && !journal::kept(u"reportShown"_s).toBool())
        windows.append(u"report \"%1\""_s.arg(type.name));
    if (!journal::kept(u"documents"_s).toArray().isEmpty() && !journal::kept(u"subletsShown"_s).toBool())
        windows.append(u"window \"Sublet Authority Documents\""_s);
    QStringList sentences;
    for (const QString& window : windows)
        sentences.append(u"Its %1 was not shown: reprint %2 from the read messages."_s.arg(
            window, journal::kept(u"newName"_s).toString()));
    return sentences;
}

void move(const journal::Entry& entry)
{
    gsMatchedQTNNO = entry.facts[u"matched"_s].toString();
    gsDeletedQTNNO = entry.facts[u"deletedNumber"_s].toString();
    gsDeletedSubquote = entry.facts[u"deletedSubquote"_s].toString();
    MoveMessage(entry.file, u"read"_s);
    gsDeletedQTNNO.clear();
    gsDeletedSubquote.clear();
}

}  // namespace

QStringList finishLoad(const journal::Entry& entry)
{
    QString text = waitingText(entry);
    const bool isBegun = !journal::kept(u"newName"_s).isUndefined();  // the move, so all before it is done
    QStringList left;
    if (!isBegun && entry.facts[u"isExported"_s].toBool())
        left += finishExport(entry);
    if (text.isEmpty()) {
        if (!isGone(entry))
            left += u"Its message is not in sight here; it is moved as soon as workstation %1 sees it."_s.arg(
                entry.workstation);
        else if (!isBegun)
            left += u"Its message has been removed or changed since, so it was not moved."_s;
        return left;
    }
    const MessageType* type = typeOf(text);
    if (type && !isBegun && type->code == MessageCode::QREQ)
        finishRequest(text, entry.number);
    move(entry);
    return type ? left + notShown(*type) : left;
}

bool stillWaits(const journal::Entry& entry)
{
    return !isGone(entry);
}

bool isThere(const QString& folder, const QString& file, const QString& hash)
{
    return isBareName(file) && files::exists(folder + file) && journal::hashOf(files::read(folder + file)) == hash;
}

QStringList removeDocuments(const journal::Entry& entry)
{
    QStringList left;
    for (const QJsonValue written : entry.facts[u"documents"_s].toArray()) {
        const QString path = written[0].toString();
        const bool isGone = attempt([&] {
            if (files::exists(path) && journal::hashOf(files::readBytes(path)) == written[1].toString())
                files::remove(path);
        });
        if (!isGone)
            left.append(u"Its document %1 could not be removed."_s.arg(path));
    }
    return left;
}

}  // namespace kest::recovery
