// Tests the connection to a MariaDB server that stops to answer on it, as after a firewall has forgotten it.
#include "platform/database/Connection.h"
#include "support/MariaDbServer.h"
#include "support/Test.h"

#include <QTcpServer>
#include <QTcpSocket>

#include <atomic>

namespace {

/// Passes what a client and the server say to each other, for the connections that it still remembers.
class Firewall final : public QThread {
public:
    Firewall()
    {
        start();
        opened.acquire();
    }
    ~Firewall() override
    {
        quit();
        wait();
    }
    Q_DISABLE_COPY_MOVE(Firewall)

    std::atomic<int> port = 0, made = 0, forgotten = 0;
    std::atomic<bool> onlyGreets = false;  // what clients say does not reach the server

private:
    void run() override
    {
        QTcpServer front;
        front.listen(QHostAddress::LocalHost);
        port = front.serverPort();
        QObject::connect(&front, &QTcpServer::newConnection, &front, [&] {
            const int number = ++made;
            QTcpSocket* client = front.nextPendingConnection();
            auto* server = new QTcpSocket(client);
            server->connectToHost(QHostAddress::LocalHost, quint16(mariaDb().port()));
            for (const auto& [from, to] : {std::pair(client, server), {server, client}})
                QObject::connect(from, &QTcpSocket::readyRead, to, [=, this, from = from, to = to] {
                    const QByteArray said = from->readAll();
                    if (number > forgotten && !(onlyGreets && from != server))
                        to->write(said);
                });
        });
        opened.release();
        exec();
    }

    QSemaphore opened;
};

}  // namespace

TEST(SilentServer, AConnectionThatAFirewallHasForgottenIsToldWithinSeconds)
{
    mariaDb().createDatabase(u"shop"_s);
    Firewall firewall;
    db::Connection connection;
    const QString text =
        mariaDb().connectionText(u"shop"_s).replace(QString::number(mariaDb().port()), QString::number(firewall.port));
    connection.setCommandTimeout(30);
    connection.open(text);
    EXPECT_TRUE(connection.answers());
    firewall.forgotten = int(firewall.made);
    QElapsedTimer time;
    time.start();
    EXPECT_FALSE(connection.answers());
    connection.open(text);
    EXPECT_TRUE(connection.answers()) << "the server itself answers";
    EXPECT_LT(time.elapsed(), 8000);

    firewall.onlyGreets = true;
    time.start();
    EXPECT_EQ(failureOf([&] { connection.open(text); }), CannotOpen);
    EXPECT_LT(time.elapsed(), 5000);
}
