// Tests the codes of the network in both directions.
#include "quotedata/NetworkCodes.h"
#include "support/Test.h"

TEST(NetworkCodes, WhatGoesOutComesBackAsTheFirstOfItsCode)
{
    for (const auto& [kind, ours, code, comesBack] : casesIn<4>("quotedata/network-codes.txt")) {
        const bool isPaint = kind == u"paint"_s;
        EXPECT_EQ(isPaint ? codeOfPaintGroup(ours) : partTypeOfMark(ours), code) << ours;
        EXPECT_EQ(isPaint ? paintGroupOfCode(code) : markOfPartType(code), comesBack) << code;
    }
    EXPECT_EQ(markOfPartType(u"recy"_s), std::nullopt);
    EXPECT_EQ(colourOfCode(codeOfColour(u" cHAMPAGNE"_s)), u"Champagne"_s);
    EXPECT_EQ(codeOfColour(u"Sea Mist "_s), u"sea mist"_s);
}

TEST(NetworkCodes, AReasonThatEndsTheRepairIsNotedButNotReported)
{
    EXPECT_EQ(reasonOfCode(u"notp"_s), u"Repair not Proceeding"_s);
    EXPECT_EQ(reportedReasonOfCode(u"notp"_s), std::nullopt);
    EXPECT_EQ(reportedReasonOfCode(u"meth"_s), u"Method of Repair"_s);
}
