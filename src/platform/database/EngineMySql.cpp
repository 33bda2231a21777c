// The engine for MariaDB and MySQL, which uses QMYSQL.
#include "platform/database/MySqlServer.h"
#include "platform/database/QtSqlEngine.h"

#include <QSqlError>

#include <optional>

namespace kest::db {

using namespace Qt::StringLiterals;

namespace {

constexpr int connectSeconds = 5;

class EngineMySql final : public QtSqlEngine {
public:
    EngineMySql(const QString& host, int port, const QString& databaseName, const QString& user,
                const QString& password)
        : QtSqlEngine(u"QMYSQL"_s)
    {
        // with "localhost", the driver would use a local socket and ignore the port
        database.setHostName(host.compare(u"localhost"_s, Qt::CaseInsensitive) == 0 && port > 0 ? u"127.0.0.1"_s
                                                                                                : host);
        if (port > 0)
            database.setPort(port);
        database.setDatabaseName(databaseName);
        database.setUserName(user);
        database.setPassword(password);
        database.setConnectOptions(u"CLIENT_FOUND_ROWS=1;MYSQL_OPT_CONNECT_TIMEOUT=%1"_s.arg(connectSeconds));
        openDatabase();
        // strict mode, so that a value that is too long is refused and not cut, even if the server is configured
        // otherwise
        run(u"SET SESSION sql_mode=CONCAT(@@sql_mode, ',NO_BACKSLASH_ESCAPES,PIPES_AS_CONCAT,STRICT_ALL_TABLES'), "
            "autocommit=1"_s);
        server.emplace(*this);
    }

    const Dialect& dialect() const override { return mySqlDialect(); }
    void setTimeout(int seconds) override { run(server->timeoutStatement(seconds)); }

    QStringList tableNames() override { return tableNamesOf(*this, MySqlServer::informationSchema()); }
    std::unique_ptr<TableInfo> readTable(const QString& name) override
    {
        return tableOf(*this, MySqlServer::informationSchema(), name);
    }

    bool lock(const QString& name, int seconds) override { return server->lock(name, seconds); }
    void unlock(const QString& name) override { server->unlock(name); }

protected:
    bool meansConnectionLost(const QSqlError& error) const override
    {
        return MySqlServer::meansConnectionLost(error.nativeErrorCode());
    }
    QString sqlState(const QSqlError& error) const override { return MySqlServer::sqlState(error.nativeErrorCode()); }

private:
    std::optional<MySqlServer> server;
};

}  // namespace

std::unique_ptr<Engine> openMySql(const QString& host, int port, const QString& database, const QString& user,
                                  const QString& password)
{
    return std::make_unique<EngineMySql>(host, port, database, user, password);
}

}  // namespace kest::db
