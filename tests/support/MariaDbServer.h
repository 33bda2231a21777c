// Runs a MariaDB server for tests on a free loopback port.
#pragma once

#include "support/TestServer.h"

namespace kest::test {

class MariaDbServer final : public TestServer {
public:
    MariaDbServer();
    ~MariaDbServer() override { server_.terminate(); }
    Q_DISABLE_COPY_MOVE(MariaDbServer)

    int port() const { return port_; }
    // as mariadb.sql creates them
    QString user() const { return QStringLiteral("kest"); }
    QString password() const { return QStringLiteral("s3cret"); }
    QString connectionText(const QString& database) const override { return connectionText(database, "MySQL"); }
    /// Returns the connection text for a driver that is registered with ODBC.
    QString connectionText(const QString& database, const char* driver) const;

private:
    int port_;
};

inline MariaDbServer& mariaDb()
{
    return sharedServer<MariaDbServer>();
}

}  // namespace kest::test
