#include "platform/database/Waiting.h"

#include <QScopedValueRollback>

#include <chrono>
#include <future>
#include <utility>

namespace kest::db {

namespace {

constexpr auto slice = std::chrono::milliseconds(10);

std::function<void()> stepOfStatement;
Wait waitForServer;
bool isWaiting = false;

}  // namespace

void setStatementStep(std::function<void()> step)
{
    stepOfStatement = std::move(step);
}

void statementStep()
{
    if (stepOfStatement)
        stepOfStatement();
}

void setWait(Wait wait)
{
    waitForServer = std::move(wait);
}

void patiently(const QString& what, const std::function<void()>& step)
{
    if (!waitForServer || isWaiting) {  // an event that is handled while waiting may need a server, too
        step();
        return;
    }
    const QScopedValueRollback waiting(isWaiting, true);
    std::future<void> done = std::async(std::launch::async, step);
    waitForServer(what, [&] { return done.wait_for(slice) == std::future_status::ready; });
    done.get();
}

}  // namespace kest::db
