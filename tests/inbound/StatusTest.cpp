#include "shell/SharedVariables.h"
#include "support/Load.h"
#include "support/Shop.h"

namespace kest::test {

using namespace Qt::StringLiterals;
using namespace std::string_literals;
using StatusMessages = Shop;

TEST_F(StatusMessages, EachMovesTheQuoteToItsState)
{
    const struct {
        Message message;
        int stage;
        bool locked;
        const char* notes;
        const char* networkNumber;
        const char* boxes;
    } cases[] = {
        {quoteMatch("500"), 3, true, "(01/02/2008 : Matched Quote Request)", "KQ9", ""},
        {quoteDeletion("KQ1").reason("Sent twice"), 1, false,
         "(today : Deleted KEST Quote) (today : Quote Deleted \"Reason : Sent twice\") "
         "(01/02/2008 : Active Quote Request)",
         "",
         "[information] ORLA has requested quote 500 be deleted.\r\nReason: Sent twice\r\n"
         "If you want to revise, please re-open and edit the quote then re-send to the insurer."},
        {revisionRequest("QR1").reason("Add the grille"), 1, false,
         "(today : Quote Revision Requested \"Reason : Add the grille\") (01/02/2008 : Active Quote Request)", "",
         "[information] ORLA has requested quote 500 be revised.\r\nReason: Add the grille\r\n"
         "Please re-open and edit the quote then re-send to the insurer."},
        {cancellation("QR1").reason("sold"), 9, true,
         "(today : QR Cancelled - sold) (01/02/2008 : Cancelled Quote Request)", "KQ1", ""},
        {cancellationBackout("QR1"), 1, false, "(today : QR Reinstated) (01/02/2008 : Active Quote Request)", "KQ1",
         ""},
        {excessWaiver("500"), 7, false, "(today : ORLA Waived Excess) (01/02/2008 : Responded Quote Request)", "KQ1",
         "[none] ORLA has removed the excess from this quote due to a special arrangement, "
         "Please update your invoices accordingly.\r\nQuote: 500"},
    };
    for (const auto& c : cases) {
        quote("500").request("QR1").quoteNumber("KQ1").set("excess", 300).stage(7).set("ReadOnly", nullptr);
        quote("500").remarks("(01/02/2008 : Responded Quote Request)");

        EXPECT_TRUE(load(Message(c.message).set("kestQuoteNumber", c.networkNumber[0] ? c.networkNumber : "KQ1")));

        EXPECT_EQ(quote("500").stage(), c.stage);
        EXPECT_EQ(quote("500").locked(), c.locked);
        EXPECT_EQ(quote("500").notes(), c.notes);
        EXPECT_EQ(quote("500").text("KESTQuoteNo"), c.networkNumber);
        EXPECT_EQ(shown(), c.boxes);
    }
}

TEST_F(StatusMessages, AMatchTakesOverTheNetworksNumbers)
{
    quote("500", 2).set("KESTQRVer", "7");
    EXPECT_TRUE(load(quoteMatch("500/2").request("QR8").claim("8800").set("kestQuoteNumber", "KQ8")));
    EXPECT_EQ(quote("500", 2).text("KESTQRNo"), "QR8");
    EXPECT_EQ(quote("500", 2).text("KESTQRVer"), "1");
    EXPECT_EQ(quote("500", 2).text("Claim"), "8800");
    EXPECT_EQ(quote("500", 2).text("KESTQuoteNo"), "KQ8");
    EXPECT_EQ(quote("500", 2).number("ExtraInfo"), 1);
}

TEST_F(StatusMessages, ARevisionTakesTheNewestQuoteACancellationTheOldest)
{
    quote("500").request("QR1");
    quote("500", 1).request("QR1");

    EXPECT_TRUE(load(cancellation("QR1")));
    EXPECT_EQ(quote("500").stage(), 9);
    EXPECT_EQ(quote("500", 1).stage(), 1);
    EXPECT_TRUE(load(cancellationBackout("QR1")));
    EXPECT_EQ(quote("500").stage(), 1);

    EXPECT_TRUE(load(revisionRequest("QR1").version("3")));
    EXPECT_EQ(quote("500", 1).text("KESTQRVer"), "3");
    EXPECT_EQ(quote("500").text("KESTQRVer"), "1");
    EXPECT_EQ(shown(),
              "[information] ORLA has requested quote 500/1 be revised.\r\nReason: Add the grille\r\n"
              "Please re-open and edit the quote then re-send to the insurer.");
}

TEST_F(StatusMessages, AWaiverLeavesEverythingButTheExcess)
{
    quote("500", 1).set("excess", 400).stage(4).locked(true).note("Waiting ORLA Waived Excess", "03/02/2008");
    EXPECT_TRUE(load(excessWaiver("500/1")));
    EXPECT_EQ(quote("500", 1).number("excess"), 0);
    EXPECT_EQ(quote("500", 1).stage(), 4);
    EXPECT_TRUE(quote("500", 1).locked());
    EXPECT_EQ(quote("500", 1).notes(), "(03/02/2008 : ORLA Waived Excess)");
}

TEST_F(StatusMessages, ASupplementaryQuoteIsDeletedOnlyWhenTheUserAgrees)
{
    const char* const closing =
        "[information] ORLA has requested quote 500/2 be deleted.\r\nReason: Sent twice\r\n"
        "If you want to revise, please re-open and edit the quote then re-send to the insurer.";
    quote("500").stage(4).note("Won Quote Request").line(1);
    quote("500", 1).line(1);
    quote("500", 2).quoteNumber("KQ2").line(1);

    EXPECT_FALSE(load(quoteDeletion("KQ2")));  // No is the default
    EXPECT_TRUE(quoteExists("500", 2));
    EXPECT_EQ(quote("500").notes(), "(01/02/2008 : Won Quote Request)");
    EXPECT_EQ(shown(),
              "[none] This Supplimentary Quote will be DELETED.\r\nIf you require a record of this quote please "
              "print a copy before loading this message.\r\nDo you still want to continue loading this message?\n"s +
                  closing);

    desktop.emplace(R"({"boxes": [{"text": "will be DELETED", "answer": "yes"}]})");
    EXPECT_TRUE(load(quoteDeletion("KQ2")));
    EXPECT_FALSE(quoteExists("500", 2));
    EXPECT_EQ(rowCount("QUOTE2"), 2);
    EXPECT_EQ(rowCount("QUOTE3"), 2);
    EXPECT_EQ(quote("500").stage(), 4);
    EXPECT_EQ(quote("500").notes(), "(today : Supplementary 500/2 Deleted) (01/02/2008 : Won Quote Request)");
    EXPECT_EQ(u"[information] "_s + desktop->boxTexts().last(), QString::fromLatin1(closing));
    // the file is named after the quote that has gone
    EXPECT_EQ(gsDeletedQTNNO, u"500"_s);
    EXPECT_EQ(gsDeletedSubquote, u"2"_s);
}

TEST_F(StatusMessages, AMessageWhoseQuoteIsUnknownIsRefused)
{
    const char* const noQuote = "[critical] Couldn't Locate Matching KEST Quote, Please contact MarlinDesk Support.";
    const char* const noRequest =
        "[critical] Couldn't Locate Matching KEST Quote Request Number, Please contact MarlinDesk Support.";
    const std::pair<Message, std::string> cases[] = {
        {quoteMatch("500/1"), noQuote},
        {excessWaiver("501"), noQuote},
        {quoteDeletion("KQ2"),
         "[critical] Couldn't Locate Matching KEST Quote Number, Please contact MarlinDesk Support."},
        {revisionRequest("QR2"), noRequest},
        {cancellation("QR2"), noRequest},
        {cancellationBackout("QR2"), noRequest},
        {assessmentResult("KQ2"), noRequest},
        {assessmentBackout("QR2"), noRequest},
        {adjustedQuote("501").request("QR2"),
         "[critical] Error locating Quote in Database, Please contact Marlindesk Support."},
    };
    quote("500").request("QR1").quoteNumber("KQ1").stage(7);
    for (const auto& [message, box] : cases) {
        EXPECT_FALSE(load(message));
        EXPECT_EQ(shown(), box);
    }
    EXPECT_EQ(quote("500").stage(), 7);
    EXPECT_EQ(quote("500").notes(), "");
}

}  // namespace kest::test
