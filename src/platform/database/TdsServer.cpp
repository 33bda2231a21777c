#include "platform/database/TdsServer.h"

#include <QByteArray>
#include <QDeadlineTimer>
#include <QHostInfo>
#include <QList>
#include <QTcpSocket>
#include <QUdpSocket>

namespace kest::db {

using namespace Qt::StringLiterals;

namespace {

constexpr quint16 browserPort = 1434;

}  // namespace

int portOfInstance(const QString& host, const QString& instance, int milliseconds)
{
    const QDeadlineTimer deadline(milliseconds);
    QUdpSocket browser;
    browser.connectToHost(host, browserPort);
    if (!browser.waitForConnected(milliseconds))
        return 0;
    browser.write('\x04' + instance.toLatin1() + '\0');  // asks for a single instance
    if (!browser.waitForReadyRead(int(deadline.remainingTime())) || !browser.hasPendingDatagrams())
        return 0;
    // three bytes, then "ServerName;HOST;InstanceName;NAME;IsClustered;No;Version;15.0.2000.5;tcp;49172;;"
    const QList<QByteArray> words = browser.read(browser.pendingDatagramSize()).mid(3).split(';');
    const qsizetype tcp = words.indexOf("tcp");
    return tcp < 0 ? 0 : words.value(tcp + 1).toInt();
}

bool answersHello(const QString& host, int port, int milliseconds)
{
    // a prelogin packet: header, the option "version", the end of the options, the version
    static const QByteArray hello = QByteArray::fromHex(
        "1201001a00000100"
        "00000b0006"
        "010011"
        "0001"
        "ff"
        "000000000000"
        "02");
    const QDeadlineTimer deadline(milliseconds);
    QTcpSocket socket;
    socket.connectToHost(host, quint16(port));
    if (!socket.waitForConnected(milliseconds))
        return false;
    socket.write(hello);
    return socket.waitForReadyRead(int(deadline.remainingTime()));
}

}  // namespace kest::db
