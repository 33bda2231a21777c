#include "reports/BuildAuthReport.h"

#include "base/SharedVariables.h"
#include "platform/Prompt.h"
#include "platform/RuntimeError.h"
#include "platform/database/Sql.h"
#include "platform/values.h"
#include "quotedata/Quote.h"
#include "quotedata/QuoteTotals.h"
#include "quotedata/Rounding.h"
#include "reports/QuoteComparison.h"

namespace kest {

using namespace Qt::StringLiterals;

namespace {

QuoteKey quoteOf(const xml::Document& document)
{
    return QuoteKey::fromReference(document.textOf(u"//rootns:quoteBody/rootns:quoteReference"_s));
}

/// Opens the quote of the message's request. If there is none, shows a box and returns a closed recordset.
db::Recordset openQuote(const xml::Document& document, const QuoteKey& key, const QString& refusal)
{
    const QString request = document.textOf(u"//rootns:quoteRequestNumber"_s);
    db::Recordset quote(gConn);
    quote.open(sql("SELECT * FROM QUOTE1 WHERE QTNNO='{}' AND SUBQUOTE='{}' AND KESTQRNo='{}'", key.number,
                   key.subquote, request));
    if (quote.eof() || key.number.trimmed().isEmpty() || request.trimmed().isEmpty()) {
        desktop::msgBox(refusal, desktop::Icon::Critical);
        quote.close();
    }
    return quote;
}

/// Returns "0" if the message's amount equals that of the main quote, otherwise the message's text.
QString changed(const QString& told, double (*asInQuote)(double), const db::Recordset& mainQuote, const QString& column)
{
    if (told.isEmpty())
        return told;
    const double amount = RoundAmount(asInQuote(toDouble(told)), 2);
    const QVariant held = mainQuote.value(column);
    const bool isSame = !held.isNull() && RoundAmount(toDouble(held), 2) == amount;
    return isSame ? u"0"_s : told;
}

double withTaxTakenOff(double amount)
{
    return amount / 11 * 10;
}

ComparisonHeader authorisedHeader(const xml::Document& document, const QString& number)
{
    db::Recordset mainQuote(gConn);
    mainQuote.open(sql("SELECT * FROM QUOTE1 WHERE QTNNO='{}' AND SUBQUOTE=0", number));
    const auto amount = [&](const QString& name) {
        return toDouble(document.textOf(u"//rootns:quoteBody/rootns:"_s + name));
    };
    const auto asTold = [](double told) { return told; };
    const QString excess = document.textOrEmptyOf(u"//rootns:excess"_s);
    const QString contribution = document.textOrEmptyOf(u"//rootns:customerContribution"_s);
    return readHeader(document, ComparisonOf::AuthorisedQuote) +
           ComparisonHeader{
               {u"excess"_s, changed(excess, asTold, mainQuote, u"excess"_s)},
               {u"contri"_s, changed(contribution, withTaxTakenOff, mainQuote, u"contri"_s)},
               {u"quote_total"_s, amount(u"quoteTotal"_s) - amount(u"gst"_s)},
           };
}

/// Adds a row for a quote without changes, so that its report still shows the header and the total.
void addUnchanged(db::Recordset& table, const ComparisonHeader& header)
{
    table.addNew();
    for (const QLatin1StringView field : {"line_no"_L1, "itemno"_L1, "lab_grp"_L1, "paint_grp"_L1, "category"_L1,
                                          "script"_L1, "amount"_L1, "vendor"_L1, "old_amount"_L1, "old_qty"_L1})
        table.set(field, u""_s);
    table.set(u"action"_s, u"N"_s);
    table.set(u"qty"_s, 1);
    table.set(u"gst"_s, 0);
    setHeader(table, header);
}

/// Returns the sum of the columns, or Null if one of them is Null.
QVariant sum(const db::Recordset& row, std::initializer_list<QLatin1StringView> columns)
{
    double sum = 0;
    for (const QLatin1StringView column : columns) {
        if (row.isNull(column))
            return {};
        sum += toDouble(row.value(column));
    }
    return sum;
}

db::Recordset buildAuthorised(const xml::Document& document, const QString& number, db::Recordset& quote, bool Reprint)
{
    db::Recordset lines = Quote::openLines(QuoteKey::fromRow(quote));
    const ComparisonHeader header = authorisedHeader(document, number);
    db::Recordset table = openComparison(ComparisonOf::AuthorisedQuote);
    addChangedLines(table, header, document, quote, lines, ComparisonOf::AuthorisedQuote, Reprint);
    if (lines.recordCount() > 0)
        lines.moveFirst();  // a search without a match has left them at their end, and the totals would be 0
    CalcAuthorisedTotals(quote, lines);
    if (table.recordCount() == 0)
        addUnchanged(table, header);
    finishAuthReport(table, quote, lines);
    return table;
}

}  // namespace

std::optional<db::Recordset> BuildAuthReport(const xml::Document& document, QString& quoteNumber, QString& subquote,
                                             bool Reprint)
{
    try {
        if (quoteNumber.isEmpty()) {
            const QuoteKey told = quoteOf(document);
            quoteNumber = told.number;
            subquote = told.subquote;
        }
        db::Recordset quote =
            openQuote(document, {quoteNumber, subquote},
                      u"Matching quote was not found in database, Please contact MarlinDesk Support."_s);
        if (!quote.isOpen())
            return {};
        return buildAuthorised(document, quoteNumber, quote, Reprint);
    } catch (const RuntimeError&) {
        desktop::msgBox(u"error"_s);
        return {};
    }
}

void finishAuthReport(db::Recordset& table, const db::Recordset& quote, db::Recordset& lines)
{
    const QVariant total = sum(quote, {"TOTAL"_L1, "PRTTOTAL"_L1, "MISTOTAL"_L1});
    for (table.moveFirst(); !table.eof(); table.moveNext()) {
        table.set(u"total_md"_s, total);
        if (!findLine(lines, table.text(u"line_no"_s)))
            continue;
        const QString itemNo = lines.text(u"itemno"_s).trimmed();
        if (!itemNo.isEmpty())
            table.set(u"itemno"_s, itemNo);
    }
    table.moveFirst();
}

bool fillAdjustedReport(db::Recordset& table, const xml::Document& document, bool Reprint)
{
    const db::Recordset quote =
        openQuote(document, quoteOf(document), u"Quote not found in database. Please contact MarlinDesk Support."_s);
    if (!quote.isOpen())
        return false;
    db::Recordset lines = Quote::openLines(QuoteKey::fromRow(quote));
    addChangedLines(table, readHeader(document, ComparisonOf::AdjustedQuote), document, quote, lines,
                    ComparisonOf::AdjustedQuote, Reprint);
    return true;
}

}  // namespace kest
