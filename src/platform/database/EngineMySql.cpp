// The engines for MariaDB and MySQL: one uses QMYSQL, the other an ODBC driver.
#include "platform/Waiting.h"
#include "platform/database/DriverSocket.h"
#include "platform/database/EngineOdbc.h"
#include "platform/database/MySqlServer.h"
#include "platform/database/QtSqlEngine.h"

#include <QSqlError>

#include <optional>

namespace kest::db {

using namespace Qt::StringLiterals;

namespace {

constexpr int connectSeconds = 4;  // for each step of opening a connection
constexpr int graceSeconds = 5;    // more than the limit that the server observes itself

QString versionIn(const Answer& answer)
{
    return answer.values.front().toString();
}

class EngineMySql final : public QtSqlEngine {
public:
    EngineMySql(const MySqlAddress& address, int statementSeconds) : QtSqlEngine(u"QMYSQL"_s)
    {
        // with "localhost", the driver would use a local socket and ignore the port
        const bool isHere = address.host.compare(u"localhost"_s, Qt::CaseInsensitive) == 0 && address.port > 0;
        database.setHostName(isHere ? u"127.0.0.1"_s : address.host);
        if (address.port > 0)
            database.setPort(address.port);
        database.setDatabaseName(address.database);
        database.setUserName(address.user);
        database.setPassword(address.password);
        QString options = u"CLIENT_FOUND_ROWS=1;MYSQL_OPT_CONNECT_TIMEOUT=%1"_s.arg(connectSeconds);
        if (statementSeconds > 0)
            options += u";MYSQL_OPT_READ_TIMEOUT=%1;MYSQL_OPT_WRITE_TIMEOUT=%1"_s.arg(statementSeconds + graceSeconds);
        database.setConnectOptions(options);
        openDatabase();
        socket.find();
        // strict mode, so that a value that is too long is refused and not cut, even if the server is configured
        // otherwise
        runShortly(
            u"SET SESSION sql_mode=CONCAT(@@sql_mode, ',NO_BACKSLASH_ESCAPES,PIPES_AS_CONCAT,STRICT_ALL_TABLES'), "
            "autocommit=1"_s);
        server.emplace(*this, versionIn(runShortly(MySqlServer::versionStatement())));
    }

    const Dialect& dialect() const override { return mySqlDialect(); }
    Answer run(const QString& statement) override
    {
        return isShort() ? runShortly(statement) : QtSqlEngine::run(statement);
    }
    void setTimeout(int seconds) override { runShortly(server->timeoutStatement(seconds)); }

    void ping() override
    {
        patiently(u"Waiting for "_s + database.hostName() + u"..."_s, [&] { runShortly(u"SELECT 1"_s); });
    }

    QStringList tableNames() override { return tableNamesOf(*this, MySqlServer::informationSchema()); }
    std::unique_ptr<TableInfo> readTable(const QString& name) override
    {
        return tableOf(*this, MySqlServer::informationSchema(), name);
    }

    bool lock(const QString& name, int seconds) override { return server->lock(name, seconds); }
    void unlock(const QString& name) override { server->unlock(name); }
    void endSession(const QString& session, const QString& lock) override { server->endSession(session, lock); }

protected:
    bool meansConnectionLost(const QSqlError& error) const override
    {
        return MySqlServer::meansConnectionLost(error.nativeErrorCode());
    }
    QString sqlState(const QSqlError& error) const override { return MySqlServer::sqlState(error.nativeErrorCode()); }

private:
    /// Executes a statement that takes no time. The connection of a server that does not answer for seconds is lost.
    Answer runShortly(const QString& statement)
    {
        Answer answer;
        socket.limit([&] { answer = QtSqlEngine::run(statement); });
        return answer;
    }

    DriverSocket socket;
    std::optional<MySqlServer> server;
};

/// Uses an ODBC driver for MariaDB or MySQL.
class EngineMySqlOverOdbc final : public EngineOdbc {
public:
    explicit EngineMySqlOverOdbc(std::unique_ptr<OdbcConnection> connection)
        : EngineOdbc(std::move(connection)), server(*this, versionIn(runShortly(MySqlServer::versionStatement())))
    {
        runShortly(u"SET SESSION sql_mode=CONCAT(@@sql_mode, ',PIPES_AS_CONCAT')"_s);
    }

    const Dialect& dialect() const override { return mySqlOverOdbcDialect(); }
    QVariant insert(const QString& statement) override
    {
        run(statement);
        return run(u"SELECT LAST_INSERT_ID()"_s).values.front();
    }
    void setTimeout(int seconds) override { runShortly(server.timeoutStatement(seconds)); }

    QStringList tableNames() override { return tableNamesOf(*this, MySqlServer::informationSchema()); }
    std::unique_ptr<TableInfo> readTable(const QString& name) override
    {
        return tableOf(*this, MySqlServer::informationSchema(), name);
    }

    bool lock(const QString& name, int seconds) override { return server.lock(name, seconds); }
    void unlock(const QString& name) override { server.unlock(name); }
    void endSession(const QString& session, const QString& lock) override { server.endSession(session, lock); }

protected:
    /// Drivers don't limit statements themselves.
    Answer runShortly(const QString& statement) override
    {
        Answer answer;
        socket().limit([&] { answer = run(statement, 0); });
        return answer;
    }
    int statementSeconds() const override { return 0; }
    bool meansConnectionLost(const OdbcMessage& message) const override
    {
        return MySqlServer::meansConnectionLost(QString::number(message.native));
    }
    QString sqlState(const OdbcMessage& message) const override { return message.state; }

private:
    MySqlServer server;
};

}  // namespace

std::unique_ptr<Engine> openMySql(const MySqlAddress& address, int statementSeconds)
{
    return std::make_unique<EngineMySql>(address, statementSeconds);
}

std::unique_ptr<Engine> mySqlOverOdbc(std::unique_ptr<OdbcConnection> connection)
{
    return std::make_unique<EngineMySqlOverOdbc>(std::move(connection));
}

}  // namespace kest::db
