// Tests messages that move a quote to another state, and submission responses.
#include "inbound/modLoadXML.h"
#include "support/Shop.h"

using StatusMessages = Shop;

TEST_F(StatusMessages, EachMovesTheQuoteToItsState)
{
    const QString responded = u"(01/02/2008 : Responded Quote Request)"_s;
    for (const auto& [subquote, before, notes, message, state, after, boxes] : casesIn<7>("inbound/states.txt")) {
        gConn->execute(u"UPDATE QUOTE1 SET KESTQRNo=NULL, KESTQuoteNo=NULL"_s);
        QuoteRow row = quote("500", subquote.toInt()).request("QR1").quoteNumber("KQ1").stage(7).set("excess", 300);
        fill(row, before).remarks(notes.isEmpty() ? responded : notes);
        row.line(1);
        EXPECT_TRUE(load(Message::told(message)));
        EXPECT_EQ(row.state(), state.toStdString());
        EXPECT_TRUE(row.shows(after)) << message << notes;
        EXPECT_EQ(QString::fromStdString(shown()).replace(u"\r\n"_s, u" / "_s), boxes);
    }
}

TEST_F(StatusMessages, EachMeansOneQuoteOfTheRequest)
{
    for (const auto& [message, meant] : casesIn<2>("inbound/meant-quotes.txt")) {
        for (const int subquote : {0, 1})
            quote("500", subquote).request("QR1").quoteNumber("KQ1").stage(7);
        EXPECT_TRUE(load(Message::told(message)));
        for (const int subquote : {0, 1})
            EXPECT_EQ(quote("500", subquote).stage() != 7, subquote == meant.toInt()) << message;
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
              "print a copy before loading this message.\r\nDo you still want to continue loading this message?\n"
              "[information] ORLA has requested quote 500/2 be deleted.\r\nReason: Sent twice\r\n"
              "If you want to revise, please re-open and edit the quote then re-send to the insurer.");

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

TEST_F(StatusMessages, AMessageWhoseQuoteIsUnknownOrHasNoLinesIsRefused)
{
    quote("502").request("QR5");
    // an empty number does not match an empty number
    quote("500").request("").quoteNumber("").stage(7).line(1);
    quote("").request("").quoteNumber("KQ9").line(1);
    for (const QString& unknown : {u"QR2"_s, u""_s}) {
        for (auto [message, box] : casesIn<2>("inbound/unknown-quotes.txt")) {
            EXPECT_FALSE(load(Message::told(message.replace(u'?', unknown))));
            EXPECT_EQ(shown(), box.toStdString());
        }
    }
    EXPECT_TRUE(load(manualQuote("888").request(""))) << shown();
    EXPECT_TRUE(quoteExists("888"));
    EXPECT_EQ(quote("500").state(), "7 open - ");
    EXPECT_EQ(quote("502").state(), "1 open - ");
    EXPECT_EQ(quote("500").lines(), 1);
    EXPECT_EQ(quote("").state(), "1 open KQ9 ");
}

static void takeResponse(const Text& file, const Text& number, const Text& status = "Submitted")
{
    QString text = submissionResponse(number).set("quoteSubmissionStatus", status).text();
    LoadSubmissionResponse(text, file);
}

TEST_F(StatusMessages, ASubmissionResponseGivesTheQuoteItsNumber)
{
    quote("500", 2).note("Sending KEST Quote").note("Sending KEST Quote", "02/02/2008");
    for (int twice = 0; twice < 2; ++twice)  // as each fill does
        takeResponse("R_500_2_0001.xml", "KQ5");
    EXPECT_EQ(quote("500", 2).state(),
              "1 locked KQ5 (02/02/2008 : Submitted KEST Quote) (01/02/2008 : Submitted KEST Quote)");

    quote("501").note("Sending KEST Quote");
    takeResponse("R_501_0.xml", "KQ6", "submitted");  // a different status
    EXPECT_EQ(quote("501").state(), "1 open KQ6 (01/02/2008 : Sending KEST Quote)");
}
