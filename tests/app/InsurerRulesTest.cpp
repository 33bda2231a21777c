#include "app/transport/InsurerRules.h"
#include "platform/RuntimeError.h"
#include "platform/files/files.h"

#include <gtest/gtest.h>

namespace kest::test {

using namespace Qt::StringLiterals;

namespace {

QString faultsOf(const QString& rules)
{
    try {
        app::parsedRules(rules);
        return {};
    } catch (const RuntimeError& error) {
        return error.description();
    }
}

}  // namespace

TEST(InsurerRules, AFaultIsToldWithItsLine)
{
    const std::pair<QString, QString> cases[] = {
        {u"seed nine"_s, u"line 1: seed takes one whole number"_s},
        {u"\nauthorise"_s, u"line 2: a step stands below its occasion: on start, on quote NUMBER, ..."_s},
        {u"on quote 1\n authorise chnge=1"_s,
         u"line 2: authorise knows no \"chnge\"; it knows change, add, delete, "
         "sublet, excess, contribution, comment, assessor, wait, quote, request, "
         "claim, network, rego"_s},
        {u"on quote 1\n adjust change=-1"_s, u"line 2: change takes a whole number from 0 to 999, not \"-1\""_s},
        {u"on quote 1\n authorise excess=lots"_s, u"line 2: excess takes an amount, not \"lots\""_s},
        {u"on quote 1\n revise reason=\"again"_s, u"line 2: a double quote has no second one"_s},
        {u"on quote 1\n revise again"_s, u"line 2: \"again\" is not NAME=VALUE"_s},
        {u"on quote 1\n waive wait=1 wait=2"_s, u"line 2: wait is given twice"_s},
        {u"on quote 1/12"_s, u"line 1: \"1/12\" is not NUMBER or NUMBER/SUBQUOTE with a subquote of one digit"_s},
        {u"on request *"_s, u"line 1: on request takes the number of a request"_s},
        {u"on start\n authorise"_s, u"line 2: authorise at the start has to say which quote: quote=NUMBER"_s},
        {u"on start\n cancel"_s, u"line 2: cancel at the start has to say which request: request=NUMBER"_s},
        {u"on start\n request\n cancel"_s, {}},
        {u"on start\n marker quote=1/x\n request extra=maybe"_s,
         u"line 2: quote takes NUMBER or NUMBER/SUBQUOTE, not \"1/x\"\nline 3: extra takes yes or no, not \"maybe\""_s},
    };
    for (const auto& [rules, faults] : cases)
        EXPECT_EQ(faultsOf(rules), faults) << rules.toStdString();
    EXPECT_TRUE(
        faultsOf(u"on quote 1\n authorize"_s).startsWith(u"line 2: \"authorize\" is no step; a step is request"_s));
    EXPECT_TRUE(faultsOf(u"on monday"_s).startsWith(u"line 1: an occasion is: on start, on quote"_s));
}

TEST(InsurerRules, AValueMayHoldBlanksAndACommentEndsTheLine)
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

TEST(InsurerRules, TheRuleThatNamesTheQuoteGoesBeforeThoseForItsRequestAndForAny)
{
    const app::InsurerRules rules = app::parsedRules(
        u"on quote *\non request 20\non quote A1\non quote A1\n"
        "on quote */*\non request 20/1\non request 20\n"_s);
    struct Case {
        QString quote, subquote, request;
        int time, line;
    };
    const Case cases[] = {
        {u"a1"_s, u"0"_s, u"20"_s, 1, 3}, {u"A1"_s, u"0"_s, u"20"_s, 2, 4}, {u"A1"_s, u"0"_s, u"20"_s, 9, 4},
        {u"B"_s, u"0"_s, u"20"_s, 1, 2},  {u"B"_s, u"0"_s, u"20"_s, 2, 7},  {u"B"_s, u"1"_s, u"20"_s, 1, 6},
        {u"B"_s, u"0"_s, {}, 1, 1},       {u"B"_s, u"2"_s, u"20"_s, 1, 5},  {u"A1"_s, u"1"_s, {}, 1, 5},
    };
    for (const Case& c : cases) {
        const app::Rule* rule = rules.ruleFor(c.quote, c.subquote, c.request, c.time);
        ASSERT_NE(rule, nullptr);
        EXPECT_EQ(rule->line, c.line) << c.quote.toStdString() << '/' << c.subquote.toStdString() << ' ' << c.time;
    }
    EXPECT_EQ(app::parsedRules(u"on quote 1"_s).ruleFor(u"2"_s, u"0"_s, {}, 1), nullptr);
}

TEST(InsurerRules, TheRulesOfTheDemoHoldNoFault)
{
    const QString rules = files::read(QStringLiteral(KEST_SOURCE_DIR) + u"/sql/demo/insurer.rules"_s);
    EXPECT_EQ(faultsOf(rules), QString());
    EXPECT_EQ(app::parsedRules(rules).rules.size(), 5);
}

}  // namespace kest::test
