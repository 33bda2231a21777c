// The check of a database: it tells what does not hold, changes nothing, and leaves nothing behind.
#include "platform/database/Session.h"
#include "setup/CheckDatabase.h"
#include "setup/HostTables.h"
#include "setup/PrepareDatabase.h"
#include "setup/QuoteDatabase.h"
#include "support/MariaDbServer.h"
#include "support/OdbcDrivers.h"
#include "support/Shop.h"

/// Returns the points with that result, and why they have it.
static std::string pointsThat(app::CheckedPoint::Result result, const app::DatabaseCheck& check)
{
    QStringList texts;
    for (const app::CheckedPoint& point : check.points)
        if (point.result == result)
            texts += point.what + u": "_s + point.why;
    return texts.join(u'\n').toStdString();
}

static std::string failures(const std::function<db::ConnectionPtr()>& connect = anotherConnection)
{
    return pointsThat(app::CheckedPoint::Result::Fails, app::checkDatabase(connect));
}

struct CheckedDatabase : Shop {
    static QStringList tables()
    {
        QStringList names = anotherConnection()->session().engine().tableNames();
        names.sort();
        return names;
    }
};

TEST_F(CheckedDatabase, PassesWithoutAChange)
{
    quote("500").line(1);
    const QStringList before = tables();
    const std::string held = holdings();
    const app::DatabaseCheck check = app::checkDatabase(anotherConnection);
    EXPECT_EQ(pointsThat(app::CheckedPoint::Result::Fails, check), "");
    EXPECT_EQ(check.facts.first().first, shopIsOnServer() ? u"driver"_s : u"server"_s);
    EXPECT_FALSE(check.facts.first().second.trimmed().isEmpty());
    if (app::serverOf(gConn) == app::Server::SqlServer) {
        EXPECT_EQ(pointsThat(app::CheckedPoint::Result::Skipped, check), "");
    }
    if (app::serverOf(gConn) == app::Server::MySql) {
        const auto overOdbc = [] {
            auto made = std::make_shared<db::Connection>();
            made->open(mariaDb().connectionText(gsDatabase, odbcMariaDb));
            return made;
        };
        EXPECT_EQ(failures(overOdbc), "");
    }
    EXPECT_EQ(tables(), before);
    EXPECT_EQ(holdings(), held);
}

TEST_F(CheckedDatabase, GetsOnlyThePartsThatItLacks)
{
    const db::ConnectionPtr database = anotherConnection();
    app::createParts(database, app::missingParts(database));  // a server's may lack them, as a host's
    const bool isEmbedded = app::serverOf(database) == app::Server::Embedded;
    database->execute(isEmbedded ? u"DROP INDEX QUOTE2_QTNNO"_s : u"DROP INDEX QUOTE2_QTNNO ON QUOTE2"_s);
    database->execute(isEmbedded ? u"DROP INDEX QUOTE1_QTNNO"_s : u"DROP INDEX QUOTE1_QTNNO ON QUOTE1"_s);
    database->execute(u"CREATE INDEX OTHER ON QUOTE1 (QTNNO, REGO)"_s);
    if (app::serverOf(database) == app::Server::SqlServer)
        for (const QString& useless :
             {u"CREATE INDEX FILTERED ON QUOTE2 (QTNNO, Subquote) WHERE QTNNO IS NOT NULL"_s,
              u"CREATE INDEX ASLEEP ON QUOTE2 (QTNNO, Subquote)"_s, u"ALTER INDEX ASLEEP ON QUOTE2 DISABLE"_s,
              u"CREATE SCHEMA other"_s, u"CREATE TABLE other.QUOTE2 (QTNNO INT, Subquote INT)"_s,
              u"CREATE INDEX ELSEWHERE ON other.QUOTE2 (QTNNO, Subquote)"_s})
            database->session().engine().run(useless);
    else if (isEmbedded)
        database->execute(u"CREATE INDEX FILTERED ON QUOTE2 (QTNNO, Subquote) WHERE QTNNO IS NOT NULL"_s);

    const QList<app::MissingPart> missing = app::missingParts(database);
    ASSERT_EQ(missing.size(), 1);
    EXPECT_EQ(missing[0].what, u"index of QUOTE2 by QTNNO"_s);
    app::createParts(database, missing);
    EXPECT_TRUE(app::missingParts(database).isEmpty());

    database->execute(u"DROP TABLE KESTJournal"_s);
    database->execute(isEmbedded ? u"DROP INDEX KESTOperation_File"_s
                                 : u"DROP INDEX KESTOperation_File ON KESTOperation"_s);
    const QList<app::MissingPart> journal = app::missingParts(database);
    ASSERT_EQ(journal.size(), 1);
    EXPECT_EQ(journal[0].statements.size(), 4) << "the table, its two indexes, and one of the other table";
    app::createParts(database, journal);

    database->execute(isEmbedded ? u"DROP INDEX OTHER"_s : u"DROP INDEX OTHER ON QUOTE1"_s);
    app::createParts(database, app::missingParts(database));
}

TEST_F(CheckedDatabase, IsReachedByAnotherDriverIfTheHostsIsNotRegistered)
{
    db::Connection other;
    const int nativeClient = 1;
    other.open(connectionText(nativeClient));
    EXPECT_TRUE(other.hasTable(u"QUOTE1"_s));
}

TEST_F(CheckedDatabase, OnlyTriggersThatCanRunAreNoted)
{
    const db::ConnectionPtr database = anotherConnection();
    const bool hasTriggers = app::serverOf(database) == app::Server::SqlServer;
    const QStringList statements{
        u"CREATE TRIGGER WORKS ON CAR AFTER UPDATE AS UPDATE CAR SET REGO='A' WHERE REGO='B'"_s,
        u"CREATE TRIGGER RESTS ON CAR AFTER UPDATE AS UPDATE CAR SET REGO='A' WHERE REGO='B'"_s,
        u"DISABLE TRIGGER RESTS ON CAR"_s, u"CREATE TABLE other.CAR (REGO INT)"_s,
        u"CREATE TRIGGER ELSEWHERE ON other.CAR AFTER UPDATE AS UPDATE CAR SET REGO='A' WHERE REGO='B'"_s};
    for (const QString& statement : hasTriggers ? statements : QStringList())
        database->session().engine().run(statement);
    EXPECT_EQ(app::lookAtHostTables(database).notes.filter(u"trigger"_s),
              hasTriggers ? QStringList(u"CAR has the trigger WORKS"_s) : QStringList());
}

TEST_F(CheckedDatabase, AFailureOnTheWayLeavesNoTable)
{
    const QStringList before = tables();
    constexpr int each = 31;
    int count = 0;
    db::setStatementFault([&] { return ++count % each == 0; });
    EXPECT_NE(failures(), "");
    db::setStatementFault({});
    EXPECT_GT(count, each);
    EXPECT_EQ(tables(), before);
}

TEST(IncompleteDatabase, EachMissingPartIsNamed)
{
    const TestProfile profile;
    const auto connect = [] { return app::openEmbedded(u"incomplete"_s); };
    const db::ConnectionPtr database = connect();
    app::createTables(*database, app::Server::Embedded);
    database->execute(u"DROP TABLE SUBLET"_s);
    database->execute(u"DROP TABLE KESTColours"_s);
    database->execute(u"CREATE TABLE KESTColours (Code VARCHAR(10), Script DATETIME)"_s);
    EXPECT_EQ(failures(connect),
              "the quote tables have every column that is used: there is no column KESTColours.id; KESTColours.Script "
              "holds another kind of value; there is no table SUBLET");
}
