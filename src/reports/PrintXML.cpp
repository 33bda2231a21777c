#include "reports/PrintXML.h"

#include "messages/Envelope.h"
#include "sublets/SubletDocuments.h"
#include "sublets/frmSubletAuth.h"
#include "platform/RuntimeError.h"
#include "platform/database/Sql.h"
#include "platform/Prompt.h"
#include "platform/files/files.h"
#include "platform/values.h"
#include "reports/BuildAuthReport.h"
#include "reports/QuoteComparison.h"
#include "reports/ReportTable.h"
#include "reports/frmPrintPreview.h"
#include "base/Helpers.h"
#include "base/SharedVariables.h"
#include "base/modDBAccess.h"

#include <QStringList>

#include <algorithm>
#include <functional>
#include <optional>
#include <span>
#include <tuple>

namespace kest {

using namespace Qt::StringLiterals;

namespace {

using Texts = std::pair<QLatin1StringView, QLatin1StringView>;

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

constexpr Texts colours[] = {
    {"AQUA"_L1, "Aqua"_L1},   {"BEIG"_L1, "Beige"_L1},     {"BLAK"_L1, "Black"_L1},  {"BLUE"_L1, "Blue"_L1},
    {"BROW"_L1, "Brown"_L1},  {"CHAM"_L1, "Champagne"_L1}, {"GOLD"_L1, "Gold"_L1},   {"GREN"_L1, "Green"_L1},
    {"GREY"_L1, "Grey"_L1},   {"MARN"_L1, "Maroon"_L1},    {"ORAG"_L1, "Orange"_L1}, {"PINK"_L1, "Pink"_L1},
    {"PURP"_L1, "Purple"_L1}, {"RED"_L1, "Red"_L1},        {"SILV"_L1, "Silver"_L1}, {"WHIT"_L1, "White"_L1},
    {"YELW"_L1, "Yellow"_L1},
};

constexpr Texts reasons[] = {
    {"UNSP"_L1, "Unspecified Reason"_L1}, {"INCO"_L1, "Quote Incomplete"_L1}, {"LABR"_L1, "Labour Price"_L1},
    {"PART"_L1, "Part Price"_L1},         {"PAIN"_L1, "Paint Price"_L1},      {"RECY"_L1, "Recycled Parts"_L1},
    {"METH"_L1, "Method of Repair"_L1},
};

/// Null for an unknown code: the field stays unset.
QVariant TextOf(const QString& code, std::span<const Texts> texts)
{
    for (const auto& [known, text] : texts)
        if (code.toUpper() == known)
            return QString(text);
    return {};
}

/// A step that printing goes on behind, where it finds a recordset without a current row.
void Step(const std::function<void()>& step)
{
    try {
        step();
    } catch (const RuntimeError& error) {
        if (error.number() != NoCurrentRow)
            throw;
    }
}

void Set(db::Recordset& row, const char* field, const QVariant& value)
{
    if (!value.isNull())
        row.set(QString::fromLatin1(field), value);
}

QString FullName(const xml::Document& message)
{
    const QString customer = u"//rootns:claimCustomer/rootns:"_s;
    if (const xml::Node company = message.selectSingleNode(customer + u"companyName"_s))
        return company.text();
    QString name = message.textOf(customer + u"title"_s);
    for (const QString& part : {u"firstName"_s, u"surname"_s})
        name = name.trimmed() + u' ' + message.textOf(customer + part);
    return name;
}

QString BuiltDate(const xml::Document& message)
{
    const auto number = [&](const QString& element) {
        return toLong(SafeVal(message.textOf(u"//rootns:extraVehicleInformation/rootns:"_s + element), u"0"_s));
    };
    const qint64 year = number(u"yearOfManufacture"_s);
    const qint64 month = number(u"monthOfManufacture"_s);
    if (year <= 0)
        return u""_s;
    return PadZeroLeft(QString::number(month == 0 ? 1 : month), 2) + u'/' + QString::number(year);
}

QString ImageDescription(const QString& requestNumber, const QString& imageId)
{
    const QString name = requestNumber + u'_' + PadZeroLeft(imageId, 3) + u".txt"_s;
    if (!files::isPlainName(name) || !files::exists(gsUnreadPath + name) || files::size(gsUnreadPath + name) == 0)
        return u""_s;
    return files::read(gsUnreadPath + name).trimmed();
}

void FillImage(db::Recordset& row, const QString& requestNumber, const QString& image)
{
    const QString imageId = QString::number(toLong(image));
    Set(row, "image_id", imageId);
    Set(row, "image_desc", ImageDescription(requestNumber, imageId));
}

void FillRequest(db::Recordset& row, const xml::Document& message, const QString& quoteNumber)
{
    const auto text = [&](const char* element) {
        return message.textOf(u"//rootns:"_s + QString::fromLatin1(element));
    };
    const auto extra = [&](const char* element) {
        return message.textOf(u"//rootns:extraVehicleInformation/rootns:"_s + QString::fromLatin1(element));
    };
    Set(row, "Corp", text("corporateCustomer"));
    Set(row, "Quote", quoteNumber);
    Set(row, "Qrno", text("quoteRequestNumber"));
    Set(row, "Rego", NormaliseRego(text("vehicleRegistration")));
    Set(row, "Claim", text("claimNumber"));
    Set(row, "Claim_desc", text("claimDescription"));
    Set(row, "Fullname", FullName(message));
    Set(row, "Location", text("vehicleLocation"));
    Set(row, "Bay", text("bayNumber"));
    Set(row, "Offsite", toBool(text("offsiteQuoting")) ? 1 : 0);
    Set(row, "Quote_due", FormatNetworkDate(text("quoteDueTime")));
    Set(row, "Veh_desc", text("vehicleDescription"));
    Set(row, "Make", extra("make"));
    Set(row, "Body", extra("bodyShape"));
    Set(row, "Built_date", BuiltDate(message));
    Set(row, "Colour_desc", TextOf(extra("color"), colours));
    Set(row, "Odometer", extra("odometer"));
    Set(row, "Damage", extra("damageDescription"));
    Set(row, "Old_Damage", extra("oldDamageDescription"));
    Set(row, "Instruction", text("instructions"));
}

bool PrintRequest(const xml::Document& message)
{
    const QString requestNumber = message.textOf(u"//rootns:quoteRequestNumber"_s);
    db::Recordset quote(gConn);
    quote.open(sql("SELECT * FROM QUOTE1 WHERE KESTQRNO='{}' AND KESTQRVer='{}' ORDER BY rec_id DESC", requestNumber,
                   message.textOf(u"//rootns:quoteRequestVersionNumber"_s)));
    if (quote.eof()) {
        desktop::msgBox(u"Quote does not exist in database, please contact MarlinDesk Support."_s,
                        desktop::Icon::Critical);
        return false;
    }
    quote.moveLast();  // the oldest
    const QList<xml::Node> images = message.documentElement().selectNodes(u"rootns:quoteRequestImageIds/*"_s);
    db::Recordset table = OpenReportTable(requestFields);
    for (qsizetype i = 0; i < qMax(images.size(), 1); ++i) {
        table.addNew();
        Step([&] { FillRequest(table, message, quote.text(u"QTNNO"_s)); });
        if (!images.isEmpty())
            Step([&] { FillImage(table, requestNumber, images[i].text()); });
    }
    frmPrintPreview::ShowForm(QuoteRequestReport, u""_s, &table);
    return true;
}

bool PrintResult(const xml::Document& message)
{
    const QString requestNumber = message.textOf(u"//rootns:kestQuoteRequestNumber"_s);
    db::Recordset quote(gConn);
    quote.open(sql("SELECT * FROM QUOTE1 WHERE KESTQRNo='{}' ORDER BY rec_id DESC", requestNumber));
    if (quote.recordCount() != 1) {
        desktop::msgBox(u"Failed Matching Quote. Please contact MarlinDesk Support"_s, desktop::Icon::Critical);
        return false;
    }
    db::Recordset table = OpenReportTable(resultFields);
    table.addNew();
    Step([&] {
        Set(table, "KESTQuoteNo", message.textOf(u"//rootns:kestOriginalQuoteNumber"_s));
        Set(table, "QTNNO", quote.text(u"QTNNO"_s));
        Set(table, "subquote", quote.text(u"Subquote"_s));
        Set(table, "KESTQRNO", requestNumber);
        Set(table, "reason", TextOf(message.textOf(u"//rootns:reasonCode"_s), reasons));
    });
    frmPrintPreview::ShowForm(AssessmentReport, QStringList{u""_s, u"Assessment Result"_s}, &table);
    return true;
}

bool PrintAdjusted(const xml::Document& message, bool Reprint)
{
    db::Recordset table = OpenComparison(ComparisonOf::AdjustedQuote);
    bool isMatched = true;
    Step([&] { isMatched = FillAdjustedReport(table, message, Reprint); });
    if (isMatched)
        frmPrintPreview::ShowForm(ComparisonReport, u""_s, &table);
    return isMatched;
}

/// A document's name begins with the quote number, one more character, and the subquote.
bool HasSubletDocument(const QString& number, const QString& subquote)
{
    const QStringList names = files::list(SubletFolder());
    return std::ranges::any_of(names, [&](const QString& name) {
        return name.startsWith(number, Qt::CaseInsensitive) && name.mid(number.size() + 1, subquote.size()) == subquote;
    });
}

bool PrintAuthorised(const xml::Document& message, bool Reprint)
{
    QString number;
    QString subquote;
    std::optional<db::Recordset> table = BuildAuthReport(message, number, subquote, Reprint);
    frmPrintPreview::ShowForm(ComparisonReport, u""_s, table ? &*table : nullptr);
    std::tie(number, subquote) = SplitQuoteRef(message.textOf(u"//rootns:quoteBody/rootns:quoteReference"_s));
    if (HasSubletDocument(number, subquote))
        frmSubletAuth::ShowForm(number, subquote);
    return table.has_value();
}

bool Print(const QString& fileName, bool Reprint)
{
    QString text = files::read(gsListFolder + fileName);
    const xml::Document message = ParsedMessage(text);
    const QString type = message.documentElement().textOrEmptyOf(u"//*[name()='messageType']"_s);
    if (type == u"QREQ"_s)
        return PrintRequest(message);
    if (type == u"ADQT"_s)
        return PrintAdjusted(message, Reprint);
    if (type == u"AUQT"_s)
        return PrintAuthorised(message, Reprint);
    if (type == u"ARES"_s)
        return PrintResult(message);
    return true;  // the other types have no report, nor has a marker, which names no type
}

}  // namespace

bool PrintXML(const QString& fileName, bool Reprint)
{
    if (fileName.isEmpty())
        return true;
    EnsureConnection();
    try {
        return Print(fileName, Reprint);
    } catch (const RuntimeError& error) {
        desktop::msgBox(u"An error %1 has occured, Please contact MarlinDesk Support\r\n%2-%3"_s.arg(error.number())
                            .arg(error.description(), error.source()));
        return false;
    }
}

}  // namespace kest
