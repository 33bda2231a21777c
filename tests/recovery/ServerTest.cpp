// What only a server has: sessions that outlive their process, rights, and tables without transactions.
#include "base/History.h"
#include "base/Journal.h"
#include "base/modLoggerEx.h"
#include "platform/files/Lock.h"
#include "recovery/Recovery.h"
#include "setup/HostTables.h"
#include "support/MariaDbServer.h"
#include "support/Shop.h"

namespace {

struct RecoveryOnAServer : Shop {
    RecoveryOnAServer()
    {
        const bool isSqlServer = app::serverOf(gConn) == app::Server::SqlServer;
        administrator->open(isSqlServer ? connectionText(driverNumber()) : mariaDb().connectionText(gsDatabase));
    }

    /// Loads a message on a new connection, which finds the tables and rights as they are now.
    void loadAnew()
    {
        dropConnection();
        ASSERT_TRUE(EnsureConnection());
        quote("500").request("QR1").stage(1);
        arrive("m.xml", cancellation("QR1"));
        EXPECT_TRUE(loadAsTheWindow(u"m.xml"_s)) << shown();
        EXPECT_EQ(quote("500").stage(), 9);
    }

    static int timesLogged(const QString& text)
    {
        return files::exists(errorLogPath()) ? int(files::read(errorLogPath()).count(text)) : 0;
    }

    const db::ConnectionPtr administrator = std::make_shared<db::Connection>();
};

}  // namespace

TEST_F(RecoveryOnAServer, EndsTheSessionOfItsOwnDeadProcess)
{
    quote("500").claim("C0");
    {
        journal::Operation operation(journal::Kind::Save);
        gConn->execute(u"UPDATE QUOTE1 SET Claim='C9' WHERE QTNNO='500'"_s);
        operation.end(journal::State::Done);
    }
    const db::ConnectionPtr dead = anotherConnection();
    const QString lock = journal::historyOf(u"500"_s, {}).front().lock;
    const db::Lock held(dead, lock);
    administrator->execute(sql("UPDATE KESTOperation SET State='open', ServerSession='{}'", dead->serverSession()));

    {
        const files::Lock alive(profile::root() + u"/operations.lock"_s, lock);
        recovery::settle();
        EXPECT_TRUE(dead->answers()) << "the process lives";
    }
    administrator->execute(u"UPDATE KESTOperation SET ServerSession='1'"_s);
    recovery::settle();
    EXPECT_TRUE(dead->answers()) << "the number has gone to another session, which does not have the lock";

    administrator->execute(sql("UPDATE KESTOperation SET ServerSession='{}'", dead->serverSession()));
    recovery::settle();
    EXPECT_FALSE(dead->answers());
    EXPECT_EQ(quote("500").text("Claim"), "C0");

    administrator->execute(u"UPDATE KESTOperation SET State='open'"_s);
    journal::Entry entry = journal::pendingOperations().front();
    const journal::Operation resumed(entry, 5);
    EXPECT_EQ(journal::pendingOperations().front().serverSession, gConn->serverSession())
        << "another session may get the number of the dead one";
}

TEST_F(RecoveryOnAServer, TablesWithoutTransactionsKeepNoJournal)
{
    administrator->execute(u"ALTER TABLE QUOTE3 ENGINE=MyISAM"_s);
    loadAnew();
    administrator->execute(u"ALTER TABLE QUOTE3 ENGINE=InnoDB"_s);
    EXPECT_FALSE(journal::isKept());
    EXPECT_EQ(rowCount("KESTOperation"), 0);
    EXPECT_EQ(timesLogged(u"The table QUOTE3 has no transactions"_s), 1);
}

TEST_F(RecoveryOnAServer, AJournalThatMayNotBeWrittenStopsNoLoad)
{
    const std::pair<QString, QString> cases[] = {{u"KESTOperation"_s, u"SELECT"_s},
                                                 {u"KESTJournal"_s, u"SELECT"_s},
                                                 {u"KESTOperation"_s, u"SELECT, INSERT"_s},
                                                 {u"KESTJournal"_s, u"SELECT, INSERT, UPDATE"_s}};
    for (const auto& [forbidden, rights] : cases) {
        administrator->execute(u"REVOKE ALL ON *.* FROM 'sa'@'127.0.0.1'"_s);
        db::Recordset names(administrator);
        names.open(u"SELECT TABLE_NAME FROM INFORMATION_SCHEMA.TABLES WHERE TABLE_SCHEMA=DATABASE()"_s);
        for (; !names.eof(); names.moveNext()) {
            const QString table = names.text(u"TABLE_NAME"_s);
            administrator->execute(u"GRANT %1 ON %2 TO 'sa'@'127.0.0.1'"_s.arg(
                table.compare(forbidden, Qt::CaseInsensitive) == 0 ? rights : u"ALL"_s, table));
        }
        administrator->execute(u"GRANT SELECT ON *.* TO 'sa'@'127.0.0.1'"_s);
        loadAnew();
        EXPECT_EQ(rowCount("KESTOperation") + rowCount("KESTJournal"), 0) << forbidden << rights;
        administrator->execute(u"REVOKE ALL PRIVILEGES, GRANT OPTION FROM 'sa'@'127.0.0.1'"_s);
        administrator->execute(u"GRANT ALL ON *.* TO 'sa'@'127.0.0.1'"_s);
        dropConnection();
        EXPECT_TRUE(EnsureConnection());
    }
    EXPECT_EQ(timesLogged(u"denied"_s), 3) << "each reason once";
}
