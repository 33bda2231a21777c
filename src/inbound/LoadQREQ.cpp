// Loads a quote request, which becomes a new quote without lines, with its car, customer, note and photographs.
#include "base/Helpers.h"
#include "base/Journal.h"
#include "base/SharedVariables.h"
#include "base/modDBAccess.h"
#include "inbound/Finishing.h"
#include "inbound/Loading.h"
#include "inbound/NextNumbers.h"
#include "inbound/modLoadXML.h"
#include "messages/Envelope.h"
#include "platform/RuntimeError.h"
#include "platform/Waiting.h"
#include "platform/database/Sql.h"
#include "platform/files/files.h"
#include "platform/values.h"
#include "quotedata/NetworkCodes.h"
#include "quotedata/Quote.h"
#include "quotedata/StateTable.h"
#include "reports/PrintXML.h"

#include <QStringList>

#include <utility>

namespace kest {

using namespace Qt::StringLiterals;

namespace {

constexpr QLatin1StringView universalInsurer = "KEST Universal Insurer"_L1;

/// The values of the message. Reading them throws if an element is missing or malformed, even one that only the report
/// shows, so that such a message fails before anything is stored.
struct Request {
    /// Reads what is needed to find out if the request is known.
    void readKey(const xml::Document& message);
    void readRest(const xml::Document& message);

    QString number;
    QString version;
    QString claim;
    QString rego;
    QString companyName;
    QString title;
    QString firstName;
    QString surname;
    bool extraInformation = false;
    qint64 builtYear = 0;
    qint64 builtMonth = 0;
    QString transmission;
    QString cylinders;
    QString vin;
    QString colourCode;
    QString paintType;
    QString odometer;
};

void Request::readKey(const xml::Document& message)
{
    rego = NormaliseRego(message.textOf(u"//rootns:vehicleRegistration"_s));
    number = message.textOf(u"//rootns:quoteRequestNumber"_s);
    version = message.textOf(u"//rootns:quoteRequestVersionNumber"_s);
    claim = message.textOf(u"//rootns:claimNumber"_s);
}

void Request::readRest(const xml::Document& message)
{
    for (const QLatin1StringView shownOnly :
         {"claimDescription"_L1, "claimManager"_L1, "corporateCustomer"_L1, "vehicleLocation"_L1, "bayNumber"_L1,
          "vehicleDescription"_L1, "instructions"_L1, "extraVehicleInformation/rootns:make"_L1,
          "extraVehicleInformation/rootns:bodyShape"_L1, "extraVehicleInformation/rootns:fuelLevel"_L1,
          "extraVehicleInformation/rootns:damageDescription"_L1,
          "extraVehicleInformation/rootns:oldDamageDescription"_L1})
        message.textOf(u"//rootns:"_s + shownOnly);

    if (const xml::Node company = message.selectSingleNode(u"//rootns:claimCustomer/rootns:companyName"_s))
        companyName = company.text().left(35);
    if (companyName.isEmpty()) {
        title = message.textOf(u"//rootns:claimCustomer/rootns:title"_s).left(10);
        firstName = message.textOf(u"//rootns:claimCustomer/rootns:firstName"_s).left(25);
        surname = message.textOf(u"//rootns:claimCustomer/rootns:surname"_s).left(35);
    }
    toBool(message.textOf(u"//rootns:offsiteQuoting"_s));
    extraInformation = toBool(message.textOf(u"//rootns:extraQuoteInformationRequested"_s));
    FormatNetworkDate(message.textOf(u"//rootns:quoteDueTime"_s));

    const auto extra = [&](QLatin1StringView name) {
        return message.textOf(u"//rootns:extraVehicleInformation/rootns:"_s + name);
    };
    builtYear = toLong(SafeVal(extra("yearOfManufacture"_L1), u"0"_s));
    builtMonth = toLong(SafeVal(extra("monthOfManufacture"_L1), u"0"_s));
    transmission = extra("transmissionType"_L1);
    cylinders = extra("numberOfCylinders"_L1);
    vin = extra("vinChassis"_L1);
    colourCode = extra("color"_L1);
    paintType = extra("paintType"_L1);
    odometer = extra("odometer"_L1);
}

/// Makes the insurer of quote requests the current row. Returns false if there is none.
bool chooseInsurer(db::Recordset& insurer)
{
    if (insurer.eof())
        return false;
    if (insurer.recordCount() == 2 && insurer.text(u"NAME"_s) == universalInsurer)
        insurer.moveNext();
    else if (insurer.recordCount() > 2)
        insurer.find(sql("name='{}'", QString(universalInsurer)));
    return true;
}

/// Opens the customer of the car or, if it has none, the one of that name. If there is neither, it is empty.
db::Recordset openCustomer(const db::Recordset& car, const Request& request)
{
    db::Recordset customer(gConn);
    if (!car.eof()) {
        customer.open(sql("SELECT * FROM CUSTOMER WHERE CUST_ID={}", car.value(u"CUST_ID"_s)));
    } else if (!request.firstName.trimmed().isEmpty()) {
        const QString firstWord = request.firstName.split(u' ', Qt::SkipEmptyParts).value(0);
        customer.open(sql("SELECT * FROM CUSTOMER WHERE NAME='{}' AND FIRSTNAME LIKE '{}%'", request.surname.trimmed(),
                          likeText(firstWord)));
    } else {
        customer.open(sql("SELECT * FROM CUSTOMER WHERE NAME='{}' AND FIRSTNAME = ''", request.companyName.trimmed()));
    }
    return customer;
}

void fillCustomer(db::Recordset& customer, const Request& request)
{
    const QString none = u""_s;
    setColumns(customer, {
                             {"NAME"_L1, request.companyName.isEmpty() ? request.surname : request.companyName},
                             {"FIRSTNAME"_L1, request.firstName},
                             {"SALUTATION"_L1, request.title},
                             {"Account"_L1, 190},
                             {"street"_L1, none},
                             {"suburb"_L1, none},
                             {"PHONE_B"_L1, none},
                             {"Fax"_L1, none},
                             {"PHONE_P"_L1, none},
                             {"email"_L1, none},
                             {"mobile"_L1, none},
                         });
}

QString colourOf(const QString& code, db::Recordset& colours)
{
    if (code.isEmpty())
        return u""_s;
    colours.find(sql("Code='{}'", code));
    return colours.eof() ? u""_s : colours.text(u"Script"_s).trimmed();
}

void fillNewCar(db::Recordset& car, const Request& request, db::Recordset& colours)
{
    const db::Recordset model = opened(u"SELECT * FROM MODEL WHERE MODEL_ID1='Z000'"_s);
    const QString none = u""_s;
    setColumns(car, {
                        {"PAINT_GP"_L1, paintGroupOfCode(request.paintType)},
                        {"REGO"_L1, request.rego},
                        {"KEST"_L1, 1},
                        {"MODEL_ID"_L1, model.value(u"MODEL_ID"_s)},
                        {"BODY_ID"_L1, u"4"_s},
                        {"BODY_ID2"_L1, u"4S"_s},
                        {"ENGINE"_L1, none},
                        {"SCHEDULE"_L1, none},
                        {"MTA_SCHED"_L1, none},
                        {"TRI_SCHED"_L1, none},
                        {"UN_SCHED"_L1, none},
                        {"paint_code"_L1, none},
                        {"TRIM_CODE"_L1, none},
                        {"OPT_CODE"_L1, none},
                        {"MODEL_NO"_L1, none},
                        {"Year"_L1, buildDate(request.builtYear, qMax<qint64>(request.builtMonth, 0))},
                        {"COLOUR"_L1, colourOf(request.colourCode, colours)},
                        {"VIN"_L1, request.vin},
                        {"XMission"_L1, transmissionOfCode(request.transmission)},
                    });
    if (!request.cylinders.isEmpty())
        car.set(u"CYLINDERS"_s, SafeVal(request.cylinders, u"0"_s));
}

/// Fills the car and the customer of a request, adding those that the shop does not have. Returns the customer. Stores
/// only the mark of a known car.
db::Recordset fillCarAndCustomer(db::Recordset& car, const Request& request, db::Recordset& colours)
{
    const bool carFound = !car.eof();
    if (carFound) {
        car.set(u"KEST"_s, 1);
        car.update();
    }
    db::Recordset customer = openCustomer(car, request);
    if (customer.eof()) {
        customer.addNew();
        fillCustomer(customer, request);
    }
    if (carFound) {
        respellColour(car, colours);
    } else {
        car.addNew();
        fillNewCar(car, request, colours);
    }
    if (car.isNull(u"PAINT_GP"_s))
        throw RuntimeError(NullValue, u"The column PAINT_GP of the car %1 is Null."_s.arg(request.rego));
    return customer;
}

void fillQuote(db::Recordset& quote, const QString& quoteNumber, const Request& request, const db::Recordset& insurer,
               const db::Recordset& cinfo)
{
    setColumns(quote, {
                          {"QUOTER"_L1, u""_s},
                          {"QTNNO"_L1, quoteNumber},
                          {"Subquote"_L1, 0},
                          {"qtndate"_L1, shortDate(QDate::currentDate())},
                          {"INSURER_ID"_L1, insurer.value(u"INSURER_ID"_s)},
                          {"KESTQRNo"_L1, request.number},
                          {"KESTQRVer"_L1, request.version},
                          {"Claim"_L1, request.claim},
                          {"REGO"_L1, request.rego},
                          {"RR_RATE"_L1, insurer.value(u"RR_RATE"_s)},
                          {"RA_RATE"_L1, insurer.value(u"RA_RATE"_s)},
                          {"QSENT"_L1, u"R"_s},
                          {"excess"_L1, 0},
                          {"contri"_L1, 0},
                          {"NEWPC"_L1, insurer.value(u"new_mu"_s)},
                          {"SECONDPC"_L1, cinfo.value(u"second_mu"_s)},
                          {"RECOREPC"_L1, cinfo.value(u"recore_mu"_s)},
                          {"AFTERPC"_L1, cinfo.value(u"after_mu"_s)},
                          {"assess"_L1, u""_s},
                          {"excess_gst"_L1, insurer.isNull(u"excess_gst"_s) ? 2 : insurer.value(u"excess_gst"_s)},
                          {"Type"_L1, u"MTA"_s},
                          {"ExtraInfo"_L1, request.extraInformation},
                      });
    fillWithoutTotals(quote);
    if (!request.odometer.isEmpty())
        quote.set(u"kms"_s, request.odometer);
}

/// Returns a path that no image of the quote has, and adds it to them. NextImageNumber() reads only three digits, so
/// above 999 it returns numbers that are taken.
QString newImagePath(const QString& quoteNumber, QStringList& images)
{
    for (int number = NextImageNumber(quoteNumber, images);; ++number) {
        const QString name = quoteNumber + u"_0"_s + PadZeroLeft(QString::number(number), 3) + u".jpg"_s;
        if (images.contains(name, Qt::CaseInsensitive))
            continue;
        images.append(name);
        return files::pathForWriting(gsImagesPath, name);
    }
}

/// Moves a picture to the host's images of the quote. The name is kept before, so that an interrupted move ends under
/// it.
void takePhotograph(const QString& arrived, const QString& path, const QString& quoteNumber, QStringList& images)
{
    const QString begun = journal::kept(arrived).toString();
    if (!begun.isEmpty() && files::exists(begun) && files::readBytes(begun) == files::readBytes(path))
        return files::remove(path);
    const QString target = begun.isEmpty() || files::exists(begun) ? newImagePath(quoteNumber, images) : begun;
    journal::keep(arrived, target);
    files::move(path, target, files::Target::Free);
}

/// Moves the pictures of the request that have arrived to the host's images of the quote.
void takePhotographs(const xml::Node& root, const QString& requestNumber, const QString& quoteNumber)
{
    const QList<xml::Node> imageIds = root.selectNodes(u"rootns:quoteRequestImageIds/*"_s);
    if (imageIds.isEmpty())
        return;
    const QStringList unread = files::list(gsUnreadPath, requestNumber + u"_*"_s);
    QStringList images = files::list(gsImagesPath, quoteNumber + u"_*"_s);
    const auto isHere = [&](const QString& name) {
        return unread.contains(name, Qt::CaseInsensitive) && files::exists(gsUnreadPath + name);
    };
    for (const xml::Node& imageId : imageIds) {
        workStep();
        const QString arrived = requestNumber + u'_' + PadZeroLeft(imageId.text(), 3);
        if (files::isPlainName(arrived) && isHere(arrived + u".jpg"_s))
            takePhotograph(arrived, gsUnreadPath + arrived + u".jpg"_s, quoteNumber, images);
        else if (journal::kept(arrived).isUndefined())
            continue;
        if (isHere(arrived + u".txt"_s))
            files::remove(gsUnreadPath + arrived + u".txt"_s);
    }
}

/// Moves the shop's counter to a free number. Ignores failures: the load is complete, and the counter only shortens the
/// search for the next number.
void countOn(db::Recordset& cinfo)
{
    const auto moveOn = [&] {
        db::Recordset tried(gConn);
        cinfo.set(u"QUOTE_VAL"_s, NextQuoteNumber({}, cinfo, tried, true));
        cinfo.update();  // fails if another workstation has moved it meanwhile, perhaps to a number now taken
    };
    bool moved = attempt(moveOn);
    for (int again = 0; again < 4 && !moved; ++again)
        moved = attempt([&] {
            cinfo.cancelUpdate();
            cinfo.requery();
            moveOn();
        });
}

}  // namespace

bool LoadQREQ(QString& text, const QString& fileName)
{
    const SharedMessage message = sharedMessage(text);

    db::Recordset insurer = opened(u"SELECT * FROM INSURER WHERE KEST=1 or name='KEST Universal Insurer'"_s);
    if (!chooseInsurer(insurer))
        return refuse(u"Error locating a valid insurer, Please contact MarlinDesk Support."_s);

    std::unique_ptr<db::Lock> newQuotes = lockNewQuotes();
    db::Recordset cinfo = opened(u"SELECT * FROM CINFO"_s);  // after the lock, because its last owner moved the counter
    db::Recordset quote(gConn);
    const QString quoteNumber = NextQuoteNumber({}, cinfo, quote, false);
    db::Recordset notes = opened(sql("SELECT * FROM QUOTE3 WHERE QTNNO='{}'", quoteNumber));
    Request request;
    request.readKey(*message);
    db::Recordset car = opened(sql("SELECT * FROM CAR WHERE REGO='{}'", request.rego));
    db::Recordset colours = opened(u"SELECT * FROM KESTColours"_s);

    const db::Recordset known = Quote::openNumbered(
        request.number, sql("SELECT * FROM QUOTE1 WHERE SUBQUOTE=0 AND KESTQRNO='{}' AND KESTQRVER='{}'",
                            request.number, request.version));
    if (!known.eof()) {
        newQuotes.reset();  // a box may stay open for hours
        return refuse(u"Quote Request already exists as quote number "_s + known.text(u"QTNNO"_s) + u'!');
    }
    request.readRest(*message);

    quote.addNew();
    // before the first update, so that a text that is too long is refused before anything is stored
    fillQuote(quote, quoteNumber, request, insurer, cinfo);
    db::Recordset customer = fillCarAndCustomer(car, request, colours);
    quote.set(u"paint_rate"_s, insurer.value(car.text(u"PAINT_GP"_s) + u"_RATE"_s));
    if (notes.eof())
        notes.addNew();
    setColumns(notes, {{"QTNNO"_L1, quoteNumber}, {"Subquote"_L1, 0}});
    applyTransition(quoteRequested, quote, notes);

    customer.update();
    car.set(u"CUST_ID"_s, customer.value(u"CUST_ID"_s));  // a new customer gets its number from the update
    car.update();
    quote.update();
    newQuotes.reset();
    journal::passPoint([&] { notes.update(); });

    PrintXML(fileName, false);
    attempt([] { EnsureConnection(); });  // the server may have dropped it while the report was open
    takePhotographs(message->documentElement(), request.number, quoteNumber);
    countOn(cinfo);
    return true;
}

void finishRequest(QString& text, const QString& quoteNumber)
{
    const SharedMessage message = sharedMessage(text);
    takePhotographs(message->documentElement(), message->textOf(u"//rootns:quoteRequestNumber"_s), quoteNumber);
    db::Recordset cinfo = opened(u"SELECT * FROM CINFO"_s);
    countOn(cinfo);
}

}  // namespace kest
