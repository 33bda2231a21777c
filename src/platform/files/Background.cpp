#include "platform/RuntimeError.h"
#include "platform/files/SystemFile.h"
#include "platform/files/files.h"

#include <QStringList>

#include <chrono>
#include <condition_variable>
#include <mutex>
#include <stop_token>
#include <thread>

namespace kest::files {

namespace {

/// Takes files away that someone else may still hold, one thread for all of them.
class Remover {
public:
    void add(const QString& systemPath)
    {
        const std::lock_guard lock(mutex);
        if (!waiting.contains(systemPath))
            waiting.append(systemPath);
        if (!worker.joinable())
            worker = std::jthread([this](const std::stop_token& stop) { run(stop); });
        changed.notify_all();
    }

    bool waitUntilDone(std::chrono::milliseconds time)
    {
        std::unique_lock lock(mutex);
        return changed.wait_for(lock, time, [this] { return waiting.isEmpty(); });
    }

private:
    void run(const std::stop_token& stop)
    {
        constexpr auto pause = std::chrono::milliseconds(100);
        std::unique_lock lock(mutex);
        while (!stop.stop_requested()) {
            changed.wait(lock, stop, [this] { return !waiting.isEmpty(); });
            const QStringList files = waiting;
            lock.unlock();
            QStringList gone;
            for (const QString& file : files) {
                attempt([&] {
                    failOnRequest(file);
                    removeFile(file);
                });
                if (!isFile(file))
                    gone.append(file);
            }
            lock.lock();
            for (const QString& file : gone)
                waiting.removeAll(file);
            changed.notify_all();
            if (!waiting.isEmpty())
                changed.wait_for(lock, stop, pause, [] { return false; });
        }
    }

    std::mutex mutex;
    std::condition_variable_any changed;
    QStringList waiting;
    std::jthread worker;  // last, so that it ends before what it uses
};

Remover& remover()
{
    static Remover instance;
    return instance;
}

}  // namespace

void removeInBackground(const QString& path)
{
    const QString place = systemPath(path);
    if (isFile(place))
        remover().add(place);
}

bool waitForBackground(int milliseconds)
{
    return remover().waitUntilDone(std::chrono::milliseconds(milliseconds));
}

}  // namespace kest::files
