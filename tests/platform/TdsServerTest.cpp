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
    explicit Client(const QString& connectionText = tdsServer().connectionText(u"plain"_s))
        : database_(QSqlDatabase::addDatabase(u"QODBC"_s, QUuid::createUuid().toString()))
    {
        database_.setDatabaseName(connectionText.chopped(1));
        database_.open();
    }
    ~Client()
    {
        const QString name = std::exchange(database_, {}).connectionName();
        QSqlDatabase::removeDatabase(name);
    }
    Q_DISABLE_COPY_MOVE(Client)

    bool isOpen() const { return database_.isOpen(); }
    QSqlRecord columns(const QString& select) const { return QSqlQuery(select, database_).record(); }
    /// Returns the last value that the statement gives, or how many rows it changes, or its error.
    QString answer(const QString& statement) const
    {
        QSqlQuery query(database_);
        query.setForwardOnly(true);
        if (!query.exec(statement))
            return u"error "_s + query.lastError().nativeErrorCode().section(u';', 0, 0);
        QString last = QString::number(query.numRowsAffected());
        do {
            while (query.next())
                last = query.value(0).toString();
        } while (query.nextResult());
        return last;
    }

private:
    QSqlDatabase database_;
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
    }
};

TEST_F(StandIn, AnswersAsTheServerDoes)
{
    const Client one;
    const Client two;
    const QString numberOfOne = one.answer(u"SELECT @@SPID"_s);
    for (auto [client, statement, answer] : casesIn<3>("tds-answers.txt")) {
        statement.replace(u"(number of one)"_s, numberOfOne);
        EXPECT_EQ((client == u"one"_s ? one : two).answer(statement), answer) << statement;
    }
    const QSqlRecord columns = two.columns(u"SELECT id, CODE, notes FROM LINE"_s);
    for (const int column : {0, 1})
        EXPECT_EQ(columns.field(column).tableName().left(1), QString()) << "it names no base table";
    QElapsedTimer time;
    time.start();
    two.answer(u"WAITFOR DELAY '00:00:00.3'"_s);
    EXPECT_GE(time.elapsed(), 300);
}

TEST_F(StandIn, IsOpenedByTheNameOfItsInstanceButNotWithAWrongPasswordOrDatabase)
{
    const QString text = u"Driver={TDS Server};Server=%1\\%2;Database=plain;Uid=sa;Pwd=;App=test;"_s;
    EXPECT_TRUE(Client(text.arg(tdsServer().address(), TdsServer::instance())).isOpen());
    EXPECT_FALSE(Client(tdsServer().connectionText(u"plain"_s).replace(u"Pwd="_s, u"Pwd=x"_s)).isOpen());
    EXPECT_FALSE(Client(tdsServer().connectionText(u"nosuch"_s)).isOpen());
}
