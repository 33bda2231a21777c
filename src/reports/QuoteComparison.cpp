#include "reports/QuoteComparison.h"

#include "base/Helpers.h"
#include "base/SharedVariables.h"
#include "messages/MessageLines.h"
#include "platform/RuntimeError.h"
#include "platform/database/Sql.h"
#include "platform/values.h"
#include "quotedata/NetworkCodes.h"
#include "quotedata/Vendors.h"
#include "reports/ReportTable.h"

#include <span>
#include <vector>

namespace kest {

using namespace Qt::StringLiterals;

namespace {

constexpr int repairerLength = 49;

constexpr ReportField fields[] = {
    {"KESTQuoteNo", 12}, {"comment", 3000},    {"authority_no", 20}, {"complete_date", 15}, {"ass_name", 40},
    {"ass_ph", 20},      {"ass_fax", 20},      {"excess", 20},       {"contri", 20},        {"auth_amt", 20},
    {"quote_ref", 20},   {"quote_type", 4},    {"action", 1},        {"line_no", 5},        {"itemno", 5},
    {"lab_grp", 20},     {"paint_grp", 20},    {"category", 4},      {"script", 39},        {"amount", 20},
    {"vendor", 20},      {"old_amount", 20},   {"qty", 20},          {"old_qty", 20},       {"gst", 20},
    {"quote_total", 20}, {"sub_repairer", 30}, {"total_md", 20},
};

// A path is read from the message, any other text is the value itself, and null is set elsewhere.
struct HeaderField {
    const char* name;
    const char* authorised;
    const char* adjusted;
};

// clang-format off
constexpr HeaderField headerFields[] = {
    {"KESTQuoteNo",   "//rootns:kestAuthorisedQuoteNumber",         "//rootns:kestAdjustedQuoteNumber"},
    {"comment",       "//rootns:assessmentComment",                 "//rootns:assessmentComment"},
    {"authority_no",  "//rootns:authorityNumber",                   "0"},
    {"complete_date", "//rootns:repairCompletionDate",              ""},
    {"ass_name",      "//rootns:orlaContact/rootns:name",           ""},
    {"ass_ph",        "//rootns:orlaContact/rootns:phone",          ""},
    {"ass_fax",       "//rootns:orlaContact/rootns:fax",            ""},
    {"excess",        nullptr,                                      "0"},
    {"contri",        nullptr,                                      "0"},
    {"auth_amt",      "//rootns:authorisedAmount",                  "0"},
    {"quote_ref",     "//rootns:quoteBody/rootns:quoteReference",   "//rootns:quoteBody/rootns:quoteReference"},
    {"quote_type",    "AUTR",                                       "ADJR"},
    {"quote_total",   nullptr,                                      "//rootns:quoteBody/rootns:quoteTotal"},
    {"sub_repairer",  "",                                           ""},
};

// The value that a field of a line has at first.
struct Start {
    enum From { Unset, Literal, Element, Number, NumberOrUnset, Tenth } from = Unset;
    const char* text = "";
};

constexpr Start unset{};
constexpr Start is(const char* text)            { return {Start::Literal, text}; }
constexpr Start of(const char* element)         { return {Start::Element, element}; }
constexpr Start number(const char* element)     { return {Start::Number, element}; }         // 0 if empty
constexpr Start numberIfAny(const char* element) { return {Start::NumberOrUnset, element}; }
constexpr Start tenthOf(const char* element)    { return {Start::Tenth, element}; }          // 0 if empty

struct StartField {
    const char* name;
    Start sections[4];  // labour, part, paint, sublet
};

constexpr StartField authorisedStart[] = {
    {"itemno",     {is(""),                  is(""),                is(""),                 is("")}},
    {"lab_grp",    {of("labourGroup"),       is(""),                is(""),                 is("")}},
    {"paint_grp",  {is(""),                  is(""),                of("paintGroup"),       is("")}},
    {"category",   {of("labourType"),        is(""),                of("paintWorkType"),    of("subletType")}},
    {"script",     {of("labourDescription"), of("partDescription"), of("paintDescription"), of("subletDescription")}},
    {"amount",     {of("labourAmount"),      of("partUnitPrice"),   of("paintAmount"),      is("0")}},
    {"qty",        {is("1"),                 of("partQuantity"),    is("1"),                is("1")}},
    {"old_qty",    {unset,                   unset,                 unset,                  is("0")}},
    {"old_amount", {unset,                   unset,                 unset,                  is("0")}},
    {"gst",        {is("0"),                 is("0"),               is("0"),                is("0")}},
    {"total_md",   {is("0"),                 is("0"),               is("0"),                is("0")}},
};

constexpr StartField adjustedStart[] = {
    {"itemno",     {is("000"),               is("000"),             is("000"),              of("quoteLineNumber")}},
    {"lab_grp",    {of("labourGroup"),       is(""),                is(""),                 is("")}},
    {"paint_grp",  {is(""),                  is(""),                of("paintGroup"),       is("")}},
    {"category",   {of("labourType"),        is(""),                of("paintWorkType"),    of("subletType")}},
    {"script",     {of("labourDescription"), of("partDescription"), of("paintDescription"), of("subletDescription")}},
    {"amount",     {number("labourAmount"),  numberIfAny("partUnitPrice"), number("paintAmount"), is("0")}},
    {"qty",        {is("0"),                 of("partQuantity"),    is("0"),                is("1")}},
    {"old_qty",    {is("0"),                 unset,                 unset,                  is("0")}},
    {"old_amount", {unset,                   unset,                 unset,                  is("0")}},
    {"gst",        {is("0"),                 tenthOf("partAmount"), is("0"),                is("0")}},
    {"total_md",   {is("0"),                 is("0"),               is("0"),                is("0")}},
};
// clang-format on

bool isDeleted(const MessageLine& line)
{
    return line.change() == LineChange::Delete;
}

QString numberOf(const MessageLine& line)
{
    return line.text("quoteLineNumber"_L1);
}

QVariant startValue(const Start& start, const MessageLine& line)
{
    if (start.from == Start::Unset)
        return {};
    if (start.from == Start::Literal)
        return QString::fromLatin1(start.text);
    const QString text = line.text(QLatin1StringView(start.text));
    if (start.from == Start::Element)
        return text;
    if (isBlank(text))
        return start.from == Start::NumberOrUnset ? QVariant() : QVariant(0);
    return start.from == Start::Tenth ? toDouble(text) * 0.1 : toDouble(text);
}

/// Returns hours times rate, or Null if one of them is Null.
QVariant product(const db::Recordset& row, const QString& hours, const QString& rate)
{
    if (row.isNull(hours) || row.isNull(rate))
        return {};
    return toDouble(row.value(hours)) * toDouble(row.value(rate));
}

// A deleted line takes a value from the shop's quote if its own value is empty or 0, whichever this says.
enum class SaysNothing { EmptyText, Zero };

void takeOver(db::Recordset& row, const QString& field, const QString& oldField, SaysNothing test)
{
    const QString own = row.text(field);
    const bool isEmpty = isBlank(own) || (test == SaysNothing::Zero && toDouble(own) == 0);
    if (isEmpty && !isBlank(row.text(oldField)))
        row.set(field, row.value(oldField));
}

/// Adds the shop's values to those of the message, in the table's last row.
class Comparison {
public:
    Comparison(db::Recordset& reportRow, const db::Recordset& shopLine, const MessageLine& messageLine,
               ComparisonOf comparison)
        : row(reportRow), shop(shopLine), line(messageLine), isAuthorised(comparison == ComparisonOf::AuthorisedQuote)
    {
    }

    void labour();
    void part();
    void paint();
    void sublet(db::Recordset& subletTypes);

private:
    bool has(const QString& column) const { return !isBlank(shop.text(column)); }
    void takeOverWhereDeleted();
    void takeScriptWhereEmpty();
    void takeItemNo();
    QVariant oldLabourAmount(const QString& type) const;

    db::Recordset& row;
    const db::Recordset& shop;
    const MessageLine& line;
    bool isAuthorised;
};

void Comparison::takeOverWhereDeleted()
{
    if (!isDeleted(line))
        return;
    const SaysNothing test = isAuthorised ? SaysNothing::Zero : SaysNothing::EmptyText;
    takeOver(row, u"qty"_s, u"old_qty"_s, test);
    takeOver(row, u"amount"_s, u"old_amount"_s, test);
}

void Comparison::takeScriptWhereEmpty()
{
    if (has(u"script"_s) && isBlank(row.text(u"script"_s)))
        row.set(u"script"_s, shop.text(u"script"_s).trimmed());
}

void Comparison::takeItemNo()
{
    if (has(u"itemno"_s))
        row.set(u"itemno"_s, shop.value(u"itemno"_s));
}

QVariant Comparison::oldLabourAmount(const QString& type) const
{
    const QString rate = u"rr_rate2"_s;
    for (const LabourType& ofHours : {labour::removeAndReplace, labour::repair})
        if (type == ofHours.code)
            return product(shop, ofHours.amountColumn, rate);
    if (!shop.isNull(u"unitcost"_s))
        return shop.value(u"unitcost"_s);
    for (const QString& hours : {u"rrhour"_s, u"rahour"_s, u"pthour"_s})
        if (!shop.isNull(hours))
            return product(shop, hours, rate);
    return {};
}

void Comparison::labour()
{
    QString type = line.text("labourType"_L1);
    if (isBlank(type)) {
        type = labourTypeOfCategory(shop.text(u"category"_s)).code;
        row.set(u"category"_s, type);
    }
    if (isDeleted(line)) {
        row.set(u"script"_s, shop.text(u"script"_s));
        row.set(u"amount"_s, isAuthorised ? u"0"_s : u""_s);
        row.set(u"gst"_s, 0);
    }
    if (!isAuthorised && isDeleted(line))
        row.set(u"old_qty"_s, 0);
    else if (!shop.isNull(u"qty"_s))
        row.set(u"old_qty"_s, shop.value(u"qty"_s));
    const QVariant oldAmount = oldLabourAmount(type);
    if (!oldAmount.isNull())
        row.set(u"old_amount"_s, oldAmount);
    takeOverWhereDeleted();
    takeScriptWhereEmpty();
    takeItemNo();
}

void Comparison::part()
{
    const bool isQuantityKept = row.text(u"qty"_s).trimmed() == shop.text(u"qty"_s).trimmed();
    if (isAuthorised || isQuantityKept) {
        const bool isAltered = line.change() == LineChange::Alter;
        if (isAltered || isDeleted(line))
            row.set(u"old_qty"_s, 0);
        if (isAltered)
            row.set(u"qty"_s, 0);
        if (isDeleted(line)) {
            row.set(u"qty"_s, shop.value(u"qty"_s));
            row.set(u"script"_s, shop.text(u"script"_s));
            row.set(u"amount"_s, shop.value(u"rrhour"_s));
            row.set(u"gst"_s, 0);
        }
    }
    if ((isAuthorised || !isQuantityKept) && has(u"qty"_s))
        row.set(u"old_qty"_s, shop.value(u"qty"_s));
    takeScriptWhereEmpty();
    if (has(u"unitcost"_s))
        row.set(u"old_amount"_s, shop.value(u"unitcost"_s));
    takeOverWhereDeleted();
    takeItemNo();
}

void Comparison::paint()
{
    if (isBlank(line.text("paintWorkType"_L1)))
        row.set(u"category"_s, u"PAIN"_s);
    if (isDeleted(line)) {
        row.set(u"script"_s, shop.text(u"script"_s));
        row.set(u"amount"_s, 0);
        row.set(u"gst"_s, 0);
    }
    row.set(u"old_qty"_s, has(u"qty"_s) ? shop.text(u"qty"_s).trimmed() : u"0"_s);
    if (has(u"pthour"_s))
        row.set(u"old_amount"_s,
                has(u"rr_rate2"_s) ? product(shop, u"pthour"_s, u"rr_rate2"_s) : shop.value(u"pthour"_s));
    else
        row.set(u"old_amount"_s, 0);
    if (isDeleted(line)) {
        takeOver(row, u"qty"_s, u"old_qty"_s, SaysNothing::Zero);
        takeOver(row, u"amount"_s, u"old_amount"_s, SaysNothing::Zero);
    }
    row.set(u"itemno"_s, has(u"itemno"_s) ? shop.text(u"itemno"_s) : u""_s);
    takeScriptWhereEmpty();
}

void Comparison::sublet(db::Recordset& subletTypes)
{
    if (isBlank(line.text("subletType"_L1)))
        row.set(u"category"_s, u"MIS"_s);
    if (isDeleted(line)) {
        if (subletTypes.recordCount() > 0)
            subletTypes.moveFirst();
        subletTypes.find(sql("Type='{}'", shop.value(u"PartNo"_s)));
        if (!subletTypes.eof())
            row.set(u"category"_s, subletTypes.value(u"Type"_s));
        row.set(u"script"_s, u""_s);
        row.set(u"amount"_s, shop.value(u"unitcost"_s));
        if (!isAuthorised) {
            row.set(u"old_qty"_s, 0);
            row.set(u"gst"_s, 0);
        }
    }
    row.set(u"itemno"_s, has(u"itemno"_s) ? shop.text(u"itemno"_s) : u""_s);
    takeScriptWhereEmpty();
}

/// Returns the vendor of a sublet line's repairer, and adds one if the shop has none of that name.
QVariant vendorOf(const MessageLine& line)
{
    return findOrAddVendor(line.text("subletRepairer"_L1).left(repairerLength),
                           line.text("subletRepairerAddress"_L1).left(repairerLength),
                           line.text("subletRepairerPhone"_L1));
}

void startRow(db::Recordset& table, const MessageLine& line, LineSection section, ComparisonOf comparison)
{
    table.addNew();
    table.set(u"action"_s, line.indicator);
    table.set(u"line_no"_s, numberOf(line));
    const std::span<const StartField> fieldsOfLine =
        comparison == ComparisonOf::AuthorisedQuote ? authorisedStart : adjustedStart;
    for (const StartField& field : fieldsOfLine) {
        const Start& start = field.sections[static_cast<size_t>(section)];
        if (const QVariant value = startValue(start, line); !value.isNull())
            table.set(QString::fromLatin1(field.name), value);
    }
}

}  // namespace

db::Recordset openComparison(ComparisonOf comparison)
{
    std::vector<ReportField> declared(std::begin(fields), std::end(fields));
    if (comparison == ComparisonOf::AdjustedQuote)
        std::erase_if(declared, [](const ReportField& field) { return qstrcmp(field.name, "vendor") == 0; });
    return openReportTable(declared);
}

ComparisonHeader readHeader(const xml::Document& document, ComparisonOf comparison)
{
    ComparisonHeader header;
    for (const HeaderField& field : headerFields) {
        const char* source = comparison == ComparisonOf::AuthorisedQuote ? field.authorised : field.adjusted;
        if (!source)
            continue;
        const QString text = QString::fromLatin1(source);
        header.append({QString::fromLatin1(field.name), text.startsWith(u"//"_s) ? document.textOf(text) : text});
    }
    return header;
}

void setHeader(db::Recordset& table, const ComparisonHeader& header)
{
    for (const auto& [field, value] : header)
        table.set(field, value);
}

bool findLine(db::Recordset& lines, const QString& number)
{
    if (isBlank(number) || lines.recordCount() == 0)
        return false;
    lines.moveFirst();
    lines.find(u"SEQ_NO"_s, number);
    return !lines.eof();
}

void addChangedLines(db::Recordset& table, const ComparisonHeader& header, const xml::Document& document,
                     const db::Recordset& quote, db::Recordset& lines, ComparisonOf comparison, bool Reprint)
{
    const bool isAuthorised = comparison == ComparisonOf::AuthorisedQuote;
    const xml::Node body = document.selectSingleNode(u"//rootns:quoteBody"_s);
    db::Recordset subletTypes(gConn);
    subletTypes.open(u"SELECT Type, Script FROM SUBLET WHERE Sublet=1"_s);
    const QVariant total = quote.value(u"TOTAL"_s);

    for (const LineSection section : lineSections) {
        for (const MessageLine& line : messageLines(body, section)) {
            if (line.change() == LineChange::Keep || (isDeleted(line) && Reprint))
                continue;
            startRow(table, line, section, comparison);
            setHeader(table, header);
            if (isAuthorised && section == LineSection::Sublet)
                table.set(u"vendor"_s, vendorOf(line));
            if (findLine(lines, numberOf(line))) {
                Comparison shown(table, lines, line, comparison);
                switch (section) {
                    case LineSection::Labour:
                        shown.labour();
                        break;
                    case LineSection::Part:
                        shown.part();
                        break;
                    case LineSection::Paint:
                        shown.paint();
                        break;
                    case LineSection::Sublet:
                        shown.sublet(subletTypes);
                        break;
                }
            }
            if (!isAuthorised || !total.isNull())
                table.set(u"total_md"_s, total);
        }
    }
}

}  // namespace kest
