// Runs made-up queries on the embedded engine and on MariaDB, which must find the same rows.
#include "platform/Databases.h"
#include "support/Chance.h"

static QString rowsOf(const db::ConnectionPtr& connection, const QString& select)
{
    QStringList rows;
    attempt([&] {
        db::Recordset found(connection);
        found.open(select);
        for (; !found.eof(); found.moveNext()) {
            QStringList values;
            for (const QString& column : found.columns())
                values += column + u'=' + (found.isNull(column) ? u"Null"_s : toText(found.value(column)));
            rows += values.join(u' ');
        }
        rows += u"end"_s;
    });
    return rows.join(u'\n');  // without "end" if the engine has refused the query
}

class Agreement : public Databases {};

TEST_P(Agreement, AQueryFindsTheSameRowsOnBothEngines)
{
    const auto embedded = std::make_shared<db::Connection>();
    embedded->open(createDatabase(On::Embedded));
    for (const char* values :
         {"'Red', 0, 1, 2.5, NULL, NULL", "'red  ', 5, 0, 0, NULL, 'x'",
          "'50% [off]', NULL, 0, -1, '2026-02-28 00:00:00', NULL", "'\xc3\x96L', 10, 1, 10, '2026-02-28 13:30:00', ''",
          "'', 7, 0, 2.25, '2026-03-01 00:00:00', 'Red'", "NULL, -1, 1, NULL, NULL, NULL",
          "'O''Hara', 5, 0, 5, NULL, NULL", "'a+b', 2, 0, 1e10, NULL, NULL",
          "'top 1', 1, 1, 0.1, '1900-01-01 00:00:00', NULL", "'back\\slash_', 99, 0, 7, NULL, NULL"})
        for (const db::ConnectionPtr& engine : {connection, embedded})
            engine->execute(
                u"INSERT INTO LINE (CODE, SEQ, flag, amount, day, notes) VALUES (%1)"_s.arg(QString::fromUtf8(values)));
    const Grammar queries("queries.txt");
    int found = 0;
    for (quint32 seed = 0; seed < 1500; ++seed) {
        Chance chance(seed);
        const QString query = queries.text(chance, u"query"_s);
        const QString rows = rowsOf(embedded, query);
        EXPECT_EQ(rowsOf(connection, query), rows) << query;
        EXPECT_TRUE(rows.endsWith(u"end"_s)) << query;
        found += rows.size() > 3;
    }
    EXPECT_GT(found, 500);
}

INSTANTIATE_TEST_SUITE_P(Both, Agreement, ::testing::Values(On::MySql));
