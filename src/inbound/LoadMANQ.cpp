// Loads a manual quote: a quote that was written outside the shop's system becomes one of its quotes, with all lines.
#include "base/Helpers.h"
#include "base/Journal.h"
#include "base/SharedVariables.h"
#include "base/modDBAccess.h"
#include "inbound/LoadQuoteBody.h"
#include "inbound/Loading.h"
#include "inbound/NextNumbers.h"
#include "inbound/modLoadXML.h"
#include "messages/Envelope.h"
#include "platform/Prompt.h"
#include "platform/RuntimeError.h"
#include "platform/database/Sql.h"
#include "platform/values.h"
#include "quotedata/Quote.h"
#include "quotedata/QuoteTotals.h"
#include "quotedata/StateTable.h"
#include "reports/PrintXML.h"

#include <optional>

namespace kest {

using namespace Qt::StringLiterals;

namespace {

struct ManualQuote {
    explicit ManualQuote(const xml::Document& message);

    QString networkNumber;
    QString request;
    QString claim;
    QString rego;
    bool isSupplementary;
    QuoteKey told;  // as far as the sender knows it
};

ManualQuote::ManualQuote(const xml::Document& message)
{
    const auto element = [&](QLatin1StringView path) {
        return message.textOf(u"//rootns:getQuoteResponse/rootns:"_s + path);
    };
    networkNumber = element("kestQuoteNumber"_L1);
    request = element("quoteRequestNumber"_L1);
    claim = element("claimNumber"_L1);
    rego = NormaliseRego(element("vehicleRegistration"_L1));
    element("vehicleDescription"_L1);
    isSupplementary = element("quoteBody/rootns:quoteType"_L1).contains(u'S');
    told = QuoteKey::fromReference(element("quoteBody/rootns:quoteReference"_L1));
}

QString newNumber(const QString& given, const db::Recordset& cinfo)
{
    db::Recordset tried(gConn);
    return NextQuoteNumber(given, cinfo, tried, false);
}

QString behind(const db::Recordset& quote)
{
    return QString::number(toLong(quote.value(u"Subquote"_s)) + 1);
}

/// Returns the next subquote of the quote that it belongs to. If the shop has no such quote, shows a box and returns
/// nothing.
std::optional<QuoteKey> matchSupplementary(const ManualQuote& manual, const db::Recordset& cinfo)
{
    const qint64 subquote = toLong(manual.told.subquote);
    const QString number = subquote == 0 ? newNumber(manual.told.number, cinfo) : manual.told.number;

    db::Recordset quotes = Quote::openNumbered(
        number, sql("SELECT QTNNO, subquote FROM QUOTE1 WHERE QTNNO = '{}' ORDER BY subquote", number));
    if (!quotes.eof()) {
        quotes.moveLast();
        const bool isAbove = subquote > toLong(quotes.value(u"subquote"_s));
        return QuoteKey{number, isAbove ? manual.told.subquote : behind(quotes)};
    }
    quotes = Quote::openNumbered(
        manual.request,
        sql("SELECT QTNNO, SUBQUOTE FROM QUOTE1 WHERE KESTQRNO='{}' ORDER BY SUBQUOTE DESC", manual.request));
    if (!quotes.eof())
        return QuoteKey{quotes.text(u"QTNNO"_s), behind(quotes)};
    refuse(u"Failed matching to existing parent KEST Quote"_s);
    return {};
}

/// Returns a registration that no car has: the given one, if necessary with dots after it.
QString freeRego(const QString& rego)
{
    db::Recordset cars = opened(sql("SELECT REGO FROM CAR WHERE REGO LIKE '{}%' ORDER BY REGO", likeText(rego)));
    QString free = rego;
    for (cars.find(sql("REGO='{}'", free)); !cars.eof(); cars.find(sql("REGO='{}'", free)))
        free += u'.';
    return free;
}

/// Changes a registration that the shop typed with blanks or dashes to the network's spelling, in the car and in the
/// quote. If another car already has this registration, that car gets a new one.
void repairRego(const QString& typed, const QString& rego, const QuoteKey& quote)
{
    const QString free = freeRego(rego);
    gConn->execute(sql("UPDATE CAR SET REGO='{}' WHERE REGO='{}'", free, rego));
    gConn->execute(sql("UPDATE CAR SET REGO='{}' WHERE REGO='{}'", rego, typed));
    gConn->execute(
        sql("UPDATE QUOTE1 SET REGO='{}' WHERE QTNNO='{}' AND Subquote='{}'", rego, quote.number, quote.subquote));
}

/// Returns the quote with that number or that request if it is for the same car, or else a new number.
QuoteKey matchMain(const ManualQuote& manual, const db::Recordset& cinfo)
{
    const QString rego = manual.rego.trimmed().toUpper();
    const auto isOfCar = [&](const QString& typed) { return AlphaNumericOnly(typed).toUpper() == rego; };

    const db::Recordset numbered = Quote::openNumbered(
        manual.told.number,
        sql("SELECT QTNNO, subquote, Rego FROM QUOTE1 WHERE QTNNO = '{}' ORDER BY subquote", manual.told.number));
    if (!numbered.eof()) {
        const QString typed = numbered.text(u"Rego"_s);
        if (typed.trimmed().toUpper() == rego)
            return QuoteKey::fromRow(numbered);
        if (isOfCar(typed)) {
            repairRego(typed, manual.rego, QuoteKey::fromRow(numbered));
            return QuoteKey::fromRow(numbered);
        }
        return {newNumber(manual.told.number, cinfo)};
    }
    const db::Recordset requested = Quote::openNumbered(
        manual.request, sql("SELECT QTNNO, Subquote, Rego FROM QUOTE1 WHERE KESTQRNO='{}'", manual.request));
    if (!requested.eof() && isOfCar(requested.text(u"Rego"_s)))
        return QuoteKey::fromRow(requested);
    return {newNumber(manual.told.number, cinfo)};
}

void fillNumbers(db::Recordset& quote, const ManualQuote& manual)
{
    setColumns(quote, {
                          {"KESTQRNo"_L1, manual.request},
                          {"KESTQuoteNo"_L1, manual.networkNumber},
                          {"Claim"_L1, manual.claim},
                          {"REGO"_L1, manual.rego},
                      });
}

/// Throws ValueTooLong if a number does not fit, before the search for the quote, which may change a registration.
void checkNumbers(const ManualQuote& manual)
{
    db::Recordset quote = opened(u"SELECT * FROM QUOTE1 WHERE rec_id=0"_s);
    quote.addNew();
    fillNumbers(quote, manual);
    quote.cancelUpdate();
}

void fillHeader(db::Recordset& quote, const ManualQuote& manual, const QuoteKey& key, const db::Recordset& insurer,
                const db::Recordset& cinfo)
{
    fillNumbers(quote, manual);
    setColumns(quote, {
                          {"qtndate"_L1, shortDate(QDate::currentDate())},
                          {"INSURER_ID"_L1, insurer.value(u"INSURER_ID"_s)},
                          {"RR_RATE"_L1, 1},
                          {"RA_RATE"_L1, 1},
                          {"paint_rate"_L1, 1},
                          {"QSENT"_L1, u"R"_s},
                          {"excess"_L1, 0},
                          {"contri"_L1, 0},
                          {"NEWPC"_L1, insurer.value(u"new_mu"_s)},
                          {"SECONDPC"_L1, cinfo.value(u"second_mu"_s)},
                          {"RECOREPC"_L1, cinfo.value(u"recore_mu"_s)},
                          {"AFTERPC"_L1, cinfo.value(u"after_mu"_s)},
                          {"assess"_L1, u""_s},
                          {"excess_gst"_L1, 1},
                          {"Type"_L1, u"MTA"_s},
                          {"ExtraInfo"_L1, true},
                          {"QTNNO"_L1, key.number},
                          {"Subquote"_L1, key.subquote},
                      });
    fillWithoutTotals(quote);
}

bool refuseWithoutCar(const QString& rego)
{
    desktop::msgBox(u"Could not find a car with registration number "_s + rego +
                        u"\r\nPlease create the car and customer before loading this quote"_s,
                    desktop::Icon::Information);
    return false;
}

/// Lets no one else create a quote. Throws RowChanged if another workstation has meanwhile created this one.
std::unique_ptr<db::Lock> lockNewQuote(const QuoteKey& key)
{
    std::unique_ptr<db::Lock> lock = lockNewQuotes();
    if (Quote(key).exists())
        throw RuntimeError(RowChanged,
                           u"Another workstation has meanwhile created quote %1."_s.arg(key.fullReference()));
    return lock;
}

bool refuseLines()
{
    desktop::msgBox(u"Error processing Quote Items, Please contact MarlinDesk Support."_s);
    return false;
}

}  // namespace

bool LoadMANQ(QString& text, const QString& fileName)
{
    const SharedMessage message = sharedMessage(text);
    const db::Recordset cinfo = opened(u"SELECT * FROM CINFO"_s);
    db::Recordset colours = opened(u"SELECT * FROM KESTColours"_s);
    const db::Recordset insurer = opened(u"SELECT * FROM INSURER WHERE KEST=1"_s);
    if (insurer.eof())
        return refuse(u"Error locating a valid insurer, Please contact MarlinDesk Support."_s);

    const ManualQuote manual(*message);
    checkNumbers(manual);
    const std::optional<QuoteKey> key =
        manual.isSupplementary ? matchSupplementary(manual, cinfo) : matchMain(manual, cinfo);
    if (!key)
        return false;

    Quote found(*key, opened(sql("SELECT * FROM QUOTE1 WHERE QTNNO='{}' AND SUBQUOTE='{}' ORDER BY rec_id DESC",
                                 key->number, key->subquote)));
    db::Recordset& quote = found.header();
    db::Recordset& lines = found.lines();
    db::Recordset& notes = found.notes();
    db::Recordset car = opened(sql("SELECT * FROM CAR WHERE REGO='{}'", manual.rego));
    if (car.eof())
        return refuseWithoutCar(manual.rego);
    car.set(u"KEST"_s, 1);
    car.update();

    const bool isNew = quote.eof();
    if (isNew)
        quote.addNew();
    if (notes.eof())
        notes.addNew();
    fillHeader(quote, manual, *key, insurer, cinfo);
    applyTransition(manualQuoteLoaded, quote, notes);
    respellColour(car, colours);
    car.set(u"REGO"_s, manual.rego);

    if (!checkQuoteBody(*message))
        return refuseLines();
    std::unique_ptr<db::Lock> newQuotes = isNew ? lockNewQuote(*key) : nullptr;
    // After this, a failure leaves the quote without lines until the message is loaded again.
    while (!lines.eof())
        lines.remove();
    car.update();
    quote.update();
    newQuotes.reset();
    if (!LoadQuoteBody(quote, lines, *message))
        return refuseLines();
    if (!CalcQuoteTotals(quote, lines))
        tellOldTotals(quote);
    quote.update();

    setColumns(notes, {{"QTNNO"_L1, quote.value(u"QTNNO"_s)}, {"Subquote"_L1, quote.value(u"Subquote"_s)}});
    journal::passPoint([&] { notes.update(); }, {{u"matched"_s, quote.text(u"QTNNO"_s)}});
    PrintXML(fileName, false);
    gsMatchedQTNNO = quote.text(u"QTNNO"_s);
    return true;
}

}  // namespace kest
