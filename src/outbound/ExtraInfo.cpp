#include "outbound/ExtraInfo.h"

#include "base/modDBAccess.h"
#include "outbound/QuoteRows.h"
#include "platform/database/Sql.h"
#include "quotedata/NetworkCodes.h"
#include "quotedata/Quote.h"

using namespace Qt::StringLiterals;

namespace kest {

namespace {

QString digitsOf(const QString& text)
{
    QString digits;
    for (const QChar c : text)
        if (c >= u'0' && c <= u'9')
            digits += c;
    return digits;
}

}  // namespace

ExtraInfo::ExtraInfo(const QuoteKey& key) : quoteRow(Quote::openHeader(key))
{
    if (quoteRow.recordCount() != 1) {
        missing = u"Couldn't locate quote in database, Please contact MarlinDesk Support"_s;
        return;
    }
    carRow = opened(sql("SELECT * FROM CAR WHERE REGO='{}'", quoteRow.value(u"REGO"_s)));
    if (carRow.recordCount() != 1) {
        missing = u"Missing relationship : Car, Please contact MarlinDesk Support"_s;
        return;
    }
    modelRow = opened(sql("SELECT MAKE, MODEL FROM ALLMODEL WHERE MODEL_ID='{}'", carRow.value(u"MODEL_ID"_s)));
    customerRow = opened(sql("SELECT SALUTATION + ' ' + FIRSTNAME + ' ' + NAME AS NAME FROM CUSTOMER WHERE CUST_ID={}",
                             carRow.value(u"CUST_ID"_s)));
    if (modelRow.recordCount() != 1 || customerRow.recordCount() != 1)
        missing = u"Missing relationship : Model or Customer, Please contact MarlinDesk Support"_s;
}

QString ExtraInfo::quoteNumber() const
{
    return trimmed(quoteRow, "QTNNO");
}

QString ExtraInfo::customer() const
{
    return trimmed(customerRow, "NAME");
}

QString ExtraInfo::rego() const
{
    return trimmed(quoteRow, "REGO");
}

QString ExtraInfo::model() const
{
    return trimmed(modelRow, "MAKE") + u' ' + trimmed(modelRow, "MODEL");
}

ExtraValues ExtraInfo::values() const
{
    const auto [month, year] = monthAndYearTyped(carRow.text(u"Year"_s));

    ExtraValues values;
    values.transmission = transmissionToSend(carRow.text(u"XMISSION"_s));
    values.vin = trimmed(carRow, "VIN");
    values.odometer = trimmed(quoteRow, "kms");
    values.cylinders = trimmed(carRow, "CYLINDERS");
    values.buildMonth = month;
    values.buildYear = year;
    values.colour = carRow.text(u"COLOUR"_s);
    return values;
}

void ExtraInfo::save(const ExtraValues& values)
{
    if (!values.vin.isEmpty())
        carRow.set(u"VIN"_s, values.vin);
    if (!values.odometer.isEmpty())
        quoteRow.set(u"kms"_s, values.odometer);
    if (const QString cylinders = digitsOf(values.cylinders); !cylinders.isEmpty())
        carRow.set(u"CYLINDERS"_s, cylinders);
    carRow.set(u"XMission"_s, values.transmission == "Automatic"_L1 ? u"Automatic"_s : u"Manual"_s);
    carRow.set(u"Year"_s, QString(values.buildMonth + u'/' + values.buildYear));
    carRow.set(u"COLOUR"_s, values.colour);
    carRow.update();
    quoteRow.update();
}

ExtraInfoResult BuildArrayFromDB(const QString& quoteNumber, const QString& subquote)
{
    ExtraInfo info({quoteNumber, subquote});
    if (!info.problem().isEmpty())
        return info.problem();
    const ExtraValues values = info.values();
    info.save(values);
    return values;
}

}  // namespace kest
