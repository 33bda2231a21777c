// Tests that nothing is lost if somebody else writes between the statements of a change.
#include "platform/Databases.h"
#include "platform/database/FaultInjection.h"

using db::Recordset;

struct Meanwhile : Databases {};

TEST_P(Meanwhile, ALongTextIsNotOverwritten)
{
    const db::ConnectionPtr other = connect();
    other->setCommandTimeout(1);  // it waits for a locked row
    const QString theirs = u"UPDATE LINE SET notes='theirs'"_s;
    bool isPast = false;
    for (int number = 1; !isPast; ++number) {
        connection->execute(u"DELETE FROM LINE"_s);
        connection->execute(u"INSERT INTO LINE (notes) VALUES ('before')"_s);
        Recordset lines = query(u"SELECT id, notes FROM LINE"_s);
        lines.set(u"notes"_s, u"ours"_s);
        int statement = 0;
        bool isTheirs = false;
        db::setStatementFault([&] {
            if (++statement == number)
                isTheirs = attempt([&] { other->execute(theirs); });
            return false;
        });
        const int refused = failureOf([&] { lines.update(); });
        db::setStatementFault({});
        EXPECT_EQ(refused, isTheirs ? RowChanged : 0) << number;
        EXPECT_EQ(query(u"SELECT notes FROM LINE"_s).text(u"notes"_s), isTheirs ? u"theirs"_s : u"ours"_s) << number;
        isPast = statement < number;
    }
}

INSTANTIATE_TEST_SUITE_P(Engines, Meanwhile, ::testing::Values(On::Embedded, On::MySql, On::Odbc, On::Tds));
