// Tests connections and statements: which engine is used, how each compares values, and which errors occur.
#include "platform/Databases.h"

#include <QSqlDatabase>
#include <QSqlQuery>

using db::Kind;
using db::Recordset;

struct Database : Databases {
    void insert(const QString& columns, const QString& values) const
    {
        connection->execute(u"INSERT INTO LINE (%1) VALUES (%2)"_s.arg(columns, values));
    }
};

TEST_P(Database, AComparisonMeansTheSameOnEveryEngine)
{
    insert(u"CODE, SEQ, flag, amount"_s, u"'Red', 0, 1, 2.5"_s);
    insert(u"CODE, SEQ, flag, amount"_s, u"'red  ', 5, 0, 0"_s);
    insert(u"CODE, SEQ, day"_s, u"'50% [off]', NULL, "_s + stored(u"2026-02-28"_s, u"00:00:00"_s));
    insert(u"CODE, SEQ"_s, u"'ÖL', 10"_s);
    insert(u"CODE, SEQ"_s, u"'', 7"_s);
    for (int time = 0; time < 2; ++time)  // a statement of a known wording is not translated again
        for (const QStringList& row : rowsIn("comparisons.txt"))
            for (const QString& condition : row.mid(1))
                EXPECT_EQ(count(condition), row[0].toInt()) << condition;
}

TEST_P(Database, StatementsInTheDialectOfTheHostAreUnderstood)
{
    insert(u"CODE, SEQ"_s, u"'A+B', 1"_s);
    insert(u"CODE, SEQ"_s, u"NULL, 2"_s);
    insert(u"CODE, SEQ"_s, u"'c', 3"_s);
    for (const auto& [code, kind] : {std::pair(u"none"_s, Kind::Text), {u"c"_s, Kind::WholeNumber}})
        EXPECT_EQ(query(u"SELECT MAX(SEQ + 1) AS n FROM LINE WHERE CODE='%1'"_s.arg(code)).kind(u"n"_s), kind)
            << "the kind of each result, though the wording is the same";
    for (const auto& [statement, outcome] : casesIn<2>("dialect.txt"))
        EXPECT_EQ(statement.startsWith(u"SELECT"_s, Qt::CaseInsensitive)
                      ? rowsOf(connection, statement).join(u", "_s)
                      : QString::number(connection->execute(statement)),
                  outcome)
            << statement;
}

TEST_P(Database, NoValueEndsItsLiteral)
{
    const QString hostile[] = {
        u"O'Brien"_s, u"\\"_s,         u"\\' OR 1=1 -- "_s, u"'; DROP TABLE LINE; --"_s, u"{}"_s, u"a;b"_s,
        u"\"`[x]"_s,  u"? :name %1"_s, u"€\u2019"_s,        u"line\r\nbreak\ttab"_s};
    for (const QString& text : hostile) {
        const QString code = text.left(20);
        connection->execute(u"DELETE FROM LINE"_s);
        connection->execute(sql("INSERT INTO LINE (CODE, notes) VALUES ('{}', '{}')", code, text));
        Recordset rows = query(sql("SELECT * FROM LINE WHERE CODE='{}'", code));
        ASSERT_EQ(rows.recordCount(), 1) << text;
        EXPECT_EQ(rows.text(u"notes"_s), text);
        rows.find(sql("CODE='{}'", code));
        EXPECT_FALSE(rows.eof()) << text;
        for (const QString& written : {u"x"_s, code}) {
            rows.set(u"CODE"_s, written);
            rows.set(u"notes"_s, text + written);
            rows.update();
        }
        rows.requery();
        ASSERT_EQ(rows.recordCount(), 1) << text;
        EXPECT_EQ(rows.text(u"notes"_s), text + code);
    }
    insert(u"SEQ"_s, u"1"_s);
    for (const QString& two : {u"DELETE FROM LINE; DELETE FROM CAR"_s, u"SELECT 1;DELETE FROM LINE"_s})
        EXPECT_EQ(failureOf([&] { connection->execute(two); }), StatementFailed);
    EXPECT_EQ(failureOf([&] { query(u"SELECT * FROM LINE; DELETE FROM LINE"_s); }), StatementFailed);
    EXPECT_EQ(count(u"SEQ=1"_s), 1);
}

TEST_P(Database, AFailureKeepsTheCodesOfTheDatabase)
{
    const RuntimeError noTable = failure([&] { query(u"SELECT * FROM NOSUCH"_s); });
    EXPECT_EQ(noTable.number(), StatementFailed);
    EXPECT_FALSE(noTable.nativeCode().isEmpty());
    EXPECT_TRUE(noTable.sqlState().startsWith(u"42"_s)) << noTable.sqlState();
    EXPECT_TRUE(noTable.description().contains(u"NOSUCH"_s, Qt::CaseInsensitive)) << noTable.what();

    Recordset cars = query(u"SELECT * FROM CAR"_s);
    EXPECT_EQ(added(cars, u"REGO"_s, u"ABC1"_s), 0);
    EXPECT_EQ(added(cars, u"REGO"_s, u"abc1 "_s), StatementFailed);
    cars.cancelUpdate();
    for (const auto& [rego, state] : {std::pair(u"abc1"_s, u"23000"_s), {u"XYZ789"_s, QString()}})
        EXPECT_EQ(failure([&] { connection->execute(sql("INSERT INTO CAR (REGO) VALUES ('{}')", rego)); }).sqlState(),
                  state);
    EXPECT_EQ(connection->state(), 1);
}

TEST_P(Database, ANamedLockKeepsEverybodyElseOut)
{
    const QString name = u"1006.XML of "_s + QString(300, u'é');
    const db::ConnectionPtr other = connect();
    std::optional<db::Lock> held(std::in_place, connection, name);
    EXPECT_TRUE(held->isHeld());
    EXPECT_FALSE(db::Lock(connection, name).isHeld()) << "a second time";
    EXPECT_FALSE(db::Lock(other, name).isHeld());
    EXPECT_TRUE(db::Lock(other, name + u'2').isHeld());
    held.reset();
    EXPECT_TRUE(db::Lock(other, name).isHeld());
    const db::Lock lost(other, name);
    other->close();
    EXPECT_TRUE(db::Lock(connection, name, 5).isHeld()) << "the lock of a connection that is gone";
}

TEST_P(Database, AConnectionThatHasGoneIsNoticed)
{
    const auto drop = [&] {
        const QString own = GetParam() == On::Tds ? u"@@SPID"_s : u"CONNECTION_ID()"_s;
        const QString id = query(u"SELECT %1 AS id"_s.arg(own)).text(u"id"_s);
        connect()->execute(u"KILL "_s + id);
    };
    Recordset lines = query(u"SELECT * FROM LINE"_s);
    EXPECT_TRUE(connection->answers());
    if (GetParam() == On::Embedded) {
        db::setStatementFault([] { return true; }, CannotOpen);
    } else {
        drop();
    }
    EXPECT_EQ(failureOf([&] { query(u"SELECT * FROM LINE"_s); }), CannotOpen);
    EXPECT_EQ(connection->state(), 0);
    db::setStatementFault({});
    EXPECT_EQ(failureOf([&] { connection->execute(u"DELETE FROM LINE"_s); }), CannotOpen);
    connection->open(connectionText);
    EXPECT_EQ(connection->state(), 1);
    EXPECT_EQ(count(u"1=1"_s), 0);
    lines.requery();
    if (GetParam() != On::Embedded) {
        drop();
        EXPECT_FALSE(connection->answers()) << "before any statement has failed";
    }
    EXPECT_EQ(failureOf([&] { Recordset(nullptr).open(u"SELECT 1"_s); }), NoObject);
}

TEST_P(Database, AServerThatFallsSilentIsToldWithinSeconds)
{
    if (GetParam() == On::Embedded)
        return;
    const TestServer& server = GetParam() == On::Tds ? static_cast<const TestServer&>(tdsServer()) : mariaDb();
    connection->setCommandTimeout(30);
    const auto open = [&] { connection->open(connectionText); };
    {
        const auto silence = server.silence();
        const QDeadlineTimer noticed(8000);
        EXPECT_FALSE(connection->answers() || noticed.hasExpired());
        const QDeadlineTimer told(5000);
        EXPECT_EQ(failureOf(open), CannotOpen);
        EXPECT_FALSE(told.hasExpired());
    }
    open();
    EXPECT_TRUE(connection->answers());
}

TEST_P(Database, ReadsWhatAnotherToolHasWritten)
{
    if (GetParam() != On::Embedded)  // where each value has the type of its column
        return;
    {
        QSqlDatabase tool = QSqlDatabase::addDatabase(u"QSQLITE"_s, u"tool"_s);
        tool.setDatabaseName(profile.root() + u"/databases/shop.db"_s);
        ASSERT_TRUE(tool.open());
        EXPECT_TRUE(QSqlQuery(tool).exec(
            u"INSERT INTO LINE (CODE, SEQ, amount, flag, day) VALUES (5, 'x', '1,5', -1, '2026-02-28'), "
            "(NULL, 1.5, 3, 'True', '2026-02-28T10:00:00')"_s));
    }
    QSqlDatabase::removeDatabase(u"tool"_s);
    Recordset lines = query(u"SELECT * FROM LINE"_s);
    EXPECT_EQ(lines.value(u"CODE"_s), QVariant(u"5"_s));
    EXPECT_EQ(lines.text(u"SEQ"_s), u"x"_s);
    EXPECT_EQ(lines.value(u"flag"_s), QVariant(true));
    EXPECT_EQ(lines.value(u"day"_s), QVariant(columnDate(QDate(2026, 2, 28), QTime(0, 0))));
    for (const QString& column : {u"flag"_s, u"day"_s, u"SEQ"_s}) {
        EXPECT_EQ(written(lines, column, {}), 0) << "finds the row by the value in the file";
        EXPECT_TRUE(lines.isNull(column));
    }
    lines.moveNext();
    EXPECT_EQ(lines.value(u"SEQ"_s), QVariant(1.5));
    EXPECT_EQ(lines.value(u"flag"_s), QVariant(true));
    EXPECT_EQ(written(lines, u"day"_s, u"1/3/2026"_s), 0);
    EXPECT_EQ(query(u"SELECT day + '' AS stored FROM LINE WHERE day IS NOT NULL"_s).text(u"stored"_s),
              u"2026-03-01 00:00:00"_s);
}

INSTANTIATE_TEST_SUITE_P(Engines, Database, ::testing::Values(On::Embedded, On::MySql, On::Odbc, On::Tds));

TEST(EmbeddedLock, BelongsToAllWhoMayWriteTheDatabase)
{
    const TestProfile profile;
    const auto connection = std::make_shared<db::Connection>();
    connection->open(createDatabase(On::Embedded));
    const QString file = profile.root() + u"/databases/shop.db"_s;
    const QString locks = file + u"-locks"_s;
    QFile::setPermissions(file, QFile::ReadOwner | QFile::WriteOwner | QFile::ReadGroup | QFile::WriteGroup);
    EXPECT_TRUE(db::Lock(connection, u"x"_s).isHeld());
    EXPECT_EQ(QFile::permissions(locks), QFile::permissions(file));
    EXPECT_TRUE(QFile::remove(locks) && QDir().mkdir(locks));
    EXPECT_EQ(failureOf([&] { db::Lock(connection, u"x"_s); }), PermissionDenied) << "nobody has what can't be locked";
}

TEST(connectionText, ChoosesTheEngine)
{
    const TestProfile profile;
    QDir().mkpath(profile.root() + u"/databases"_s);
    for (const QString& name : {u"Shop.db"_s, u"BRANCH.Shop.db"_s})
        QFile(profile.root() + u"/databases/"_s + name).open(QIODevice::WriteOnly);
    files::write(profile.root() + u"/databases/junk.db"_s, QString(5000, u'x'));
    mariaDb().createDatabase(u"shop"_s);
    tdsServer().createDatabase(u"shop"_s);
    for (auto [text, outcome] : casesIn<2>("connection-texts.txt")) {
        text.replace(u"THISHOST"_s, QSysInfo::machineHostName());
        text.replace(u"MARIADB"_s, QString::number(mariaDb().port()));
        text.replace(u"TDSHOST"_s, tdsServer().address());
        const bool opens = outcome == u"opens"_s;
        db::Connection connection;
        const RuntimeError thrown = failure([&] { connection.open(text); });
        EXPECT_EQ(thrown.number(), opens ? 0 : CannotOpen) << text;
        EXPECT_TRUE(opens || outcome == u"fails"_s || thrown.nativeCode() == outcome) << text << thrown.nativeCode();
        EXPECT_EQ(connection.state(), opens ? 1 : 0) << text;
    }
    EXPECT_FALSE(QFile::exists(profile.root() + u"/databases/NoShop.db"_s)) << "a missing database is not made";
}

TEST(PastedStatement, FillsPlacesByWhereTheyStand)
{
    for (const auto& [statement, value, expected] : casesIn<3>("statements.txt"))
        EXPECT_EQ(outcomeOf([&] { return sql(statement.toUtf8().constData(), value); }), expected);
    EXPECT_EQ(sql("A={} AND B={} AND C='{}'", 2.5, true, 5), u"A=2.5 AND B=1 AND C='5'"_s);
    EXPECT_EQ(sql("A={} AND B='{}'", QVariant(), QVariant()), u"A=NULL AND B=''"_s);
    EXPECT_EQ(sql("A='{}' AND B={} AND C='{}'", u"{}'"_s, 1, u"c"_s), u"A='{}''' AND B=1 AND C='c'"_s);
}
