#include "support/MariaDbServer.h"

#include "platform/RuntimeError.h"
#include "platform/database/Connection.h"
#include "platform/database/Sql.h"
#include "support/Places.h"

#include <QDir>
#include <QProcessEnvironment>
#include <QStandardPaths>
#include <QTcpServer>

#include <unistd.h>

#include <stdexcept>

namespace kest::test {

using namespace Qt::StringLiterals;

static QString program(const QString& name)
{
    return QStandardPaths::findExecutable(name, {u"/usr/bin"_s, u"/usr/sbin"_s, u"/usr/local/bin"_s});
}

static QString thisUser()
{
    return u"--user="_s + (geteuid() == 0 ? u"root"_s : qEnvironmentVariable("USER", QString::number(geteuid())));
}

static QString textFor(const QString& driver, int port, const QString& database, const QString& user,
                       const QString& password)
{
    return u"Driver={%1};Server=127.0.0.1;Port=%2;Database=%3;Uid=%4;Pwd=%5;"_s.arg(driver, QString::number(port),
                                                                                    database, user, password);
}

MariaDbServer::MariaDbServer()
    : TestServer(u"mariadb"_s, u"mysql"_s,
                 u"DROP DATABASE IF EXISTS %1; CREATE DATABASE %1 CHARACTER SET utf8mb4 COLLATE utf8mb4_general_ci"_s)
{
    createData();
    {
        QTcpServer free;
        if (!free.listen(QHostAddress::LocalHost))
            throw std::runtime_error("no free port on the loopback interface");
        port_ = free.serverPort();
    }
    db::Connection connection;
    start(program(u"mariadbd"_s),
          {u"--defaults-file="_s + checkoutFile(u"tests/data/mariadb.cnf"_s), thisUser(),
           u"--datadir="_s + folder_.filePath(u"data"_s), u"--port="_s + QString::number(port_),
           u"--socket="_s + folder_.filePath(u"s.sock"_s), u"--pid-file="_s + folder_.filePath(u"pid"_s)},
          [&] { return attempt([&] { connection.open(textFor(u"MySQL"_s, port_, u"mysql"_s, u"root"_s, {})); }); });
    // the component always logs in as "sa", and its password is empty by default
    for (const auto& [name, secret] : {std::pair(user(), password()), std::pair(u"sa"_s, QString())})
        connection.execute(
            sql("GRANT ALL ON *.* TO '{}'@'127.0.0.1' IDENTIFIED BY '{}' WITH GRANT OPTION", name, secret));
}

void MariaDbServer::createData()
{
    // its own folder: at its start, a server deletes all temporary tables that it finds
    QDir(folder_.path()).mkdir(u"tmp"_s);
    QProcessEnvironment environment = QProcessEnvironment::systemEnvironment();
    environment.insert(u"TMPDIR"_s, folder_.filePath(u"tmp"_s));
    server_.setProcessEnvironment(environment);
    QProcess install;
    install.setProcessEnvironment(environment);
    install.setProcessChannelMode(QProcess::MergedChannels);
    install.start(program(u"mariadb-install-db"_s),
                  {u"--no-defaults"_s, thisUser(), u"--datadir="_s + folder_.filePath(u"data"_s),
                   u"--auth-root-authentication-method=normal"_s, u"--skip-test-db"_s, u"--skip-name-resolve"_s});
    if (!install.waitForFinished() || install.exitCode() != 0)
        throw std::runtime_error("mariadb-install-db: " + install.readAll().toStdString());
}

QString MariaDbServer::connectionText(const QString& database, const char* driver) const
{
    return textFor(QString::fromLatin1(driver), port_, database, user(), password());
}

}  // namespace kest::test
