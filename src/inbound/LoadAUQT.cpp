// Loads an authorised quote: the insurer accepts a quote, unchanged or with changed lines, under an authority number.
#include "base/Helpers.h"
#include "base/Journal.h"
#include "base/modDBAccess.h"
#include "base/modLoggerEx.h"
#include "inbound/LoadQuoteBody.h"
#include "inbound/Loading.h"
#include "inbound/modLoadXML.h"
#include "jobexport/WriteQuote.h"
#include "messages/Envelope.h"
#include "platform/Prompt.h"
#include "platform/database/Sql.h"
#include "platform/values.h"
#include "quotedata/NoteChain.h"
#include "quotedata/Quote.h"
#include "quotedata/QuoteTotals.h"
#include "quotedata/Rounding.h"
#include "quotedata/StateTable.h"
#include "reports/BuildAuthReport.h"
#include "reports/ReportTable.h"
#include "reports/frmPrintPreview.h"
#include "sublets/frmSubletAuth.h"

#include <optional>
#include <utility>

namespace kest {

using namespace Qt::StringLiterals;

namespace {

constexpr QLatin1StringView unknownRego = "UNIVERSAL"_L1;

/// The values of the message. The constructor throws if an element is missing, even one that only the report shows, so
/// that an incomplete message fails before anything is stored.
struct Authorisation {
    explicit Authorisation(const xml::Document& message);

    QString authorisedNumber;
    QString request;
    QString originalNumber;
    QString claim;
    QString completionDate;
    QString rego;
    QString assessor;
    QString excess;
    QString contribution;
    QString reference;
};

Authorisation::Authorisation(const xml::Document& message)
{
    const auto element = [&](QLatin1StringView path) { return message.textOf(u"//rootns:"_s + path); };
    for (const QLatin1StringView shownOnly :
         {"authorityNumber"_L1, "claimManager"_L1, "corporateCustomer"_L1, "orlaContact/rootns:phone"_L1,
          "orlaContact/rootns:fax"_L1, "assessmentComment"_L1, "authorisedAmount"_L1, "quoteBody/rootns:quoteType"_L1,
          "quoteBody/rootns:labourTotal"_L1, "quoteBody/rootns:partTotal"_L1, "quoteBody/rootns:partMarkUpTotal"_L1,
          "quoteBody/rootns:gst"_L1, "quoteBody/rootns:paintTotal"_L1, "quoteBody/rootns:quoteTotal"_L1})
        element(shownOnly);
    const QString customer = u"//rootns:authorisedQuoteClaimCustomer/rootns:"_s;
    if (!message.selectSingleNode(customer + u"companyName"_s)) {
        for (const QLatin1StringView name : {"title"_L1, "firstName"_L1, "surname"_L1})
            message.textOf(customer + name);
    }

    authorisedNumber = element("kestAuthorisedQuoteNumber"_L1);
    request = element("quoteRequestNumber"_L1);
    originalNumber = element("kestOriginalQuoteNumber"_L1);
    claim = element("claimNumber"_L1);
    completionDate = element("repairCompletionDate"_L1);
    rego = NormaliseRego(element("vehicleRegistration"_L1));
    assessor = element("orlaContact/rootns:name"_L1);
    excess = message.textOrEmptyOf(u"//rootns:excess"_s);
    contribution = message.textOrEmptyOf(u"//rootns:customerContribution"_s);
    reference = element("quoteBody/rootns:quoteReference"_L1);
}

/// Returns the quote with that key. If there is none, returns the quote with the message's request, network number and
/// registration, and sets `key` to its key. If several match, the first is current and `key` stays as it is. If none
/// matches, returns nothing.
std::optional<Quote> findQuote(const Authorisation& told, QuoteKey& key)
{
    Quote named(key);
    if (named.exists())
        return named;
    if (isBlank(told.request) || isBlank(told.originalNumber))
        return {};
    db::Recordset header = opened(sql("SELECT * FROM QUOTE1 WHERE KESTQRNO='{}' AND KESTQuoteNo='{}' AND REGO = '{}'",
                                      told.request, told.originalNumber, told.rego));
    if (header.eof())
        return {};
    if (header.recordCount() == 1)
        key = QuoteKey::fromRow(header);
    const QString subquote = header.text(u"Subquote"_s);
    return Quote({key.number, subquote}, std::move(header));
}

/// Stores the excess and the customer's contribution, which only a main quote has. An amount that is empty in the quote
/// stays empty.
void takeOverMoney(const Authorisation& told, const QuoteKey& key)
{
    db::Recordset quote = Quote::openHeader(key);
    const auto has = [&](const QString& column) { return !quote.text(column).trimmed().isEmpty(); };

    const double excess = SafeVal(told.excess, u"0"_s);
    if (has(u"excess"_s) && toDouble(quote.value(u"excess"_s)) != excess) {
        quote.set(u"excess"_s, RoundAmount(double(excess), 2));
        quote.update();
    }
    // The message's contribution includes the tax of 10 percent, the quote's does not.
    const double contribution = RoundAmount(SafeVal(told.contribution, u"0"_s) / 11 * 10, 2);
    if (has(u"contri"_s) && RoundAmount(toDouble(quote.value(u"contri"_s)), 2) != contribution) {
        quote.set(u"contri"_s, contribution);
        quote.update();
    }
}

/// Returns "Whitby, Morgan Lee" for "Morgan Lee Whitby".
QString surnameFirst(const QString& name)
{
    constexpr qsizetype surnameLength = 15;  // characters
    const qsizetype blank = name.lastIndexOf(u' ');
    const QString surname = name.mid(blank + 1).left(surnameLength);
    const QString given = name.left(qMax<qsizetype>(blank, 0));
    return given.isEmpty() ? surname : surname + u", "_s + given;
}

void fillNumbers(db::Recordset& quote, const Authorisation& told, const QString& rego)
{
    setColumns(quote, {
                          {"KESTQRNo"_L1, told.request},
                          {"KESTQuoteNo"_L1, told.originalNumber},
                          {"KESTAuthNo"_L1, told.authorisedNumber},
                          {"Claim"_L1, told.claim},
                          {"REGO"_L1, rego},
                      });
}

void fillHeader(db::Recordset& quote, const Authorisation& told, const QString& rego, const db::Recordset& insurer)
{
    fillNumbers(quote, told, rego);
    setColumns(quote, {
                          {"assess"_L1, cutFor(quote, u"assess"_s, surnameFirst(told.assessor))},
                          {"AuthDate"_L1, shortDate(QDate::currentDate())},
                          {"targetdate"_L1, toDate(told.completionDate)},
                          {"INSURER_ID"_L1, insurer.value(u"INSURER_ID"_s)},
                          {"RR_RATE"_L1, 1},
                          {"RA_RATE"_L1, 1},
                          {"paint_rate"_L1, 1},
                          {"QSENT"_L1, u"R"_s},
                          {"excess_gst"_L1, 1},
                      });
    fillWithoutTotals(quote);
}

bool refusePlainly(const QString& text)
{
    desktop::msgBox(text);
    return false;
}

void showResults(const db::Recordset& quote, std::optional<db::Recordset>& comparison, const QuoteKey& key)
{
    WriteQuote(quote.text(u"QTNNO"_s), quote.text(u"Subquote"_s));
    if (comparison)
        frmPrintPreview::ShowForm(ComparisonReport, u""_s, &*comparison);
    if (gbSubletDocumentArrived) {
        frmSubletAuth::ShowForm(key.number, key.subquote);
        gbSubletDocumentArrived = false;
    }
}

bool authorise(QString& text)
{
    const SharedMessage message = sharedMessage(text);
    const Authorisation told(*message);
    QuoteKey key = QuoteKey::fromReference(told.reference);

    std::optional<Quote> found = findQuote(told, key);
    if (!found)
        return refuse(u"Couldn't Locate Matching KEST Quote, Please contact MarlinDesk Support."_s);
    db::Recordset& quote = found->header();
    const QString rego = told.rego == unknownRego ? quote.text(u"REGO"_s) : told.rego;
    db::Recordset& lines = found->lines();
    if (lines.eof())
        return refusePlainly(u"Error: Cannot load an Authorisation onto a blank quote!"_s);
    db::Recordset& notes = found->notes();
    db::Recordset car = opened(sql("SELECT * FROM CAR WHERE REGO='{}'", rego));
    const db::Recordset insurer =
        opened(sql("SELECT * FROM INSURER WHERE INSURER_ID={}", quote.value(u"INSURER_ID"_s)));
    if (car.eof())
        return refusePlainly(u"Could not locate Car listed on Authorisation. Please Contact MarlinDesk Support."_s);
    fillNumbers(quote, told, rego);  // a number that is too long is refused before anything is stored
    quote.cancelUpdate();
    car.set(u"KEST"_s, 1);
    car.update();
    if (insurer.eof())
        return refuse(u"Error locating a valid insurer, Please contact MarlinDesk Support."_s);
    if (notes.eof())
        notes.addNew();

    // before the lines change, because it compares with the lines as they are now
    std::optional<db::Recordset> comparison = BuildAuthReport(*message, key.number, key.subquote, false);
    if (key.isMain())
        takeOverMoney(told, key);
    quote.requery();
    fillHeader(quote, told, rego, insurer);
    if (!GetNoteStatus(u"Quote Request"_s, notes.text(u"remarks"_s)).isEmpty())
        applyTransition(requestWon, quote, notes);
    applyTransition(quoteAuthorised, quote, notes);
    quote.update();

    if (!LoadQuoteBody(quote, lines, *message))
        return refusePlainly(u"Error processing Quote Items, Please contact MarlinDesk Support."_s);
    setColumns(notes, {{"QTNNO"_L1, quote.value(u"QTNNO"_s)}, {"Subquote"_L1, quote.value(u"Subquote"_s)}});
    notes.update();
    if (lines.recordCount() > 0)
        lines.moveFirst();  // a search without a match has left them at their end, and the totals would be 0
    bool isStored = false;
    journal::passPoint([&] { isStored = CalcAuthorisedTotals(quote, lines); },
                       {{u"isExported"_s, true}, {u"hasReport"_s, comparison.has_value()}});
    if (!isStored)
        tellOldTotals(quote);
    if (comparison)
        finishAuthReport(*comparison, quote, lines);
    showResults(quote, comparison, key);
    return true;
}

}  // namespace

bool LoadAUQT(QString& text, const QString&)
{
    try {
        return authorise(text);
    } catch (const RuntimeError& error) {
        LogError(error, u"modLoadXML.LoadAUQT"_s, u"LoadAUQT"_s);
        return false;
    }
}

}  // namespace kest
