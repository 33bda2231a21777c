#include "inbound/LoadQuoteBody.h"

#include "base/Journal.h"
#include "base/QuoteKey.h"
#include "base/modDBAccess.h"
#include "base/modLoggerEx.h"
#include "inbound/Loading.h"
#include "inbound/NextNumbers.h"
#include "messages/MessageLines.h"
#include "platform/RuntimeError.h"
#include "platform/database/Sql.h"
#include "platform/files/Base64.h"
#include "platform/files/files.h"
#include "platform/values.h"
#include "quotedata/NetworkCodes.h"
#include "quotedata/Vendors.h"

#include <QCryptographicHash>
#include <QJsonArray>

namespace kest {

using namespace Qt::StringLiterals;

bool gbSubletDocumentArrived = false;

namespace {

constexpr int descriptionLength = 39;  // characters
constexpr int partNumberLength = 21;
constexpr int repairerLength = 49;
constexpr int tickOfNewLine = 7;

qint64 numberOf(const MessageLine& line)
{
    return toLong(line.requiredText("quoteLineNumber"_L1));
}

/// Makes the row that a line fills the current row, a new row if the line is added. Deletes the row of a deleted line.
/// Returns false if there is no row to fill.
bool standOnRow(db::Recordset& rows, LineChange change, qint64 number)
{
    if (rows.recordCount() > 0)
        rows.moveFirst();
    switch (change) {
        case LineChange::Add:
        case LineChange::Insert:
            rows.addNew();
            return true;
        case LineChange::Keep:
        case LineChange::Unknown:
            return false;
        case LineChange::Alter:
        case LineChange::Delete:
            break;
    }
    rows.find(u"SEQ_NO"_s, number);
    if (rows.eof())
        return false;
    if (change == LineChange::Delete)
        rows.remove();
    return change == LineChange::Alter;
}

void fillKey(db::Recordset& row, const db::Recordset& quote, qint64 number)
{
    const QuoteKey key = QuoteKey::fromRow(quote);
    setColumns(row, {{"QTNNO"_L1, quote.value(u"QTNNO"_s)},
                     {"Subquote"_L1, quote.value(u"Subquote"_s)},
                     {"SEQ_NO"_L1, NextLineNumber(number, key.number, key.subquote)}});
}

void fillWhereEmpty(db::Recordset& row, const QString& column, const QVariant& value)
{
    if (row.text(column).isEmpty())
        row.set(column, value);
}

/// Updates the row and gives it an item code. Updates it first: the search for a code moves through the rows and
/// ignores errors, so a failed update would go unnoticed.
void storeWithItemNo(db::Recordset& row)
{
    row.update();
    if (row.text(u"itemno"_s).isEmpty())
        row.set(u"itemno"_s, NextItemNo(row));
    row.update();
}

// The rate of a loaded line is 1, so that the hours are its amount of money.

void fillLabourAmount(db::Recordset& row, const LabourType& type, const QString& script, const QString& amount)
{
    const bool isOther = type.code == labour::other.code;
    setColumns(row, {{"category"_L1, QString(type.category)},
                     {"script"_L1, script},
                     {type.amountColumn, toDouble(amount)},
                     {"rr_rate2"_L1, isOther ? 0 : 1}});
    if (isOther)
        row.set(u"directbill"_s, u"R"_s);
}

void takeLabour(const db::Recordset& quote, db::Recordset& row, const MessageLine& line)
{
    const qint64 number = numberOf(line);
    const QString type = line.requiredText("labourType"_L1);
    const QString script = line.requiredText("labourDescription"_L1).left(descriptionLength);
    const QString amount = line.requiredText("labourAmount"_L1);
    if (!standOnRow(row, line.change(), number))
        return;

    fillKey(row, quote, number);
    if (const LabourType* known = labourTypeOfCode(type))
        fillLabourAmount(row, *known, script, amount);
    fillWhereEmpty(row, u"allow_tick"_s, tickOfNewLine);
    setColumns(row, {{"opg_rate"_L1, 0},
                     {"Tag"_L1, 1},
                     {"delitem"_L1, false},
                     {"VENDOR"_L1, 0},
                     {"tosend"_L1, u"A"_s},
                     {"PartNo"_L1, u""_s},
                     {"blend"_L1, 0}});
    storeWithItemNo(row);
}

/// Sets the side of the car if the description begins with it. A side that a person has set stays.
void fillSide(db::Recordset& row, const QString& description)
{
    fillWhereEmpty(row, u"SIDE"_s, u"O"_s);
    if (row.text(u"SIDE"_s) != u"O"_s)
        return;
    const QString start = description.toUpper().left(3);
    if (start == u"L/H"_s)
        row.set(u"SIDE"_s, u"L"_s);
    else if (start == u"R/H"_s)
        row.set(u"SIDE"_s, u"R"_s);
}

void takePart(const db::Recordset& quote, db::Recordset& row, const MessageLine& line)
{
    const qint64 number = numberOf(line);
    const QString partNumber = line.requiredText("partNumber"_L1).left(partNumberLength);
    const QString type = line.requiredText("partType"_L1);
    const QString description = line.requiredText("partDescription"_L1);
    const QString quantityText = line.requiredText("partQuantity"_L1);
    const QString priceText = line.requiredText("partUnitPrice"_L1);
    const QString percentageText = line.requiredText("partMarkUpPercentage"_L1);
    line.requiredText("partAmount"_L1);
    line.requiredText("partMarkUpAmount"_L1);
    if (!standOnRow(row, line.change(), number))
        return;

    fillKey(row, quote, number);
    setColumns(
        row,
        {{"category"_L1, u"PRT"_s}, {"script"_L1, description.left(descriptionLength)}, {"PartNo"_L1, partNumber}});
    if (const auto mark = markOfPartType(type))
        row.set(u"MARK"_s, *mark);
    const double quantity = toDouble(quantityText);
    if (quantity == 0)
        row.set(u"Report"_s, true);
    else
        row.set(u"qty"_s, quantity);
    const double price = toDouble(priceText);
    setColumns(row, {{"unitcost"_L1, price}, {"rrhour"_L1, price + price * toDouble(percentageText) / 100}});
    fillSide(row, description);
    setColumns(row, {{"VENDOR"_L1, 0}, {"blend"_L1, 0}, {"Tag"_L1, 1}, {"delitem"_L1, false}, {"tosend"_L1, u"A"_s}});
    storeWithItemNo(row);
}

/// Removes the marker of blended paint from the end.
QString withoutBlend(const QString& description)
{
    constexpr qsizetype marker = 6;  // characters: the word and the blank before it
    if (!description.toUpper().trimmed().endsWith(u"BLEND"_s))
        return description;
    return description.chopped(qMin(marker, description.size()));
}

void takePaint(const db::Recordset& quote, db::Recordset& row, const MessageLine& line)
{
    const qint64 number = numberOf(line);
    line.requiredText("paintWorkType"_L1);
    const QString script = withoutBlend(line.requiredText("paintDescription"_L1)).left(descriptionLength);
    const QString amount = line.requiredText("paintAmount"_L1);
    if (!standOnRow(row, line.change(), number))
        return;

    fillKey(row, quote, number);
    fillWhereEmpty(row, u"category"_s, u"PAINT"_s);  // other paint work keeps its category when it is changed
    setColumns(row, {{"script"_L1, script}, {"pthour"_L1, toDouble(amount)}});
    fillWhereEmpty(row, u"blend"_s, 0);
    setColumns(row, {{"Tag"_L1, 1}, {"delitem"_L1, false}, {"tosend"_L1, u"A"_s}, {"rr_rate2"_L1, 1}});
    fillWhereEmpty(row, u"allow_tick"_s, tickOfNewLine);
    row.set(u"opg_rate"_s, 1);
    storeWithItemNo(row);
}

/// The elements of a sublet line. An element that a line lacks has the value of the line before it.
struct Sublet {
    qint64 number = 0;
    QString description;
    QString repairer;
    QString address;
    QString phone;

    void read(const MessageLine& line);
};

void Sublet::read(const MessageLine& line)
{
    const auto take = [&](const QString& element, QString& text) {
        if (const xml::Node told = line.node.selectSingleNode(element))
            text = told.text();
    };
    take(u"rootns:subletDescription"_s, description);
    take(u"rootns:subletRepairer"_s, repairer);
    take(u"rootns:subletRepairerAddress"_s, address);
    take(u"rootns:subletRepairerPhone"_s, phone);
}

/// Returns a number for a line that has none but comes with a document: above all lines of the quote or, if the quote
/// has no lines, above the line before it.
qint64 numberForDocument(const QuoteKey& quote, qint64 before)
{
    const db::Recordset rows =
        opened(sql("SELECT MAX(SEQ_NO) FROM QUOTE2 WHERE QTNNO='{}' AND SUBQUOTE='{}'", quote.number, quote.subquote));
    const QVariant highest = rows.value(rows.columns().constFirst());
    return NextDocumentLine(highest.isNull() ? before : toLong(highest));
}

/// Stores the document of a line, if it has one. Returns the number of the line, a new one if the document needs it.
qint64 takeDocument(const db::Recordset& quote, const MessageLine& line, qint64 before)
{
    qint64 number = numberOf(line);
    const xml::Node document = line.node.selectSingleNode(u"rootns:subletAuthorityDocument"_s);
    if (!document)
        return number;
    const QuoteKey key = QuoteKey::fromRow(quote);
    if (number == 0)
        number = numberForDocument(key, before);
    const QString path = NextDocumentName(key.number, key.subquote, number);
    const QByteArray base64 = document.utf8();
    QCryptographicHash hash(QCryptographicHash::Sha256);
    files::decodeBase64(base64, [&](const QByteArray& bytes) { hash.addData(bytes); });
    // first, so that taking an interrupted load back removes the document, too
    journal::openNow(key.number, key.subquote);
    QJsonArray written = journal::kept(u"documents"_s).toArray();
    written.append(QJsonArray{path, QString::fromLatin1(hash.result().toHex())});
    journal::keep(u"documents"_s, written);
    files::writeBase64(path, base64, files::Target::Free);
    gbSubletDocumentArrived = true;
    return number;
}

void takeSublet(const db::Recordset& quote, db::Recordset& row, const MessageLine& line, Sublet& told)
{
    told.read(line);
    told.number = takeDocument(quote, line, told.number);
    if (!standOnRow(row, line.change(), told.number))
        return;

    fillKey(row, quote, told.number);
    setColumns(row,
               {{"category"_L1, u"MIS"_s}, {"script"_L1, told.description.left(descriptionLength)}, {"blend"_L1, 0}});
    if (line.change() == LineChange::Insert) {
        setColumns(row, {{"Report_on"_L1, 0},
                         {"delitem"_L1, false},
                         {"tosend"_L1, u"A"_s},
                         {"unitcost"_L1, 0},
                         {"Tag"_L1, 1},
                         {"itemno"_L1, u""_s},
                         {"directbill"_L1, u"R"_s},
                         {"VENDOR"_L1, findOrAddVendor(told.repairer.left(repairerLength), told.address, told.phone)}});
    }
    storeWithItemNo(row);
}

/// Returns the quote body. Throws TypeMismatch if a line has an unknown change indicator.
xml::Node bodyOf(const xml::Document& message)
{
    const xml::Node body = message.selectSingleNode(u"rootns:quoteBody"_s);
    for (const LineSection section : lineSections)
        for (const MessageLine& line : messageLines(body, section))
            if (line.change() == LineChange::Unknown)
                throw RuntimeError(TypeMismatch, u"The change indicator \"%1\" is not known."_s.arg(line.indicator));
    return body;
}

void takeLines(const db::Recordset& quote, db::Recordset& rows, const xml::Document& message)
{
    const xml::Node body = bodyOf(message);
    for (const QLatin1StringView total :
         {"labourTotal"_L1, "partTotal"_L1, "partMarkUpTotal"_L1, "gst"_L1, "paintTotal"_L1, "quoteTotal"_L1})
        body.textOf(u"rootns:"_s + total);

    Sublet told;
    for (const LineSection section : lineSections)
        for (const MessageLine& line : messageLines(body, section))
            switch (section) {
                case LineSection::Labour:
                    takeLabour(quote, rows, line);
                    break;
                case LineSection::Part:
                    takePart(quote, rows, line);
                    break;
                case LineSection::Paint:
                    takePaint(quote, rows, line);
                    break;
                case LineSection::Sublet:
                    takeSublet(quote, rows, line, told);
                    break;
            }
}

template <class Step>
bool trapped(Step step)
{
    try {
        step();
        return true;
    } catch (const RuntimeError& error) {
        LogError(error, u"modLoadXML.LoadQuoteBody"_s, u"LoadQuoteBody"_s);
        return false;
    }
}

}  // namespace

bool LoadQuoteBody(const db::Recordset& rsQuote, db::Recordset& rsLines, const xml::Document& message)
{
    return trapped([&] { takeLines(rsQuote, rsLines, message); });
}

bool checkQuoteBody(const xml::Document& message)
{
    return trapped([&] { bodyOf(message); });
}

}  // namespace kest
