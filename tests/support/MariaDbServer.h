// Runs a MariaDB server for tests on a free loopback port, with its data in a temporary folder.
#pragma once

#include <QProcess>
#include <QString>
#include <QTemporaryDir>

namespace kest::test {

class MariaDbServer {
public:
    /// Starts the server and waits until it is ready. Throws std::runtime_error with the server's output if it does not
    /// start.
    MariaDbServer();
    /// Stops the server. It also stops if the test program crashes.
    ~MariaDbServer();

    int port() const { return tcpPort; }
    QString user() const { return QStringLiteral("kest"); }
    QString password() const { return QStringLiteral("s3cret"); }

    /// Creates an empty database, after dropping one of the same name, and runs a script in it.
    void createDatabase(const QString& name, const QString& script = {});
    /// Returns the connection text for a database on this server, with the driver "MySQL" or one that is registered
    /// with ODBC.
    QString connectionText(const QString& database, const QString& driver = QStringLiteral("MySQL")) const;
    /// Stops the server as a power cut would.
    void kill();

private:
    void prepareData();
    void start();

    QTemporaryDir folder;
    QProcess server;
    int tcpPort = 0;
};

/// Returns the server of this test program. The first call starts it.
MariaDbServer& mariaDb();
/// Call this before the program ends.
void stopMariaDb();

}  // namespace kest::test
