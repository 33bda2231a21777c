#include "shell/SharedVariables.h"
#include "support/Load.h"
#include "support/Shop.h"

namespace kest::test {

using namespace Qt::StringLiterals;
using StatusMessages = Shop;

namespace {

std::string deletionBox(const std::string& label)
{
    return "[information] ORLA has requested quote " + label +
           " be deleted.\r\nReason: Sent twice\r\n"
           "If you want to revise, please re-open and edit the quote then re-send to the insurer.";
}

}  // namespace

TEST_F(StatusMessages, EachMovesTheQuoteToItsState)
{
    const struct {
        Message message;
        const char* state;
        std::string boxes;
    } cases[] = {
        {quoteMatch("500/2").set("kestQuoteNumber", "KQ9"), "3 locked KQ9 (01/02/2008 : Matched Quote Request)", ""},
        {revisionRequest("QR1").reason("Add the grille"),
         "1 open - (today : Quote Revision Requested \"Reason : Add the grille\") (01/02/2008 : Active Quote Request)",
         "[information] ORLA has requested quote 500/2 be revised.\r\nReason: Add the grille\r\n"
         "Please re-open and edit the quote then re-send to the insurer."},
        {cancellation("QR1").reason("sold"),
         "9 locked KQ1 (today : QR Cancelled - sold) (01/02/2008 : Cancelled Quote Request)", ""},
        {cancellationBackout("QR1"), "1 open KQ1 (today : QR Reinstated) (01/02/2008 : Active Quote Request)", ""},
        {excessWaiver("500/2"), "7 open KQ1 (today : ORLA Waived Excess) (01/02/2008 : Responded Quote Request)",
         "[none] ORLA has removed the excess from this quote due to a special arrangement, "
         "Please update your invoices accordingly.\r\nQuote: 500/2"},
    };
    for (const auto& c : cases) {
        quote("500", 2).request("QR1").quoteNumber("KQ1").set("excess", 300).stage(7).set("ReadOnly", nullptr);
        quote("500", 2).remarks("(01/02/2008 : Responded Quote Request)");
        EXPECT_TRUE(load(c.message));
        EXPECT_EQ(quote("500", 2).state(), c.state);
        EXPECT_EQ(shown(), c.boxes);
    }
    EXPECT_EQ(quote("500", 2).number("excess"), 0);

    quote("501").quoteNumber("KQ3").stage(7).locked(true).note("Responded Quote Request");
    EXPECT_TRUE(load(quoteDeletion("KQ3").reason("Sent twice")));
    EXPECT_EQ(quote("501").state(),
              "1 open - (today : Deleted KEST Quote) (today : Quote Deleted \"Reason : Sent twice\") "
              "(01/02/2008 : Active Quote Request)");
    EXPECT_EQ(shown(), deletionBox("501"));
}

TEST_F(StatusMessages, AMatchAndARevisionTakeOverWhatTheMessageSays)
{
    quote("500").set("KESTQRVer", "7");
    EXPECT_TRUE(load(quoteMatch("500").request("QR8").claim("8800")));
    EXPECT_TRUE(quote("500").shows("KESTQRNo=QR8 KESTQRVer=1 Claim=8800 ExtraInfo=True"));
    EXPECT_TRUE(load(revisionRequest("QR8").version("3")));
    EXPECT_EQ(quote("500").text("KESTQRVer"), "3");
}

TEST_F(StatusMessages, EachMeansOneQuoteOfTheRequest)
{
    enum { oldest, newest };
    const std::pair<Message, int> cases[] = {
        {cancellation("QR1"), oldest},     {cancellationBackout("QR1"), oldest}, {revisionRequest("QR1"), newest},
        {assessmentResult("KQ1"), oldest}, {assessmentBackout("QR1"), newest},
    };
    for (const auto& [message, meant] : cases) {
        for (const int subquote : {oldest, newest})
            quote("500", subquote).request("QR1").quoteNumber("KQ1").stage(7);
        EXPECT_TRUE(load(message));
        EXPECT_NE(quote("500", meant).stage(), 7) << message.text().toStdString();
        EXPECT_EQ(quote("500", 1 - meant).stage(), 7) << message.text().toStdString();
    }
}

TEST_F(StatusMessages, ASupplementaryQuoteIsDeletedOnlyWhenTheUserAgrees)
{
    quote("500").stage(4).note("Won Quote Request").line(1);
    quote("500", 1).line(1);
    quote("500", 2).quoteNumber("KQ2").line(1);

    EXPECT_FALSE(load(quoteDeletion("KQ2")));  // No is the default
    EXPECT_TRUE(quoteExists("500", 2));
    EXPECT_EQ(shown(),
              "[none] This Supplimentary Quote will be DELETED.\r\nIf you require a record of this quote please "
              "print a copy before loading this message.\r\nDo you still want to continue loading this message?\n" +
                  deletionBox("500/2"));

    desktop.emplace(R"({"boxes": [{"text": "will be DELETED", "answer": "yes"}]})");
    EXPECT_TRUE(load(quoteDeletion("KQ2")));
    EXPECT_FALSE(quoteExists("500", 2));
    EXPECT_EQ(rowCount("QUOTE2"), 2);
    EXPECT_EQ(rowCount("QUOTE3"), 2);
    EXPECT_EQ(quote("500").state(), "4 open - (today : Supplementary 500/2 Deleted) (01/02/2008 : Won Quote Request)");
    EXPECT_EQ(desktop->boxes().size(), 2);
    EXPECT_EQ(gsDeletedQTNNO + u'/' + gsDeletedSubquote, u"500/2"_s)
        << "the file is named after the quote that has gone";
}

TEST_F(StatusMessages, AMessageWhoseQuoteIsUnknownIsRefused)
{
    const char* const noQuote = "[critical] Couldn't Locate Matching KEST Quote, Please contact MarlinDesk Support.";
    const char* const noNumber =
        "[critical] Couldn't Locate Matching KEST Quote Number, Please contact MarlinDesk Support.";
    const char* const noRequest =
        "[critical] Couldn't Locate Matching KEST Quote Request Number, Please contact MarlinDesk Support.";
    const char* const noAdjusted = "[critical] Error locating Quote in Database, Please contact Marlindesk Support.";
    quote("500").request("").quoteNumber("").stage(7).line(1);  // an empty number leads to no quote either
    for (const char* unknown : {"QR2", ""}) {
        const std::pair<Message, std::string> cases[] = {
            {quoteMatch("500/1"), noQuote},
            {excessWaiver("501"), noQuote},
            {quoteDeletion(unknown), noNumber},
            {revisionRequest(unknown), noRequest},
            {cancellation(unknown), noRequest},
            {cancellationBackout(unknown), noRequest},
            {assessmentResult(unknown), noRequest},
            {assessmentBackout(unknown), noRequest},
            {adjustedQuote("501").request(unknown), noAdjusted},
            {authorisedQuote("501").request(unknown).quoteNumber(unknown), noQuote},
        };
        for (const auto& [message, box] : cases) {
            EXPECT_FALSE(load(message));
            EXPECT_EQ(shown(), box);
        }
    }
    EXPECT_TRUE(load(manualQuote("888").request(""))) << shown();
    EXPECT_TRUE(quoteExists("888"));
    EXPECT_EQ(quote("500").state(), "7 open - ");
    EXPECT_EQ(quote("500").lines(), 1);
}

}  // namespace kest::test
