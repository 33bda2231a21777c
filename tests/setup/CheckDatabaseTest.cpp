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
    /// Changes the database by the statements of a step for its kind of server. Returns a connection that has read none
    /// of it yet.
    static db::ConnectionPtr changed(const QString& step)
    {
        static const QString servers[] = {u"embedded"_s, u"mysql"_s, u"sqlserver"_s};
        const db::ConnectionPtr database = anotherConnection();
        for (const auto& [of, on, statement] : casesIn<3>("host-changes.txt"))
            if (of == step && on.split(u' ').contains(servers[int(app::serverOf(database))]))
                database->session().engine().run(statement);
        return anotherConnection();
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
    db::ConnectionPtr database = anotherConnection();
    app::createParts(database, app::missingParts(database));  // a server's may lack them, as a host's
    database = changed(u"indexes"_s);
    const QList<app::MissingPart> missing = app::missingParts(database);
    ASSERT_EQ(missing.size(), 1);
    EXPECT_EQ(missing[0].what, u"index of QUOTE2 by QTNNO"_s);
    app::createParts(database, missing);
    EXPECT_TRUE(app::missingParts(database).isEmpty());

    database = changed(u"journal"_s);
    const QList<app::MissingPart> journal = app::missingParts(database);
    ASSERT_EQ(journal.size(), 1);
    EXPECT_EQ(journal[0].statements.size(), 4) << "the table, its two indexes, and one of the other table";
    app::createParts(database, journal);
    database = changed(u"end"_s);
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
    EXPECT_EQ(app::lookAtHostTables(changed(u"triggers"_s)).notes.filter(u"trigger"_s).join(u'\n'),
              app::serverOf(gConn) == app::Server::SqlServer ? u"CAR has the trigger WORKS"_s : QString());
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
