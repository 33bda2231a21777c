#include "inbound/modLoadXML.h"
#include "platform/RuntimeError.h"
#include "support/Load.h"
#include "support/Shop.h"

namespace kest::test {

using Assessments = Shop;

namespace {

void takeResponse(const Text& file, const Text& number, const Text& status = "Submitted")
{
    QString text = submissionResponse(number).set("quoteSubmissionStatus", status).text();
    LoadSubmissionResponse(text, file);
}

}  // namespace

TEST_F(Assessments, AResultClosesAMainQuoteAndHandsASupplementaryOneBack)
{
    const std::pair<const char*, const char*> cases[] = {
        {"PART", "(today : Tender Failed \"Reason : Part Price\") (01/02/2008 : Lose Quote Request)"},
        {"tlss", "(today : Tender Failed \"Reason : Total Loss\") (01/02/2008 : Total Loss Quote Request)"},
        {"abc", "(today : Tender Failed \"Reason : Unknown Reason Code - ABC\") (01/02/2008 : Lose Quote Request)"},
    };
    for (const auto& [code, notes] : cases) {
        quote("500").quoteNumber("KQ1").stage(3).remarks("(01/02/2008 : Responded Quote Request)");
        EXPECT_TRUE(load(assessmentResult("KQ1").reason(code)));
        EXPECT_EQ(quote("500").state(), std::string("10 locked KQ1 ") + notes);
    }
    quote("500", 1).quoteNumber("KQ2").stage(3).locked(true);
    EXPECT_TRUE(load(assessmentResult("KQ2").reason("tlss")));
    EXPECT_EQ(quote("500", 1).state(), "1 open KQ2 (today : Quote Rejected \"Reason : Total Loss\")");
}

TEST_F(Assessments, ABackOutUndoesWhatWasDecided)
{
    const struct {
        int subquote;
        const char *authorised, *before, *after, *authorisation;
    } cases[] = {
        {0, "KA1", "(02/02/2008 : Authorised Quote) (01/02/2008 : Won Quote Request)",
         "(02/02/2008 : Deleted Authorised Quote) (01/02/2008 : Responded Quote Request)", "KESTAuthNo=- AuthDate=-"},
        {0, "", "(01/02/2008 : Lose Quote Request)",
         "(today : Fail Tender Backout) (01/02/2008 : Responded Quote Request)", "KESTAuthNo= AuthDate=01/02/2008"},
        // the number of a supplementary quote's authorisation stays
        {1, "KA1", "(01/02/2008 : Quote Rejected \"Reason : Part Price\")",
         "(today : Rejected Supplementary Backout) (01/02/2008 : Quote Rejected \"Reason : Part Price\")",
         "KESTAuthNo=KA1 AuthDate=01/02/2008"},
        {1, "KA1", "(02/02/2008 : Authorised Quote) (01/02/2008 : Rejected Supplementary Backout)",
         "(02/02/2008 : Deleted Authorised Quote) (01/02/2008 : Rejected Supplementary Backout)",
         "KESTAuthNo=KA1 AuthDate=-"},
    };
    for (const auto& c : cases) {
        QuoteRow row = quote("500", c.subquote).request("QR1").authorised(c.authorised).stage(4).remarks(c.before);
        row.set("AuthDate", "01/02/2008");
        EXPECT_TRUE(load(assessmentBackout("QR1")));
        EXPECT_EQ(row.state(), std::string("3 locked - ") + c.after);
        EXPECT_TRUE(row.shows(c.authorisation)) << c.before;
    }
}

TEST_F(Assessments, EachAdjustmentAddsANoteToAQuoteWithLines)
{
    quote("500").request("QR1").stage(3).locked(true).note("Responded Quote Request").line(1);
    EXPECT_TRUE(load(adjustedQuote("500")));
    EXPECT_TRUE(load(adjustedQuote("999")));  // a wrong reference: the newest quote of the request
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
    takeResponse("R_500_2_0001.xml", "KQ5");  // each fill applies it again
    EXPECT_EQ(quote("500", 2).state(),
              "1 locked KQ5 (02/02/2008 : Submitted KEST Quote) (01/02/2008 : Submitted KEST Quote)");

    quote("501").note("Sending KEST Quote");
    takeResponse("R_501_0.xml", "KQ6", "submitted");  // another status
    EXPECT_EQ(quote("501").state(), "1 open KQ6 (01/02/2008 : Sending KEST Quote)");

    // without its quote, or without a subquote in its name: the fill says so
    EXPECT_THROW(takeResponse("R_502_0.xml", "KQ7"), RuntimeError);
    EXPECT_THROW(takeResponse("R_501.xml", "KQ7"), RuntimeError);
    EXPECT_EQ(quote("501").text("KESTQuoteNo"), "KQ6");
}

}  // namespace kest::test
