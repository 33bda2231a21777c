#include "reports/PrintXML.h"

#include "base/Helpers.h"
#include "base/QuoteKey.h"
#include "base/SharedVariables.h"
#include "base/modDBAccess.h"
#include "messages/Envelope.h"
#include "messages/MessageTypes.h"
#include "platform/Prompt.h"
#include "platform/RuntimeError.h"
#include "platform/database/Sql.h"
#include "platform/files/files.h"
#include "platform/values.h"
#include "quotedata/NetworkCodes.h"
#include "quotedata/Quote.h"
#include "quotedata/Vendors.h"
#include "reports/BuildAuthReport.h"
#include "reports/QuoteComparison.h"
#include "reports/ReportTable.h"
#include "reports/frmPrintPreview.h"
#include "sublets/SubletDocuments.h"
#include "sublets/frmSubletAuth.h"

#include <QStringList>

#include <algorithm>
#include <functional>
#include <optional>

namespace kest {

using namespace Qt::StringLiterals;

namespace {

constexpr ReportField requestFields[] = {
    {"Corp", 20},         {"Quote", 8},
    {"Qrno", 20},         {"Rego", 10},
    {"Claim", 20},        {"Claim_desc", 3000},
    {"Fullname", 90},     {"Location", 55},
    {"Bay", 4},           {"Offsite", 0, db::Kind::WholeNumber},
    {"Quote_due", 25},    {"Veh_desc", 3000},
    {"Make", 20},         {"Body", 20},
    {"Built_date", 7},    {"Colour_desc", 15},
    {"Odometer", 20},     {"Damage", 3000},
    {"Old_Damage", 3000}, {"Instruction", 3000},
    {"image_id", 20},     {"image_desc", 3000},
};

constexpr ReportField resultFields[] = {
    {"KESTQuoteNo", 12}, {"QTNNO", 8}, {"subquote", 1}, {"KESTQRNO", 10}, {"reason", 3000},
};

/// Runs a step and ignores NoCurrentRow.
void step(const std::function<void()>& step)
{
    try {
        step();
    } catch (const RuntimeError& error) {
        if (error.number() != NoCurrentRow)
            throw;
    }
}

void setField(db::Recordset& row, const char* field, const QVariant& value)
{
    row.set(QString::fromLatin1(field), value);
}

QString fullName(const xml::Document& message)
{
    const QString customer = u"//rootns:claimCustomer/rootns:"_s;
    if (const xml::Node company = message.selectSingleNode(customer + u"companyName"_s))
        return company.text();
    QString name = message.textOf(customer + u"title"_s);
    for (const QString& part : {u"firstName"_s, u"surname"_s})
        name = name.trimmed() + u' ' + message.textOf(customer + part);
    return name;
}

QString builtDate(const xml::Document& message)
{
    const auto number = [&](const QString& element) {
        return toLong(SafeVal(message.textOf(u"//rootns:extraVehicleInformation/rootns:"_s + element), u"0"_s));
    };
    return buildDate(number(u"yearOfManufacture"_s), number(u"monthOfManufacture"_s));
}

QString imageDescription(const QString& requestNumber, const QString& imageId)
{
    const QString name = requestNumber + u'_' + PadZeroLeft(imageId, 3) + u".txt"_s;
    if (!files::isPlainName(name) || !files::exists(gsUnreadPath + name) || files::size(gsUnreadPath + name) == 0)
        return u""_s;
    return files::read(gsUnreadPath + name).trimmed();
}

void fillImage(db::Recordset& row, const QString& requestNumber, const QString& image)
{
    const QString imageId = QString::number(toLong(image));
    setField(row, "image_id", imageId);
    setField(row, "image_desc", imageDescription(requestNumber, imageId));
}

void fillRequest(db::Recordset& row, const xml::Document& message, const QString& quoteNumber)
{
    const auto text = [&](const char* element) {
        return message.textOf(u"//rootns:"_s + QString::fromLatin1(element));
    };
    const auto extra = [&](const char* element) {
        return message.textOf(u"//rootns:extraVehicleInformation/rootns:"_s + QString::fromLatin1(element));
    };
    setField(row, "Corp", text("corporateCustomer"));
    setField(row, "Quote", quoteNumber);
    setField(row, "Qrno", text("quoteRequestNumber"));
    setField(row, "Rego", NormaliseRego(text("vehicleRegistration")));
    setField(row, "Claim", text("claimNumber"));
    setField(row, "Claim_desc", text("claimDescription"));
    setField(row, "Fullname", fullName(message));
    setField(row, "Location", text("vehicleLocation"));
    setField(row, "Bay", text("bayNumber"));
    setField(row, "Offsite", toBool(text("offsiteQuoting")) ? 1 : 0);
    setField(row, "Quote_due", FormatNetworkDate(text("quoteDueTime")));
    setField(row, "Veh_desc", text("vehicleDescription"));
    setField(row, "Make", extra("make"));
    setField(row, "Body", extra("bodyShape"));
    setField(row, "Built_date", builtDate(message));
    if (const auto colour = colourOfCode(extra("color")))
        setField(row, "Colour_desc", *colour);
    setField(row, "Odometer", extra("odometer"));
    setField(row, "Damage", extra("damageDescription"));
    setField(row, "Old_Damage", extra("oldDamageDescription"));
    setField(row, "Instruction", text("instructions"));
}

bool printRequest(const xml::Document& message)
{
    const QString requestNumber = message.textOf(u"//rootns:quoteRequestNumber"_s);
    db::Recordset quote = Quote::openNumbered(
        requestNumber, sql("SELECT * FROM QUOTE1 WHERE KESTQRNO='{}' AND KESTQRVer='{}' ORDER BY rec_id DESC",
                           requestNumber, message.textOf(u"//rootns:quoteRequestVersionNumber"_s)));
    if (quote.eof()) {
        desktop::msgBox(u"Quote does not exist in database, please contact MarlinDesk Support."_s,
                        desktop::Icon::Critical);
        return false;
    }
    quote.moveLast();  // the oldest
    const QList<xml::Node> images = message.documentElement().selectNodes(u"rootns:quoteRequestImageIds/*"_s);
    db::Recordset table = openReportTable(requestFields);
    for (qsizetype i = 0; i < qMax(images.size(), 1); ++i) {
        table.addNew();
        step([&] { fillRequest(table, message, quote.text(u"QTNNO"_s)); });
        if (!images.isEmpty())
            step([&] { fillImage(table, requestNumber, images[i].text()); });
    }
    frmPrintPreview::ShowForm(QuoteRequestReport, u""_s, &table);
    return true;
}

bool printResult(const xml::Document& message)
{
    const QString requestNumber = message.textOf(u"//rootns:kestQuoteRequestNumber"_s);
    db::Recordset quote = Quote::openNumbered(
        requestNumber, sql("SELECT * FROM QUOTE1 WHERE KESTQRNo='{}' ORDER BY rec_id DESC", requestNumber));
    if (quote.recordCount() != 1) {
        desktop::msgBox(u"Failed Matching Quote. Please contact MarlinDesk Support"_s, desktop::Icon::Critical);
        return false;
    }
    db::Recordset table = openReportTable(resultFields);
    table.addNew();
    step([&] {
        setField(table, "KESTQuoteNo", message.textOf(u"//rootns:kestOriginalQuoteNumber"_s));
        setField(table, "QTNNO", quote.text(u"QTNNO"_s));
        setField(table, "subquote", quote.text(u"Subquote"_s));
        setField(table, "KESTQRNO", requestNumber);
        if (const auto reason = reportedReasonOfCode(message.textOf(u"//rootns:reasonCode"_s)))
            setField(table, "reason", *reason);
    });
    frmPrintPreview::ShowForm(AssessmentReport, QStringList{u""_s, u"Assessment Result"_s}, &table);
    return true;
}

/// Returns the header as a table, for a report without rows.
report::Table oneRow(const ComparisonHeader& header)
{
    report::Table table{{}, {QVariantList()}};
    for (const auto& [field, value] : header) {
        table.fields.append(field);
        table.rows.first().append(value);
    }
    return table;
}

bool printAdjusted(const xml::Document& message, bool Reprint)
{
    db::Recordset table = openComparison(ComparisonOf::AdjustedQuote);
    bool isMatched = true;
    step([&] { isMatched = fillAdjustedReport(table, message, Reprint); });
    if (isMatched)
        frmPrintPreview::ShowForm(ComparisonReport, u""_s, &table,
                                  oneRow(readHeader(message, ComparisonOf::AdjustedQuote)));
    return isMatched;
}

/// Returns true if the quote has a sublet document.
bool hasSubletDocument(const QuoteKey& quote)
{
    const QStringList names = files::list(subletFolder());
    return std::ranges::any_of(names, [&](const QString& name) { return quote.begins(name); });
}

bool printAuthorised(const xml::Document& message, bool Reprint)
{
    QString number;
    QString subquote;
    std::optional<db::Recordset> table;
    {
        const KeptVendors keptVendors;
        table = BuildAuthReport(message, number, subquote, Reprint);
    }
    frmPrintPreview::ShowForm(ComparisonReport, u""_s, table ? &*table : nullptr);
    const QuoteKey quote = QuoteKey::fromReference(message.textOf(u"//rootns:quoteBody/rootns:quoteReference"_s));
    if (hasSubletDocument(quote))
        frmSubletAuth::ShowForm(quote.number, quote.subquote);
    return table.has_value();
}

bool print(const QString& fileName, bool Reprint)
{
    QString text = files::read(gsListFolder + fileName);
    const SharedMessage message = repairedMessage(text);
    const MessageType* type = findMessageType(message->documentElement().textOrEmptyOf(u"//*[name()='messageType']"_s));
    if (!type)
        return true;
    switch (type->code) {
        case MessageCode::QREQ:
            return printRequest(*message);
        case MessageCode::ADQT:
            return printAdjusted(*message, Reprint);
        case MessageCode::AUQT:
            return printAuthorised(*message, Reprint);
        case MessageCode::ARES:
            return printResult(*message);
        default:
            return true;  // it has no report
    }
}

}  // namespace

bool PrintXML(const QString& fileName, bool Reprint)
{
    if (fileName.isEmpty())
        return true;
    EnsureConnection();
    try {
        return print(fileName, Reprint);
    } catch (const RuntimeError& error) {
        desktop::msgBox(u"An error %1 has occured, Please contact MarlinDesk Support\r\n%2-%3"_s.arg(error.number())
                            .arg(error.description(), error.source()));
        return false;
    }
}

}  // namespace kest
