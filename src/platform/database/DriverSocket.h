// Limits the time that a driver waits for its server, without a function of the driver.
#pragma once

#include <QSet>

#include <functional>

namespace kest::db {

/// The socket that a driver opens when it connects. It is created before the driver connects.
class DriverSocket {
public:
    DriverSocket();

    /// Finds the socket after the driver has connected. It stays unknown if the process has opened another one
    /// meanwhile.
    void find();
    /// Runs a step of the driver that takes no time. If it takes seconds, shuts the socket down, so that the step
    /// fails. If the socket is unknown, waits for the driver.
    void limit(const std::function<void()>& step) const;

private:
    void shutDown() const;

    QSet<quint64> before;  // the inodes of other sockets
    int descriptor = -1;
    quint64 inode = 0;
};

}  // namespace kest::db
