// Tests the connection to a MariaDB server that stops answering on it, as after a firewall has forgotten it.
#include "platform/database/Connection.h"
#include "support/MariaDbServer.h"
#include "support/Test.h"

#include <QTcpServer>
#include <QTcpSocket>

#include <atomic>

TEST(SilentServer, AConnectionThatAFirewallHasForgottenIsToldWithinSeconds)
{
    mariaDb().createDatabase(u"shop"_s);
    std::atomic<int> made = 0;
    std::atomic<int> forgotten = 0;        // how many of these connections
    std::atomic<bool> onlyGreets = false;  // what clients say does not reach the server
    QThread thread;
    auto* firewall = new QTcpServer;
    ASSERT_TRUE(firewall->listen(QHostAddress::LocalHost));
    const QString text = mariaDb().connectionText(u"shop"_s).replace(QString::number(mariaDb().port()),
                                                                     QString::number(firewall->serverPort()));
    QObject::connect(firewall, &QTcpServer::newConnection, firewall, [&, firewall] {
        QTcpSocket* client = firewall->nextPendingConnection();
        auto* server = new QTcpSocket(client);
        server->connectToHost(QHostAddress::LocalHost, quint16(mariaDb().port()));
        const auto pass = [&, number = ++made](QTcpSocket* from, QTcpSocket* to, bool isClient) {
            QObject::connect(from, &QTcpSocket::readyRead, to, [&, number, from, to, isClient] {
                const QByteArray said = from->readAll();
                if (number > forgotten && !(onlyGreets && isClient))
                    to->write(said);
            });
        };
        pass(client, server, true);
        pass(server, client, false);
    });
    QObject::connect(&thread, &QThread::finished, firewall, &QObject::deleteLater);
    firewall->moveToThread(&thread);
    thread.start();

    db::Connection connection;
    connection.setCommandTimeout(30);
    connection.open(text);
    EXPECT_TRUE(connection.answers());
    forgotten = int(made);
    QElapsedTimer time;
    time.start();
    EXPECT_FALSE(connection.answers());
    connection.open(text);
    EXPECT_TRUE(connection.answers()) << "the server itself answers";
    EXPECT_LT(time.elapsed(), 8000);

    onlyGreets = true;
    time.start();
    EXPECT_EQ(failureOf([&] { connection.open(text); }), CannotOpen);
    EXPECT_LT(time.elapsed(), 5000);
    thread.quit();
    thread.wait();
}
