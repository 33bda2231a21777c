// Tests that statements of one wording, which are translated and prepared only once, each mean their own values.
#include "platform/Databases.h"

struct Shape : Databases {};

TEST_P(Shape, EachStatementMeansItsOwnValues)
{
    connection->execute(
        u"INSERT INTO LINE (CODE, SEQ, flag, day) VALUES ('A', 0, 0, %1), ('O''Neil', 1, 1, %2), "
        "('?', 2, 1, NULL), ('Ab 5%', NULL, 0, NULL)"_s.arg(stored(u"2026-02-28"_s, u"00:00:00"_s),
                                                            stored(u"2026-03-01"_s, u"00:00:00"_s)));
    const std::pair<QString, int> rows[] = {
        {u"CODE='A'"_s, 1},
        {u"CODE='O''Neil'"_s, 1},
        {u"CODE='?'"_s, 1},
        {u"CODE=''"_s, 0},
        {u"SEQ='1'"_s, 1},
        {u"SEQ=' 2.0'"_s, 1},
        {u"SEQ=''"_s, 1},
        {u"SEQ='none'"_s, 0},
        {u"SEQ<>'1'"_s, 2},
        {u"SEQ<>'none'"_s, 3},
        {u"SEQ=1"_s, 1},
        {u"SEQ>=1"_s, 2},
        {u"SEQ>=1.5"_s, 1},
        {u"SEQ<1e1"_s, 3},
        {u"flag='true'"_s, 2},
        {u"flag='0'"_s, 2},
        {u"flag='x'"_s, 0},
        {u"day='28/02/2026'"_s, 1},
        {u"day='2026-03-02'"_s, 0},
        {u"CODE LIKE 'a%'"_s, 2},
        {u"CODE LIKE 'a'"_s, 1},
        {u"CODE LIKE 'a[b-c]%'"_s, 1},
        {u"CODE LIKE '%[%]'"_s, 1},
        {u"CODE IN ('a', 'x')"_s, 1},
        {u"CODE IN ('?', 'o''neil')"_s, 2},
        {u"SEQ IN ('1', 'x')"_s, 1},
        {u"SEQ IN ('', '2')"_s, 2},
        {u"CODE='A' AND SEQ=0"_s, 1},
        {u"CODE='A' AND SEQ='0'"_s, 1},
    };
    for (int time = 0; time < 2; ++time) {
        for (const auto& [condition, expected] : rows)
            EXPECT_EQ(count(condition), expected) << condition;
        for (const int top : {3, 1, 2})
            EXPECT_EQ(query(u"SELECT TOP %1 * FROM LINE ORDER BY id"_s.arg(top)).recordCount(), top);
    }
    EXPECT_EQ(connection->execute(u"UPDATE LINE SET SEQ='7' WHERE CODE='A'"_s), 1);
    EXPECT_EQ(connection->execute(u"UPDATE LINE SET SEQ='' WHERE CODE='?'"_s), 1);
    EXPECT_EQ(query(u"SELECT SEQ FROM LINE WHERE CODE='A'"_s).value(u"SEQ"_s), QVariant(qint64(7)));
    EXPECT_EQ(query(u"SELECT SEQ FROM LINE WHERE CODE='?'"_s).value(u"SEQ"_s), QVariant(qint64(0)));
}

TEST_P(Shape, AColumnThatIsWorkedOutHasTheKindOfEachResult)
{
    connection->execute(u"INSERT INTO LINE (CODE, SEQ) VALUES ('A', NULL), ('B', 5)"_s);
    const auto kindFor = [&](const QString& code) {
        return query(u"SELECT SEQ+1 AS n FROM LINE WHERE CODE='%1'"_s.arg(code)).kind(u"n"_s);
    };
    EXPECT_EQ(kindFor(u"A"_s), db::Kind::Text);
    EXPECT_EQ(kindFor(u"B"_s), db::Kind::WholeNumber);
    EXPECT_EQ(kindFor(u"A"_s), db::Kind::Text);
}

TEST_P(Shape, AWrongValueLeavesTheStatementUsable)
{
    const auto insert = [&](const QString& id) {
        return failure([&] { connection->execute(u"INSERT INTO CAR (REGO) VALUES ('%1')"_s.arg(id)); }).number();
    };
    EXPECT_EQ(insert(u"ABC123"_s), 0);
    EXPECT_EQ(insert(u"ABC123"_s), StatementFailed);
    EXPECT_EQ(insert(u"XYZ789"_s), 0);
    EXPECT_EQ(query(u"SELECT REGO FROM CAR"_s).recordCount(), 2);
}

INSTANTIATE_TEST_SUITE_P(Engines, Shape, ::testing::Values(On::Embedded, On::MySql, On::Odbc, On::Tds));
