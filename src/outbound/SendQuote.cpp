#include "outbound/SendQuote.h"

#include "base/Helpers.h"
#include "base/Journal.h"
#include "base/SharedVariables.h"
#include "base/modDBAccess.h"
#include "outbound/modCreateXML.h"
#include "platform/Prompt.h"
#include "platform/RuntimeError.h"
#include "platform/database/Sql.h"
#include "platform/values.h"
#include "quotedata/NoteChain.h"
#include "quotedata/Quote.h"
#include "quotedata/QuoteTotals.h"

using namespace Qt::StringLiterals;

namespace kest {

namespace {

const QString quoteNotFound = u"Quote not found in database, Please contact MarlinDesk Support."_s;

/// Returns why a main quote can't be sent, or an empty text if it can.
QString mainQuoteRefusal(const db::Recordset& quote, const QString& remarks)
{
    const db::Recordset insurer =
        opened(sql("SELECT NAME, KEST FROM INSURER WHERE INSURER_ID={}", quote.value(u"INSURER_ID"_s)));
    if (insurer.eof())
        return u"Could not locate Insurer! Please contact MarlinDesk Support."_s;
    if (!insurer.isNull(u"KEST"_s) && !isTrue(insurer.value(u"KEST"_s)))
        return u"Invalid Insurer, Please check the Insurer is valid & is marked as a KEST Insurer"_s;
    if (!quote.text(u"msgno"_s).isEmpty())
        return u"This quote has already been sent via TIDE, you cannot use KEST to send this quote."_s;
    if (SafeVal(quote.text(u"Claim"_s), u"0"_s) <= 0)
        return u"An Invalid claim number has been entered, please check the Claim Number and try again."_s;
    const db::Recordset customer = opened(sql(
        "SELECT * FROM CUSTOMER WHERE CUST_ID IN (SELECT CUST_ID FROM CAR WHERE REGO='{}')", quote.value(u"REGO"_s)));
    if (customer.eof())
        return u"Error locating customer record, Quote cannot be sent."_s;
    if (customer.text(u"NAME"_s).isEmpty())
        return u"Customer Name is Blank! Quote cannot be sent."_s;
    if (!quote.text(u"KESTQRNo"_s).isEmpty() && GetNoteStatus(u"Quote Request"_s, remarks) != "Active"_L1)
        return u"Quote request is not marked as active, Quote cannot be sent."_s;
    return {};
}

/// Returns why the quote can't be sent, or an empty text if it can.
QString refusalOf(const db::Recordset& quote, const QuoteKey& key)
{
    const db::Recordset zeroQuantities =
        opened(sql("SELECT * FROM QUOTE2 WHERE QTNNO='{}' AND SUBQUOTE='{}' AND CATEGORY='PRT' AND QTY=0", key.number,
                   key.subquote));
    if (!zeroQuantities.eof())
        return u"Items with a Quantity of 0 cannot be sent to ORLA. Please check the quote details and try again."_s;

    const db::Recordset notes = Quote::openNotes(key);
    const QString remarks = notes.eof() ? QString() : notes.text(u"remarks"_s);
    if (quote.recordCount() == 0)
        return quoteNotFound;
    if (quote.recordCount() != 1)
        return u"A Critical Error has occured, Please contact MarlinDesk Support. %1 Records"_s.arg(
            quote.recordCount());
    if (isTrue(quote.value(u"ReadOnly"_s)))
        return GetNoteStatus(u"Quote Request"_s, remarks) == "Cancelled"_L1
                   ? u"This quote request has been cancelled, Quote cannot be sent."_s
                   : u"This quote has already been submitted to ORLA, you cannot send a quote twice."_s;
    if (!key.isMain())
        return GetNoteStatus(u"KEST Quote"_s, remarks) == "Submitted"_L1
                   ? u"This additional has already been submitted to ORLA, you cannot send a quote twice."_s
                   : QString();
    return mainQuoteRefusal(quote, remarks);
}

void tellOldTotals(const QuoteKey& key)
{
    desktop::msgBox(
        u"Quote %1 is sent, but its totals could not be stored. The error log says why. Check the totals in the "
        "estimating program."_s.arg(key.reference()),
        desktop::Icon::Exclamation);
    EnsureConnection();  // it may have been lost while the box was open
}

void tellGonePictures(const QuoteKey& key, const QStringList& gone)
{
    desktop::msgBox(
        u"Quote %1 is sent, but without the pictures %2, which are gone from the pictures' folder. Send them to the "
        "insurer in another way."_s.arg(key.reference(), gone.join(u", "_s)),
        desktop::Icon::Exclamation);
}

}  // namespace

double SendQuote(db::Recordset& quote, bool* sent)
{
    EnsureConnection();
    if (quote.eof())
        return refuseSend(quoteNotFound);
    const QString number = quote.text(u"QTNNO"_s);
    quote = opened(sql("SELECT * FROM QUOTE1 WHERE QTNNO='{}' ORDER BY SUBQUOTE DESC", number));
    if (quote.eof())
        return refuseSend(quoteNotFound);
    const QuoteKey key{number, quote.text(u"Subquote"_s)};
    quote = Quote::openHeader(key);

    if (const QString refusal = refusalOf(quote, key); !refusal.isEmpty())
        return refuseSend(refusal);

    journal::Operation operation(journal::Kind::Send);
    try {
        const bool hasTotals = RoundQuoteLines(quote);
        const double total = CreateQuoteXML(quote);
        if (total != 0 && !hasTotals)
            tellOldTotals(key);
        if (sent)
            *sent = total != 0;
        QStringList gone;
        if (total != 0)
            gone = CreateImageXML(gsImagesPath, quote);
        operation.end(total != 0 ? journal::State::Done : journal::State::Failed);
        if (!gone.isEmpty())
            tellGonePictures(key, gone);
        return total;
    } catch (const RuntimeError&) {
        if (isDocumentAnnounced())  // a picture that does not fit on the disk, a note that another user has changed
            operation.end(journal::State::Unfinished);
        throw;
    }
}

}  // namespace kest
