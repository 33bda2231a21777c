// A row that an interrupted load has added stays if someone has filled one of its columns since.
#include "recovery/TakeBack.h"
#include "support/Shop.h"

namespace kest::test {

using namespace Qt::StringLiterals;

using FilledRow = Shop;

TEST_F(FilledRow, StaysAlsoIfTheColumnHasADefault)
{
    quote("500").line(1);
    arrive("m.xml", authorisedQuote("500").paint(3, "I").labour(4, "I"));
    ASSERT_TRUE(loadAsTheWindow(u"m.xml"_s)) << shown();
    const QVariant load = opened(u"SELECT MAX(Operation) AS newest FROM KESTOperation"_s).value(u"newest"_s);

    quote("500").line(3).set("Report_on", 1);  // the load gave it no value, so the table gave it 0
    EXPECT_EQ(recovery::takeBack(load.toLongLong()).size(), 1);
    EXPECT_EQ(rowCount("QUOTE2", "SEQ_NO=3"), 1);
    EXPECT_EQ(rowCount("QUOTE2", "SEQ_NO=4"), 0);
}

}  // namespace kest::test
