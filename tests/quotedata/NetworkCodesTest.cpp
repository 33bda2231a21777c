#include "quotedata/NetworkCodes.h"
#include "support/Test.h"

TEST(NetworkCodes, WhatGoesOutComesBackAsTheFirstOfItsCode)
{
    const std::tuple<QString, QString, QString> paint[] = {
        {u"m2"_s, u"PEAR"_s, u"M2"_s}, {u"S3"_s, u"CLER"_s, u"S2"_s}, {u"Q"_s, u""_s, u"S3"_s}};
    for (const auto& [group, code, comesBack] : paint) {
        EXPECT_EQ(codeOfPaintGroup(group), code);
        EXPECT_EQ(paintGroupOfCode(code), comesBack);
    }
    const std::tuple<QString, QString, QString> parts[] = {{u""_s, u"NEW"_s, u" "_s},
                                                           {u"R"_s, u"RECY"_s, u"U"_s},
                                                           {u"X"_s, u"EXCH"_s, u"X"_s},
                                                           {u"x"_s, u"NEW"_s, u" "_s}};
    for (const auto& [mark, type, comesBack] : parts) {
        EXPECT_EQ(partTypeOfMark(mark), type);
        EXPECT_EQ(markOfPartType(type), comesBack);
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
