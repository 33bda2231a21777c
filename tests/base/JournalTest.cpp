// The journal records every change of an operation together with the change, and nothing else.
#include "base/History.h"
#include "base/Journal.h"
#include "setup/PrepareDatabase.h"
#include "support/Shop.h"

struct JournalOfAShop : Shop {
    /// Returns the operations on quote 500, newest first, such as "load of m.xml: done".
    static QString operations()
    {
        QStringList told;
        for (const journal::Entry& entry : journal::historyOf(u"500"_s, {}))
            told += journal::titleOf(entry) + u": "_s + entry.state;
        return told.join(u", "_s);
    }
    static int records() { return rowCount("KESTOperation") + rowCount("KESTJournal"); }
};

/// Removes one of the two tables. The result creates both anew, on a server that keeps them for the next test.
[[nodiscard]] static auto withoutJournal()
{
    gConn->execute(u"DROP TABLE KESTJournal"_s);
    return qScopeGuard([] {
        gConn->execute(u"DROP TABLE KESTOperation"_s);
        app::createParts(gConn, app::missingParts(gConn));
    });
}

TEST_F(JournalOfAShop, RecordsNothingForALoadThatChangesNothing)
{
    quote("500").request("QR1");
    arrive("m.xml", authorisedQuote("501"));
    EXPECT_FALSE(loadAsTheWindow(u"m.xml"_s));
    EXPECT_EQ(listed().size(), 1);
    EXPECT_EQ(records(), 0);

    quote("500").note("Sending KEST Quote");
    arrive("R_500_0.xml", submissionResponse("KQ7"));
    listed();
    const int first = records();
    EXPECT_GT(first, 0);
    listed();
    EXPECT_EQ(records(), first) << "the response lies there at every fill";
}

TEST_F(JournalOfAShop, KeepsTheChangesOfALoadThatFailed)
{
    quote("500").claim("C0");
    {
        const journal::Operation operation(journal::Kind::Load, u"m.xml"_s);
        const journal::Operation nested(journal::Kind::Send);
        gConn->execute(sql("UPDATE QUOTE1 SET CLAIM='{}' WHERE QTNNO='{}'", u"C'1"_s, u"500"_s));
    }
    EXPECT_EQ(operations(), u"load of m.xml: failed"_s);
    const auto changes = journal::changesOf(journal::historyOf(u"500"_s, {}).front().id);
    ASSERT_EQ(changes.size(), 1);
    EXPECT_EQ(journal::linesOf(changes.front().row).join(u'\n').toUpper(), uR"(CLAIM: "C0" -> "C'1")"_s);
    EXPECT_EQ(quote("500").text("CLAIM"), "C'1");
}

TEST_F(JournalOfAShop, WritesAChangeTogetherWithItsRecord)
{
    quote("500").claim("C1");
    db::Recordset row = opened(u"SELECT * FROM QUOTE1 WHERE QTNNO='500'"_s);
    quote("500").claim("C2");
    const journal::Operation operation(journal::Kind::Save);

    row.set(u"CLAIM"_s, u"C3"_s);
    EXPECT_EQ(failureOf([&] { row.update(); }), RowChanged);
    EXPECT_EQ(records(), 0) << "the row was changed by someone else, so nothing was changed";

    row = opened(u"SELECT * FROM QUOTE1 WHERE QTNNO='500'"_s);
    row.set(u"CLAIM"_s, u"C3"_s);
    const auto back = withoutJournal();
    EXPECT_EQ(failureOf([&] { row.update(); }), StatementFailed);
    EXPECT_EQ(failureOf([&] { gConn->execute(u"DELETE FROM QUOTE1 WHERE QTNNO='500'"_s); }), StatementFailed);
    EXPECT_EQ(quote("500").text("CLAIM"), "C2");
    EXPECT_EQ(rowCount("KESTOperation"), 0);
}

TEST_F(JournalOfAShop, IsNotNeededForALoad)
{
    const auto back = withoutJournal();
    journal::watch(gConn);
    quote("500").request("QR1").note("Active Quote Request");
    arrive("m.xml", cancellation("QR1"));
    EXPECT_TRUE(loadAsTheWindow(u"m.xml"_s)) << shown();
    EXPECT_EQ(quote("500").stage(), 9);
    EXPECT_EQ(operations(), QString());
}

TEST_F(JournalOfAShop, ForgetsOldOperationsSomeRowsAtATimeButNoOpenOne)
{
    for (const auto& [state, daysAgo] :
         {std::pair("open", 200), {"done", 100}, {"failed", 91}, {"done", 89}, {"unfinished", 200}, {"done", 95}})
        gConn->execute(sql("INSERT INTO KESTOperation (OperationKind, State, StartedAt) VALUES ('load', '{}', '{}')",
                           QString::fromLatin1(state),  // the server numbers them from 1
                           QDateTime::currentDateTime().addDays(-daysAgo).toString(u"yyyy-MM-ddTHH:mm:ss"_s)));
    for (const auto& [number, count] : {std::pair(3, 600), {3, 500}, {4, 100}}) {
        const QStringList records(count, u"(%1, 'T', 0)"_s.arg(number));
        gConn->execute(u"INSERT INTO KESTJournal (Operation, TableName, Settled) VALUES "_s + records.join(u','));
    }
    gConn->execute(uR"(UPDATE KESTOperation SET Facts='{"undoes":6}' WHERE Operation=5)"_s);

    journal::prune();
    EXPECT_EQ(rowCount("KESTOperation", "Operation IN (1, 3, 4, 5, 6)"), 5);
    EXPECT_EQ(rowCount("KESTOperation"), 5);
    EXPECT_EQ(rowCount("KESTJournal", "Operation=3"), 101);
    EXPECT_EQ(journal::entryOf(3).state, u"pruned"_s);

    journal::prune();
    EXPECT_EQ(rowCount("KESTOperation", "Operation IN (1, 4, 5, 6)"), 4);
    EXPECT_EQ(rowCount("KESTOperation"), 4);
    EXPECT_EQ(rowCount("KESTJournal"), 100);
}
