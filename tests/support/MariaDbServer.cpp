#include "support/MariaDbServer.h"

#include "platform/RuntimeError.h"
#include "platform/database/Connection.h"
#include "platform/database/Sql.h"
#include "setup/QuoteDatabase.h"
#include "support/MemoryFolder.h"
#include "support/Places.h"

#include <QDeadlineTimer>
#include <QDir>
#include <QProcessEnvironment>
#include <QStandardPaths>
#include <QTcpServer>
#include <QThread>

#include <sys/prctl.h>
#include <unistd.h>

#include <csignal>
#include <memory>
#include <stdexcept>

namespace kest::test {

using namespace Qt::StringLiterals;

namespace {

std::unique_ptr<MariaDbServer> shared;

constexpr int startMilliseconds = 30000;
constexpr int stopMilliseconds = 10000;

QString program(const QString& name)
{
    const QString found = QStandardPaths::findExecutable(name);
    return found.isEmpty() ? QStandardPaths::findExecutable(name, {u"/usr/sbin"_s, u"/usr/local/sbin"_s}) : found;
}

QString thisUser()
{
    return geteuid() == 0 ? u"root"_s : qEnvironmentVariable("USER", QString::number(geteuid()));
}

QString textFor(const QString& driver, int port, const QString& database, const QString& user, const QString& password)
{
    return u"Driver={%1};Server=127.0.0.1;Port=%2;Database=%3;Uid=%4;Pwd=%5;"_s.arg(driver, QString::number(port),
                                                                                    database, user, password);
}

}  // namespace

MariaDbServer::MariaDbServer() : folder(memoryFolder(u"mariadb"_s))
{
    prepareData();
    start();
}

MariaDbServer::~MariaDbServer()
{
    server.terminate();
    if (!server.waitForFinished(stopMilliseconds))
        kill();
}

void MariaDbServer::prepareData()
{
    // its own folder: at its start, a server deletes all temporary tables that it finds
    QDir(folder.path()).mkdir(u"tmp"_s);
    QProcessEnvironment environment = QProcessEnvironment::systemEnvironment();
    environment.insert(u"TMPDIR"_s, folder.filePath(u"tmp"_s));
    server.setProcessEnvironment(environment);
    QProcess install;
    install.setProcessEnvironment(environment);
    install.setProcessChannelMode(QProcess::MergedChannels);
    install.start(program(u"mariadb-install-db"_s),
                  {u"--no-defaults"_s, u"--user="_s + thisUser(), u"--datadir="_s + folder.filePath(u"data"_s),
                   u"--auth-root-authentication-method=normal"_s, u"--skip-test-db"_s, u"--skip-name-resolve"_s});
    if (!install.waitForFinished(startMilliseconds) || install.exitCode() != 0)
        throw std::runtime_error("mariadb-install-db: " + install.readAll().toStdString());
}

void MariaDbServer::start()
{
    QTcpServer free;
    if (!free.listen(QHostAddress::LocalHost))
        throw std::runtime_error("no free port on the loopback interface");
    tcpPort = free.serverPort();
    free.close();
    server.setProcessChannelMode(QProcess::MergedChannels);
    server.setChildProcessModifier([] { prctl(PR_SET_PDEATHSIG, SIGKILL); });
    server.start(program(u"mariadbd"_s),
                 {u"--defaults-file="_s + checkoutFile(u"tests/data/mariadb.cnf"_s), u"--user="_s + thisUser(),
                  u"--datadir="_s + folder.filePath(u"data"_s), u"--port="_s + QString::number(tcpPort),
                  u"--socket="_s + folder.filePath(u"s.sock"_s), u"--pid-file="_s + folder.filePath(u"pid"_s)});
    const QDeadlineTimer deadline(startMilliseconds);
    db::Connection connection;
    while (!attempt([&] { connection.open(textFor(u"MySQL"_s, tcpPort, u"mysql"_s, u"root"_s, {})); })) {
        if (deadline.hasExpired() || server.state() == QProcess::NotRunning)
            throw std::runtime_error("mariadbd: " + server.readAll().toStdString());
        QThread::msleep(20);
        server.waitForReadyRead(1);
    }
    // the component always logs in as "sa", and its password is empty by default
    for (const auto& [name, secret] : {std::pair(user(), password()), std::pair(u"sa"_s, QString())})
        connection.execute(
            sql("GRANT ALL ON *.* TO '{}'@'127.0.0.1' IDENTIFIED BY '{}' WITH GRANT OPTION", name, secret));
}

void MariaDbServer::createDatabase(const QString& name, const QString& script)
{
    db::Connection connection;
    connection.open(connectionText(u"mysql"_s));
    connection.execute(u"DROP DATABASE IF EXISTS "_s + name);
    connection.execute(u"CREATE DATABASE "_s + name + u" CHARACTER SET utf8mb4 COLLATE utf8mb4_general_ci"_s);
    connection.open(connectionText(name));
    for (const QString& statement : app::statementsIn(script))
        connection.execute(statement);
}

QString MariaDbServer::connectionText(const QString& database, const QString& driver) const
{
    return textFor(driver, tcpPort, database, user(), password());
}

void MariaDbServer::kill()
{
    server.kill();
    server.waitForFinished(stopMilliseconds);
}

MariaDbServer& mariaDb()
{
    if (!shared)
        shared = std::make_unique<MariaDbServer>();
    return *shared;
}

void stopMariaDb()
{
    shared.reset();
}

}  // namespace kest::test
