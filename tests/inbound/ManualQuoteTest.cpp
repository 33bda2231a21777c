// Tests the load of manual quotes: which quote they become, and what they replace.
#include "support/Shop.h"

using ManualQuotes = Shop;

const auto lineFailure = u"\n[none] Error processing Quote Items, Please contact MarlinDesk Support."_s;

/// Returns the number and subquote of the quote that the last load created or found.
static std::string loadedQuote()
{
    const Row row("QUOTE1", "KESTQuoteNo='KQ1'");
    return row.exists() ? row.text("QTNNO") + '/' + row.text("Subquote") : "none";
}

TEST_F(ManualQuotes, EachHasItsQuoteAsTheTableSays)
{
    quote("500").rego("abc123 ").request("QR5");
    quote("501").rego("XYZ789").request("QR6");
    quote("502").rego("ABC-123").request("QR7");
    quote("600").request("QR8");
    quote("600", 2).request("QR8");
    quote("").rego("ABC123");
    car(" ABC123");
    const Snapshot before;
    for (const auto& [elements, quote] : casesIn<2>("inbound/manual-quotes.txt")) {
        const bool taken = quote != u"none"_s;
        EXPECT_EQ(load(Message::told(u"MANQ "_s + elements)), taken) << elements;
        EXPECT_EQ(shown(), taken ? "" : "[critical] Failed matching to existing parent KEST Quote") << elements;
        EXPECT_EQ(loadedQuote(), quote.toStdString()) << elements;
        EXPECT_EQ(gsMatchedQTNNO, taken ? quote.section(u'/', 0, 0) : QString()) << elements;
        EXPECT_EQ(Row("CINFO", "1=1").text("QUOTE_VAL"), "1001");  // the counter does not change
        before.restore();
    }
    EXPECT_FALSE(load(Message::told("MANQ quoteBody/quoteType=AS quoteBody/quoteReference=500/x")));
    EXPECT_NE(shown().find("modLoadXML.LoadXML"), std::string::npos);
}

TEST_F(ManualQuotes, ANewNumberIsTheFirstFreeOneHoweverManyAreTaken)
{
    car("ABC123");
    const Snapshot before;
    QList<int> statements;
    for (const int taken : {3, 300}) {
        for (int i = 0; i < taken; ++i)
            quote(std::to_string(1001 + i));
        quote(std::to_string(1001 + taken + 1));  // after a gap
        int count = 0;
        db::setStatementFault([&] { return ++count == 0; });
        EXPECT_TRUE(load(manualQuote("MANQ")));
        db::setStatementFault({});
        EXPECT_EQ(loadedQuote(), std::to_string(1001 + taken) + "/0");
        statements.append(count);
        before.restore();
    }
    EXPECT_LT(statements[1] - statements[0], 12);
}

TEST_F(ManualQuotes, TheQuoteIsReplaced)
{
    quote("500").request("QR5").set("excess", 500).set("QUOTER", "Pat Ferrier").note("Active Quote Request");
    quote("500").line(7, "PRT");
    quote("500").line(8);
    quote("501").line(7);
    car("ABC123").set("COLOUR", "sILVER");
    gConn->execute(u"UPDATE INSURER SET new_mu=25"_s);
    gConn->execute(u"UPDATE CINFO SET second_mu=15, recore_mu=16, after_mu=17"_s);
    EXPECT_TRUE(
        load(Message::told("MANQ quoteBody/quoteReference=500 quoteRequestNumber=QR9 claimNumber=8800\nlabour 1 I\n"
                           "labour 2 I labourType=REPR labourAmount=60\npart 3 - partQuantity=2\npaint 4 I")));
    EXPECT_EQ(shown(), "");
    EXPECT_EQ(rowCount("QUOTE2", "QTNNO='500' AND SEQ_NO<=4"), 4);
    EXPECT_EQ(rowCount("QUOTE2"), 4 + 1);
    EXPECT_TRUE(quote("500").shows(
        "KESTQRNo=QR9 KESTQuoteNo=KQ1 Claim=8800 REGO=ABC123 qtndate=today INSURER_ID=1 RR_RATE=1 RA_RATE=1 "
        "paint_rate=1 QSENT=R excess=0 contri=0 RR_TOTAL=100 RA_TOTAL=60 "
        "PAINT_TOTAL=150 TOTAL=310 PRTTOTAL=500 MISTOTAL=0 CONTACTID=0 NEWPC=25 SECONDPC=15 RECOREPC=16 AFTERPC=17 "
        "assess= excess_gst=1 override=0 rr_override=0 ra_override=0 paint_override=0 quotechanged=1 "
        "invoiced=0 Type=MTA ReadOnly=1 ExtraInfo=1 Job_stage=3 QUOTER=Pat Ferrier"));
    EXPECT_TRUE(car("ABC123").shows("KEST=1 COLOUR=Silver"));
    EXPECT_EQ(quote("500").notes(), "(today : Manual Quote Loaded) (01/02/2008 : Responded Quote Request)");
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

TEST_F(ManualQuotes, AQuoteThatExistsWaitsForNobodyWhoCreatesOne)
{
    quote("500").line(7);
    const db::Lock creating(anotherConnection(), u"new quote"_s);
    ASSERT_TRUE(creating.isHeld());
    EXPECT_TRUE(load(manualQuote("500").labour(1, "I"))) << shown();
}

TEST_F(ManualQuotes, ARefusalTouchesNoLine)
{
    quote("500").line(7);
    const auto refusal = [&](const Message& message) {
        EXPECT_FALSE(load(message));
        EXPECT_EQ(quote("500").line(7).text("script") + std::to_string(quote("500").lines()), "Front bumper bar1");
        return QString::fromStdString(shown());
    };
    EXPECT_EQ(refusal(manualQuote("501").rego("O'HARA 1").labour(1, "I")),
              u"[information] Could not find a car with registration number O'HARA 1\r\n"
              "Please create the car and customer before loading this quote"_s);
    EXPECT_FALSE(quoteExists("501"));
    EXPECT_TRUE(refusal(manualQuote("500").labour(1, "I").labour(2, "X")).endsWith(lineFailure));
    gConn->execute(u"UPDATE INSURER SET KEST=0"_s);
    EXPECT_EQ(refusal(manualQuote("500").labour(1, "I")),
              u"[critical] Error locating a valid insurer, Please contact MarlinDesk Support."_s);
}

TEST_F(ManualQuotes, AFailureInALineLeavesTheQuoteToTheNextLoad)
{
    quote("500").line(7);
    EXPECT_FALSE(load(manualQuote("500").labour(1, "I").paint(2, "I", {{"paintAmount", "x"}})));
    EXPECT_TRUE(QString::fromStdString(shown()).endsWith(lineFailure));
    EXPECT_EQ(rowCount("QUOTE2"), 1);  // the old line has been deleted, and the first new one is stored
    EXPECT_TRUE(gsMatchedQTNNO.isEmpty());
    EXPECT_TRUE(load(manualQuote("500").labour(1, "I").paint(2, "I")));
    EXPECT_EQ(quote("500").lines(), 2);
}
