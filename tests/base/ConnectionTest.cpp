// Tests which database the settings name, and what happens if it does not answer.
#include "base/Journal.h"
#include "base/modLoggerEx.h"
#include "support/MariaDbServer.h"
#include "support/OdbcDrivers.h"
#include "support/Shop.h"
#include "support/TdsServer.h"

#include <QTcpServer>

TEST(connectionText, NamesTheServerAsItsDriverExpects)
{
    gsDatabase = u"WirSql"_s;
    gsSAPwd = u"secret"_s;
    for (const auto& [driver, server, instance, text] : casesIn<4>("connection-servers.txt")) {
        gsServer = server;
        gsInstance = instance;
        const QString login = text.isEmpty() ? QString() : u"Database=WirSql;Uid=sa;Pwd=secret;"_s;
        EXPECT_EQ(connectionText(driver.toInt()), text + login);
    }
}

struct ShopConnection : Shop {
    static void openWith(const QString& key, const QString& value)
    {
        setSetting(key, value);
        OpenDatabase();
    }
};

TEST_F(ShopConnection, ATabletWorksOnTheMasterOrOnItsOwn)
{
    setSetting(u"DatabaseName"_s, u"Own"_s);
    setSetting(u"TabletMasterDatabaseName"_s, u"Master"_s);
    for (const auto& [useMaster, database, local] :
         {std::tuple(u"1"_s, u"Master"_s, false), {u"0"_s, u"Own"_s, true}, {u"yes"_s, u"Own"_s, false}}) {
        openWith(u"TabletUseMaster"_s, useMaster);
        EXPECT_EQ(gsDatabase, database) << useMaster;
        EXPECT_EQ(gbTabletLocal, local) << useMaster;
    }
    gbTabletLocal = false;
}

TEST_F(ShopConnection, AnUnknownDriverNumberOnAnOldSystemOpensNothing)
{
    setSetting(u"ClientConnectionType"_s, u"7"_s);
    setSetting(u"CurrentVersion"_s, u"5.1"_s, u"Microsoft\\Windows NT\\CurrentVersion"_s);
    OpenDatabase();
    EXPECT_EQ(GetConnection(), nullptr);
    setSetting(u"CurrentVersion"_s, u"6.1"_s, u"Microsoft\\Windows NT\\CurrentVersion"_s);
    EXPECT_NE(GetConnection(), nullptr);
}

TEST_F(ShopConnection, WhyItFailedIsTold)
{
    setSetting(u"DatabaseName"_s, u"Nowhere"_s);
    gcnDB->close();
    EXPECT_FALSE(hasConnection());
    EXPECT_FALSE(EnsureConnection());
    const QString reason = connectionFailure();
    EXPECT_TRUE(reason.contains(u"Nowhere.db"_s)) << reason;
    EXPECT_EQ(
        desktop->boxTexts(),
        QStringList{u"Could not connect to the quote database, Please contact MarlinDesk Support.\r\n\r\n"_s + reason});
    EXPECT_EQ(failure([] { opened(u"SELECT * FROM CINFO"_s); }).description(), reason);
    EXPECT_EQ(files::read(errorLogPath()).count(u"Description: "_s + reason), 1);
    EXPECT_FALSE(OpenRecordset(u"SELECT * FROM CINFO"_s, false, true));
    EXPECT_TRUE(desktop->boxTexts().last().startsWith(u"-2147467259: Could not Initialize Database! - "_s));

    setSetting(u"DatabaseName"_s, u"WirSql"_s);
    EXPECT_TRUE(EnsureConnection());
    EXPECT_EQ(connectionFailure(), QString());
    files::write(root() + u"/registry.ini"_s, u"\n"_s);
    gcnDB->close();
    EXPECT_FALSE(EnsureConnection()) << "not to the database of the defaults";
    EXPECT_TRUE(connectionFailure().contains(u"damaged"_s));
}

TEST_F(ShopConnection, ADatabaseThatDoesNotSayWhetherItHasAJournalIsNotUsed)
{
    const auto statement = [](const QString& text) { anotherConnection()->execute(text); };
    statement(u"ALTER TABLE KESTJournal RENAME TO kept"_s);
    statement(u"CREATE VIEW KESTJournal AS SELECT * FROM gone"_s);
    OpenDatabase();
    EXPECT_FALSE(gcnDB->answers()) << "work without the journal could not be taken back";
    EXPECT_TRUE(files::read(errorLogPath()).contains(u"no such table: main.gone"_s));
    statement(u"DROP VIEW KESTJournal"_s);
    statement(u"ALTER TABLE kept RENAME TO KESTJournal"_s);
    EXPECT_TRUE(EnsureConnection() && journal::isKept());
}

TEST_F(ShopConnection, ASilentServerCostsFiveSecondsForAllStepsTogether)
{
    QTcpServer silent;  // the system accepts connections for it, and nobody answers
    ASSERT_TRUE(silent.listen(QHostAddress::LocalHost));
    setSetting(u"ServerName"_s, u"mysql:127.0.0.1:%1"_s.arg(silent.serverPort()));
    gcnDB->close();
    const QDeadlineTimer limit(5000);
    for (int step = 0; step < 3; ++step)
        EXPECT_EQ(GetConnection(), nullptr);
    EXPECT_FALSE(limit.hasExpired());
    openWith(u"ServerName"_s, u"(local)"_s);
    EXPECT_TRUE(EnsureConnection());
}

TEST_F(ShopConnection, AServerThatFallsSilentAfterTheLoginCostsFiveSeconds)
{
    const OdbcDrivers drivers(OdbcDrivers::WithSqlServer);
    const QStringList names{u"mysql:127.0.0.1:%1"_s, u"127.0.0.1,%1"_s};
    for (const QString& name : names) {
        const bool isMySql = name == names[0];
        (isMySql ? static_cast<TestServer&>(mariaDb()) : tdsServer()).createDatabase(u"WirSql"_s);
        QProcess proxy;
        proxy.start(u"/usr/bin/python3"_s,
                    {u"-B"_s, checkoutFile(u"tests/support/falls_silent.py"_s),
                     isMySql ? u"127.0.0.1"_s : tdsServer().address(),
                     QString::number(isMySql ? mariaDb().port() : 1433), u"INFORMATION_SCHEMA"_s});
        ASSERT_TRUE(proxy.waitForReadyRead());
        if (!isMySql) {
            openWith(u"ServerName"_s, tdsServer().address());
            EXPECT_NO_THROW(gConn->execute(u"WAITFOR DELAY '00:00:03'"_s)) << "only a start has the short limit";
        }
        const QDeadlineTimer limit(5000);
        openWith(u"ServerName"_s, name.arg(proxy.readLine().toInt()));
        EXPECT_FALSE(limit.hasExpired()) << name;
        EXPECT_EQ(gcnDB->state(), 0) << name;
        EXPECT_TRUE(proxy.waitForReadyRead()) << "refused before: " << connectionFailure();
        EXPECT_NE(connectionFailure(), QString());
        proxy.closeWriteChannel();
        EXPECT_TRUE(proxy.waitForFinished());
    }
}

TEST_F(ShopConnection, ASettingLowersTheTimeOfAStatement)
{
    openWith(u"CommandTimeout"_s, u"1"_s);
    const QDeadlineTimer limit(10000);
    EXPECT_THROW(opened(u"WITH RECURSIVE n(i) AS (SELECT 1 UNION ALL SELECT i + 1 FROM n) SELECT COUNT(*) FROM n"_s),
                 RuntimeError);
    EXPECT_FALSE(limit.hasExpired());
}

TEST_F(ShopConnection, TheOptionsOfTheSettingOrTheVariableReachTheDriver)
{
    const OdbcDrivers drivers(OdbcDrivers::WithSqlServer);
    tdsServer().createDatabase(u"WirSql"_s);
    const QString options = u"Server="_s + tdsServer().address();
    openWith(u"ServerName"_s, u"127.0.0.1,1"_s);
    EXPECT_FALSE(gcnDB->answers());
    openWith(u"OdbcOptions"_s, options);
    EXPECT_TRUE(gcnDB->answers()) << connectionFailure();
    EXPECT_TRUE(databaseDescription().contains(u", driver libtdsodbc"_s)) << databaseDescription();
    qputenv("KEST2_ODBC_OPTIONS", options.toUtf8());
    openWith(u"OdbcOptions"_s, u""_s);
    EXPECT_TRUE(gcnDB->answers()) << connectionFailure();
    qunsetenv("KEST2_ODBC_OPTIONS");
}
