// A MariaDB server for tests, on a free loopback port, with its data in a temporary folder.
#pragma once

#include <QProcess>
#include <QString>
#include <QTemporaryDir>

namespace kest::test {

class MariaDbServer {
public:
    /// Started and ready; throws std::runtime_error with the server's own words where it does not come up.
    MariaDbServer();
    /// Stopped. It ends with the test program too, however that ends.
    ~MariaDbServer();

    int port() const { return tcpPort; }
    QString user() const { return QStringLiteral("kest"); }
    QString password() const { return QStringLiteral("s3cret"); }

    /// Makes an empty database, in place of one of that name, and runs the statements of a script in it.
    void createDatabase(const QString& name, const QString& script = {});
    /// A connection text that names the database on this server, for "MySQL" or for a driver registered with ODBC.
    QString connectionText(const QString& database, const QString& driver = QStringLiteral("MySQL")) const;
    /// Ends the server as a power cut would.
    void kill();

private:
    void prepareData();
    void start();

    QTemporaryDir folder;
    QProcess server;
    int tcpPort = 0;
};

/// The one server of a test program, started when it is first asked for.
MariaDbServer& mariaDb();
/// Before the program ends.
void stopMariaDb();

}  // namespace kest::test
