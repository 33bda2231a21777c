// Runs a simulated SQL Server for tests, which clients reach through FreeTDS. tds/standin.py describes its limits.
#pragma once

#include <QProcess>
#include <QString>
#include <QTemporaryDir>

namespace kest::test {

class TdsServer {
public:
    /// Starts the server and waits until it is ready. Throws std::runtime_error with its output if it does not start.
    TdsServer();
    /// Stops the server. It also stops if the test program crashes.
    ~TdsServer();

    /// Returns an address of this machine that nothing else uses. The port is SQL Server's usual one, so a client needs
    /// only the address.
    QString address() const { return address_; }
    /// Returns the instance that the browser service at that address knows.
    static QString instance() { return QStringLiteral("SHOP"); }
    static QString user() { return QStringLiteral("sa"); }

    /// Creates an empty database, after dropping one of the same name, and runs a script in it.
    void createDatabase(const QString& name, const QString& script = {});
    QString connectionText(const QString& database) const;
    /// Returns a script for MariaDB that creates tables with the types that a host's tables have on SQL Server.
    static QString schemaOf(QString mariaDbScript);

private:
    QTemporaryDir folder_;
    QProcess server_;
    QString address_;
};

/// Returns the simulated server of this test program. The first call starts it.
TdsServer& tdsServer();
/// Call this before the program ends.
void stopTdsServer();

}  // namespace kest::test
