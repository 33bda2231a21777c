#include "inbound/modLoadXML.h"

#include "base/Helpers.h"
#include "base/Journal.h"
#include "base/SharedVariables.h"
#include "base/modLoggerEx.h"
#include "inbound/Loading.h"
#include "messages/Envelope.h"
#include "messages/Folders.h"
#include "messages/MessageTypes.h"
#include "platform/Prompt.h"
#include "platform/RuntimeError.h"
#include "platform/files/files.h"
#include "quotedata/Vendors.h"

#include <QJsonArray>
#include <QStringList>

namespace kest {

using namespace Qt::StringLiterals;

namespace {

bool loadAs(MessageCode type, QString& text, const QString& fileName)
{
    switch (type) {
        case MessageCode::QREQ:
            return LoadQREQ(text, fileName);
        case MessageCode::QMQR:
            return LoadQMQR(text, fileName);
        case MessageCode::MANQ:
            return LoadMANQ(text, fileName);
        case MessageCode::QTDL:
            return LoadQTDL(text, fileName);
        case MessageCode::RRQT:
            return LoadRRQT(text, fileName);
        case MessageCode::QRCN:
            return LoadQRCN(text, fileName);
        case MessageCode::ADQT:
            return LoadADQT(text, fileName);
        case MessageCode::AUQT:
            return LoadAUQT(text, fileName);
        case MessageCode::ARES:
            return LoadARES(text, fileName);
        case MessageCode::BACA:
            return LoadBACA(text, fileName);
        case MessageCode::BCQR:
            return LoadBCQR(text, fileName);
        case MessageCode::EWAP:
            return LoadEWAP(text, fileName);
    }
    return false;
}

void reportParseError(const xml::ParseError& error, const QString& fileName)
{
    const QStringList lines{
        u"Error loading XML file: "_s + fileName,
        u"Error Code: "_s + QString::number(static_cast<qint32>(error.errorCode)),
        u"Reason: "_s + error.reason,
        u"Source Text:"_s,
        QString(error.srcText).remove(u'\t').trimmed(),
    };
    desktop::msgBox(lines.join(u"\r\n"_s), desktop::Icon::Critical, u"KEST"_s);
}

bool isNotice(const xml::Node& root)
{
    const xml::Node first = root.firstChild();
    return first.nodeName() == u"mailtype"_s && first.text() == u"MDMSG"_s;
}

/// Shows a notice of the estimating product and moves its file. A notice never counts as loaded.
void takeNotice(const xml::Node& root, const QString& fileName)
{
    desktop::msgBox(root.textOf(u"body"_s), desktop::Icon::Exclamation);
    for (int number = 0; number <= 999; ++number) {
        const QString target = gsReadPath + u"MDMSG"_s + PadZeroLeft(QString::number(number), 3) + u".xml"_s;
        if (files::exists(target))
            continue;
        files::copy(gsUnreadPath + fileName, target);
        DeleteFileByBatch(gsUnreadPath + fileName);
        return;
    }
}

bool isPicture(const QString& path)
{
    return files::readStart(path, 1) == "\xFF";
}

void withdrawIfRequest(const QString& name, const QString& requestNumber)
{
    const QString path = gsUnreadPath + name;
    if (isPicture(path))
        return;
    QString text = files::read(path);
    const xml::Document waiting = parsedMessage(text);
    if (waiting.parseError().errorCode != 0)
        return;
    const xml::Node root = waiting.documentElement();
    const xml::Node number = root.selectSingleNode(u"//rootns:quoteRequestNumber"_s);
    if (root.textOrEmptyOf(u"messageType"_s) != u"QREQ"_s || !number || number.text() != requestNumber)
        return;
    QJsonArray withdrawn = journal::kept(u"withdrawn"_s).toArray();
    withdrawn.append(name);
    journal::keep(u"withdrawn"_s, withdrawn);
    journal::openNow({}, {});  // because the load may still be refused, and then its next try must know
    files::remove(path, files::Force::Yes);
}

/// Deletes unread quote requests that a manual quote has answered, so that they don't become a second quote.
void withdrawWaitingRequests(const QString& requestNumber, const QString& fileName)
{
    if (isBlank(requestNumber))
        return;
    for (const QString& name : files::list(gsUnreadPath)) {
        if (!isBareName(name) || name.compare(fileName, Qt::CaseInsensitive) == 0)
            continue;
        try {
            withdrawIfRequest(name, requestNumber);
        } catch (const RuntimeError& error) {
            if (error.number() != FileNotFound)  // the transport may have removed it since the folder was listed
                throw;
        }
    }
}

bool load(QString& text, const QString& fileName)
{
    const SharedMessage message = repairedMessage(text);
    if (message->parseError().errorCode != 0) {
        reportParseError(message->parseError(), fileName);
        return false;
    }

    const xml::Node root = message->documentElement();
    if (isNotice(root)) {
        takeNotice(root, fileName);
        return false;
    }

    const QString messageType = root.textOf(u"messageType"_s);
    if (messageType == u"MANQ"_s)
        withdrawWaitingRequests(root.textOf(u"//rootns:getQuoteResponse/rootns:quoteRequestNumber"_s), fileName);

    const MessageType* type = findMessageType(messageType.toUpper());
    return type && loadAs(type->code, text, fileName);
}

}  // namespace

bool LoadXML(QString& text, const QString& fileName)
{
    const KeptMessage keptMessage;
    const KeptVendors keptVendors;
    try {
        return load(text, fileName);
    } catch (const RuntimeError& error) {
        LogError(error, u"modLoadXML.LoadXML"_s, u"LoadXML"_s);
        return false;
    }
}

}  // namespace kest
