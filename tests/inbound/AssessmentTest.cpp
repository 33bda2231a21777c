#include "inbound/modLoadXML.h"
#include "support/Shop.h"

using Assessments = Shop;

static void takeResponse(const Text& file, const Text& number, const Text& status = "Submitted")
{
    QString text = submissionResponse(number).set("quoteSubmissionStatus", status).text();
    LoadSubmissionResponse(text, file);
}

TEST_F(Assessments, ABackOutUndoesWhatWasDecided)
{
    for (const auto& [subquote, authority, before, after, authorisation] : casesIn<5>("inbound/back-outs.txt")) {
        QuoteRow row = quote("500", subquote.toInt()).request("QR1").authorised(authority).stage(4).remarks(before);
        row.set("AuthDate", "01/02/2008");
        EXPECT_TRUE(load(assessmentBackout("QR1")));
        EXPECT_EQ(row.state(), "3 locked - " + after.toStdString());
        EXPECT_TRUE(row.shows(authorisation)) << before;
    }
}

TEST_F(Assessments, EachAdjustmentAddsANoteToAQuoteWithLines)
{
    quote("500").request("QR1").stage(3).locked(true).note("Responded Quote Request").line(1);
    EXPECT_TRUE(load(adjustedQuote("500")));
    EXPECT_TRUE(load(adjustedQuote("999")));  // with a wrong reference, the newest quote of the request is used
    EXPECT_EQ(shown(), "[critical] Quote not found in database. Please contact MarlinDesk Support.") << "no report";
    EXPECT_EQ(quote("500").state(),
              "3 locked - (today : Adjustment Suggested) (today : Adjustment Suggested) "
              "(01/02/2008 : Responded Quote Request)");

    quote("500", 1).request("QR1");
    EXPECT_FALSE(load(adjustedQuote("500/1")));
    EXPECT_EQ(shown(), "[none] Error: Cannot load an Adjustment onto a blank quote!");
    EXPECT_EQ(quote("500", 1).notes(), "");
}

TEST_F(Assessments, ASubmissionResponseGivesTheQuoteItsNumber)
{
    quote("500", 2).note("Sending KEST Quote").note("Sending KEST Quote", "02/02/2008");
    takeResponse("R_500_2_0001.xml", "KQ5");
    takeResponse("R_500_2_0001.xml", "KQ5");  // as each fill does
    EXPECT_EQ(quote("500", 2).state(),
              "1 locked KQ5 (02/02/2008 : Submitted KEST Quote) (01/02/2008 : Submitted KEST Quote)");

    quote("501").note("Sending KEST Quote");
    takeResponse("R_501_0.xml", "KQ6", "submitted");  // a different status
    EXPECT_EQ(quote("501").state(), "1 open KQ6 (01/02/2008 : Sending KEST Quote)");
}
