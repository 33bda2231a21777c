// Tests the load of authorised quotes: which quote they find, what is refused, and what is stored.
#include "inbound/LoadQuoteBody.h"
#include "support/Shop.h"

struct AuthorisedQuotes : Shop {
    AuthorisedQuotes()
    {
        gbSubletDocumentArrived = false;
        quote("500").request("QR1").stage(3).locked(true).note("Responded Quote Request").line(1);
    }
};

TEST_F(AuthorisedQuotes, TheQuoteIsFoundByNumberOrByTheNetworksNumbers)
{
    quote("500", 2).request("QR1").line(1);
    quote("600").request("QR6").quoteNumber("KQ6").rego("XYZ789").line(1);
    car("XYZ789");
    const Message byNumbers = authorisedQuote("wrong").request("QR6").quoteNumber("KQ6").rego("XYZ789");
    const std::pair<Message, QuoteRow> cases[] = {{authorisedQuote("500/0"), quote("500")},
                                                  {authorisedQuote("500/2"), quote("500", 2)},
                                                  {byNumbers, quote("600")}};
    for (const auto& [message, row] : cases) {
        EXPECT_TRUE(load(message));
        EXPECT_EQ(shown(), "");
        EXPECT_EQ(row.text("KESTAuthNo"), "KA1");
        EXPECT_EQ(rowCount("QUOTE1", "KESTAuthNo='KA1'"), 1);
        gConn->execute(u"UPDATE QUOTE1 SET KESTAuthNo=NULL"_s);
    }

    // two such quotes count as a match, but it is unclear whose lines are meant
    anotherQuote("601").request("QR6").quoteNumber("KQ6").rego("XYZ789");
    EXPECT_FALSE(load(byNumbers));
    EXPECT_EQ(shown(), "[none] Error: Cannot load an Authorisation onto a blank quote!");
}

TEST_F(AuthorisedQuotes, ARefusalSaysWhyInThisOrder)
{
    quote("700").rego("GONE").set("INSURER_ID", nullptr);
    const auto refusal = [&] {
        EXPECT_FALSE(load(authorisedQuote("700").rego("GONE")));
        EXPECT_TRUE(quote("700").isNull("KESTAuthNo"));
        return shown();
    };
    EXPECT_EQ(refusal(), "[none] Error: Cannot load an Authorisation onto a blank quote!");
    quote("700").line(1);
    EXPECT_EQ(refusal(), "[none] Could not locate Car listed on Authorisation. Please Contact MarlinDesk Support.");
    car("GONE");
    EXPECT_EQ(refusal(), "[critical] Error locating a valid insurer, Please contact MarlinDesk Support.");
    EXPECT_EQ(car("GONE").number("KEST"), 1);  // stored before the insurer is checked
}

TEST_F(AuthorisedQuotes, ValuesOfTheHeaderComeOverToTheMainQuote)
{
    quote("500", 1).request("QR1").set("excess", 7).set("contri", 8).line(1);
    for (const auto& [elements, before, after] : casesIn<3>("inbound/authorised-columns.txt")) {
        fill(quote("500"), before).remarks("(01/02/2008 : Responded Quote Request)");
        EXPECT_TRUE(load(authorisedQuote("500").with(elements)));
        EXPECT_TRUE(load(authorisedQuote("500/1").with(elements)));
        EXPECT_TRUE(quote("500").shows(after)) << elements;
        EXPECT_EQ(quote("500").notes(), "(today : Authorised Quote) (01/02/2008 : Won Quote Request)");
        EXPECT_EQ(car("ABC123").number("KEST"), 1);
        EXPECT_TRUE(quote("500", 1).shows("excess=7 contri=8")) << elements;
    }
}

TEST_F(AuthorisedQuotes, TotalsFollowTheMergedLines)
{
    quote("500").line(1).set("rrhour", 2).set("rr_rate2", 38);
    quote("500").line(2, "RA").set("rahour", 1).set("rr_rate2", 50);
    quote("500").line(3, "PRT").set("qty", 1).set("rrhour", 80);
    putTemplate(730);
    EXPECT_TRUE(load(
        Message::told("AUQT quoteBody/quoteReference=500\nlabour 1 N\nlabour 2 D\npart 3 C partQuantity=3\npaint 8 I\n"
                      "labour 9 I labourType=OTH labourAmount=12.5\nsublet 77 D")));  // which is not in the quote
    EXPECT_EQ(quote("500").lines(), 4);
    EXPECT_TRUE(quote("500").shows("TOTAL=226 PRTTOTAL=750 MISTOTAL=12.5"));
    const QByteArray report = QJsonDocument(desktop->record().windows).toJson();
    for (const char* onlyNow : {"\"988.5\"", "\"990\"", "\"137\""})  // the total and the codes of new lines
        EXPECT_TRUE(report.contains(onlyNow)) << onlyNow;
}

TEST_F(AuthorisedQuotes, ANoteOfTheRequestIsAddedOnlyWhereItHasOne)
{
    gConn->execute(u"DELETE FROM QUOTE3"_s);
    EXPECT_TRUE(load(authorisedQuote("500")));
    EXPECT_EQ(quote("500").notes(), "(today : Authorised Quote)");
    EXPECT_EQ(rowCount("QUOTE3", "QTNNO='500' AND Subquote=0"), 1);
}

TEST_F(AuthorisedQuotes, AFailureLeavesWhatWasWrittenBeforeIt)
{
    const auto expectFailure = [&](const Message& message, const char* told) {
        EXPECT_FALSE(load(message));
        EXPECT_NE(shown().find(told), std::string::npos) << told;
    };
    const std::string untouched = "(01/02/2008 : Responded Quote Request)";
    for (const char* missing : {"authorityNumber", "orlaContact/fax", "quoteBody/gst",
                                "authorisedQuoteClaimCustomer/surname", "repairCompletionDate"}) {
        expectFailure(authorisedQuote("500").without(missing), "modLoadXML.LoadAUQT");
        EXPECT_EQ(car("ABC123").number("KEST"), 0) << missing;
    }
    // with an invalid date, the car and the money are stored, but nothing of the header
    quote("500").set("excess", 500);
    expectFailure(authorisedQuote("500").set("excess", "300").set("repairCompletionDate", "soon"), "Error Number: 13");
    EXPECT_EQ(car("ABC123").number("KEST"), 1);
    EXPECT_EQ(quote("500").number("excess"), 300);
    EXPECT_EQ(quote("500").state(), "3 locked - " + untouched);
    // with an unreadable line, the header is stored with totals of 0, and so are the lines before it
    quote("500").line(1).set("rrhour", 2).set("rr_rate2", 38);
    expectFailure(authorisedQuote("500").part(2, "I").paint(3, "I", {{"paintAmount", "x"}}),
                  "\n[none] Error processing Quote Items, Please contact MarlinDesk Support.");
    EXPECT_TRUE(quote("500").shows("KESTAuthNo=KA1 TOTAL=0"));
    EXPECT_EQ(quote("500").lines(), 2);
    EXPECT_EQ(quote("500").notes(), untouched);
}
