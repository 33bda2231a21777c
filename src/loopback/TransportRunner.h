// Runs the transport whenever the shop puts a file into the outgoing folder, and at intervals.
#pragma once

#include "loopback/Transport.h"
#include "platform/files/Lock.h"

#include <QFileSystemWatcher>
#include <QObject>
#include <QTimer>

#include <functional>
#include <optional>

namespace kest::app {

/// Returns the transport's folders in this profile.
TransportFolders transportFolders();

/// Runs a transport until it is destroyed.
class TransportRunner : public QObject {
public:
    /// Called after every run, even if nothing was carried.
    using Heard = std::function<void(const Carry&)>;

    TransportRunner(const TransportFolders& folders, Heard heard);

    /// Returns false if another transport is running on these folders. Throws RuntimeError if they can't be written.
    bool claim();
    /// Runs the transport now and from then on. Call claim() first.
    void start();
    /// Runs the transport once.
    void carryNow();

private:
    void watch();

    TransportFolders folders;
    Transport transport;
    Heard heard;
    std::optional<files::Lock> lock;
    QFileSystemWatcher watcher;
    QTimer settled;
    QTimer interval;
};

/// Calls a function from the event loop on SIGINT and SIGTERM, as long as the object lives.
class OnTermination {
public:
    explicit OnTermination(std::function<void()> end);
    ~OnTermination();
    Q_DISABLE_COPY_MOVE(OnTermination)

private:
    class Signals;
    std::unique_ptr<Signals> signals_;
};

}  // namespace kest::app
