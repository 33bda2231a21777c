// Tests that the simulated SQL Server answers the real driver as the server does, as far as other tests rely on it.
#include "support/TdsServer.h"
#include "support/Test.h"

#include <QSqlDatabase>
#include <QSqlError>
#include <QSqlField>
#include <QSqlQuery>
#include <QSqlRecord>

/// A client that uses only Qt's plugin, the driver manager and the driver.
class Client {
public:
    explicit Client(const QString& name, const QString& connectionText = tdsServer().connectionText(u"plain"_s))
        : name_(name), database_(QSqlDatabase::addDatabase(u"QODBC"_s, name))
    {
        database_.setDatabaseName(connectionText.chopped(1));
        open_ = database_.open();
    }
    ~Client()
    {
        database_ = {};
        QSqlDatabase::removeDatabase(name_);
    }
    Q_DISABLE_COPY_MOVE(Client)

    bool isOpen() const { return open_; }
    QSqlQuery run(const QString& statement) const
    {
        QSqlQuery query(database_);
        query.setForwardOnly(true);
        query.exec(statement);
        return query;
    }
    QVariant ask(const QString& statement) const
    {
        QSqlQuery query = run(statement);
        QVariant last;
        do {
            while (query.next())
                last = query.value(0);
        } while (query.nextResult());
        return last;
    }

private:
    QString name_;
    QSqlDatabase database_;
    bool open_ = false;
};

struct StandIn : ::testing::Test {
    StandIn()
    {
        tdsServer().createDatabase(
            u"plain"_s,
            u"CREATE TABLE LINE (id INT IDENTITY(1,1) NOT NULL PRIMARY KEY, CODE VARCHAR(20), SEQ INT, "
            "flag BIT, day DATETIME, notes TEXT, local NVARCHAR(20), version TIMESTAMP);"
            "CREATE TABLE AUDIT (id INT IDENTITY(1,1) PRIMARY KEY, what VARCHAR(20));"
            "INSERT INTO AUDIT (what) VALUES ('first'); INSERT INTO AUDIT (what) VALUES ('second')"_s);
        client.emplace(u"client"_s);
    }
    std::optional<Client> client;
};

TEST_F(StandIn, NamesNoBaseTable)
{
    const QSqlRecord columns = client->run(u"SELECT id, CODE, notes FROM LINE"_s).record();
    EXPECT_EQ(columns.field(0).tableName().left(1), u""_s);
    EXPECT_EQ(columns.field(1).tableName().left(1), u""_s);
}

TEST_F(StandIn, RefusesAsTheServerDoes)
{
    client->run(u"INSERT INTO LINE (CODE) VALUES ('a')"_s);
    for (const auto& [number, statement] : casesIn<2>("tds-refusals.txt"))
        EXPECT_EQ(client->run(statement).lastError().nativeErrorCode().section(u';', 0, 0), number) << statement;
    EXPECT_FALSE(Client(u"wrong"_s, tdsServer().connectionText(u"plain"_s).replace(u"Pwd="_s, u"Pwd=x"_s)).isOpen());
    EXPECT_FALSE(Client(u"nowhere"_s, tdsServer().connectionText(u"nosuch"_s)).isOpen());
}

TEST_F(StandIn, CountsWhatATriggerDoesFirst)
{
    client->run(
        u"CREATE TRIGGER Audit ON LINE AFTER INSERT, UPDATE AS INSERT INTO AUDIT (what) SELECT what FROM AUDIT"_s);
    EXPECT_EQ(client->run(u"INSERT INTO LINE (CODE) VALUES ('a')"_s).numRowsAffected(), 2);
    EXPECT_EQ(client->ask(u"SELECT @@IDENTITY"_s).toInt(), 4) << "the trigger's";
    EXPECT_EQ(client->ask(u"SELECT SCOPE_IDENTITY()"_s).toInt(), 1);
    client->run(u"SET NOCOUNT ON"_s);
    EXPECT_EQ(client->run(u"UPDATE LINE SET SEQ=1"_s).numRowsAffected(), -1);
    EXPECT_EQ(client->ask(u"UPDATE LINE SET SEQ=1 WHERE CODE='A '; SELECT @@ROWCOUNT"_s).toInt(), 1);
}

TEST_F(StandIn, KeepsOnlyLettersThatTheTypeHas)
{
    client->run(u"INSERT INTO LINE (CODE, local) VALUES (N'Żoë €', N'Żoë €')"_s);
    client->run(u"INSERT INTO LINE (local) VALUES ('Żoë €')"_s);
    EXPECT_EQ(client->ask(u"SELECT COUNT(*) FROM LINE WHERE CODE=N'?oë €'"_s).toInt(), 1);
    EXPECT_EQ(client->ask(u"SELECT COUNT(*) FROM LINE WHERE local=N'żoë €'"_s).toInt(), 1);
}

TEST_F(StandIn, GivesANamedLockToOneSessionUntilItEnds)
{
    const auto get =
        u"DECLARE @r int; EXEC @r = sp_getapplock @Resource=N'x', @LockMode='Exclusive', "
        "@LockOwner='Session', @LockTimeout=100; SELECT @r"_s;
    EXPECT_EQ(client->ask(get).toInt(), 0);
    EXPECT_EQ(client->ask(get).toInt(), 0) << "again, by who has it";
    const Client other(u"other"_s);
    EXPECT_EQ(other.ask(get).toInt(), -1);
    client->run(u"EXEC sp_releaseapplock @Resource=N'x', @LockOwner='Session'"_s);
    EXPECT_EQ(other.ask(get).toInt(), -1) << "taken twice, given back once";
    other.run(u"KILL %1"_s.arg(client->ask(u"SELECT @@SPID"_s).toInt()));
    EXPECT_GE(other.ask(get).toInt(), 0);
    EXPECT_TRUE(client->run(u"SELECT 1"_s).lastError().isValid());
}

TEST_F(StandIn, IsFoundByTheNameOfItsInstance)
{
    const QString text = u"Driver={TDS Server};Server=%1\\%2;Database=plain;Uid=sa;Pwd=;App=test;"_s;
    EXPECT_TRUE(Client(u"instance"_s, text.arg(tdsServer().address(), TdsServer::instance())).isOpen());
}

TEST_F(StandIn, TakesItsTimeWhenItIsTold)
{
    QElapsedTimer time;
    time.start();
    client->run(u"WAITFOR DELAY '00:00:00.3'"_s);
    EXPECT_GE(time.elapsed(), 300);
}
