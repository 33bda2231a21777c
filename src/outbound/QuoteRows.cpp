#include "outbound/QuoteRows.h"

#include "base/modDBAccess.h"
#include "platform/RuntimeError.h"
#include "platform/database/Sql.h"

using namespace Qt::StringLiterals;

namespace kest {

namespace {

void require(const db::Recordset& record, const QString& what, const QuoteRows& rows)
{
    if (record.eof())
        throw RuntimeError(NoCurrentRow, u"The %1 of quote %2 is missing."_s.arg(what, rows.key.fullReference()));
}

}  // namespace

QuoteRows::QuoteRows(db::Recordset& quoteRecord) : quote(quoteRecord), key(QuoteKey::fromRow(quoteRecord))
{
    car =
        opened(sql("SELECT TOP 1 REGO, BODY_ID2, MODEL_ID, CUST_ID, YEAR, COLOUR, CYLINDERS, PAINT_GP, XMISSION, "
                   "ENG_SIZE, VIN FROM CAR WHERE CAR.REGO='{}'",
                   quote.value(u"REGO"_s)));
    require(car, u"car"_s, *this);
    customer =
        opened(sql("SELECT CUST_ID, SALUTATION, FIRSTNAME, NAME, PHONE_P, PHONE_B FROM CUSTOMER WHERE CUST_ID='{}'",
                   car.value(u"CUST_ID"_s)));
    model = opened(
        sql("SELECT MODEL_ID, MAKE, MODEL, SCHEDULE FROM ALLMODEL WHERE MODEL_ID='{}'", car.value(u"MODEL_ID"_s)));
    body = opened(sql("SELECT body_id2, body_desc2 FROM BODY2 WHERE BODY2.body_id2='{}'", car.value(u"BODY_ID2"_s)));
    notes = opened(
        sql("SELECT QTNNO, SUBQUOTE, REMARKS, P_REMARKS, INCIDENT_NOTES FROM QUOTE3 WHERE QTNNO='{}' AND SUBQUOTE='{}'",
            key.number, key.subquote));
    if (!key.isMain())
        mainQuote = opened(sql("select * from quote1 where qtnno = '{}' and subquote = '0'", key.number));
}

void QuoteRows::requireAll() const
{
    require(customer, u"customer"_s, *this);
    require(notes, u"notes row"_s, *this);
}

QString text(const db::Recordset& record, const char* column)
{
    return record.eof() ? QString() : record.text(QString::fromLatin1(column));
}

QString trimmed(const db::Recordset& record, const char* column)
{
    return text(record, column).trimmed();
}

}  // namespace kest
