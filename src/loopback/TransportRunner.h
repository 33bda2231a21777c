// Keeps the transport at work: at once when the shop leaves something, and at intervals.
#pragma once

#include "loopback/Transport.h"
#include "platform/files/Lock.h"

#include <QFileSystemWatcher>
#include <QObject>
#include <QTimer>

#include <functional>
#include <optional>

namespace kest::app {

/// Where the transport of this profile works.
TransportFolders transportFolders();

class TransportRunner : public QObject {
public:
    /// Hears of every carry, those included that found nothing.
    using Heard = std::function<void(const Carry&)>;

    TransportRunner(const TransportFolders& folders, Heard heard);

    /// False while another transport works on these folders. Throws if nothing can be written there.
    bool claim();
    void start();
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

/// Ends something on SIGINT and SIGTERM, in the event loop, as long as it lives.
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
