// Runs made-up statements, and those of the component, on the embedded engine and on MariaDB, which must find and store
// the same.
#include "platform/Databases.h"
#include "setup/QuoteDatabase.h"
#include "support/Chance.h"

namespace {

/// Returns the rows, or those before a failure.
QStringList rowsOf(const db::ConnectionPtr& connection, const QString& select)
{
    QStringList rows;
    attempt([&] {
        db::Recordset found(connection);
        found.open(select);
        for (; !found.eof(); found.moveNext()) {
            QStringList values;
            for (const QString& column : found.columns())
                values += column.toUpper() + u'=' + (found.isNull(column) ? u"Null"_s : toText(found.value(column)));
            rows += values.join(u' ');
        }
        rows += u"end"_s;
    });
    return rows;  // without "end" if the engine has refused the query
}

/// Returns the statements in the sources that work on the quote database.
QStringList statementsOfComponent()
{
    static const QRegularExpression comment(u"^\\s*//.*$"_s, QRegularExpression::MultilineOption);
    static const QRegularExpression join(u"(?<=[^\\\\])\"(_s|_L1)?\\s*\\n\\s*u?\""_s);
    static const QRegularExpression literal(u"\"((SELECT|UPDATE|DELETE FROM|INSERT INTO) [^\"]+)\""_s,
                                            QRegularExpression::CaseInsensitiveOption);
    static const QRegularExpression ofOthers(
        u"newJob|KESTJournal|last_insert_id|INFORMATION_SCHEMA|sys\\.|sqlite_|%1|\\($"_s);
    QStringList all;
    QDirIterator walk(checkoutFile(u"src"_s), {u"*.cpp"_s}, QDir::Files, QDirIterator::Subdirectories);
    while (walk.hasNext()) {
        QString code = files::read(walk.next());
        if (walk.filePath().contains(QRegularExpression(u"/src/(platform|app|day|loopback|setup)/"_s)))
            continue;
        code.remove(comment).remove(join);
        for (const QRegularExpressionMatch& match : literal.globalMatch(code))
            if (!match.captured(1).contains(ofOthers))
                all += match.captured(1);
    }
    return all;
}

/// Puts values into a statement, most of which are in the column that they are compared with.
QString withValues(QString statement, const db::ConnectionPtr& shop, Chance& chance)
{
    static const QRegularExpression place(u"(?:(\\w+) ?(?:=|<>|<=?|LIKE) ?)?('%?)?\\{\\}"_s);
    static const QRegularExpression table(u"(?:FROM|UPDATE|INTO) (\\w+)"_s, QRegularExpression::CaseInsensitiveOption);
    for (auto match = place.match(statement); match.hasMatch(); match = place.match(statement)) {
        const bool isText = match.capturedLength(2) > 0;
        QString value = isText ? u"2026-02-28"_s : u"1"_s;
        attempt([&] {
            db::Recordset rows(shop);
            rows.open(
                u"SELECT %1 FROM %2 WHERE %1 IS NOT NULL"_s.arg(match.captured(1), table.match(statement).captured(1)));
            if (rows.recordCount() > 0 && (!isText || !chance.once(4))) {
                rows.setAbsolutePosition(chance.number(1, rows.recordCount()));
                value = toText(rows.value(rows.columns().constFirst()));
            }
        });
        if (isText && chance.once(3))
            value = value.toUpper() + u' ';
        statement.replace(match.capturedEnd() - 2, 2, value.replace(u'\'', u"''"_s));
    }
    return statement;
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
    const Grammar statements("queries.txt");
    int found = 0;
    for (quint32 seed = 0; seed < 1500; ++seed) {
        Chance chance(seed);
        const QString query = statements.text(chance, u"query"_s);
        const QStringList rows = rowsOf(embedded, query);
        EXPECT_EQ(rowsOf(connection, query), rows) << query;
        EXPECT_EQ(rows.last(), u"end"_s) << query;
        found += rows.size() > 1;
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

TEST_P(Agreement, TheComponentsStatementsMeanTheSameOnBothEngines)
{
    const db::ConnectionPtr embedded = app::openEmbedded(u"quotes"_s);
    app::createTables(*embedded, app::Server::Embedded);
    mariaDb().createDatabase(u"quotes"_s, {});
    connection = std::make_shared<db::Connection>();
    connection->open(mariaDb().connectionText(u"quotes"_s));
    app::createTables(*connection, app::Server::MySql);
    for (const db::ConnectionPtr& engine : {connection, embedded}) {
        app::fillNewShop(*engine);
        app::fillDemoShop(*engine, QDate(2026, 2, 28));
    }
    Chance chance(1);
    int found = 0;
    for (const QString& statement : statementsOfComponent() + statementsOfComponent()) {
        const QString filled = withValues(statement, embedded, chance);
        QString select = filled;
        if (!filled.startsWith(u"SELECT"_s, Qt::CaseInsensitive)) {
            const auto isDone = [&](db::Connection& engine) { return attempt([&] { engine.execute(filled); }); };
            EXPECT_EQ(isDone(*connection), isDone(*embedded)) << filled;
            select =
                u"SELECT * FROM "_s + filled.section(u' ', filled.startsWith(u"UPDATE"_s) ? 1 : 2).section(u' ', 0, 0);
        }
        QStringList rows = rowsOf(embedded, select);
        QStringList others = rowsOf(connection, select);
        if (!select.contains(u"ORDER BY"_s, Qt::CaseInsensitive)) {
            rows.sort();
            others.sort();
        }
        EXPECT_EQ(others, rows) << filled;
        EXPECT_TRUE(rows.contains(u"end"_s)) << filled;
        found += rows.size() > 1;
    }
    EXPECT_GT(found, 80);
}

INSTANTIATE_TEST_SUITE_P(Both, Agreement, ::testing::Values(On::MySql));
