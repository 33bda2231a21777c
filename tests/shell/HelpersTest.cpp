// The small routines by whose exact rules messages are read.
#include "platform/RuntimeError.h"
#include "shell/Helpers.h"
#include "support/TestProfile.h"

#include <gtest/gtest.h>

#include <ctime>
#include <tuple>

using namespace Qt::StringLiterals;
using namespace kest;

TEST(Helpers, ReplacementsAreNotSearchedAgain)
{
    const std::tuple<QString, QString, QString, QString> cases[] = {
        {u"aXbx"_s, u"-"_s, u"x"_s, u"a-b-"_s}, {u"&&"_s, u"&amp;"_s, u"&"_s, u"&amp;&amp;"_s},
        {u"aaa"_s, u"b"_s, u"AA"_s, u"ba"_s},   {u""_s, u"b"_s, u"a"_s, u""_s},
        {u"abc"_s, u"-"_s, u""_s, u"abc"_s},    {u"abc"_s, u""_s, u"B"_s, u"ac"_s}};
    for (const auto& [text, replacement, search, expected] : cases)
        EXPECT_EQ(ReplaceText(text, replacement, search), expected);
}

TEST(Helpers, ZerosPadUpToTheLength)
{
    EXPECT_EQ(PadZeroLeft(u"7"_s, 3), u"007"_s);
    EXPECT_EQ(PadZeroLeft(u"1234"_s, 3), u"1234"_s);
    EXPECT_EQ(PadZeroLeft(u""_s, 2), u"00"_s);
    EXPECT_EQ(PadZeroLeft(u"7"_s, -1), u"7"_s);
}

TEST(Helpers, ANumberIsReadFromTextThatMayHoldAnythingElse)
{
    const std::tuple<QString, QString, double> cases[] = {
        {u" -12.5 "_s, u"0"_s, -12.5}, {u"1,234.50"_s, u"0"_s, 1234.5},
        {u"12A34"_s, u"0"_s, 1234},    {u"$1,200.50 incl"_s, u"0"_s, 1200.5},
        {u"abc"_s, u"7"_s, 7},         {u""_s, u"7"_s, 7},
        {u"1.2.3"_s, u"7"_s, 7},       {u"."_s, u"7"_s, 7},
        {u"abc"_s, u"abc"_s, 0},       {u"-x5"_s, u"0"_s, 5},
        {u"1e999"_s, u"7"_s, 1999},    {QString(500, u'9'), u"7"_s, 7}};
    for (const auto& [text, fallback, expected] : cases)
        EXPECT_EQ(SafeVal(text, fallback), expected) << text.toStdString();
}

TEST(Helpers, ARegistrationThatIsNoneIsUniversal)
{
    for (const QString& none : {u" tba "_s, u"Universal"_s, u"ADVISE"_s, u""_s, u"  "_s})
        EXPECT_EQ(NormaliseRego(none), u"UNIVERSAL"_s);
    for (const QString& rego : {u" abc 123 "_s, u"TBA1"_s})
        EXPECT_EQ(NormaliseRego(rego), rego);
}

TEST(Helpers, AQuoteReferenceHoldsAnOptionalSubquote)
{
    const std::tuple<QString, QString, QString, QString> cases[] = {
        {u"123"_s, u"123"_s, u"123"_s, u"0"_s},     {u"123/0"_s, u"123"_s, u"123"_s, u"0"_s},
        {u"123/2"_s, u"123/2"_s, u"123"_s, u"2"_s}, {u"123/"_s, u"123"_s, u"123"_s, u""_s},
        {u"1/x"_s, u"1"_s, u"1"_s, u"x"_s},         {u"1/2/3"_s, u"1/2/3"_s, u"1"_s, u"2/3"_s},
        {u"/1"_s, u"/1"_s, u""_s, u"1"_s},          {u""_s, u""_s, u""_s, u"0"_s},
        {u"1/-1"_s, u"1"_s, u"1"_s, u"-1"_s}};
    for (const auto& [reference, normal, number, subquote] : cases) {
        EXPECT_EQ(NormaliseQuoteRef(reference), normal) << reference.toStdString();
        EXPECT_EQ(SplitQuoteRef(reference), std::pair(number, subquote)) << reference.toStdString();
    }
}

TEST(Helpers, LettersDigitsAndExtensions)
{
    EXPECT_EQ(AlphaNumericOnly(u"(03) 95-55 ab\u00c9Z\u0661"_s), u"039555abZ"_s);
    EXPECT_EQ(GetExtensionUpper(u"a.b. Jpg "_s), u"JPG"_s);
    EXPECT_EQ(GetExtensionUpper(u"jpg"_s), QString());
    EXPECT_EQ(GetExtensionUpper(u"a."_s), QString());
}

TEST(Helpers, AMessagesDateIsShownInLocalTime)
{
    const QByteArray before = qgetenv("TZ");
    qputenv("TZ", "Australia/Sydney");
    ::tzset();
    const std::pair<QString, QString> cases[] = {
        {u""_s, u""_s},
        {u"2024-07-01T02:05:09.000Z"_s, u"1/7/2024 12:05 PM"_s},
        {u"2024-01-31T13:30:00.000Z"_s, u"1/2/2024 12:30 AM"_s},
        {u"2024-10-05T15:59:59.999Z"_s, u"6/10/2024 1:59 AM"_s},
        {u"2024-10-05T16:00:00.000Z"_s, u"6/10/2024 3:00 AM"_s},
        {u"2024-10-06T02:30:00.000Z"_s, u"6/10/2024 1:30 PM"_s},
        {u"2024-07-01T02:35:00.00Z"_s, u"1/7/2024 12:35 PM"_s},
        {u"2024-07-01T02:35:00Z"_s, u"1/7/2024 12:03 PM"_s},  // without a fraction the cut takes half of the minute
    };
    for (const auto& [text, expected] : cases)
        EXPECT_EQ(FormatNetworkDate(text), expected) << text.toStdString();
    EXPECT_THROW(FormatNetworkDate(u"not a date"_s), RuntimeError);
    EXPECT_THROW(FormatNetworkDate(u"Z"_s), RuntimeError);
    EXPECT_EQ(UtcToLocal(QDateTime(QDate(2024, 7, 1), QTime(0, 0, 5, 900))).time(), QTime(10, 0, 5));
    before.isNull() ? qunsetenv("TZ") : qputenv("TZ", before);
    ::tzset();
}
