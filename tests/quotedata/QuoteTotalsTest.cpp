// Tests the totals of a quote, and how amounts are rounded.
#include "base/modLoggerEx.h"
#include "quotedata/QuoteTotals.h"
#include "quotedata/Rounding.h"
#include "support/Shop.h"

using Totals = Shop;

/// The header and the lines of the quote 500, as a caller passes them.
struct Opened {
    db::Recordset header = kest::opened(u"SELECT * FROM QUOTE1 WHERE QTNNO='500'"_s);
    db::Recordset lines = kest::opened(u"SELECT * FROM QUOTE2 WHERE QTNNO='500'"_s);
};

static bool calc(bool (*routine)(db::Recordset& quote, db::Recordset& lines))
{
    Opened opened;
    return routine(opened.header, opened.lines);
}

TEST(RoundAmount, RoundsTheBinaryValueHalfAwayFromZeroOrFails)
{
    for (const auto& [amount, rounded] : casesIn<2>("quotedata/rounding.txt")) {
        double changed = amount.toDouble();
        EXPECT_DOUBLE_EQ(RoundAmount(changed, 2), rounded.toDouble()) << amount;
        EXPECT_DOUBLE_EQ(changed, rounded.toDouble()) << amount;
    }
    EXPECT_EQ(RoundAmount(234.5, 0), 235);
    for (double value : {21474836.48, -21474836.50, 1.5e15, 1e307})
        EXPECT_THROW(RoundAmount(value, 2), RuntimeError) << value;
}

TEST_F(Totals, TheFractionIsCutFromTheText)
{
    EXPECT_EQ(RoundDown(-234.5), -234);
    EXPECT_EQ(RoundDown(99.99999999999999), 99.99999999999999);
    EXPECT_EQ(RoundDown(HUGE_VAL), 0);
    EXPECT_EQ(shown(), "[information] Round Down: Overflow");
}

TEST_F(Totals, LinesOfOneKeyAreEachCountedOnce)
{
    quote("500").line(1, "MIS").set("unitcost", 5.004);
    const QString line = u"SELECT * FROM QUOTE2"_s;
    Opened opened;
    db::Recordset damaged = kest::opened(QStringList{line, line, line}.join(u" UNION ALL "_s));
    for (const auto& routine : {&CalcQuoteTotals, &CalcAuthorisedTotals}) {
        quote("500").set("MISTOTAL", 0);
        opened.header.requery();
        damaged.moveFirst();
        routine(opened.header, damaged);
        EXPECT_DOUBLE_EQ(quote("500").number("MISTOTAL"), 15.012) << "which is not rounded";
    }
}

TEST_F(Totals, ANullThatMattersLeavesTheQuoteAsItWas)
{
    for (const auto& [category, column, send, authorisation] : casesIn<4>("quotedata/null-columns.txt")) {
        quote("500").line(1, category);
        gConn->execute(u"UPDATE QUOTE2 SET qty=2, rr_rate2=2, opg_rate=2, unitcost=2, rrhour=2, rahour=2, pthour=2"_s);
        for (const QString& name : column.split(u' '))
            quote("500").line(1).set(name, nullptr);
        for (const auto& [routine, effect] :
             {std::pair(&CalcQuoteTotals, send), {&CalcAuthorisedTotals, authorisation}}) {
            quote("500").set("MISTOTAL", 7);
            EXPECT_EQ(calc(routine), effect == u"totalled"_s) << column;
            EXPECT_EQ(quote("500").number("MISTOTAL"), effect == u"totalled"_s ? 0 : 7) << column;
        }
        gConn->execute(u"DELETE FROM QUOTE2"_s);
    }
    EXPECT_EQ(shown(), "");
    EXPECT_TRUE(lastLogRecord().contains(u"of the quote line"_s));
}

TEST_F(Totals, RoundedLinesAreStored)
{
    Row line = quote("500").line(1, "MIS");
    fill(line, "unitcost=10.456 rahour=1.005 pthour=- rrhour=-2.345 qty=1.234 rr_rate2=3.333 opg_rate=4.444");
    Opened opened;
    RoundQuoteLines(opened.header);

    EXPECT_TRUE(line.shows("unitcost=10.46 rrhour=-2.35 rahour=1 pthour=- qty=1.234 rr_rate2=3.333 opg_rate=4.444"));
    EXPECT_DOUBLE_EQ(quote("500").number("MISTOTAL"), 10.46);

    line.set("unitcost", 30000000);
    EXPECT_THROW(RoundQuoteLines(opened.header), RuntimeError) << "a failure goes to the caller";
}
