// Runs made-up queries on the embedded engine and on MariaDB, which must find the same rows.
#include "platform/Databases.h"
#include "support/Chance.h"

namespace {

/// Writes queries of the table LINE in the dialect of SQL Server.
class QueryWriter {
public:
    explicit QueryWriter(quint32 seed) : chance(seed) {}

    QString query()
    {
        const QString top = chance.once(3) ? u"TOP %1 "_s.arg(chance.number(1, 4)) : QString();
        const QString what = chance.one({u"*"_s, u"id, CODE + ' + ' + CODE AS joined"_s, u"id, [SEQ], flag"_s,
                                         u"id, CODE + 'top 1' AS t, SEQ + 1 AS n"_s});
        return u"SELECT %1%2 FROM LINE WHERE %3 ORDER BY id%4"_s.arg(top, what, condition(0),
                                                                     chance.one({QString(), u" DESC"_s}));
    }

private:
    QString condition(int depth)
    {
        if (depth == 3 || chance.once(2))
            return chance.once(5) ? u"NOT ("_s + comparison() + u')' : comparison();
        return u"(%1 %2 %3)"_s.arg(condition(depth + 1), chance.one({u"AND"_s, u"OR"_s}), condition(depth + 1));
    }
    QString comparison()
    {
        switch (chance.number(0, 6)) {
            case 0:
                return u"CODE "_s + equality() + u" '"_s + word() + u'\'';
            case 1:
                return u"CODE %1LIKE '%2'"_s.arg(chance.one({QString(), u"NOT "_s}), pattern());
            case 2:
                return chance.one({u"SEQ"_s, u"amount"_s, u"LINE.SEQ"_s}) + order() + number();
            case 3:
                return u"flag"_s + equality() + chance.one({u"0"_s, u"1"_s, u"'1'"_s, u"TRUE"_s, u"'False'"_s});
            case 4:
                return chance.one({u"CODE"_s, u"SEQ"_s, u"day"_s, u"notes"_s}) +
                       chance.one({u" IS NULL"_s, u" IS NOT NULL"_s});
            case 5:
                return u"SEQ IN (%1, %2)"_s.arg(number(), number());
            default:
                return chance.one({u"SEQ IN (SELECT SEQ FROM LINE WHERE CODE='red')"_s, u"day='28/02/2026'"_s,
                                   u"day<>'2026-02-28'"_s, u"CODE IN ('RED', 'top 1 ', '')"_s,
                                   u"day>'2026-02-28 00:00:00'"_s});
        }
    }
    QString equality() { return chance.one({u"="_s, u"<>"_s}); }
    QString order() { return chance.one({u"="_s, u"<>"_s, u"<"_s, u">"_s, u"<="_s, u">="_s}); }
    QString number()
    {
        return chance.one({u"0"_s, u"5"_s, u"-1"_s, u"2.5"_s, u"'5'"_s, u"''"_s, u"'abc'"_s, u"'5.0 '"_s, u"'-1'"_s,
                           u"'0x5'"_s, u"'1e1'"_s, u"' 7'"_s});
    }
    QString word()
    {
        return chance.one({u"Red"_s, u"RED  "_s, u""_s, u" "_s, u"O''Hara"_s, u"%"_s, u"[off]"_s, u"a+b"_s, u"top 1"_s,
                           u"\u00f6l"_s, u"\\"_s, u"--"_s, u"a;b"_s, u"{}"_s, u"?"_s});
    }
    QString pattern()
    {
        QString all;
        for (int piece = chance.number(1, 4); piece > 0; --piece)
            all += chance.one({u"%"_s, u"_"_s, u"r"_s, u"E"_s, u"d"_s, u"[p-s]"_s, u"[^a]"_s, u"[[]"_s, u" "_s,
                               u"\u00d6"_s, u"50%"_s, u"''"_s, u"\\"_s, u"[%]"_s, u"[_]"_s, u"!"_s});
        return all;
    }

    Chance chance;
};

QString rowsOf(const db::ConnectionPtr& connection, const QString& select)
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

}  // namespace

class Agreement : public Databases {};

TEST_P(Agreement, AQueryFindsTheSameRowsOnBothEngines)
{
    const QString embeddedText = createDatabase(On::Embedded);
    const auto embedded = std::make_shared<db::Connection>();
    embedded->open(embeddedText);
    for (const char* values :
         {"'Red', 0, 1, 2.5, NULL, NULL", "'red  ', 5, 0, 0, NULL, 'x'",
          "'50% [off]', NULL, 0, -1, '2026-02-28 00:00:00', NULL", "'\xc3\x96L', 10, 1, 10, '2026-02-28 13:30:00', ''",
          "'', 7, 0, 2.25, '2026-03-01 00:00:00', 'Red'", "NULL, -1, 1, NULL, NULL, NULL",
          "'O''Hara', 5, 0, 5, NULL, NULL", "'a+b', 2, 0, 1e10, NULL, NULL",
          "'top 1', 1, 1, 0.1, '1900-01-01 00:00:00', NULL", "'back\\slash_', 99, 0, 7, NULL, NULL"})
        for (const db::ConnectionPtr& engine : {connection, embedded})
            engine->execute(
                u"INSERT INTO LINE (CODE, SEQ, flag, amount, day, notes) VALUES (%1)"_s.arg(QString::fromUtf8(values)));
    int found = 0;
    for (quint32 seed = 0; seed < 1500; ++seed) {
        const QString query = QueryWriter(seed).query();
        const QString rows = rowsOf(embedded, query);
        EXPECT_EQ(rowsOf(connection, query), rows) << query;
        EXPECT_TRUE(rows.endsWith(u"end"_s)) << query;
        found += rows.size() > 3;
    }
    EXPECT_GT(found, 500);
}

INSTANTIATE_TEST_SUITE_P(Both, Agreement, ::testing::Values(On::MySql));
