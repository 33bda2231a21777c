// Loads the six messages that change the state of a quote but not its lines.
#include "base/Journal.h"
#include "base/SharedVariables.h"
#include "base/modDBAccess.h"
#include "inbound/Loading.h"
#include "inbound/modLoadXML.h"
#include "messages/Envelope.h"
#include "platform/Prompt.h"
#include "platform/database/Sql.h"
#include "platform/values.h"
#include "quotedata/Quote.h"
#include "quotedata/StateTable.h"
#include "reports/PrintXML.h"

#include <QStringList>

#include <utility>

namespace kest {

using namespace Qt::StringLiterals;

namespace {

constexpr QLatin1StringView quoteReference = "//rootns:getQuoteResponse/rootns:quoteBody/rootns:quoteReference"_L1;

constexpr QLatin1StringView noSuchQuote = "Couldn't Locate Matching KEST Quote, Please contact MarlinDesk Support."_L1;
constexpr QLatin1StringView noSuchQuoteNumber =
    "Couldn't Locate Matching KEST Quote Number, Please contact MarlinDesk Support."_L1;
constexpr QLatin1StringView noSuchRequest =
    "Couldn't Locate Matching KEST Quote Request Number, Please contact MarlinDesk Support."_L1;

void tell(const QStringList& lines)
{
    desktop::msgBox(lines.join(u"\r\n"_s), desktop::Icon::Information);
}

/// Returns the oldest quote of the request, which is usually the main quote.
Quote oldestOfRequest(const QString& request)
{
    db::Recordset header =
        Quote::openNumbered(request, sql("SELECT * FROM QUOTE1 WHERE KESTQRNO='{}' ORDER BY rec_id DESC", request));
    if (!header.eof())
        header.moveLast();
    return Quote(std::move(header));
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

/// What the file move needs.
QJsonObject deletedKey()
{
    return {{u"deletedNumber"_s, gsDeletedQTNNO}, {u"deletedSubquote"_s, gsDeletedSubquote}};
}

void deleteQuoteRows(const QuoteKey& key)
{
    const auto& [number, subquote] = key;
    gConn->execute(sql("DELETE FROM QUOTE3 WHERE QTNNO='{}' AND SUBQUOTE={}", number, subquote));
    gConn->execute(sql("DELETE FROM QUOTE2 WHERE QTNNO='{}' AND SUBQUOTE={}", number, subquote));
    journal::passPoint(
        [&] { gConn->execute(sql("DELETE FROM QUOTE1 WHERE QTNNO='{}' AND SUBQUOTE={}", key.number, key.subquote)); },
        deletedKey());
}

}  // namespace

bool LoadQMQR(QString& text, const QString& fileName)
{
    const SharedMessage message = sharedMessage(text);
    Quote quote(QuoteKey::fromReference(message->textOf(quoteReference)));
    if (!quote.exists())
        return refuse(noSuchQuote);

    setColumns(quote.header(),
               {
                   {"KESTQuoteNo"_L1, message->textOf(u"//rootns:getQuoteResponse/rootns:kestQuoteNumber"_s)},
                   {"KESTQRNo"_L1, message->textOf(u"//rootns:getQuoteResponse/rootns:quoteRequestNumber"_s)},
                   {"KESTQRVer"_L1, 1},
                   {"Claim"_L1, message->textOf(u"//rootns:getQuoteResponse/rootns:claimNumber"_s)},
                   {"ExtraInfo"_L1, true},
               });
    applyTransition(quoteMatched, quote);
    quote.header().update();
    journal::passPoint([&] { quote.notes().update(); });
    PrintXML(fileName, false);
    return true;
}

bool LoadEWAP(QString& text, const QString& fileName)
{
    const SharedMessage message = sharedMessage(text);
    const QString reference = message->textOf(quoteReference);
    Quote quote(QuoteKey::fromReference(reference));
    if (!quote.exists())
        return refuse(noSuchQuote);

    quote.header().set(u"excess"_s, 0);
    applyTransition(excessWaived, quote);
    desktop::msgBox(
        u"ORLA has removed the excess from this quote due to a special arrangement, "
        "Please update your invoices accordingly.\r\nQuote: "_s +
        reference);
    EnsureConnection();  // the box may have been open for hours
    quote.header().update();
    journal::passPoint([&] { quote.notes().update(); });
    PrintXML(fileName, false);
    return true;
}

bool LoadQTDL(QString& text, const QString&)
{
    const SharedMessage message = sharedMessage(text);
    const QString networkNumber = message->textOf(u"//rootns:getQuoteDeletionResponse/rootns:kestQuoteNumber"_s);
    Quote quote(Quote::openNumbered(networkNumber, sql("SELECT * FROM QUOTE1 WHERE KESTQuoteNo='{}'", networkNumber)));
    if (quote.header().eof())
        return refuse(noSuchQuoteNumber);

    const QString reason = message->textOf(u"//rootns:getQuoteDeletionResponse/rootns:reason"_s);
    gsDeletedQTNNO = quote.key().number;  // the file's new name needs it after the quote may have been deleted
    gsDeletedSubquote = quote.key().subquote;

    // The notes go to the main quote, even if a supplementary quote is deleted.
    db::Recordset notes = Quote::openNotes({quote.key().number});
    bool taken = true;
    if (!quote.isSupplementary()) {
        applyTransition(quoteDeleted, quote.header(), notes, reason);
        quote.header().update();
        journal::passPoint([&] { notes.update(); }, deletedKey());
    } else if ((taken = agreesToDeletion())) {
        EnsureConnection();  // the question may have been open for hours
        // first, because after the deletion the message finds no quote, and a failure here could not be repaired
        applyTransition(supplementaryDeleted, quote.header(), notes, quote.key().reference());
        notes.update();
        deleteQuoteRows(quote.key());
    }

    tell({u"ORLA has requested quote "_s + quote.key().reference() + u" be deleted."_s, u"Reason: "_s + reason,
          u"If you want to revise, please re-open and edit the quote then re-send to the insurer."_s});
    return taken;
}

bool LoadRRQT(QString& text, const QString&)
{
    const SharedMessage message = sharedMessage(text);
    const QString request = message->textOf(u"//rootns:getReqForRevQteResponse/rootns:quoteRequestNumber"_s);
    Quote quote(Quote::openNumbered(
        request, sql("SELECT TOP 1 * FROM QUOTE1 WHERE KESTQRNO='{}' ORDER BY rec_id DESC", request)));
    if (quote.header().eof())
        return refuse(noSuchRequest);

    const QString comments = message->textOf(u"//rootns:getReqForRevQteResponse/rootns:comments"_s);
    quote.header().set(u"KESTQRVer"_s,
                       message->textOf(u"//rootns:getReqForRevQteResponse/rootns:quoteRequestVersionNumber"_s));
    applyTransition(revisionRequested, quote, comments);
    quote.header().update();
    journal::passPoint([&] { quote.notes().update(); });

    tell({u"ORLA has requested quote "_s + quote.key().reference() + u" be revised."_s, u"Reason: "_s + comments,
          u"Please re-open and edit the quote then re-send to the insurer."_s});
    return true;
}

bool LoadQRCN(QString& text, const QString&)
{
    const SharedMessage message = sharedMessage(text);
    const QString request = message->textOf(u"//rootns:getQRCancellationResponse/rootns:quoteRequestNumber"_s);
    Quote quote = oldestOfRequest(request);
    if (quote.header().eof())
        return refuse(noSuchRequest);

    const QString reason = message->textOf(u"//rootns:getQRCancellationResponse/rootns:qrCancellationReason"_s);
    applyTransition(requestCancelled, quote, reason);
    quote.notes().update();
    journal::passPoint([&] { quote.header().update(); });
    return true;
}

bool LoadBCQR(QString& text, const QString&)
{
    const SharedMessage message = sharedMessage(text);
    const QString request = message->textOf(u"//rootns:getBackoutCancelledQRResponse/rootns:kestQuoteRequestNumber"_s);
    Quote quote = oldestOfRequest(request);
    if (quote.header().eof())
        return refuse(noSuchRequest);

    applyTransition(requestReinstated, quote);
    quote.notes().update();
    journal::passPoint([&] { quote.header().update(); });
    return true;
}

}  // namespace kest
