#include "platform/database/TdsServer.h"

#include <QByteArray>
#include <QDeadlineTimer>
#include <QList>
#include <QScopeGuard>

#include <netdb.h>
#include <poll.h>
#include <sys/socket.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <memory>

namespace kest::db {

using namespace Qt::StringLiterals;

namespace {

constexpr int browserPort = 1434;
constexpr qsizetype longestAnswer = 65536;  // bytes

/// Waits until a socket can be read or written, as `event` says.
bool waitFor(short event, int socket, const QDeadlineTimer& deadline)
{
    pollfd state{socket, event, 0};
    int ready = 0;
    do
        ready = ::poll(&state, 1, int(deadline.remainingTime()));
    while (ready < 0 && errno == EINTR);
    return ready > 0;
}

/// Sends a question to an address and returns the first part of the answer, or nothing if none arrives in time.
QByteArray answerOf(const addrinfo& address, const QByteArray& question, const QDeadlineTimer& deadline)
{
    const int socket =
        ::socket(address.ai_family, address.ai_socktype | SOCK_NONBLOCK | SOCK_CLOEXEC, address.ai_protocol);
    if (socket < 0)
        return {};
    const auto closed = qScopeGuard([socket] { ::close(socket); });
    static_cast<void>(::connect(socket, address.ai_addr, address.ai_addrlen));  // if this fails, so does the sending
    if (!waitFor(POLLOUT, socket, deadline) ||
        ::send(socket, question.constData(), size_t(question.size()), MSG_NOSIGNAL) != question.size() ||
        !waitFor(POLLIN, socket, deadline))
        return {};
    QByteArray answer(longestAnswer, Qt::Uninitialized);
    return answer.first(std::max<ssize_t>(::recv(socket, answer.data(), longestAnswer, 0), 0));
}

/// Asks the addresses of a host in turn. Qt's network library is not used, because each start would have to load it.
QByteArray answerOf(const QString& host, int port, int socketType, const QByteArray& question, int milliseconds)
{
    const QDeadlineTimer deadline(std::max(milliseconds, 0));
    addrinfo wanted{};
    wanted.ai_socktype = socketType;
    addrinfo* found = nullptr;
    if (::getaddrinfo(host.toUtf8().constData(), QByteArray::number(port).constData(), &wanted, &found) != 0)
        return {};
    const std::unique_ptr<addrinfo, decltype(&::freeaddrinfo)> addresses(found, &::freeaddrinfo);
    int left = 0;
    for (const addrinfo* address = found; address; address = address->ai_next)
        ++left;
    QByteArray answer;
    for (const addrinfo* address = found; address && answer.isEmpty(); address = address->ai_next)
        answer = answerOf(*address, question, QDeadlineTimer(deadline.remainingTime() / left--));
    return answer;
}

}  // namespace

int portOfInstance(const QString& host, const QString& instance, int milliseconds)
{
    const QByteArray question = '\x04' + instance.toLatin1() + '\0';  // asks for a single instance
    // three bytes, then "ServerName;HOST;InstanceName;NAME;IsClustered;No;Version;15.0.2000.5;tcp;49172;;"
    const QList<QByteArray> words = answerOf(host, browserPort, SOCK_DGRAM, question, milliseconds).mid(3).split(';');
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
    return !answerOf(host, port, SOCK_STREAM, hello, milliseconds).isEmpty();
}

}  // namespace kest::db
