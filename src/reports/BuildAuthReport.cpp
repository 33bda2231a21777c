#include "reports/BuildAuthReport.h"

#include "platform/RuntimeError.h"
#include "platform/database/Sql.h"
#include "platform/Prompt.h"
#include "platform/values.h"
#include "quotedata/QuoteTotals.h"
#include "quotedata/Rounding.h"
#include "reports/QuoteComparison.h"
#include "base/Helpers.h"
#include "base/SharedVariables.h"

#include <tuple>

namespace kest {

using namespace Qt::StringLiterals;

namespace {

std::pair<QString, QString> QuoteOf(const xml::Document& document)
{
    return SplitQuoteRef(document.textOf(u"//rootns:quoteBody/rootns:quoteReference"_s));
}

/// The quote of the message's request; where there is none it is closed, and a box has said so.
db::Recordset OpenQuote(const xml::Document& document, const QString& number, const QString& subquote,
                        const QString& refusal)
{
    db::Recordset quote(gConn);
    quote.open(sql("SELECT * FROM QUOTE1 WHERE QTNNO='{}' AND SUBQUOTE='{}' AND KESTQRNo='{}'", number, subquote,
                   document.textOf(u"//rootns:quoteRequestNumber"_s)));
    if (quote.eof()) {
        desktop::msgBox(refusal, desktop::Icon::Critical);
        quote.close();
    }
    return quote;
}

db::Recordset OpenLines(const db::Recordset& quote)
{
    db::Recordset lines(gConn);
    lines.open(sql("SELECT * FROM QUOTE2 WHERE QTNNO='{}' AND SUBQUOTE='{}'", quote.value(u"QTNNO"_s),
                   quote.value(u"Subquote"_s)));
    return lines;
}

/// "0" where the message tells the amount that the main quote holds, else the message's text.
QString Changed(const QString& told, double (*asInQuote)(double), const db::Recordset& mainQuote, const QString& column)
{
    if (told.isEmpty())
        return told;
    const double amount = RoundAmount(asInQuote(toDouble(told)), 2);
    const QVariant held = mainQuote.value(column);
    const bool isSame = !held.isNull() && RoundAmount(toDouble(held), 2) == amount;
    return isSame ? u"0"_s : told;
}

double WithTaxTakenOff(double amount)
{
    return amount / 11 * 10;
}

ComparisonHeader AuthorisedHeader(const xml::Document& document, const QString& number)
{
    db::Recordset mainQuote(gConn);
    mainQuote.open(sql("SELECT * FROM QUOTE1 WHERE QTNNO='{}' AND SUBQUOTE=0", number));
    const auto amount = [&](const QString& name) {
        return toDouble(document.textOf(u"//rootns:quoteBody/rootns:"_s + name));
    };
    const auto asTold = [](double told) { return told; };
    const QString excess = document.textOrEmptyOf(u"//rootns:excess"_s);
    const QString contribution = document.textOrEmptyOf(u"//rootns:customerContribution"_s);
    return ReadHeader(document, ComparisonOf::AuthorisedQuote) +
           ComparisonHeader{
               {u"excess"_s, Changed(excess, asTold, mainQuote, u"excess"_s)},
               {u"contri"_s, Changed(contribution, WithTaxTakenOff, mainQuote, u"contri"_s)},
               {u"quote_total"_s, amount(u"quoteTotal"_s) - amount(u"gst"_s)},
           };
}

/// So that the report of a quote that was taken as it stands prints, with its header and its total.
void AddUnchanged(db::Recordset& table, const ComparisonHeader& header)
{
    table.addNew();
    for (const QLatin1StringView field : {"line_no"_L1, "itemno"_L1, "lab_grp"_L1, "paint_grp"_L1, "category"_L1,
                                          "script"_L1, "amount"_L1, "vendor"_L1, "old_amount"_L1, "old_qty"_L1})
        table.set(field, u""_s);
    table.set(u"action"_s, u"N"_s);
    table.set(u"qty"_s, 1);
    table.set(u"gst"_s, 0);
    SetHeader(table, header);
}

/// Null where one of them is.
QVariant Sum(const db::Recordset& row, std::initializer_list<QLatin1StringView> columns)
{
    double sum = 0;
    for (const QLatin1StringView column : columns) {
        if (row.isNull(column))
            return {};
        sum += toDouble(row.value(column));
    }
    return sum;
}

db::Recordset BuildAuthorised(const xml::Document& document, const QString& number, db::Recordset& quote, bool Reprint)
{
    db::Recordset lines = OpenLines(quote);
    const ComparisonHeader header = AuthorisedHeader(document, number);
    db::Recordset table = OpenComparison(ComparisonOf::AuthorisedQuote);
    AddChangedLines(table, header, document, quote, lines, ComparisonOf::AuthorisedQuote, Reprint);
    if (lines.recordCount() > 0)
        lines.moveFirst();  // a search that found nothing has left them at their end, where they count nothing
    CalcAuthorisedTotals(quote, lines);
    if (table.recordCount() == 0)
        AddUnchanged(table, header);
    FinishAuthReport(table, quote, lines);
    return table;
}

}  // namespace

std::optional<db::Recordset> BuildAuthReport(const xml::Document& document, QString& quoteNumber, QString& subquote,
                                             bool Reprint)
{
    try {
        if (quoteNumber.isEmpty())
            std::tie(quoteNumber, subquote) = QuoteOf(document);
        db::Recordset quote =
            OpenQuote(document, quoteNumber, subquote,
                      u"Matching quote was not found in database, Please contact MarlinDesk Support."_s);
        if (!quote.isOpen())
            return {};
        return BuildAuthorised(document, quoteNumber, quote, Reprint);
    } catch (const RuntimeError&) {
        desktop::msgBox(u"error"_s);
        return {};
    }
}

void FinishAuthReport(db::Recordset& table, const db::Recordset& quote, db::Recordset& lines)
{
    const QVariant total = Sum(quote, {"TOTAL"_L1, "PRTTOTAL"_L1, "MISTOTAL"_L1});
    for (table.moveFirst(); !table.eof(); table.moveNext()) {
        table.set(u"total_md"_s, total);
        if (!FindLine(lines, table.text(u"line_no"_s)))
            continue;
        const QString itemNo = lines.text(u"itemno"_s).trimmed();
        if (!itemNo.isEmpty())
            table.set(u"itemno"_s, itemNo);
    }
    table.moveFirst();
}

bool FillAdjustedReport(db::Recordset& table, const xml::Document& document, bool Reprint)
{
    const auto [number, subquote] = QuoteOf(document);
    const db::Recordset quote =
        OpenQuote(document, number, subquote, u"Quote not found in database. Please contact MarlinDesk Support."_s);
    if (!quote.isOpen())
        return false;
    db::Recordset lines = OpenLines(quote);
    AddChangedLines(table, ReadHeader(document, ComparisonOf::AdjustedQuote), document, quote, lines,
                    ComparisonOf::AdjustedQuote, Reprint);
    return true;
}

}  // namespace kest
