#include "platform/database/DriverSocket.h"

#include <QHash>

#include <sys/socket.h>
#include <sys/stat.h>

#include <charconv>
#include <chrono>
#include <filesystem>
#include <future>
#include <string>
#include <system_error>

namespace kest::db {

namespace {

constexpr int answerSeconds = 4;

/// Returns the inode of a socket with a connection, or 0 if it is something else.
quint64 inodeOf(int descriptor)
{
    struct stat status {};
    sockaddr_storage peer{};
    socklen_t size = sizeof peer;
    const bool isConnected = ::fstat(descriptor, &status) == 0 && S_ISSOCK(status.st_mode) &&
                             ::getpeername(descriptor, reinterpret_cast<sockaddr*>(&peer), &size) == 0;
    return isConnected ? status.st_ino : 0;
}

/// Returns true if a socket is one between programs of this machine.
bool isLocal(int descriptor)
{
    sockaddr_storage own{};
    socklen_t size = sizeof own;
    return ::getsockname(descriptor, reinterpret_cast<sockaddr*>(&own), &size) == 0 && own.ss_family == AF_UNIX;
}

/// Returns the descriptors of all connected sockets of this process by their inodes.
QHash<quint64, int> connectedSockets()
{
    QHash<quint64, int> sockets;
    std::error_code failure;  // without the list of the system, no socket is known
    const std::filesystem::directory_iterator end;
    for (std::filesystem::directory_iterator entry("/proc/self/fd", failure); !failure && entry != end;
         entry.increment(failure)) {
        const std::string name = entry->path().filename();
        int descriptor = -1;
        std::from_chars(name.data(), name.data() + name.size(), descriptor);
        if (const quint64 inode = inodeOf(descriptor); inode != 0)
            sockets.insert(inode, descriptor);
    }
    return sockets;
}

}  // namespace

DriverSocket::DriverSocket()
{
    const QHash<quint64, int> sockets = connectedSockets();
    before = {sockets.keyBegin(), sockets.keyEnd()};
}

void DriverSocket::find()
{
    QHash<quint64, int> added = connectedSockets();
    added.removeIf([&](const std::pair<const quint64&, int&>& socket) { return before.contains(socket.first); });
    if (added.size() > 1)  // the desktop and the system open local ones at any time
        added.removeIf([](const std::pair<const quint64&, int&>& socket) { return isLocal(socket.second); });
    if (added.size() != 1)
        return;
    inode = added.cbegin().key();
    descriptor = added.cbegin().value();
}

void DriverSocket::limit(const std::function<void()>& step) const
{
    std::future<void> done = std::async(std::launch::async, step);
    if (done.wait_for(std::chrono::seconds(answerSeconds)) != std::future_status::ready)
        shutDown();
    done.get();
}

void DriverSocket::shutDown() const
{
    if (inode != 0 && inodeOf(descriptor) == inode)  // otherwise the driver has closed it
        ::shutdown(descriptor, SHUT_RDWR);
}

}  // namespace kest::db
