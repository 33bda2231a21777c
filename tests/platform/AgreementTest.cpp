// Runs made-up statements on the embedded engine and on MariaDB, which must find and store the same.
#include "platform/Databases.h"
#include "support/Chance.h"

class Agreement : public Databases {};

TEST_P(Agreement, AQueryFindsTheSameRowsOnBothEngines)
{
    const QString embeddedText = createDatabase(On::Embedded);
    const auto embedded = std::make_shared<db::Connection>();
    embedded->open(embeddedText);
    for (const QString& values : linesOf("query-rows.txt"))
        for (const db::ConnectionPtr& engine : {connection, embedded})
            engine->execute(u"INSERT INTO LINE (CODE, SEQ, flag, amount, day, notes) VALUES (%1)"_s.arg(values));
    const Grammar statements("queries.txt");
    int found = 0;
    for (quint32 seed = 0; seed < 1500; ++seed) {
        Chance chance(seed);
        const QString query = statements.text(chance, u"query"_s);
        EXPECT_TRUE(attempt([&] {
            const QStringList rows = rowsOf(embedded, query);
            EXPECT_EQ(rowsOf(connection, query), rows) << query;
            found += !rows.isEmpty();
        })) << query;
    }
    EXPECT_GT(found, 500);
    for (quint32 seed = 0; seed < 300; ++seed) {
        Chance chance(seed);
        const QString change = statements.text(chance, u"change"_s);
        for (const db::ConnectionPtr& engine : {connection, embedded})
            EXPECT_TRUE(attempt([&] { engine->execute(change); })) << change;
        const QString all = u"SELECT * FROM LINE ORDER BY id"_s;
        ASSERT_EQ(rowsOf(connection, all), rowsOf(embedded, all)) << change;
    }
}

INSTANTIATE_TEST_SUITE_P(Both, Agreement, ::testing::Values(On::MySql));
