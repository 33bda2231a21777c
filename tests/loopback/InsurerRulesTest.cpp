// Tests the rules of the simulated insurer: how they are read, and which one is chosen.
#include "loopback/InsurerRules.h"
#include "support/Test.h"

static QString faultsOf(const QString& rules)
{
    return failure([&] { app::parsedRules(rules); }).description();
}

TEST(InsurerRules, AFaultIsToldWithItsLine)
{
    for (const QStringList& row : rowsIn("loopback/rule-faults.txt"))
        EXPECT_EQ(faultsOf(row[0]), row[1]);
    EXPECT_TRUE(
        faultsOf(u"on quote 1\n authorize"_s).startsWith(u"line 2: \"authorize\" is not a step; a step is request"_s));
    EXPECT_EQ(faultsOf(files::read(checkoutFile(u"sql/demo/insurer.rules"_s))), QString());
    EXPECT_TRUE(faultsOf(u"on monday"_s).startsWith(u"line 1: an occasion is: on start, on quote"_s));
}

TEST(InsurerRules, ACommentEndsALineUnlessItIsQuoted)
{
    const app::InsurerRules rules = app::parsedRules(
        u"seed 7 # any\r\n# all of it\n\non quote 1004/1 claim=9\n\trevise reason=\"a # b\" wait=2 # c\n"_s);
    ASSERT_EQ(rules.rules.size(), 1);
    const app::Rule& rule = rules.rules[0];
    EXPECT_EQ(rules.seed, 7U);
    EXPECT_EQ(rule.number + u' ' + rule.subquote + u' ' + rule.parameters[u"claim"_s], u"1004 1 9"_s);
    ASSERT_EQ(rule.steps.size(), 1);
    EXPECT_EQ(rule.steps[0].parameters[u"reason"_s], u"a # b"_s);
    EXPECT_EQ(rule.steps[0].number(u"wait"_s), 2);
    EXPECT_EQ(app::parsedStep(rule.steps[0].text).parameters, rule.steps[0].parameters);
}

TEST(InsurerRules, TheRuleThatNamesTheQuoteGoesFirst)
{
    const app::InsurerRules rules = app::parsedRules(
        u"on quote *\non request 20\non quote A1\non quote A1\n"
        "on quote */*\non request 20/1\non request 20\n"_s);
    for (const auto& [quote, subquote, request, time, line] : casesIn<5>("loopback/rule-choice.txt")) {
        const app::Rule* rule = rules.ruleFor({quote, subquote}, request, time.toInt());
        ASSERT_NE(rule, nullptr);
        EXPECT_EQ(rule->line, line.toInt()) << quote << '/' << subquote;
    }
    EXPECT_EQ(app::parsedRules(u"on quote 1"_s).ruleFor({u"2"_s}, {}, 1), nullptr);
}
