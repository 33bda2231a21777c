#include "messagelist/MessageRows.h"

#include "base/Helpers.h"
#include "base/SharedVariables.h"
#include "base/modDBAccess.h"
#include "messages/Envelope.h"
#include "messages/MessageTypes.h"
#include "platform/RuntimeError.h"
#include "platform/database/Recordset.h"
#include "platform/database/Sql.h"
#include "platform/values.h"
#include "quotedata/Quote.h"

#include <map>
#include <optional>
#include <utility>

using namespace Qt::StringLiterals;

namespace kest {
namespace {

enum RowField { TypeField, RegoField, ClaimField, CustomerField, QuoteField, VehicleField };

// The query that finds the rows of a quote by the key in the message.
const char* queryOf(RowSource source)
{
    switch (source) {
        case RowSource::NetworkNumber:
            return "SELECT * FROM QUOTE1, CAR WHERE QUOTE1.REGO=CAR.REGO AND QUOTE1.KESTQuoteNo='{}'";
        case RowSource::BackedOutRequest:
            return "SELECT * FROM QUOTE1, CAR WHERE QUOTE1.REGO=CAR.REGO AND QUOTE1.KESTQRNo='{}' ORDER BY rec_id DESC";
        default:
            return "SELECT * FROM QUOTE1, CAR WHERE QUOTE1.REGO=CAR.REGO AND QUOTE1.KESTQRNO='{}' "
                   "ORDER BY QUOTE1.rec_id DESC";
    }
}

bool suffices(const db::Recordset& rows, RowsNeeded needed)
{
    return needed == RowsNeeded::ExactlyOne ? rows.recordCount() == 1 : rows.recordCount() >= 1;
}

QString rowFailure;

// Ignores the failure of a step: the row stands with what was found. A lost connection is remembered, because it
// empties all the following rows too.
template <class Step>
void attemptForRow(Step&& step)
{
    attempt([&] {
        try {
            step();
        } catch (const RuntimeError& error) {
            if (error.number() == CannotOpen)
                rowFailure = error.description();
            throw;
        }
    });
}

// If the value can't be read, it stays as it is.
template <class Draw>
void draw(QString& value, Draw&& drawn)
{
    attemptForRow([&] { value = drawn(); });
}

void dashWhereEmpty(MessageRow& row, std::initializer_list<RowField> fields)
{
    for (const RowField field : fields)
        if (row[field].isEmpty())
            row[field] = u"-"_s;
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

using NameQuery = std::pair<QString, RowsNeeded>;
std::optional<std::map<NameQuery, QString>> keptNames;

/// Returns the name that a query finds, or an empty text if it does not find the rows that are needed.
QString nameFrom(const NameQuery& query, QString (*nameIn)(const db::Recordset& rows))
{
    if (keptNames && keptNames->contains(query))
        return keptNames->at(query);
    const db::Recordset rows = opened(query.first);
    const QString name = suffices(rows, query.second) ? nameIn(rows) : QString();
    if (keptNames)
        keptNames->emplace(query, name);
    return name;
}

QString customerQuery(const QVariant& customer)
{
    return sql("SELECT SALUTATION + ' ' + FIRSTNAME + ' ' + NAME AS NAME FROM CUSTOMER WHERE CUST_ID={}", customer);
}

QString customerName(const QVariant& customer, RowsNeeded needed)
{
    return nameFrom({customerQuery(customer), needed},
                    [](const db::Recordset& names) { return names.text(u"Name"_s); });
}

/// Keeps the names of the customers of all these quotes.
void keepCustomers(db::Recordset& quotes)
{
    QStringList numbers;
    for (; !quotes.eof(); quotes.moveNext())
        if (!quotes.isNull(u"CUST_ID"_s))
            numbers.append(sql("{}", quotes.value(u"CUST_ID"_s)));
    if (!keptNames || numbers.isEmpty())
        return;
    numbers.removeDuplicates();
    db::Recordset names = opened(
        sql("SELECT CUST_ID, SALUTATION + ' ' + FIRSTNAME + ' ' + NAME AS NAME FROM CUSTOMER WHERE CUST_ID IN (") +
        numbers.join(u", "_s) + u')');
    for (; !names.eof(); names.moveNext())
        keptNames->emplace(NameQuery{customerQuery(names.value(u"CUST_ID"_s)), RowsNeeded::ExactlyOne},
                           names.text(u"Name"_s));
}

QString customerOfCar(const QString& rego, RowsNeeded needed)
{
    db::Recordset car(gConn);
    car.open(sql("SELECT * FROM CAR WHERE REGO='{}'", rego));
    return suffices(car, needed) ? customerName(car.value(u"CUST_ID"_s), needed) : QString();
}

QString vehicleName(const QVariant& model)
{
    return nameFrom({sql("SELECT MAKE, MODEL FROM ALLMODEL WHERE MODEL_ID='{}'", model), RowsNeeded::ExactlyOne},
                    [](const db::Recordset& names) {
                        return toText(names.value(u"MAKE"_s)) + u' ' + toText(names.value(u"MODEL"_s));
                    });
}

void drawFromMessage(MessageRow& row, const xml::Document& message, const MessageType& type)
{
    draw(row[RegoField], [&] { return NormaliseRego(message.textOf(u"//rootns:vehicleRegistration"_s)); });
    draw(row[ClaimField], [&] { return message.textOf(u"//rootns:claimNumber"_s); });
    draw(row[VehicleField], [&] { return message.textOf(u"//rootns:vehicleDescription"_s); });
    if (type.code == MessageCode::QREQ) {
        row[QuoteField] = u"-"_s;
        draw(row[CustomerField], [&] { return customerOfRequest(message); });
        return;
    }
    draw(row[QuoteField],
         [&] { return NormaliseQuoteRef(message.textOf(u"//rootns:quoteBody/rootns:quoteReference"_s)); });
    draw(row[CustomerField], [&] { return customerOfCar(row[RegoField], type.rowsNeeded); });
}

// `quote` is a row of QUOTE1 joined with its CAR.
void drawFromQuote(MessageRow& row, const db::Recordset& quote)
{
    draw(row[ClaimField], [&] { return toText(quote.value(u"Claim"_s)); });
    draw(row[QuoteField], [&] {
        return NormaliseQuoteRef(toText(quote.value(u"QTNNO"_s)) + u'/' + toText(quote.value(u"Subquote"_s)));
    });
    draw(row[VehicleField], [&] { return vehicleName(quote.value(u"MODEL_ID"_s)); });
    draw(row[CustomerField], [&] { return customerName(quote.value(u"CUST_ID"_s), RowsNeeded::ExactlyOne); });
}

void drawRegoAndQuote(MessageRow& row, const db::Recordset& quote)
{
    draw(row[RegoField], [&] { return toText(quote.value(u"REGO"_s)); });
    drawFromQuote(row, quote);
}

void drawAlone(StartedRow& started)
{
    db::Recordset quote(gConn);
    quote.open(sql(queryOf(started.type->rowSource), started.key));
    if (suffices(quote, started.type->rowsNeeded))
        drawRegoAndQuote(started.row, quote);
}

/// Moves to the first quote with that key. Returns how many there are; 2 means two or more.
int moveToKey(db::Recordset& quotes, const QString& column, const QString& key)
{
    if (quotes.recordCount() == 0)
        return 0;
    quotes.moveFirst();
    quotes.find(column, key);
    if (quotes.eof())
        return 0;
    const int first = quotes.absolutePosition();
    quotes.moveNext();
    quotes.find(column, key);
    const int count = quotes.eof() ? 1 : 2;
    quotes.setAbsolutePosition(first);
    return count;
}

/// Asks for the quotes of several rows at once, and then alone for those that this does not find: the database may
/// compare texts in another way, or refuse all because of one key.
void drawTogether(const QList<StartedRow*>& rows, bool isNetworkNumber)
{
    QStringList keys;
    for (const StartedRow* started : rows)
        keys.append(sql("'{}'", started->key));
    const QString select =
        isNetworkNumber ? sql("SELECT * FROM QUOTE1, CAR WHERE QUOTE1.REGO=CAR.REGO AND QUOTE1.KESTQuoteNo IN (") +
                              keys.join(u", "_s) + u')'
                        : sql("SELECT * FROM QUOTE1, CAR WHERE QUOTE1.REGO=CAR.REGO AND QUOTE1.KESTQRNo IN (") +
                              keys.join(u", "_s) + u") ORDER BY QUOTE1.rec_id DESC"_s;
    db::Recordset quotes(gConn);
    const bool isAsked = rows.size() > 1 && attempt([&] { quotes.open(select); });
    if (isAsked)
        attempt([&] { keepCustomers(quotes); });
    const QString column = isNetworkNumber ? u"KESTQuoteNo"_s : u"KESTQRNo"_s;
    for (StartedRow* started : rows)
        attemptForRow([&] {
            const int count = isAsked ? moveToKey(quotes, column, started->key) : 0;
            if (count == 0)
                drawAlone(*started);
            else if (count == 1 || started->type->rowsNeeded == RowsNeeded::AtLeastOne)
                drawRegoAndQuote(started->row, quotes);
        });
}

QString claimOfQuote(const QString& reference)
{
    Quote quote(QuoteKey::fromReference(reference));
    if (!quote.exists() || !suffices(quote.header(), RowsNeeded::ExactlyOne))
        return {};
    return quote.header().isNull(u"Claim"_s) ? u"-"_s : quote.header().text(u"Claim"_s);
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
    draw(row[RegoField], [&] { return NormaliseRego(document.textOf(u"//request/vehicleRegistration"_s)); });
    attemptForRow([&] {
        const QString reference = document.textOf(u"//request/quoteBody/quoteReference"_s);
        row[QuoteField] = NormaliseQuoteRef(reference);
        row[ClaimField] = claimOfQuote(reference);
    });
    draw(row[CustomerField], [&] { return customerOfSentQuote(document); });
    draw(row[VehicleField], [&] { return document.textOf(u"//request/vehicleDescription"_s); });
    dashWhereEmpty(row, {RegoField, CustomerField, VehicleField});
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
    StartedRow started = startMessageRow(message, typeName);
    finishMessageRows({&started});
    return started.row;
}

StartedRow startMessageRow(const xml::Document& message, const QString& typeName)
{
    if (typeName == "SENT"_L1)
        return {sentRow(message)};

    const MessageType* type = nullptr;
    attempt([&] { type = findMessageType(message.textOf(u"messageType"_s)); });
    if (!type || type->rowSource == RowSource::None)
        return {{u"ERROR"_s}};
    StartedRow started{{typeName}};
    if (type->rowSource == RowSource::Message) {
        drawFromMessage(started.row, message, *type);
        dashWhereEmpty(started.row, {RegoField, CustomerField, QuoteField, VehicleField});
    } else {
        started.type = type;
        draw(started.key, [&] { return message.textOf(type->rowKey); });
    }
    return started;
}

void finishMessageRows(const QList<StartedRow*>& rows)
{
    constexpr qsizetype rowsAtOnce = 100;
    for (const bool isNetworkNumber : {true, false}) {
        QList<StartedRow*> alike;
        for (StartedRow* started : rows)
            if (started->type &&
                !started->key.trimmed().isEmpty() &&  // quotes of the host may have an empty number too
                (started->type->rowSource == RowSource::NetworkNumber) == isNetworkNumber)
                alike.append(started);
        for (qsizetype from = 0; from < alike.size(); from += rowsAtOnce)
            drawTogether(alike.mid(from, rowsAtOnce), isNetworkNumber);
    }
    for (StartedRow* started : rows)
        if (started->type)
            dashWhereEmpty(started->row, {RegoField, ClaimField, CustomerField, QuoteField, VehicleField});
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
    draw(row[QuoteField], [&] { return marker.textOf(u"qtnno"_s); });
    draw(subquote, [&] { return marker.textOf(u"subquote"_s); });
    draw(row[RegoField], [&] { return marker.textOf(u"rego"_s); });
    attemptForRow([&] {
        if (row[QuoteField].trimmed().isEmpty())
            return;
        db::Recordset quote(gConn);
        quote.open(
            sql("SELECT * FROM QUOTE1, CAR WHERE QUOTE1.REGO=CAR.REGO AND QUOTE1.QTNNO='{}' AND "
                "QUOTE1.subquote='{}' ORDER BY QUOTE1.rec_id DESC",
                row[QuoteField], subquote));
        if (suffices(quote, RowsNeeded::ExactlyOne))
            drawFromQuote(row, quote);
    });
    dashWhereEmpty(row, {RegoField, ClaimField, CustomerField, QuoteField, VehicleField});
    return row;
}

QString takeRowFailure()
{
    return std::exchange(rowFailure, {});
}

KeptNames::KeptNames()
{
    keptNames.emplace();
}

KeptNames::~KeptNames()
{
    keptNames.reset();
}

}  // namespace kest
