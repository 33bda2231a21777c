#include "support/TestServer.h"

#include "platform/database/Connection.h"
#include "setup/QuoteDatabase.h"
#include "support/Places.h"

#include <QDeadlineTimer>

#include <sys/prctl.h>
#include <sys/wait.h>

#include <csignal>
#include <stdexcept>

namespace kest::test {

constexpr int startMilliseconds = 60000;
constexpr int stopMilliseconds = 10000;

TestServer::TestServer(const QString& name, QString first, QString creation)
    : folder_(memoryFolder(name)), first_(std::move(first)), creation_(std::move(creation))
{
    server_.setProcessChannelMode(QProcess::MergedChannels);
    server_.setChildProcessModifier([] { prctl(PR_SET_PDEATHSIG, SIGKILL); });
}

TestServer::~TestServer()
{
    if (!server_.waitForFinished(stopMilliseconds))
        server_.kill();
}

void TestServer::start(const QString& program, const QStringList& arguments, const std::function<bool()>& isReady)
{
    server_.start(program, arguments);
    const QDeadlineTimer deadline(startMilliseconds);
    while (!isReady()) {
        if (deadline.hasExpired() || server_.state() == QProcess::NotRunning)
            throw std::runtime_error(program.toStdString() + ": " + server_.readAll().toStdString());
        server_.waitForReadyRead(20);
    }
}

QScopeGuard<std::function<void()>> TestServer::silence() const
{
    const auto process = pid_t(server_.processId());
    ::kill(process, SIGSTOP);
    ::waitpid(process, nullptr, WUNTRACED);  // all its threads have stopped
    return QScopeGuard<std::function<void()>>([process] { ::kill(process, SIGCONT); });
}

void TestServer::createDatabase(const QString& name, const QString& script) const
{
    db::Connection connection;
    for (const auto& [database, statements] : {std::pair(first_, creation_.arg(name)), {name, script}}) {
        connection.open(connectionText(database));
        for (const QString& statement : app::statementsIn(statements))
            connection.execute(statement);
    }
}

}  // namespace kest::test
