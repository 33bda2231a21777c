#include "platform/RuntimeError.h"
#include "quotedata/QuoteTotals.h"
#include "quotedata/Rounding.h"
#include "shell/SharedVariables.h"
#include "shell/modDBAccess.h"
#include "support/Shop.h"

#include <functional>

namespace kest::test {

using namespace Qt::StringLiterals;
using Totals = Shop;

namespace {

/// Header and lines of the quote 500, as a caller hands them over.
struct Opened {
    db::Recordset header = kest::Opened(u"SELECT * FROM QUOTE1 WHERE QTNNO='500'"_s);
    db::Recordset lines = kest::Opened(u"SELECT * FROM QUOTE2 WHERE QTNNO='500'"_s);
};

void calc(void (*routine)(db::Recordset& quote, db::Recordset& lines))
{
    Opened opened;
    routine(opened.header, opened.lines);
}

std::string totals()
{
    std::string all;
    for (const char* column : {"TOTAL", "RR_TOTAL", "RA_TOTAL", "PAINT_TOTAL", "PRTTOTAL", "MISTOTAL"})
        all += (all.empty() ? "" : " ") + quote("500").text(column);
    return all;
}

LineRow part(QuoteRow quote, int sequence, const Value& quantity, const Value& price)
{
    return quote.line(sequence, "PRT").set("qty", quantity).set("rrhour", price);
}

}  // namespace

TEST(RoundAmount, RoundsTheBinaryValueHalfAwayFromZero)
{
    const std::pair<double, double> cases[] = {
        {2.345, 2.35},
        {-2.345, -2.35},
        {1.005, 1},
        {-0.004, 0},
        {49.995, 50},
        {12.5, 12.5},
        {0.1 + 0.2, 0.3},
        {5.55e-17, 0},
        {-3e-15, 0},
        {21474836.46, 21474836.46},
        {-21474836.48, -21474836.48},
    };
    for (auto [value, expected] : cases) {
        double changed = value;
        EXPECT_DOUBLE_EQ(RoundAmount(changed, 2), expected) << value;
        EXPECT_DOUBLE_EQ(changed, expected) << value;
    }
    EXPECT_EQ(RoundAmount(234.5, 0), 235);
}

TEST(RoundAmount, FailsWhereTheScaledAmountDoesNotFit)
{
    for (double value : {21474836.48, -21474836.50, 1.5e15, 1e307})
        EXPECT_THROW(RoundAmount(value, 2), RuntimeError) << value;
}

TEST_F(Totals, TheFractionIsCutFromTheText)
{
    for (const auto& [value, expected] : {std::pair(-234.5, -234.0), std::pair(99.99999999999999, 99.99999999999999)})
        EXPECT_EQ(RoundDown(value), expected) << value;
    EXPECT_EQ(RoundDown(HUGE_VAL), 0);
    EXPECT_EQ(desktop->boxes(), QStringList(u"information|Round Down|Overflow|ok"_s));
}

TEST_F(Totals, EachSectionSumsItsRoundedLines)
{
    quote("500").line(1, "R&R").set("rr_rate2", 38.5).set("rrhour", 1.25);   // 48.125
    quote("500").line(2, "RA").set("rr_rate2", 40).set("rahour", 2);         // 80
    quote("500").line(3, "PAINT").set("rr_rate2", 46.1).set("pthour", 1.5);  // 69.15
    quote("500").line(4, "OPG").set("opg_rate", 10).set("pthour", 0.5);      // 5
    part(quote("500"), 5, 3, 10.111);                                        // 30.333
    quote("500").line(6, "MIS").set("unitcost", 10.456);
    quote("500").line(7, "mis").set("unitcost", 99);  // no section of that spelling

    // Authorised labour is one sum, and the sections stay.
    quote("500").set("RR_TOTAL", 1).set("RA_TOTAL", 2).set("PAINT_TOTAL", 3);
    calc(CalcAuthorisedTotals);
    EXPECT_EQ(totals(), "202.28 1 2 3 30.33 10.456");
    EXPECT_EQ(quote("500").number("quotechanged"), 1);
    calc(CalcQuoteTotals);
    EXPECT_EQ(totals(), "202.28 48.13 80 69.15 30.33 10.456");
}

TEST_F(Totals, OnlyLinesThatStandForWorkCount)
{
    using Change = std::function<void(LineRow&)>;
    const std::pair<const char*, Change> cases[] = {
        {"a deleted line", [](LineRow& line) { line.set("delitem", true); }},
        {"a line whose mark of deletion is open", [](LineRow& line) { line.set("delitem", nullptr); }},
        {"a report item", [](LineRow& line) { line.set("Report_on", 1); }},
        {"no price", [](LineRow& line) { line.set("rrhour", nullptr); }},
        {"no price and no quantity", [](LineRow& line) { line.set("rrhour", nullptr).set("qty", nullptr); }},
        {"a replaced line",
         [](LineRow& line) {
             quote("500").line(9, "PRT").set("DELETEDITEM", qint64(line.number("itemid"))).set("delitem", true);
         }},
    };
    for (const auto& [what, change] : cases) {
        LineRow line = part(quote("500"), 1, 2, 50);
        change(line);
        quote("500").set("PRTTOTAL", 7);
        calc(CalcQuoteTotals);
        EXPECT_EQ(quote("500").number("PRTTOTAL"), 0) << what;
        gConn->execute(u"DELETE FROM QUOTE2"_s);
    }
    calc(CalcQuoteTotals);
    EXPECT_EQ(quote("500").number("TOTAL"), 0) << "a quote without lines";
}

TEST_F(Totals, ANullThatMattersLeavesTheQuoteAsItWas)
{
    const struct {
        const char* category;
        const char* column;
        bool countsWhenSent;
        bool countsWhenAuthorised;
    } cases[] = {
        {"PRT", "qty", false, false},      {"R&R", "rr_rate2", false, false}, {"OPG", "opg_rate", false, false},
        {"MIS", "unitcost", false, false}, {"RA", "rahour", true, false},     {"PAINT", "pthour", true, false},
        {"RA", "rrhour", true, true},
    };
    for (const auto& c : cases) {
        LineRow line = quote("500").line(1, c.category);
        for (const char* column : {"qty", "rr_rate2", "opg_rate", "unitcost", "rrhour", "rahour", "pthour"})
            line.set(column, 2);
        line.set(c.column, nullptr);

        quote("500").set("MISTOTAL", 7);
        calc(CalcQuoteTotals);
        EXPECT_EQ(quote("500").number("MISTOTAL") == 0, c.countsWhenSent) << c.category << c.column;
        quote("500").set("MISTOTAL", 7);
        calc(CalcAuthorisedTotals);
        EXPECT_EQ(quote("500").number("MISTOTAL") == 0, c.countsWhenAuthorised) << c.category << c.column;
        gConn->execute(u"DELETE FROM QUOTE2"_s);
    }
    EXPECT_EQ(shown(), "");
}

TEST_F(Totals, LinesThatAreWalkedAlreadyCountOnlyForASend)
{
    part(quote("500"), 1, 1, 40);
    Opened opened;
    opened.lines.moveNext();
    CalcQuoteTotals(opened.header, opened.lines);
    EXPECT_EQ(quote("500").number("PRTTOTAL"), 40);
    CalcAuthorisedTotals(opened.header, opened.lines);
    EXPECT_EQ(quote("500").number("PRTTOTAL"), 0);
}

TEST_F(Totals, RoundingStoresMoneyAndHoursAndTotalsThem)
{
    LineRow line = quote("500").line(1, "MIS").set("unitcost", 10.456).set("rahour", 1.005).set("pthour", nullptr);
    line.set("rrhour", -2.345).set("qty", 1.234).set("rr_rate2", 3.333).set("opg_rate", 4.444);
    Opened opened;
    RoundQuoteLines(opened.header);

    const std::pair<const char*, const char*> expected[] = {
        {"unitcost", "10.46"}, {"rrhour", "-2.35"},   {"rahour", "1"},       {"pthour", ""},
        {"qty", "1.234"},      {"rr_rate2", "3.333"}, {"opg_rate", "4.444"},
    };
    for (const auto& [column, text] : expected)
        EXPECT_EQ(line.text(column), text) << column;
    EXPECT_DOUBLE_EQ(quote("500").number("MISTOTAL"), 10.46);

    line.set("unitcost", 30000000);
    EXPECT_THROW(RoundQuoteLines(opened.header), RuntimeError) << "a failure goes to the caller";
}

}  // namespace kest::test
