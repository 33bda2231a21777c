#include "base/Helpers.h"
#include "base/QuoteKey.h"
#include "base/SharedVariables.h"
#include "messagelist/Summary.h"
#include "messages/Envelope.h"
#include "platform/RuntimeError.h"
#include "platform/database/Recordset.h"
#include "platform/database/Sql.h"
#include "platform/values.h"

using namespace Qt::StringLiterals;

namespace kest {
namespace {

enum Column { Type, Rego, Claim, Customer, Quote, Vehicle };

enum class Rows { ExactlyOne, AtLeastOne };

// For messages that name a quote: where the key of the quote is, and the query that finds the quote's row.
struct QuoteSource {
    QLatin1StringView code;
    QLatin1StringView key;
    const char* query;
    Rows needed;
};

constexpr const char* byNetworkNumber =
    "SELECT * FROM QUOTE1, CAR WHERE QUOTE1.REGO=CAR.REGO AND QUOTE1.KESTQuoteNo='{}'";
constexpr const char* byRequest =
    "SELECT * FROM QUOTE1, CAR WHERE QUOTE1.REGO=CAR.REGO AND QUOTE1.KESTQRNO='{}' ORDER BY QUOTE1.rec_id DESC";
constexpr const char* byBackedOutRequest =
    "SELECT * FROM QUOTE1, CAR WHERE QUOTE1.REGO=CAR.REGO AND QUOTE1.KESTQRNo='{}' ORDER BY rec_id DESC";

constexpr QuoteSource quoteSources[] = {
    {"QTDL"_L1, "//rootns:kestQuoteNumber"_L1, byNetworkNumber, Rows::ExactlyOne},
    {"RRQT"_L1, "//rootns:quoteRequestNumber"_L1, byRequest, Rows::AtLeastOne},
    {"QRCN"_L1, "//rootns:quoteRequestNumber"_L1, byRequest, Rows::ExactlyOne},
    {"ADQT"_L1, "//rootns:kestOriginalQuoteNumber"_L1, byNetworkNumber, Rows::ExactlyOne},
    {"AUQT"_L1, "//rootns:kestOriginalQuoteNumber"_L1, byNetworkNumber, Rows::ExactlyOne},
    {"ARES"_L1, "//rootns:kestOriginalQuoteNumber"_L1, byNetworkNumber, Rows::ExactlyOne},
    {"BACA"_L1, "//rootns:kestQuoteRequestNumber"_L1, byBackedOutRequest, Rows::AtLeastOne},
    {"BCQR"_L1, "//rootns:kestQuoteRequestNumber"_L1, byRequest, Rows::ExactlyOne},
};

bool isDrawnFromMessage(const QString& code)
{
    return code == "QREQ"_L1 || code == "QMQR"_L1 || code == "MANQ"_L1;
}

bool suffices(const db::Recordset& rows, Rows needed)
{
    return needed == Rows::ExactlyOne ? rows.recordCount() == 1 : rows.recordCount() >= 1;
}

// If the value can't be read, it stays as it is.
template <class Draw>
void draw(QString& value, Draw&& drawn)
{
    attempt([&] { value = drawn(); });
}

void dashWhereEmpty(MessageRow& row, std::initializer_list<Column> columns)
{
    for (const Column column : columns)
        if (row[column].isEmpty())
            row[column] = u"-"_s;
}

QString personName(const xml::Node& person, const QString& prefix)
{
    QString name = person.textOrEmptyOf(prefix + "title"_L1);
    for (const QLatin1StringView part : {"firstName"_L1, "surname"_L1})
        if (const xml::Node node = person.selectSingleNode(prefix + part))
            name += u' ' + node.text();
    return name;
}

QString customerOfRequest(const xml::Document& message)
{
    if (const xml::Node corporate = message.selectSingleNode(u"//rootns:corporateCustomer"_s))
        return corporate.text();
    return personName(message.selectSingleNode(u"//rootns:claimCustomer"_s), u"rootns:"_s);
}

QString customerName(const QVariant& customer, Rows needed)
{
    db::Recordset names(gConn);
    names.open(
        sql("SELECT SALUTATION + ' ' + FIRSTNAME + ' ' + NAME AS NAME FROM CUSTOMER WHERE CUST_ID={}", customer));
    return suffices(names, needed) ? names.text(u"Name"_s) : QString();
}

QString customerOfCar(const QString& rego, Rows needed)
{
    db::Recordset car(gConn);
    car.open(sql("SELECT * FROM CAR WHERE REGO='{}'", rego));
    return suffices(car, needed) ? customerName(car.value(u"CUST_ID"_s), needed) : QString();
}

QString vehicleName(const QVariant& model)
{
    db::Recordset names(gConn);
    names.open(sql("SELECT MAKE, MODEL FROM ALLMODEL WHERE MODEL_ID='{}'", model));
    if (!suffices(names, Rows::ExactlyOne))
        return {};
    return toText(names.value(u"MAKE"_s)) + u' ' + toText(names.value(u"MODEL"_s));
}

void drawFromMessage(MessageRow& row, const xml::Document& message, const QString& code)
{
    draw(row[Rego], [&] { return NormaliseRego(message.textOf(u"//rootns:vehicleRegistration"_s)); });
    draw(row[Claim], [&] { return message.textOf(u"//rootns:claimNumber"_s); });
    draw(row[Vehicle], [&] { return message.textOf(u"//rootns:vehicleDescription"_s); });
    if (code == "QREQ"_L1) {
        row[Quote] = u"-"_s;
        draw(row[Customer], [&] { return customerOfRequest(message); });
        return;
    }
    draw(row[Quote], [&] { return NormaliseQuoteRef(message.textOf(u"//rootns:quoteBody/rootns:quoteReference"_s)); });
    draw(row[Customer],
         [&] { return customerOfCar(row[Rego], code == "MANQ"_L1 ? Rows::AtLeastOne : Rows::ExactlyOne); });
}

// `quote` is a row of QUOTE1 joined with its CAR.
void drawFromQuote(MessageRow& row, const db::Recordset& quote)
{
    draw(row[Claim], [&] { return toText(quote.value(u"Claim"_s)); });
    draw(row[Quote], [&] {
        return NormaliseQuoteRef(toText(quote.value(u"QTNNO"_s)) + u'/' + toText(quote.value(u"Subquote"_s)));
    });
    draw(row[Vehicle], [&] { return vehicleName(quote.value(u"MODEL_ID"_s)); });
    draw(row[Customer], [&] { return customerName(quote.value(u"CUST_ID"_s), Rows::ExactlyOne); });
}

void drawThroughKey(MessageRow& row, const xml::Document& message, const QuoteSource& source)
{
    attempt([&] {
        db::Recordset quote(gConn);
        quote.open(sql(source.query, message.textOf(source.key)));
        if (!suffices(quote, source.needed))
            return;
        draw(row[Rego], [&] { return toText(quote.value(u"REGO"_s)); });
        drawFromQuote(row, quote);
    });
}

QString claimOfQuote(const QString& reference)
{
    const QuoteKey key = QuoteKey::fromReference(reference);
    db::Recordset quote(gConn);
    quote.open(sql("SELECT * FROM QUOTE1 WHERE QTNNO='{}' AND SUBQUOTE='{}'", key.number, key.subquote));
    if (!suffices(quote, Rows::ExactlyOne))
        return {};
    return quote.isNull(u"Claim"_s) ? u"-"_s : quote.text(u"Claim"_s);
}

QString customerOfSentQuote(const xml::Document& document)
{
    const xml::Node customer = document.selectSingleNode(u"//request/quoteClaimCustomer"_s);
    if (const xml::Node company = customer.selectSingleNode(u"companyName"_s))
        return company.text();
    return personName(customer, {});
}

MessageRow sentRow(const xml::Document& document)
{
    MessageRow row{u"Sent Quote"_s};
    draw(row[Rego], [&] { return NormaliseRego(document.textOf(u"//request/vehicleRegistration"_s)); });
    attempt([&] {
        const QString reference = document.textOf(u"//request/quoteBody/quoteReference"_s);
        row[Quote] = NormaliseQuoteRef(reference);
        row[Claim] = claimOfQuote(reference);
    });
    draw(row[Customer], [&] { return customerOfSentQuote(document); });
    draw(row[Vehicle], [&] { return document.textOf(u"//request/vehicleDescription"_s); });
    dashWhereEmpty(row, {Rego, Customer, Vehicle});
    return row;
}

}  // namespace

MessageRow GetMessageRow(const QString& text, const QString& typeName)
{
    QString prepared = text;
    return GetMessageRow(parsedMessage(prepared), typeName);
}

MessageRow GetMessageRow(const xml::Document& message, const QString& typeName)
{
    if (typeName == "SENT"_L1)
        return sentRow(message);

    QString code;
    attempt([&] { code = message.textOf(u"messageType"_s); });
    MessageRow row{typeName};
    if (isDrawnFromMessage(code)) {
        drawFromMessage(row, message, code);
        dashWhereEmpty(row, {Rego, Customer, Quote, Vehicle});
        return row;
    }
    for (const QuoteSource& source : quoteSources)
        if (code == source.code) {
            drawThroughKey(row, message, source);
            dashWhereEmpty(row, {Rego, Claim, Customer, Quote, Vehicle});
            return row;
        }
    return {u"ERROR"_s};
}

MessageRow GetMarkerRow(const QString& text, const QString& typeName)
{
    QString prepared = text;
    return GetMarkerRow(parsedMessage(prepared), typeName);
}

MessageRow GetMarkerRow(const xml::Document& marker, const QString& typeName)
{
    MessageRow row{typeName};
    QString subquote;
    draw(row[Quote], [&] { return marker.textOf(u"qtnno"_s); });
    draw(subquote, [&] { return marker.textOf(u"subquote"_s); });
    draw(row[Rego], [&] { return marker.textOf(u"rego"_s); });
    attempt([&] {
        db::Recordset quote(gConn);
        quote.open(
            sql("SELECT * FROM QUOTE1, CAR WHERE QUOTE1.REGO=CAR.REGO AND QUOTE1.QTNNO='{}' AND "
                "QUOTE1.subquote='{}' ORDER BY QUOTE1.rec_id DESC",
                row[Quote], subquote));
        if (suffices(quote, Rows::ExactlyOne))
            drawFromQuote(row, quote);
    });
    dashWhereEmpty(row, {Rego, Claim, Customer, Quote, Vehicle});
    return row;
}

}  // namespace kest
