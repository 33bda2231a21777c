// Runs a simulated SQL Server for tests, which clients reach through FreeTDS. tds/standin.py describes its limits.
#pragma once

#include "support/OdbcDrivers.h"
#include "support/Places.h"
#include "support/TestServer.h"

#include <QRegularExpression>

#include <stdexcept>
#include <utility>

namespace kest::test {

class TdsServer final : public TestServer {
public:
    TdsServer() : TestServer(QStringLiteral("tds"), QStringLiteral("master"), QStringLiteral("CREATE DATABASE %1"))
    {
        // not another Python, which would not find Debian's packages
        start(QStringLiteral("/usr/bin/python3"),
              {QStringLiteral("-B"), checkoutFile(QStringLiteral("tests/support/tds/standin.py")),
               QStringLiteral("--folder"), folder_.path(), QStringLiteral("--login"), QStringLiteral("sa:"),
               QStringLiteral("--statements"), qEnvironmentVariable("KEST2_TDS_STATEMENTS")},
              [this] { return server_.canReadLine(); });
        const QString line = QString::fromUtf8(server_.readLine()).trimmed();
        if (!line.startsWith(QStringLiteral("ready ")))
            throw std::runtime_error("standin.py: " + line.toStdString() + server_.readAll().toStdString());
        address_ = line.section(u' ', 1);
    }
    ~TdsServer() override { server_.closeWriteChannel(); }
    Q_DISABLE_COPY_MOVE(TdsServer)

    /// Returns an address of this machine that nothing else uses. The port is SQL Server's usual one, so a client needs
    /// only the address.
    QString address() const { return address_; }
    QString connectionText(const QString& database) const override
    {
        return QStringLiteral("Driver={%1};Server=%2;Port=1433;Database=%3;Uid=sa;Pwd=;App=test;")
            .arg(QLatin1StringView(odbcTds), address_, database);
    }
    /// Returns a script for MariaDB that creates tables with the types that a host's tables have on SQL Server.
    static QString schemaOf(QString mariaDbScript)
    {
        static const std::pair<const char*, const char*> words[] = {
            {"INTEGER NOT NULL AUTO_INCREMENT", "INT IDENTITY(1,1) NOT NULL"},
            {"INTEGER", "INT"},
            {"DOUBLE", "FLOAT"},
            {"BOOLEAN", "BIT"},
            {"LONGTEXT", "TEXT"}};
        for (const auto& [theirs, ours] : words)
            mariaDbScript.replace(QLatin1StringView(theirs), QLatin1StringView(ours));
        return mariaDbScript.remove(QRegularExpression(QStringLiteral(" DEFAULT CHARACTER SET [^;]*")));
    }

private:
    QString address_;
};

inline TdsServer& tdsServer()
{
    return sharedServer<TdsServer>();
}

}  // namespace kest::test
