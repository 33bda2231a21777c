// The way of a manual quote among the shop's quotes: which quote it becomes, and what replaces what was there.
#include "platform/values.h"
#include "shell/SharedVariables.h"
#include "shell/modDBAccess.h"
#include "support/FaultRun.h"
#include "support/Load.h"
#include "support/Snapshot.h"

namespace kest::test {

using namespace Qt::StringLiterals;
using ManualQuotes = Shop;

namespace {

/// Number and subquote of the quote that the last load made or matched.
std::string loadedQuote()
{
    const db::Recordset row = Opened(u"SELECT * FROM QUOTE1 WHERE KESTQuoteNo='KQ1'"_s);
    return row.eof() ? "none" : (row.text(u"QTNNO"_s) + u'/' + row.text(u"Subquote"_s)).toStdString();
}

Message supplementary(const Text& reference)
{
    return manualQuote(reference).set("quoteBody/quoteType", "AS");
}

}  // namespace

TEST_F(ManualQuotes, AMainQuoteIsMatchedByNumberThenByRequestElseNew)
{
    quote("500").rego("abc123 ").request("QR5");
    quote("501").rego("XYZ789").request("QR6");
    quote("502").rego("ABC-123").request("QR7");
    const struct {
        Message message;
        const char* quote;
    } cases[] = {
        {manualQuote("500"), "500/0"},
        {manualQuote("500/3").rego(" ABC123"), "500/0"},  // the subquote of a main quote says nothing
        {manualQuote("501"), "1002/0"},  // that number belongs to another car, and the search has begun with it
        {manualQuote("MANQ"), "1001/0"},
        {manualQuote("7"), "1001/0"},  // too short for a number
        {manualQuote("888"), "888/0"},
        {manualQuote("888").request("QR5"), "500/0"},
        {manualQuote("888").request("QR7"), "502/0"},
        {manualQuote("888").request("QR6"), "888/0"},
    };
    car(" ABC123");
    const Snapshot before;
    for (const auto& c : cases) {
        EXPECT_TRUE(load(c.message)) << shown();
        EXPECT_EQ(loadedQuote(), c.quote);
        EXPECT_EQ(gsMatchedQTNNO.toStdString() + "/0", c.quote);
        EXPECT_EQ(Opened(u"SELECT * FROM CINFO"_s).text(u"QUOTE_VAL"_s), u"1001"_s);  // the counter stays
        before.restore();
    }
}

TEST_F(ManualQuotes, ASupplementaryQuoteTakesTheNextSubquoteOfItsParent)
{
    quote("500").request("QR5");
    quote("500", 2).request("QR5");
    const struct {
        Message message;
        const char* quote;
        const char* box;
    } cases[] = {
        {supplementary("500/5"), "500/5", ""},
        {supplementary("500/2"), "500/3", ""},
        {supplementary("500/1"), "500/3", ""},
        {supplementary("500").request("QR5"), "500/3", ""},  // 500 is taken, so the request tells the parent
        {supplementary("77/1").request("QR5"), "500/3", ""},
        {supplementary("500"), "none", "[critical] Failed matching to existing parent KEST Quote"},
        {supplementary("77/1"), "none", "[critical] Failed matching to existing parent KEST Quote"},
    };
    const Snapshot before;
    for (const auto& c : cases) {
        EXPECT_EQ(load(c.message), *c.box == 0);
        EXPECT_EQ(shown(), c.box);
        EXPECT_EQ(loadedQuote(), c.quote);
        before.restore();
    }
    EXPECT_FALSE(load(supplementary("500/x")));
    EXPECT_NE(shown().find("modLoadXML.LoadXML"), std::string::npos);
}

TEST_F(ManualQuotes, TheHeaderIsWrittenAndTheLinesReplaced)
{
    quote("500").request("QR5").set("excess", 500).set("QUOTER", "Pat Ferrier").note("Active Quote Request");
    quote("500").line(7, "PRT");
    quote("500").line(8);
    quote("501").line(7);
    gConn->execute(u"UPDATE INSURER SET new_mu=25"_s);
    gConn->execute(u"UPDATE CINFO SET second_mu=15, recore_mu=16, after_mu=17"_s);
    EXPECT_TRUE(load(manualQuote("500")
                         .request("QR9")
                         .claim("8800")
                         .labour(1, "I")
                         .labour(2, "I", {{"labourType", "REPR"}, {"labourAmount", "60"}})
                         .part(3, "", {{"partQuantity", "2"}})
                         .paint(4, "I")));
    EXPECT_EQ(shown(), "");
    EXPECT_EQ(rowCount("QUOTE2", "QTNNO='500' AND SEQ_NO>4"), 0);
    EXPECT_EQ(quote("500").lines(), 4);
    EXPECT_EQ(quote("501").lines(), 1);
    const std::pair<const char*, std::string> columns[] = {
        {"KESTQRNo", "QR9"},
        {"KESTQuoteNo", "KQ1"},
        {"Claim", "8800"},
        {"REGO", "ABC123"},
        {"qtndate", shortDate(QDate::currentDate()).toStdString()},
        {"INSURER_ID", "1"},
        {"RR_RATE", "1"},
        {"RA_RATE", "1"},
        {"paint_rate", "1"},
        {"QSENT", "R"},
        {"excess", "0"},
        {"contri", "0"},
        {"RR_TOTAL", "100"},
        {"RA_TOTAL", "60"},
        {"PAINT_TOTAL", "150"},
        {"TOTAL", "310"},
        {"PRTTOTAL", "500"},
        {"MISTOTAL", "0"},
        {"CONTACTID", "0"},
        {"NEWPC", "25"},
        {"SECONDPC", "15"},
        {"RECOREPC", "16"},
        {"AFTERPC", "17"},
        {"assess", ""},
        {"excess_gst", "1"},
        {"override", "0"},
        {"rr_override", "0"},
        {"ra_override", "0"},
        {"paint_override", "0"},
        {"quotechanged", "True"},
        {"invoiced", "False"},
        {"Type", "MTA"},
        {"ReadOnly", "True"},
        {"ExtraInfo", "True"},
        {"Job_stage", "3"},
        {"QUOTER", "Pat Ferrier"},
    };
    for (const auto& [column, value] : columns)
        EXPECT_EQ(quote("500").text(column), value) << column;
    EXPECT_EQ(car("ABC123").number("KEST"), 1);
    EXPECT_EQ(quote("500").notes(), "(today : Manual Quote Loaded) (01/02/2008 : Responded Quote Request)");
}

TEST_F(ManualQuotes, TheCarsColourTakesTheSpellingOfTheTable)
{
    const std::pair<const char*, const char*> colours[] = {{"sILVER", "Silver"}, {"Sunburnt", ""}, {"", ""}};
    for (const auto& [held, stored] : colours) {
        car("ABC123").set("COLOUR", held);
        EXPECT_TRUE(load(manualQuote("500")));
        EXPECT_EQ(car("ABC123").text("COLOUR"), stored);
    }
}

TEST_F(ManualQuotes, ACarTypedWithBlanksTakesTheNetworksRegistration)
{
    car("abc 12-3").set("VIN", "the quote's");
    quote("500").rego("abc 12-3");
    quote("501").rego("abc 12-3");
    car("ABC123").set("VIN", "in the way");
    car("ABC123.").set("VIN", "moved before");
    EXPECT_TRUE(load(manualQuote("500"))) << shown();
    EXPECT_EQ(car("ABC123").text("VIN"), "the quote's");
    EXPECT_EQ(car("ABC123..").text("VIN"), "in the way");
    EXPECT_EQ(car("ABC123.").text("VIN"), "moved before");
    EXPECT_EQ(quote("500").text("REGO"), "ABC123");
    EXPECT_EQ(quote("501").text("REGO"), "abc 12-3");
}

TEST_F(ManualQuotes, ARefusalTouchesNoLine)
{
    quote("500").line(7);
    EXPECT_FALSE(load(manualQuote("501").rego("O'HARA 1").labour(1, "I")));
    EXPECT_EQ(shown(),
              "[information] Could not find a car with registration number O'HARA 1\r\n"
              "Please create the car and customer before loading this quote");
    EXPECT_FALSE(load(manualQuote("500").labour(1, "I").labour(2, "X")));
    EXPECT_NE(shown().find("\n[none] Error processing Quote Items, Please contact MarlinDesk Support."),
              std::string::npos);
    EXPECT_FALSE(load(manualQuote("500").claim(std::string(200, '7'))));
    EXPECT_NE(shown().find("too long"), std::string::npos);
    gConn->execute(u"UPDATE INSURER SET KEST=0"_s);
    EXPECT_FALSE(load(manualQuote("500").labour(1, "I")));
    EXPECT_EQ(shown(), "[critical] Error locating a valid insurer, Please contact MarlinDesk Support.");
    EXPECT_EQ(quote("500").line(7).text("script"), "Front bumper bar");
    EXPECT_EQ(quote("500").lines(), 1);
    EXPECT_FALSE(quoteExists("501"));
}

TEST_F(ManualQuotes, AFailureInALineLeavesTheQuoteToTheNextLoad)
{
    quote("500").line(7);
    EXPECT_FALSE(load(manualQuote("500").labour(1, "I").paint(2, "I", {{"paintAmount", "x"}})));
    EXPECT_NE(shown().find("\n[none] Error processing Quote Items, Please contact MarlinDesk Support."),
              std::string::npos);
    EXPECT_EQ(rowCount("QUOTE2"), 1);  // the old line is gone, the first new one is there
    EXPECT_TRUE(gsMatchedQTNNO.isEmpty());
    EXPECT_TRUE(load(manualQuote("500").labour(1, "I").paint(2, "I")));
    EXPECT_EQ(quote("500").lines(), 2);
}

TEST_F(ManualQuotes, TheFileTakesTheNumberOfItsQuote)
{
    car("ABC123");
    arrive("m.xml", manualQuote("MANQ"));
    EXPECT_TRUE(loadAsTheWindow(u"m.xml"_s));
    EXPECT_EQ(filesIn(gsReadPath), QStringList{u"1001.0_1.xml"_s});
}

}  // namespace kest::test
