#include "platform/Waiting.h"

#include <QScopedValueRollback>

#include <chrono>
#include <future>
#include <thread>
#include <utility>

namespace kest {

namespace {

constexpr auto slice = std::chrono::milliseconds(10);

std::function<void()> stepOfWork;
Wait waitForServer;
std::thread::id threadOfWindows;
const std::future<void>* running = nullptr;  // the step that the thread of the windows waits for

}  // namespace

void setWorkStep(std::function<void()> step)
{
    stepOfWork = std::move(step);
}

void workStep()
{
    if (stepOfWork)
        stepOfWork();
}

void setWait(Wait wait)
{
    waitForServer = std::move(wait);
    threadOfWindows = std::this_thread::get_id();
}

void patiently(const QString& what, const std::function<void()>& step)
{
    if (!waitForServer || std::this_thread::get_id() != threadOfWindows)
        return step();
    if (running) {  // a connection can't serve two statements at the same time
        running->wait();
        return step();
    }
    std::future<void> done = std::async(std::launch::async, step);
    {
        const QScopedValueRollback waiting(running, &std::as_const(done));
        waitForServer(what, [&] { return done.wait_for(slice) == std::future_status::ready; });
    }
    done.get();
}

}  // namespace kest
