// Runs a MariaDB server for tests on a free loopback port.
#pragma once

#include "platform/RuntimeError.h"
#include "platform/database/Connection.h"
#include "support/Places.h"
#include "support/TestServer.h"

#include <QTcpServer>

#include <stdexcept>

namespace kest::test {

class MariaDbServer final : public TestServer {
public:
    MariaDbServer()
        : TestServer(QStringLiteral("mariadb"), QStringLiteral("mysql"),
                     QStringLiteral("DROP DATABASE IF EXISTS %1; "
                                    "CREATE DATABASE %1 CHARACTER SET utf8mb4 COLLATE utf8mb4_general_ci"))
    {
        {
            QTcpServer free;
            if (!free.listen(QHostAddress::LocalHost))
                throw std::runtime_error("no free port on the loopback interface");
            port_ = free.serverPort();
        }
        db::Connection connection;
        start(QStringLiteral("/bin/sh"),
              {checkoutFile(QStringLiteral("tests/support/mariadb.sh")), folder_.path(), QString::number(port_)},
              [&] { return attempt([&] { connection.open(connectionText(QStringLiteral("mysql"))); }); });
    }
    ~MariaDbServer() override { server_.terminate(); }
    Q_DISABLE_COPY_MOVE(MariaDbServer)

    int port() const { return port_; }
    // as mariadb.sql creates them
    QString user() const { return QStringLiteral("kest"); }
    QString password() const { return QStringLiteral("s3cret"); }
    QString connectionText(const QString& database) const override { return connectionText(database, "MySQL"); }
    /// Returns the connection text for a driver that is registered with ODBC.
    QString connectionText(const QString& database, const char* driver) const
    {
        return QStringLiteral("Driver={%1};Server=127.0.0.1;Port=%2;Database=%3;Uid=%4;Pwd=%5;")
            .arg(QLatin1StringView(driver), QString::number(port_), database, user(), password());
    }

private:
    int port_ = 0;
};

inline MariaDbServer& mariaDb()
{
    return sharedServer<MariaDbServer>();
}

}  // namespace kest::test
