#include "outbound/QuoteHead.h"

#include "base/Helpers.h"
#include "platform/values.h"
#include "quotedata/NetworkCodes.h"

using namespace Qt::StringLiterals;

namespace kest {

namespace {

QString phoneNumber(const db::Recordset& customer, const char* column)
{
    return AlphaNumericOnly(trimmed(customer, column)).left(10);
}

void addCustomer(const Branch& request, const db::Recordset& customer)
{
    const auto isEmptyText = [&](const QString& column) {  // not Null, which a private customer may have
        return !customer.isNull(column) && customer.text(column).isEmpty();
    };
    const bool company = isEmptyText(u"SALUTATION"_s) && isEmptyText(u"FIRSTNAME"_s);
    const bool person = !company;
    const bool firstNameMissing = !text(customer, "SALUTATION").isEmpty() && text(customer, "FIRSTNAME").isEmpty();

    request.add("quoteClaimCustomer")
        .add({
            {"companyName", company, trimmed(customer, "NAME")},
            {"title", person, trimmed(customer, "SALUTATION")},
            {"firstName", person, firstNameMissing ? u"."_s : trimmed(customer, "FIRSTNAME")},
            {"surname", person, trimmed(customer, "NAME")},
            {"privatePhoneNumber", always, phoneNumber(customer, "PHONE_P")},
            {"businessPhoneNumber", always, phoneNumber(customer, "PHONE_B")},
        });
}

/// Returns the vehicle's values. If the insurer did not ask for extra values, they come from the car and the quote.
ExtraValues vehicleValues(const QuoteRows& rows, const std::optional<ExtraValues>& extra)
{
    const db::Recordset& car = rows.car;
    ExtraValues values;
    if (extra)
        values = *extra;
    else
        std::tie(values.buildMonth, values.buildYear) = monthAndYearWritten(text(car, "YEAR"));
    const QVariant asked = rows.quote.value(u"ExtraInfo"_s);
    if (asked.isNull() || isTrue(asked))  // Null is treated like true
        return values;

    values.transmission = transmissionToSend(text(car, "XMISSION"));
    values.cylinders = QString(text(car, "ENG_SIZE") + u' ' + text(car, "CYLINDERS")).trimmed();
    values.vin = trimmed(car, "VIN");
    values.odometer = trimmed(rows.quote, "kms");
    values.colour = text(car, "COLOUR");
    return values;
}

void addVehicle(const Branch& request, const QuoteRows& rows, const std::optional<ExtraValues>& extra)
{
    const ExtraValues values = vehicleValues(rows, extra);
    const bool asked = isTrue(rows.quote.value(u"ExtraInfo"_s));
    const QString oldDamage = asked && values.oldDamage.isEmpty() ? u"None"_s : values.oldDamage;

    const Leaves leaves = {
        filled("make", trimmed(rows.model, "MAKE")),
        filled("yearOfManufacture", values.buildYear),
        filled("monthOfManufacture", values.buildMonth),
        filled("bodyShape", trimmed(rows.body, "body_desc2")),
        filled("transmissionType", values.transmission),
        filled("numberOfCylinders", values.cylinders),
        filled("vinChassis", values.vin),
        filled("color", codeOfColour(values.colour)),
        filled("paintType", codeOfPaintGroup(text(rows.car, "PAINT_GP"))),
        filled("odometer", values.odometer),
        filled("fuelLevel", values.fuel),
        filled("damageDescription", values.damage),
        filled("oldDamageDescription", oldDamage),
    };
    if (std::ranges::any_of(leaves, &Leaf::present))
        request.add("quoteExtraVehicleInformation").add(leaves);
}

}  // namespace

InsurerReference referenceOf(const QuoteRows& rows)
{
    InsurerReference reference;
    if (!rows.key.isMain()) {
        const QString authorised = text(rows.quote, "KESTAuthNo");  // even a blank one, which then points nowhere
        reference.authorisedQuoteNumber =
            authorised.isEmpty() ? text(rows.mainQuote, "KESTQuoteNo") : authorised.trimmed();
    } else if (text(rows.quote, "KESTQRNo").isEmpty()) {
        reference.claimNumber = trimmed(rows.quote, "Claim");
    } else {
        reference.requestNumber = trimmed(rows.quote, "KESTQRNo");
        reference.requestVersion = trimmed(rows.quote, "KESTQRVer");
    }
    return reference;
}

std::optional<qint64> repairDays(const db::Recordset& quote)
{
    if (quote.isNull(u"CAR_IN"_s) || quote.isNull(u"targetdate"_s))
        return {};
    return toDate(quote.value(u"CAR_IN"_s)).date().daysTo(toDate(quote.value(u"targetdate"_s)).date());
}

void addHead(const Branch& request, const QuoteRows& rows, const InsurerReference& reference,
             const std::optional<ExtraValues>& extra, std::optional<qint64> repairDays)
{
    const bool hasRequest = !reference.requestNumber.isEmpty();
    request.add({
        filled("kestAuthorisedQuoteNumber", reference.authorisedQuoteNumber),
        filled("claimNumber", reference.claimNumber),
        {"quoteRequestNumber", hasRequest, reference.requestNumber},
        {"quoteRequestVersionNumber", hasRequest, reference.requestVersion},
        {"quotationSoftware", always, u"MarlinDesk"_s},
        {"quotationSoftwareVersion", always, QStringLiteral(KEST_VERSION)},
        {"quoteCreator", always, text(rows.quote, "QUOTER")},
    });
    addCustomer(request, rows.customer);
    request.add({
        {"vehicleRegistration", always, trimmed(rows.car, "REGO")},
        {"vehicleDescription", always, QString(text(rows.model, "MAKE") + u' ' + text(rows.model, "MODEL")).trimmed()},
    });
    if (rows.key.isMain())
        addVehicle(request, rows, extra);
    request.add({
        {"quoteComments", always, text(rows.notes, "P_REMARKS")},
        {"repairDaysRequired", repairDays.has_value(), QString::number(repairDays.value_or(0))},
    });
}

}  // namespace kest
