// Tests the comparison of the insurer's values with the shop's, cell by cell.
#include "reports/Previews.h"

using Comparison = Previews;

TEST_F(Comparison, EachLineStandsBesideTheShops)
{
    quote("500").request("QR1");
    Message authorisation = authorisedQuote("500");
    Message suggestion = adjustedQuote("500");
    for (const auto& [number, shop, insurer, ofAuthorised, ofAdjusted] : casesIn<5>("reports/comparison.txt")) {
        if (!shop.isEmpty())
            fill(quote("500").line(number.toInt()), shop);
        for (Message* message : {&authorisation, &suggestion})
            message->line(insurer.section(u' ', 0, 0), number.toInt(), insurer.section(u' ', 1, 1), fieldsIn(insurer));
    }
    for (const bool isAdjusted : {false, true}) {
        const QJsonObject window = printed(isAdjusted ? suggestion : authorisation);
        const QStringList numbers = QString::fromStdString(column(window, "line_no")).split(u", "_s);
        for (const auto& [number, shop, insurer, ofAuthorised, ofAdjusted] : casesIn<5>("reports/comparison.txt"))
            EXPECT_EQ(cells(window, int(numbers.indexOf(number)),
                            "amount old_amount qty old_qty itemno category script gst", u'/'),
                      (isAdjusted ? ofAdjusted : ofAuthorised).toStdString())
                << (isAdjusted ? "adjusted, line " : "authorised, line ") << number;
    }
}

TEST_F(Comparison, TheHeaderIsOnEveryRow)
{
    quote("500").request("QR1").set("TOTAL", 242.0);
    Message told = authorisedQuote("500/0");
    told.set("kestAuthorisedQuoteNumber", "A number that is too long").set("assessmentComment", "Names & \"quotes\" é");
    told.set("quoteBody/quoteTotal", "1,141.25").set("quoteBody/gst", "103.75").labour(1, "I").labour(2, "I");
    const QJsonObject ofAuthorised = printed(told);
    quote("500").set("TOTAL", 242.0);
    const QJsonObject ofAdjusted = printed(adjustedQuote("500").set("quoteBody/quoteTotal", "868.730").labour(1, "C"));
    for (const auto& [field, first, second] : casesIn<3>("reports/comparison-header.txt")) {
        EXPECT_EQ(column(ofAuthorised, field), (first + u", "_s + first).toStdString()) << field;
        EXPECT_EQ(column(ofAdjusted, field), second.toStdString()) << field;
    }
    const QJsonArray fields = ofAdjusted[u"table"][u"fields"].toArray();
    EXPECT_FALSE(fields.contains(u"vendor"_s));
    EXPECT_EQ(fields.size(), 27);
}

TEST_F(Comparison, AnExcessIsShownOnlyIfItDiffers)
{
    quote("500").request("QR1").set("excess", 400.0).set("contri", 100.0).line(1);
    quote("500", 1).request("QR1").set("excess", 1.0).set("contri", 1.0);  // only those of the main quote count
    for (const char* reference : {"500", "500/1"}) {
        for (const auto& [excess, contribution, expected] : casesIn<3>("reports/excess.txt"))
            EXPECT_EQ(
                cells(
                    printed(authorisedQuote(reference).set("excess", excess).set("customerContribution", contribution)),
                    0, "excess contri", u'/'),
                expected.toStdString())
                << reference;
        const Message silent = authorisedQuote(reference).without("excess").without("customerContribution");
        EXPECT_EQ(cells(printed(silent), 0, "excess contri"), "|");
    }
    quote("500").set("excess", nullptr).set("contri", nullptr);
    EXPECT_EQ(cells(printed(authorisedQuote("500").set("customerContribution", "5")), 0, "excess contri"), "0|5");
}

TEST_F(Comparison, OnlyChangedLinesHaveARow)
{
    quote("500").request("QR1").line(1).set("qty", 1.0);
    quote("500").line(2, "PRT").set("qty", 1.0);
    const auto lines = [](Message message) {
        return message.labour(1, "N").labour(3, "I").part(2, "D").part(4, "").paint(5, "I").paint(6, "");
    };
    // a line without an indicator has that of the line before it in its section, as in the load
    EXPECT_EQ(column(printed(lines(authorisedQuote("500"))), "line_no"), "3, 2, 4, 5, 6");
    EXPECT_EQ(column(printed(lines(authorisedQuote("500"))), "action"), "I, D, D, I, I");
    EXPECT_EQ(column(printed(lines(authorisedQuote("500")), true), "line_no"), "3, 5, 6");
    EXPECT_EQ(column(printed(lines(adjustedQuote("500"))), "line_no"), "3, 2, 4, 5, 6");
    EXPECT_EQ(column(printed(lines(adjustedQuote("500")), true), "line_no"), "3, 5, 6");
}

TEST_F(Comparison, AnAuthorisedQuoteWithoutChangesStillHasARow)
{
    quote("500").request("QR1").line(1, "R&R").set("rrhour", 2.0).set("rr_rate2", 30.0).set("qty", 1.0);
    quote("500").line(2, "PRT").set("rrhour", 10.0).set("qty", 3.0);
    quote("500").line(3, "MIS").set("unitcost", 5.5).set("qty", 1.0);
    const QJsonObject window = printed(authorisedQuote("500").labour(1, "N"));
    EXPECT_EQ(column(window, "quote_type"), "AUTR");
    EXPECT_EQ(cells(window, 0,
                    "action qty gst total_md line_no itemno lab_grp paint_grp category script amount vendor "
                    "old_amount old_qty"),
              "N|1|0|95.5||||||||||");
    EXPECT_EQ(quote("500").number("TOTAL"), 60);  // the totals are calculated in every case
    EXPECT_EQ(column(printed(adjustedQuote("500").labour(1, "N")), "action"), "");
}

TEST_F(Comparison, ASubletRepairerBecomesAVendorByAMerePrint)
{
    quote("500").request("QR1");
    const int known = vendor("Straightline Alignment Pty Ltd").id();
    Message message = authorisedQuote("500");
    message.sublet(1, "I").sublet(2, "N", {{"subletRepairer", "Nobody"}});
    message.sublet(3, "I", {{"subletRepairer", "O'Hara & Sons"}});
    for (int twice = 0; twice < 2; ++twice)
        EXPECT_EQ(column(printed(message, true), "vendor"), std::to_string(known) + ", " + std::to_string(known + 1));
    EXPECT_TRUE(vendor("O'Hara & Sons").shows("Account=293 STREET=8 Foundry Lane PHONE=03 5550 1010 vendor_abn="));
    print(adjustedQuote("500").sublet(4, "I", {{"subletRepairer", "Another"}}));
    EXPECT_EQ(rowCount("VENDOR"), 2);
}
