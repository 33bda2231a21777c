// Runs a simulated SQL Server for tests, which clients reach through FreeTDS. tds/standin.py describes its limits.
#pragma once

#include "support/TestServer.h"

namespace kest::test {

class TdsServer final : public TestServer {
public:
    TdsServer();
    ~TdsServer() override { server_.closeWriteChannel(); }
    Q_DISABLE_COPY_MOVE(TdsServer)

    /// Returns an address of this machine that nothing else uses. The port is SQL Server's usual one, so a client needs
    /// only the address.
    QString address() const { return address_; }
    QString connectionText(const QString& database) const override;
    /// Returns a script for MariaDB that creates tables with the types that a host's tables have on SQL Server.
    static QString schemaOf(QString mariaDbScript);

private:
    QString address_;
};

inline TdsServer& tdsServer()
{
    return sharedServer<TdsServer>();
}

}  // namespace kest::test
