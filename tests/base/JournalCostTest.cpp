// What the journal adds to a change, in statements, each of which is a round trip on a server.
#include "base/Journal.h"
#include "support/Shop.h"

using JournalCost = Shop;

TEST_F(JournalCost, IsThreeMoreStatementsForEachChange)
{
    quote("500");
    db::Recordset row = opened(u"SELECT * FROM QUOTE1 WHERE QTNNO='500'"_s);
    const auto statementsOfAChange = [&](const QString& claim) {
        int statements = 0;
        db::setStatementFault([&] {
            ++statements;
            return false;
        });
        row.set(u"CLAIM"_s, claim);
        row.update();
        db::setStatementFault({});
        return statements;
    };
    EXPECT_EQ(statementsOfAChange(u"C1"_s), 1);
    const journal::Operation operation(journal::Kind::Save);
    statementsOfAChange(u"C2"_s);  // opens the operation
    EXPECT_EQ(statementsOfAChange(u"C3"_s), 1 + 3);
    journal::passPoint([&] { EXPECT_EQ(statementsOfAChange(u"C4"_s), 1 + 4); });
}
