#include "jobexport/WriteQuote.h"

#include "base/CredentialCipher.h"
#include "base/Journal.h"
#include "base/SharedVariables.h"
#include "base/modDBAccess.h"
#include "base/modLoggerEx.h"
#include "jobexport/Address.h"
#include "platform/Prompt.h"
#include "platform/RuntimeError.h"
#include "platform/database/Recordset.h"
#include "platform/database/Sql.h"
#include "platform/values.h"
#include "quotedata/Quote.h"
#include "quotedata/Rounding.h"

#include <array>
#include <map>
#include <utility>

namespace kest {

using namespace Qt::StringLiterals;

namespace {

/// The records that an export reads and writes. A recordset that could not be opened stays closed.
struct Export {
    db::ConnectionPtr jobLink = std::make_shared<db::Connection>();
    qint64 jobId = 0;

    db::Recordset quote, mainQuote;  // the authorised quote, and the one with subquote 0
    db::Recordset lines, annotations, markers, debtor;
    db::Recordset insurer, car, model, customer;
    db::Recordset header{jobLink}, details{jobLink};
    std::map<qint64, QString> suppliers;  // names by the number of the vendor
};

struct PartType {
    QLatin1StringView mark;
    QLatin1StringView text;
};
constexpr PartType partTypes[] = {
    {""_L1, "OEM"_L1},     {"X"_L1, "EXCHANGE"_L1},     {"U"_L1, "USED"_L1},
    {"C"_L1, "RECORE"_L1}, {"A"_L1, "AFTER MARKET"_L1}, {"R"_L1, "RECONDITIONED"_L1},
};

struct Annotation {
    QLatin1StringView column;
    QLatin1StringView coreTitle;
    int lineNumber;
};
constexpr Annotation annotations[] = {
    {"anno_rr"_L1, "R&R"_L1, 900},  {"anno_ra"_L1, "RA"_L1, 901},    {"anno_paint"_L1, "PAINT"_L1, 902},
    {"anno_opg"_L1, "OPG"_L1, 903}, {"anno_part"_L1, "PRT"_L1, 904}, {"anno_misc"_L1, "MIS"_L1, 905},
};

/// The selling price of a line of a category: the product of two columns.
struct Price {
    QLatin1StringView category;
    QLatin1StringView amount;
    QLatin1StringView factor;  // if empty, the price is the amount
};
constexpr Price prices[] = {
    {"R&R"_L1, "rrhour"_L1, "rr_rate2"_L1},   {"RA"_L1, "rahour"_L1, "rr_rate2"_L1},
    {"PAINT"_L1, "pthour"_L1, "rr_rate2"_L1}, {"OPG"_L1, "pthour"_L1, "opg_rate"_L1},
    {"PRT"_L1, "rrhour"_L1, "qty"_L1},        {"MIS"_L1, "unitcost"_L1, {}},
};

void openRows(db::Recordset& rows, const QString& select)
{
    if (gConn && gConn->state() == 1) {  // without asking the server each time whether it answers
        rows = opened(select);
        return;
    }
    std::optional<db::Recordset> reopened = OpenRecordset(select);
    if (!reopened)
        throw RuntimeError(CannotOpen, u"There is no connection to the quote database."_s);
    rows = std::move(*reopened);
}

/// Returns the row with JobLink's address, closed if it can't be read.
db::Recordset joblinkSettings()
{
    db::Recordset settings;
    attempt([&] { openRows(settings, u"SELECT * FROM ExternalSettings WHERE TAG='JOBLINK'"_s); });
    return settings;
}

QString connectionText(const db::Recordset& settings)
{
    return u"Driver={MySQL ODBC 3.51 Driver};Server="_s + settings.text(u"ServerName"_s) + u";Port="_s +
           settings.text(u"Port"_s) + u";Database="_s + settings.text(u"Property1"_s) + u";User="_s +
           settings.text(u"UserName"_s) + u";Password="_s + DecryptText(settings.text(u"passWord"_s)) + u";Option=3;"_s;
}

/// Returns false if the server can't be reached. Ignores all other errors, which the following steps will meet again.
bool openJobLink(Export& job, const db::Recordset& settings)
{
    bool reached = true;
    attempt([&] {
        const QString text = connectionText(settings);
        try {
            job.jobLink->open(text);
        } catch (const RuntimeError& error) {
            reached = error.number() != CannotOpen;
            attempt([&] { logFailure(error, u"modLoadXML.WriteQuote"_s); });
            throw;
        }
    });
    return reached;
}

void makeJob(Export& job)
{
    attempt([&] {
        try {
            job.jobLink->execute(u"INSERT INTO newJob SET Status=0"_s);
        } catch (const RuntimeError& error) {
            attempt([&] { logFailure(error, u"modLoadXML.WriteQuote"_s); });
            throw;
        }
    });
    attempt([&] {
        db::Recordset identity(job.jobLink);
        identity.open(u"SELECT last_insert_id()"_s);
        job.jobId = identity.value(identity.columns().first()).toLongLong();
    });
}

void openTarget(Export& job)
{
    attempt([&] {
        job.header.open(
            sql("SELECT nJobHdr_PK, nJobID_FK, JobNr, estNr, estimateDate, startDate, endDate, invoiceDate, "
                "paintType, insName, insAddr, insPcode, insContact, insPh, insMob, insFax, insEmail, "
                "insPolicyNr, insClaimNr, custName, custAddr, custPcode, custPh, custMob, custFax, "
                "custEmail, vehReg, vehMake, vehModel, vehVIN, vehColor, vehColorCode, vehTrans, vehYear, "
                "vehMonth, estimator, assessor, jobNotes FROM newJobHdr WHERE nJobID_FK={}",
                job.jobId));
    });
    attempt([&] {
        job.details.open(
            sql("SELECT nJobDtlID_PK, nJobID_FK, coreTitle, lineDescn, lineSale, lineCost, lineNr, "
                "linePartNr, linePartQty, linePartType, lineSupplierName FROM newJobDtl WHERE "
                "nJobID_FK={}",
                job.jobId));
    });
}

/// Opens a related row, unless its key is Null.
void openRelated(db::Recordset& rows, const char* statement, const db::Recordset& owner, const QString& key)
{
    attempt([&] {
        const QVariant value = owner.value(key);
        if (!value.isNull())
            openRows(rows, sql(statement, value));
    });
}

void openSource(Export& job)
{
    const auto open = [&](db::Recordset& rows, const char* statement) {
        attempt([&] { openRows(rows, sql(statement, job.quote.text(u"QTNNO"_s))); });
    };
    open(job.lines, "SELECT * FROM QUOTE2 WHERE QTNNO='{}' AND TOSEND <> 'D' ORDER BY SEQ_NO");
    open(job.annotations, "SELECT * FROM QUOTE3 WHERE QTNNO='{}'");
    open(job.markers, "SELECT * FROM QUOTE2 WHERE QTNNO='{}' AND DELETEDITEM > 0");
    open(job.debtor, "SELECT * FROM DEBTOR WHERE QTNNO='{}' ORDER BY INVDATE DESC");

    openRelated(job.insurer, "SELECT * FROM INSURER WHERE insurer_id = {}", job.quote, u"INSURER_ID"_s);
    openRelated(job.car, "SELECT * FROM CAR WHERE rego = '{}'", job.quote, u"REGO"_s);
    openRelated(job.model, "SELECT * FROM MODEL WHERE MODEL_ID = '{}'", job.car, u"MODEL_ID"_s);
    openRelated(job.customer, "SELECT * FROM CUSTOMER WHERE cust_id = {}", job.car, u"CUST_ID"_s);
}

struct Address {
    QVariant line;
    QVariant postcode;
};
Address addressOf(const db::Recordset& owner, const QVariant& withoutPostcode)
{
    const QVariant street = owner.value(u"street"_s);
    const QVariant suburb = owner.value(u"suburb"_s);
    if (street.isNull() || suburb.isNull())
        return {};
    const QString code = joblink::postcode(toText(suburb));
    return {.line = joblink::composedAddress(toText(street), toText(suburb)),
            .postcode = code.isEmpty() ? withoutPostcode : QVariant(code)};
}

void writeHeader(Export& job)
{
    const db::Recordset& q = job.quote;
    const db::Recordset& main = job.mainQuote;
    const db::Recordset& insurer = job.insurer;
    const db::Recordset& customer = job.customer;
    const db::Recordset& car = job.car;
    const QVariant invoiced = job.debtor.eof() ? QVariant() : job.debtor.text(u"INVDATE"_s);
    const Address insurerAddress = addressOf(insurer, 0);
    const Address customerAddress = addressOf(customer, QString(u""_s));
    const joblink::BuildDate built = joblink::buildDate(car.value(u"Year"_s));

    const std::pair<const char16_t*, QVariant> values[] = {
        {u"nJobID_FK", job.jobId},
        {u"JobNr", q.value(u"QTNNO"_s)},
        {u"estNr", q.value(u"QTNNO"_s)},
        {u"estimateDate", main.text(u"qtndate"_s)},
        {u"startDate", main.value(u"CAR_IN"_s)},
        {u"endDate", main.value(u"targetdate"_s)},
        {u"invoiceDate", invoiced},
        {u"paintType", car.value(u"PAINT_GP"_s)},
        {u"insName", insurer.value(u"NAME"_s)},
        {u"insAddr", insurerAddress.line},
        {u"insPcode", insurerAddress.postcode},
        {u"insContact", insurer.value(u"contact"_s)},
        {u"insPh", insurer.value(u"phone"_s)},
        {u"insMob", QString(u""_s)},
        {u"insFax", insurer.value(u"Fax"_s)},
        {u"insEmail", insurer.value(u"email"_s)},
        {u"insPolicyNr", q.value(u"policy_no"_s)},
        {u"insClaimNr", q.value(u"Claim"_s)},
        {u"custName",
         customer.text(u"SALUTATION"_s) + u' ' + customer.text(u"FIRSTNAME"_s) + u' ' + customer.text(u"NAME"_s)},
        {u"custAddr", customerAddress.line},
        {u"custPcode", customerAddress.postcode},
        {u"custPh", customer.value(u"PHONE_B"_s)},
        {u"custMob", customer.value(u"mobile"_s)},
        {u"custFax", customer.value(u"Fax"_s)},
        {u"custEmail", customer.value(u"email"_s)},
        {u"vehReg", car.value(u"REGO"_s)},
        {u"vehMake", job.model.value(u"MAKE"_s)},
        {u"vehModel", job.model.value(u"MODEL"_s)},
        {u"vehVIN", car.value(u"VIN"_s)},
        {u"vehColor", car.value(u"COLOUR"_s)},
        {u"vehColorCode", car.value(u"paint_code"_s)},
        {u"vehTrans", car.value(u"XMission"_s)},
        {u"vehYear", built.year},
        {u"vehMonth", built.month},
        {u"estimator", q.value(u"QUOTER"_s)},
        {u"assessor", q.value(u"assess"_s)},
        {u"jobNotes", QVariant()},
    };
    job.header.addNew();
    for (const auto& [column, value] : values)
        job.header.set(QString::fromUtf16(column), value);
    job.header.update();
}

/// Returns true if another line has replaced this one: then a row of `markers` has the line's id as its DELETEDITEM.
bool isReplaced(db::Recordset& markers, const QVariant& itemId)
{
    if (markers.recordCount() == 0)
        return false;
    markers.moveFirst();
    markers.find(u"DELETEDITEM"_s, itemId);
    return !markers.eof();
}

QVariant salePrice(const db::Recordset& line)
{
    const QString category = line.text(u"category"_s);
    for (const Price& price : prices) {
        if (category != price.category)
            continue;
        double amount = toDouble(line.value(price.amount));
        if (!price.factor.isEmpty())
            amount *= toDouble(line.value(price.factor));
        return RoundAmount(amount, 2);
    }
    return {};
}

QVariant partTypeOf(const QString& mark)
{
    for (const PartType& type : partTypes)
        if (mark == type.mark)
            return QString(type.text);
    return {};
}

QString supplierOf(const QVariant& vendor, std::map<qint64, QString>& suppliers)
{
    const qint64 number = vendor.isNull() ? 0 : toLong(vendor);
    if (number <= 0)
        return u""_s;
    const auto known = suppliers.find(number);
    if (known != suppliers.end())
        return known->second;
    db::Recordset found;
    openRows(found, sql("SELECT Name FROM VENDOR WHERE vendor_id={}", vendor));
    return suppliers.emplace(number, found.eof() ? u""_s : found.text(u"NAME"_s)).first->second;
}

void writeLine(Export& job)
{
    const db::Recordset& line = job.lines;
    const QString category = line.text(u"category"_s);
    const QString partNumber = line.text(u"PartNo"_s);
    const QVariant partType = partTypeOf(line.text(u"MARK"_s).trimmed());

    db::Recordset& detail = job.details;
    detail.addNew();
    detail.set(u"nJobID_FK"_s, job.jobId);
    detail.set(u"coreTitle"_s, category == u"MIS"_s && !partNumber.isEmpty() ? u"SUBL"_s : line.value(u"category"_s));
    detail.set(u"lineDescn"_s, line.value(u"script"_s));
    if (const QVariant sale = salePrice(line); !sale.isNull())
        detail.set(u"lineSale"_s, sale);
    detail.set(u"lineCost"_s, 0);
    detail.set(u"lineNr"_s, line.value(u"SEQ_NO"_s));
    detail.set(u"linePartQty"_s, line.value(u"qty"_s));
    if (!partType.isNull())
        detail.set(u"linePartType"_s, partType);
    if (partType == QVariant(u"OEM"_s) && category == u"PRT"_s)
        detail.set(u"linePartNr"_s, partNumber.trimmed().isEmpty() ? QString(u""_s) : partNumber);
    else
        detail.set(u"linePartNr"_s, QVariant());
    detail.set(u"lineSupplierName"_s, supplierOf(line.value(u"VENDOR"_s), job.suppliers));
    detail.update();
}

void writeLines(Export& job)
{
    for (; !job.lines.eof(); job.lines.moveNext())
        if (!isReplaced(job.markers, job.lines.value(u"itemid"_s)))
            writeLine(job);
}

void writeAnnotations(Export& job)
{
    if (job.annotations.eof())
        return;
    for (const Annotation& annotation : annotations) {
        const QVariant text = job.annotations.value(annotation.column);
        if (text.isNull())
            continue;
        db::Recordset& detail = job.details;
        detail.addNew();
        detail.set(u"nJobID_FK"_s, job.jobId);
        detail.set(u"coreTitle"_s, QString(annotation.coreTitle));
        detail.set(u"lineDescn"_s, text);
        detail.set(u"lineNr"_s, annotation.lineNumber);
        for (const QString& amount : {u"lineSale"_s, u"lineCost"_s, u"linePartQty"_s})
            detail.set(amount, 0);
        for (const QString& none : {u"linePartType"_s, u"linePartNr"_s, u"lineSupplierName"_s})
            detail.set(none, QVariant());
        detail.update();
    }
}

void finish(Export& job)
{
    db::Recordset status(job.jobLink);
    // the key is a 16-bit number here, so a job above 32767 stays unfinished
    status.open(sql("SELECT nJobID_PK, status FROM newJob WHERE nJobID_PK={}", toInteger(job.jobId)));
    status.set(u"Status"_s, 1);
    status.update();
}

}  // namespace

void WriteQuote(const QString& quoteNumber, const QString& subquote)
{
    Export job;
    EnsureConnection();
    db::Recordset settings = joblinkSettings();
    if (!settings.isOpen() || settings.eof())
        return;

    attempt([&] { openRows(job.quote, Quote::headerQuery({quoteNumber, subquote})); });
    attempt([&] {
        openRows(job.mainQuote,
                 sql("SELECT * FROM QUOTE1 WHERE QTNNO='{}' AND SUBQUOTE=0", job.quote.text(u"QTNNO"_s)));
    });
    if (!openJobLink(job, settings))
        return;
    settings.close();
    EnsureConnection();  // JobLink may have answered late
    makeJob(job);
    try {
        if (job.jobId != 0)  // as soon as it is known, so that the job of an interrupted load is not made again
            journal::keep(u"job"_s, job.jobId);
        openTarget(job);
        openSource(job);
        if (job.jobId == 0 || !job.customer.isOpen() || job.customer.eof()) {
            desktop::msgBox(u"Quote could not be exported to JobLink."_s, desktop::Icon::Critical);
            return;
        }
        writeHeader(job);
        writeLines(job);
        writeAnnotations(job);
        finish(job);
    } catch (const RuntimeError& error) {
        desktop::msgBox(u"Wirra32.KEST2.modLoadXML.WriteQuote"_s, desktop::Icon::None, error.description());
    }
}

bool isJobComplete(qint64 jobId)
{
    bool isComplete = false;
    attempt([&] {
        Export job;
        if (!openJobLink(job, joblinkSettings()))
            return;
        db::Recordset row(job.jobLink);
        row.open(sql("SELECT status FROM newJob WHERE nJobID_PK={}", jobId));
        isComplete = !row.eof() && toLong(row.value(u"status"_s)) == 1;
    });
    return isComplete;
}

}  // namespace kest
