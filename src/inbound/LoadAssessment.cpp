// Loads the answers to a sent quote: submission responses, adjustments, assessment results and their back-outs.
#include "base/Helpers.h"
#include "base/History.h"
#include "base/Journal.h"
#include "base/modDBAccess.h"
#include "inbound/Loading.h"
#include "inbound/modLoadXML.h"
#include "messages/Envelope.h"
#include "platform/Prompt.h"
#include "platform/RuntimeError.h"
#include "platform/database/Sql.h"
#include "quotedata/NetworkCodes.h"
#include "quotedata/NoteChain.h"
#include "quotedata/Quote.h"
#include "quotedata/StateTable.h"
#include "reports/PrintXML.h"

#include <algorithm>
#include <optional>
#include <utility>

namespace kest {

using namespace Qt::StringLiterals;

namespace {

bool refuseRequestNumber()
{
    return refuse(u"Couldn't Locate Matching KEST Quote Request Number, Please contact MarlinDesk Support."_s);
}

/// Returns the state that a quote goes back to. Only an authorised quote has an authority number, and only a rejected
/// supplementary quote has a note that says so.
const Transition& backOutOf(Quote& quote)
{
    if (!quote.isSupplementary())
        return quote.header().text(u"KESTAuthNo"_s).isEmpty() ? failedTenderBackedOut : authorisationBackedOut;
    const QString remarks = quote.notes().text(u"remarks"_s);
    bool rejected = !GetNoteStatus(u"Rejected"_s, remarks).isEmpty();
    if (!rejected && remarks.contains(u"Rejected"_s))  // the first such note may be that of an earlier back-out
        rejected = quote.header().isNull(u"AuthDate"_s);
    return rejected ? rejectionBackedOut : supplementaryBackedOut;
}

/// Returns the quote that the reference names if it is of the request, otherwise the newest quote of the request. If
/// there is none, returns nothing.
std::optional<Quote> findAdjusted(const QuoteKey& told, const QString& request)
{
    if (isBlank(request))
        return {};
    if (!isBlank(told.number)) {
        db::Recordset named = opened(sql("SELECT * FROM QUOTE1 WHERE QTNNO='{}' AND SUBQUOTE='{}' AND KESTQRNo='{}'",
                                         told.number, told.subquote, request));
        if (!named.eof())
            return Quote(std::move(named));
    }
    db::Recordset newest = opened(sql("SELECT TOP 1 * FROM QUOTE1 WHERE KESTQRNo='{}' order by rec_id DESC", request));
    if (newest.eof())
        return {};
    return Quote(std::move(newest));
}

}  // namespace

bool LoadADQT(QString& text, const QString& fileName)
{
    const SharedMessage message = sharedMessage(text);
    const QuoteKey key = QuoteKey::fromReference(
        message->textOf(u"//rootns:getAdjustedQuoteResponse/rootns:quoteBody/rootns:quoteReference"_s));
    std::optional<Quote> found = findAdjusted(key, message->textOf(u"//rootns:quoteRequestNumber"_s));
    if (!found)
        return refuse(u"Error locating Quote in Database, Please contact Marlindesk Support."_s);
    Quote& quote = *found;
    if (quote.lines().eof()) {
        desktop::msgBox(u"Error: Cannot load an Adjustment onto a blank quote!"_s);
        return false;
    }

    applyTransition(adjustmentSuggested, quote);
    quote.header().update();
    journal::passPoint([&] { quote.notes().update(); });
    PrintXML(fileName, false);
    return true;
}

bool LoadARES(QString& text, const QString&)
{
    const SharedMessage message = sharedMessage(text);
    const QString number = message->textOf(u"//rootns:getAssmntResultResponse/rootns:kestOriginalQuoteNumber"_s);
    db::Recordset header =
        Quote::openNumbered(number, sql("SELECT * FROM QUOTE1 WHERE KESTQuoteNo='{}' ORDER BY rec_id DESC", number));
    if (header.eof())
        return refuseRequestNumber();
    header.moveLast();  // the oldest quote with that number
    Quote quote(std::move(header));

    const QString code = message->textOf(u"//rootns:getAssmntResultResponse/rootns:reasonCode"_s).toUpper();
    const Transition& lost = code == u"TLSS"_s ? totalLoss : tenderFailed;
    applyTransition(quote.isSupplementary() ? supplementaryRejected : lost, quote,
                    reasonOfCode(code).value_or(u"Unknown Reason Code - "_s + code));
    quote.header().update();
    journal::passPoint([&] { quote.notes().update(); });
    return true;
}

bool LoadBACA(QString& text, const QString& fileName)
{
    const SharedMessage message = sharedMessage(text);
    const QString request = message->textOf(u"//rootns:getBackoutAssmntResponse/rootns:kestQuoteRequestNumber"_s);
    // the first is the newest quote of the request
    Quote quote(
        Quote::openNumbered(request, sql("SELECT * FROM QUOTE1 WHERE KESTQRNO='{}' ORDER BY rec_id DESC", request)));
    if (quote.header().eof())
        return refuseRequestNumber();

    applyTransition(backOutOf(quote), quote);
    quote.header().update();
    journal::passPoint([&] { quote.notes().update(); });
    PrintXML(fileName, false);
    return true;
}

/// Returns true if another workstation applies the response, or was interrupted and is not settled yet.
static bool isResponsePending(const QString& file)
{
    return std::ranges::any_of(journal::pendingOperations(), [&](const journal::Entry& entry) {
        return entry.kind == journal::wordOf(journal::Kind::Response) &&
               entry.file.compare(file, Qt::CaseInsensitive) == 0;
    });
}

void LoadSubmissionResponse(QString& text, const QString& fileName)
{
    const auto fail = [&](int number, const QString& what) {
        throw RuntimeError(number, fileName + u' ' + what +
                                       u". Move the file out of the folder; until then no messages are listed."_s);
    };
    const QuoteKey key = QuoteKey::fromResponseName(fileName);
    if (key.number.isEmpty() || key.subquote.isEmpty() || !key.subquote[0].isDigit())
        fail(NoCurrentRow, u"does not name the quote that it answers"_s);
    Quote quote(key);
    if (!quote.exists())
        fail(NoCurrentRow, u"answers quote %1, which is no longer there"_s.arg(key.reference()));
    if (quote.notes().eof())
        fail(NoCurrentRow, u"answers quote %1, which has no notes row"_s.arg(key.reference()));
    const SharedMessage message = sharedMessage(text);
    const xml::Node root = message->documentElement();
    if (!root || !root.selectSingleNode(u"rootns:kestQuoteNumber"_s) ||
        !root.selectSingleNode(u"rootns:quoteSubmissionStatus"_s))
        fail(NoObject, u"contains no complete answer to quote %1"_s.arg(key.reference()));
    quote.header().set(u"KESTQuoteNo"_s, root.textOf(u"rootns:kestQuoteNumber"_s));
    if (root.textOf(u"rootns:quoteSubmissionStatus"_s) == u"Submitted"_s)
        applyTransition(quoteSubmitted, quote);
    journal::Operation operation(journal::Kind::Response, fileName, journal::hashOf(text));
    bool isPending = false;
    operation.beforeFirstChange([&] {
        isPending = isResponsePending(fileName);
        if (isPending)
            throw RuntimeError(RowChanged, u"The response %1 is applied once its last try is settled."_s.arg(fileName));
    });
    try {
        quote.header().update();
        journal::passPoint([&] { quote.notes().update(); });
        operation.end(journal::State::Done);
    } catch (const RuntimeError&) {
        if (!isPending)  // otherwise a later fill applies it
            throw;
    }
}

}  // namespace kest
