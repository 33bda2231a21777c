// Tests that a search by column and value finds what the criterion with that value finds.
#include "platform/Databases.h"

struct Find : Databases {};

TEST_P(Find, AValueIsFoundLikeItsCriterion)
{
    connection->execute(u"INSERT INTO LINE (CODE, SEQ, amount, flag) VALUES ('A', 0, 0, 0), ('b ', 2, -1.5, 1)"_s);
    connection->execute(u"INSERT INTO LINE (CODE, SEQ, amount, flag) VALUES ('O''Neil', 3, 100, 1)"_s);
    db::Recordset lines = query(u"SELECT * FROM LINE ORDER BY id"_s);
    const std::tuple<QString, QVariant, int> cases[] = {
        {u"CODE"_s, u"a"_s, 1}, {u"code"_s, u"B"_s, 2},     {u"Code"_s, u"o'neil"_s, 3}, {u"CODE"_s, u"x"_s, -1},
        {u"SEQ"_s, 2, 2},       {u"SEQ"_s, qint64(3), 3},   {u"seq"_s, u" 3.0"_s, 3},    {u"SEQ"_s, u""_s, 1},
        {u"SEQ"_s, u"x"_s, -1}, {u"amount"_s, -0.0, 1},     {u"amount"_s, -1.5, 2},      {u"amount"_s, u"100"_s, 3},
        {u"flag"_s, true, 2},   {u"flag"_s, u"false"_s, 1},
    };
    for (const auto& [column, value, row] : cases) {
        lines.moveFirst();
        lines.find(column, value);
        EXPECT_EQ(lines.absolutePosition(), row) << column << '=' << value.toString();
        lines.moveFirst();
        lines.find(sql((column + u"='{}'"_s).toLatin1().constData(), value));
        EXPECT_EQ(lines.absolutePosition(), row) << column << "='" << value.toString() << '\'';
    }
    lines.moveFirst();
    lines.set(u"SEQ"_s, QVariant());
    lines.find(u"SEQ"_s, QVariant());
    EXPECT_TRUE(lines.eof()) << "nothing equals Null";
    lines.moveFirst();
    lines.set(u"SEQ"_s, 7);
    lines.find(u"SEQ"_s, 7);
    EXPECT_EQ(lines.absolutePosition(), 1) << "a value that was set meanwhile";
    EXPECT_EQ(failure([&] { lines.find(u"nosuch"_s, 1); }).number(), NoSuchColumn);
}

INSTANTIATE_TEST_SUITE_P(Engines, Find, ::testing::Values(On::Embedded, On::MySql, On::Odbc, On::Tds));
