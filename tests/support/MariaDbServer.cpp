#include "support/MariaDbServer.h"

#include "platform/RuntimeError.h"
#include "platform/database/Connection.h"
#include "support/Places.h"

#include <QTcpServer>

#include <stdexcept>

namespace kest::test {

using namespace Qt::StringLiterals;

static int freePort()
{
    QTcpServer free;
    if (!free.listen(QHostAddress::LocalHost))
        throw std::runtime_error("no free port on the loopback interface");
    return free.serverPort();
}

MariaDbServer::MariaDbServer()
    : TestServer(u"mariadb"_s, u"mysql"_s,
                 u"DROP DATABASE IF EXISTS %1; CREATE DATABASE %1 CHARACTER SET utf8mb4 COLLATE utf8mb4_general_ci"_s),
      port_(freePort())
{
    db::Connection connection;
    start(u"/bin/sh"_s, {checkoutFile(u"tests/support/mariadb.sh"_s), folder_.path(), QString::number(port_)},
          [&] { return attempt([&] { connection.open(connectionText(u"mysql"_s)); }); });
}

QString MariaDbServer::connectionText(const QString& database, const char* driver) const
{
    return u"Driver={%1};Server=127.0.0.1;Port=%2;Database=%3;Uid=%4;Pwd=%5;"_s.arg(
        QLatin1StringView(driver), QString::number(port_), database, user(), password());
}

}  // namespace kest::test
