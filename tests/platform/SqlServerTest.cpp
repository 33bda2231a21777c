// Tests what only SQL Server and its drivers do, over its protocol.
#include "platform/Databases.h"
#include "platform/database/Change.h"
#include "platform/database/Dialect.h"
#include "platform/database/OdbcDrivers.h"
#include "platform/database/Session.h"
#include "platform/database/TdsServer.h"

#include <QNetworkDatagram>
#include <QUdpSocket>

#include <clocale>
#include <future>

using db::Recordset;

struct SqlServer : Databases {
    /// Returns the number that a batch selects.
    int asked(const QString& batch) const { return connection->session().engine().run(batch).values.front().toInt(); }
};

TEST_P(SqlServer, AnyTextComesBackWhole)
{
    const auto back = qScopeGuard(
        [before = std::string(std::setlocale(LC_ALL, nullptr))] { std::setlocale(LC_ALL, before.c_str()); });
    std::setlocale(LC_ALL, "C");  // as in a service
    connection = connect();
    connection->execute(
        u"CREATE TABLE TEXTS (id INT IDENTITY(1,1) PRIMARY KEY, old TEXT, long VARCHAR(MAX), wide NVARCHAR(MAX), "
        "short NVARCHAR(20))"_s);
    Recordset texts = query(u"SELECT * FROM TEXTS"_s);
    // long literals are sent in pieces of 4,095 units, which must not cut a letter in two
    for (const int length : {0, 255, 256, 4093, 4094, 4095, 4096, 8001, 8189, 65536, 65537, 200000}) {
        const QString text = QString(length, u'x') + u"Zoë €5"_s;
        const QString wide = QString(length, u'x') + u"😀 Żółw"_s;
        texts.addNew();
        for (const QString& column : {u"old"_s, u"long"_s})
            texts.set(column, text);
        texts.set(u"wide"_s, wide);
        EXPECT_EQ(written(texts, u"short"_s, u"Żółw 😀"_s), 0) << length;
        texts.requery();
        texts.moveLast();
        EXPECT_EQ(texts.text(u"old"_s), text) << length;
        EXPECT_EQ(texts.text(u"long"_s), text) << length;
        EXPECT_EQ(texts.text(u"wide"_s), wide) << length;
        EXPECT_EQ(texts.text(u"short"_s), u"Żółw 😀"_s) << length;
        EXPECT_EQ(written(texts, u"old"_s, text + u'.'), 0) << length;
    }
    EXPECT_EQ(query(u"SELECT * FROM TEXTS WHERE short='żółw 😀'"_s).recordCount(), 12);
    EXPECT_EQ(db::sqlServerDialect().literal(u"O'Brien"_s), u"'O''Brien'"_s) << "an index needs it without N";
}

TEST_P(SqlServer, AFailureMeansWhatItsNumberMeansOnThisServer)
{
    const std::tuple<int, QString, bool> cases[] = {
        {1205, u"40001"_s, true},  // a deadlock
        {-2, u"HYT00"_s, true},   {1222, u"HYT00"_s, true}, {2627, u"23000"_s, true}, {104, u"42000"_s, true},
        {10053, {}, false},       {10054, {}, false},       {10060, {}, false},       {20004, {}, false}};
    for (const auto& [number, state, livesOn] : cases) {
        connection = connect();
        const RuntimeError thrown = failure([&, &error = number] {
            const db::Change change(*connection, u"LINE"_s, db::ChangeSteps::ReadAndWrite);
            connection->session().engine().run(u"EXEC standin_fail @number=%1"_s.arg(error));
        });
        EXPECT_EQ(thrown.nativeCode(), QString::number(number));
        EXPECT_EQ(connection->state(), livesOn ? 1 : 0) << number;
        EXPECT_TRUE(!livesOn || thrown.sqlState() == state) << number << thrown.sqlState();
    }
}

TEST_P(SqlServer, ALockThatTheServerRefusesIsNotTakenForSomebodyElses)
{
    connection->session().engine().run(u"EXEC standin_refuse_locks"_s);
    EXPECT_EQ(failure([&] { const db::Lock lock(connection, u"a"_s); }).number(), StatementFailed);
}

TEST_P(SqlServer, OrdinaryWorkGivesNoStatementUp)
{
    const auto attentions = u"DECLARE @r int; EXEC @r = standin_attentions; SELECT @r"_s;
    connection->execute(u"INSERT INTO CAR (REGO, CODE) VALUES ('A', 'x')"_s);
    for (int i = 0; i < 3; ++i) {
        Recordset lines = query(u"SELECT * FROM LINE"_s);
        EXPECT_EQ(added(lines, u"CODE"_s, u"x"_s), 0);
        EXPECT_EQ(written(lines, u"notes"_s, QString(5000, u'n')), 0);
        EXPECT_EQ(written(lines, u"notes"_s, u"short"_s), 0);
        Recordset joined = query(u"SELECT L.*, C.owner FROM LINE L INNER JOIN CAR C ON C.CODE=L.CODE"_s);
        EXPECT_EQ(written(joined, u"owner"_s, u"Ann %1"_s.arg(i)), 0);
        EXPECT_TRUE(db::Lock(connection, u"a"_s).isHeld());
        EXPECT_TRUE(connection->answers());
        EXPECT_EQ(failure([&] { query(u"SELECT * FROM NOSUCH"_s); }).number(), StatementFailed);
        lines.remove();
    }
    EXPECT_EQ(asked(attentions), 0);
    connection->setCommandTimeout(1);
    EXPECT_THROW(connection->execute(u"WAITFOR DELAY '00:00:20'"_s), RuntimeError);
    EXPECT_EQ(asked(attentions), 1);
}

TEST_P(SqlServer, AWaitForALockIsLimitedLikeAStatement)
{
    const auto limit = u"SELECT @@LOCK_TIMEOUT"_s;
    connection->setCommandTimeout(7);
    EXPECT_EQ(asked(limit), 7000);
    connection->open(connectionText);
    EXPECT_EQ(asked(limit), 7000) << "it outlives the session";
    connection->setCommandTimeout(0);
    EXPECT_EQ(asked(limit), -1);
}

TEST_P(SqlServer, AnInstanceThatIsMissingIsNamed)
{
    db::Connection other;
    const QString text = QString(connectionText).replace(tdsServer().address(), u"127.0.0.1\\NOSUCH"_s);
    EXPECT_TRUE(
        failure([&] { other.open(QString(text).remove(u"Port=1433;"_s)); }).description().contains(u"NOSUCH"_s));
}

TEST(TdsServer, ItsBrowserTellsThePortOfAnInstance)
{
    // an address for each process, because the port is fixed
    const qint64 process = QCoreApplication::applicationPid();
    const QString host = u"127.7.%1.%2"_s.arg(process / 250 % 250).arg(process % 250 + 1);
    EXPECT_EQ(db::portOfInstance(host, u"SHOP"_s, 5000), 0) << "nobody listens";
    QUdpSocket browser;
    ASSERT_TRUE(browser.bind(QHostAddress(host), 1434));
    EXPECT_EQ(db::portOfInstance(host, u"SHOP"_s, 20), 0) << "a silent host";
    auto port = std::async(std::launch::async, [&] { return db::portOfInstance(host, u"SHOP"_s, 5000); });
    browser.receiveDatagram();  // the question that had no answer
    ASSERT_TRUE(browser.waitForReadyRead(5000));
    const QNetworkDatagram question = browser.receiveDatagram();
    EXPECT_EQ(question.data(), QByteArray("\x04SHOP\0", 6));
    browser.writeDatagram("\x05..ServerName;HOST;InstanceName;SHOP;tcp;49172;;", question.senderAddress(),
                          quint16(question.senderPort()));
    EXPECT_EQ(port.get(), 49172);
}

TEST_P(SqlServer, EachDriverGetsTheServerInItsOwnForm)
{
    const OdbcDrivers drivers(
        "[FreeTDS]\nDriver=libtdsodbc.so\n[ODBC Driver 18 for SQL Server]\nDriver=libmsodbcsql-18.3.so\n"
        "[Odd]\nDriver=libodd.so\n");
    EXPECT_EQ(db::sqlServerDriver(), u"ODBC Driver 18 for SQL Server"_s);
    for (auto [driver, server, options, expected] : casesIn<4>("odbc-texts.txt")) {
        server.replace(u"STANDIN"_s, tdsServer().address());
        expected.replace(u"STANDIN"_s, tdsServer().address());
        const db::ConnectionText given(u"Driver={SQL Server};Server=%1;Database=WirSql;Uid=sa;Pwd=p;"_s.arg(server));
        EXPECT_EQ(db::odbcTarget(given, driver, db::ConnectionText(options)).connectionText, expected);
    }
}

INSTANTIATE_TEST_SUITE_P(Alone, SqlServer, ::testing::Values(On::Tds));
