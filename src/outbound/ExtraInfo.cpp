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
    values[Transmission] = transmissionToSend(carRow.text(u"XMISSION"_s));
    values[VIN] = trimmed(carRow, "VIN");
    values[Odometer] = trimmed(quoteRow, "kms");
    values[Cylinders] = trimmed(carRow, "CYLINDERS");
    values[BuildMonth] = month;
    values[BuildYear] = year;
    values[Colour] = carRow.text(u"COLOUR"_s);
    return values;
}

void ExtraInfo::save(const ExtraValues& values)
{
    if (!values[VIN].isEmpty())
        carRow.set(u"VIN"_s, values[VIN]);
    if (!values[Odometer].isEmpty())
        quoteRow.set(u"kms"_s, values[Odometer]);
    if (const QString cylinders = digitsOf(values[Cylinders]); !cylinders.isEmpty())
        carRow.set(u"CYLINDERS"_s, cylinders);
    carRow.set(u"XMission"_s, values[Transmission] == "Automatic"_L1 ? u"Automatic"_s : u"Manual"_s);
    carRow.set(u"Year"_s, QString(values[BuildMonth] + u'/' + values[BuildYear]));
    carRow.set(u"COLOUR"_s, values[Colour]);
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
