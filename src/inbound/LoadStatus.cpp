// Loads the six messages that change the state of a quote but not its lines.
#include "base/QuoteKey.h"
#include "base/SharedVariables.h"
#include "base/modDBAccess.h"
#include "inbound/Loading.h"
#include "inbound/modLoadXML.h"
#include "messages/Envelope.h"
#include "platform/Prompt.h"
#include "platform/database/Sql.h"
#include "platform/values.h"
#include "quotedata/StateTable.h"
#include "reports/PrintXML.h"

#include <QStringList>

namespace kest {

using namespace Qt::StringLiterals;

namespace {

constexpr QLatin1StringView quoteReference = "//rootns:getQuoteResponse/rootns:quoteBody/rootns:quoteReference"_L1;

constexpr QLatin1StringView noSuchQuote = "Couldn't Locate Matching KEST Quote, Please contact MarlinDesk Support."_L1;
constexpr QLatin1StringView noSuchQuoteNumber =
    "Couldn't Locate Matching KEST Quote Number, Please contact MarlinDesk Support."_L1;
constexpr QLatin1StringView noSuchRequest =
    "Couldn't Locate Matching KEST Quote Request Number, Please contact MarlinDesk Support."_L1;

db::Recordset openByReference(const QString& reference)
{
    const auto [number, subquote] = QuoteKey::fromReference(reference);
    return opened(sql("SELECT * FROM QUOTE1 WHERE QTNNO='{}' AND SUBQUOTE='{}'", number, subquote));
}

void tell(const QStringList& lines)
{
    desktop::msgBox(lines.join(u"\r\n"_s), desktop::Icon::Information);
}

/// Opens the oldest quote of the request, which is usually the main quote. If there is none, `eof` is true.
db::Recordset openOldestOfRequest(const QString& request)
{
    db::Recordset quote = opened(sql("SELECT * FROM QUOTE1 WHERE KESTQRNO='{}' ORDER BY rec_id DESC", request));
    if (!quote.eof())
        quote.moveLast();
    return quote;
}

bool agreesToDeletion()
{
    const QStringList lines{
        u"This Supplimentary Quote will be DELETED."_s,
        u"If you require a record of this quote please print a copy before loading this message."_s,
        u"Do you still want to continue loading this message?"_s,
    };
    return desktop::ask(lines.join(u"\r\n"_s), desktop::Icon::None, {}, desktop::Answer::No);
}

void deleteQuoteRows(const QuoteKey& key)
{
    const auto& [number, subquote] = key;
    gConn->execute(sql("DELETE FROM QUOTE3 WHERE QTNNO='{}' AND SUBQUOTE={}", number, subquote));
    gConn->execute(sql("DELETE FROM QUOTE2 WHERE QTNNO='{}' AND SUBQUOTE={}", number, subquote));
    gConn->execute(sql("DELETE FROM QUOTE1 WHERE QTNNO='{}' AND SUBQUOTE={}", number, subquote));
}

}  // namespace

bool LoadQMQR(QString& text, const QString& fileName)
{
    const xml::Document message = parsedMessage(text);
    db::Recordset quote = openByReference(message.textOf(quoteReference));
    if (quote.eof())
        return refuse(noSuchQuote);
    db::Recordset notes = openNotes(quote);

    quote.set(u"KESTQuoteNo"_s, message.textOf(u"//rootns:getQuoteResponse/rootns:kestQuoteNumber"_s));
    quote.set(u"KESTQRNo"_s, message.textOf(u"//rootns:getQuoteResponse/rootns:quoteRequestNumber"_s));
    quote.set(u"KESTQRVer"_s, 1);
    quote.set(u"Claim"_s, message.textOf(u"//rootns:getQuoteResponse/rootns:claimNumber"_s));
    quote.set(u"ExtraInfo"_s, true);
    applyTransition(quoteMatched, quote, notes);
    quote.update();
    notes.update();
    PrintXML(fileName, false);
    return true;
}

bool LoadEWAP(QString& text, const QString& fileName)
{
    const xml::Document message = parsedMessage(text);
    const QString reference = message.textOf(quoteReference);
    db::Recordset quote = openByReference(reference);
    if (quote.eof())
        return refuse(noSuchQuote);
    db::Recordset notes = openNotes(quote);

    quote.set(u"excess"_s, 0);
    applyTransition(excessWaived, quote, notes);
    desktop::msgBox(
        u"ORLA has removed the excess from this quote due to a special arrangement, "
        "Please update your invoices accordingly.\r\nQuote: "_s +
        reference);
    quote.update();
    notes.update();
    PrintXML(fileName, false);
    return true;
}

bool LoadQTDL(QString& text, const QString&)
{
    const xml::Document message = parsedMessage(text);
    const QString networkNumber = message.textOf(u"//rootns:getQuoteDeletionResponse/rootns:kestQuoteNumber"_s);
    db::Recordset quote = opened(sql("SELECT * FROM QUOTE1 WHERE KESTQuoteNo='{}'", networkNumber));
    if (isUnknown(networkNumber, quote))
        return refuse(noSuchQuoteNumber);

    const QuoteKey key = QuoteKey::fromRow(quote);
    const QString label = quoteLabel(quote);
    const QString reason = message.textOf(u"//rootns:getQuoteDeletionResponse/rootns:reason"_s);
    gsDeletedQTNNO = key.number;  // the file's new name needs it after the quote may have been deleted
    gsDeletedSubquote = key.subquote;

    // The notes go to the main quote, even if a supplementary quote is deleted.
    db::Recordset notes = opened(sql("SELECT * FROM QUOTE3 WHERE QTNNO='{}' AND SUBQUOTE='0'", key.number));
    bool taken = true;
    if (!isSupplementary(quote)) {
        applyTransition(quoteDeleted, quote, notes, reason);
        quote.update();
        notes.update();
    } else if ((taken = agreesToDeletion())) {
        deleteQuoteRows(key);
        applyTransition(supplementaryDeleted, quote, notes, label);
        notes.update();
    }

    tell({u"ORLA has requested quote "_s + label + u" be deleted."_s, u"Reason: "_s + reason,
          u"If you want to revise, please re-open and edit the quote then re-send to the insurer."_s});
    return taken;
}

bool LoadRRQT(QString& text, const QString&)
{
    const xml::Document message = parsedMessage(text);
    const QString request = message.textOf(u"//rootns:getReqForRevQteResponse/rootns:quoteRequestNumber"_s);
    db::Recordset quote = opened(sql("SELECT TOP 1 * FROM QUOTE1 WHERE KESTQRNO='{}' ORDER BY rec_id DESC", request));
    if (isUnknown(request, quote))
        return refuse(noSuchRequest);
    db::Recordset notes = openNotes(quote);

    const QString comments = message.textOf(u"//rootns:getReqForRevQteResponse/rootns:comments"_s);
    quote.set(u"KESTQRVer"_s, message.textOf(u"//rootns:getReqForRevQteResponse/rootns:quoteRequestVersionNumber"_s));
    applyTransition(revisionRequested, quote, notes, comments);
    quote.update();
    notes.update();

    tell({u"ORLA has requested quote "_s + quoteLabel(quote) + u" be revised."_s, u"Reason: "_s + comments,
          u"Please re-open and edit the quote then re-send to the insurer."_s});
    return true;
}

bool LoadQRCN(QString& text, const QString&)
{
    const xml::Document message = parsedMessage(text);
    const QString request = message.textOf(u"//rootns:getQRCancellationResponse/rootns:quoteRequestNumber"_s);
    db::Recordset quote = openOldestOfRequest(request);
    if (isUnknown(request, quote))
        return refuse(noSuchRequest);
    db::Recordset notes = openNotes(quote);

    const QString reason = message.textOf(u"//rootns:getQRCancellationResponse/rootns:qrCancellationReason"_s);
    applyTransition(requestCancelled, quote, notes, reason);
    notes.update();
    quote.update();
    return true;
}

bool LoadBCQR(QString& text, const QString&)
{
    const xml::Document message = parsedMessage(text);
    const QString request = message.textOf(u"//rootns:getBackoutCancelledQRResponse/rootns:kestQuoteRequestNumber"_s);
    db::Recordset quote = openOldestOfRequest(request);
    if (isUnknown(request, quote))
        return refuse(noSuchRequest);
    db::Recordset notes = openNotes(quote);

    applyTransition(requestReinstated, quote, notes);
    notes.update();
    quote.update();
    return true;
}

}  // namespace kest
