#include "loopback/TransportRunner.h"

#include "platform/files/files.h"
#include "setup/Profile.h"

#include <QJsonObject>
#include <QSocketNotifier>

#include <fcntl.h>
#include <unistd.h>

#include <csignal>

namespace kest::app {

using namespace Qt::StringLiterals;

namespace {

constexpr int settleTime = 300;  // milliseconds, because the shop writes a quote and its images one after the other
constexpr int slowTime = 5000;   // milliseconds, for steps that are due and for folders that can't be watched

int signalPipe[2] = {-1, -1};

void noteSignal(int)
{
    const char any = 0;
    const auto written = ::write(signalPipe[1], &any, 1);
    static_cast<void>(written);  // if the pipe is full, a signal is already waiting in it
}

}  // namespace

TransportFolders transportFolders()
{
    const QJsonObject places = where();
    const auto folder = [&](const QString& name) { return places[name].toString() + u'/'; };
    return {folder(u"unread"_s), folder(u"unsent"_s), folder(u"sent"_s), folder(u"component"_s)};
}

TransportRunner::TransportRunner(const TransportFolders& all, Heard listener)
    : folders(all), transport(all), heard(std::move(listener))
{
    settled.setSingleShot(true);
    settled.setInterval(settleTime);
    interval.setInterval(slowTime);
    connect(&watcher, &QFileSystemWatcher::directoryChanged, &settled, qOverload<>(&QTimer::start));
    connect(&settled, &QTimer::timeout, this, [this] {
        if (!files::list(folders.unsent).isEmpty())  // else the transport itself has emptied it
            carryNow();
    });
    connect(&interval, &QTimer::timeout, this, [this] { carryNow(); });
}

bool TransportRunner::claim()
{
    files::makeFolder(folders.own);
    lock.emplace(folders.own + u"KESTWeb.lock"_s);
    return lock->isHeld();
}

void TransportRunner::start()
{
    watch();
    interval.start();
    carryNow();
}

void TransportRunner::carryNow()
{
    watch();
    heard(transport.carry());
}

void TransportRunner::watch()
{
    if (watcher.directories().isEmpty() && files::folderExists(folders.unsent))
        watcher.addPath(files::systemPath(folders.unsent));
}

class OnTermination::Signals {
public:
    explicit Signals(std::function<void()> end) : notifier(readEnd(), QSocketNotifier::Read)
    {
        QObject::connect(&notifier, &QSocketNotifier::activated, &notifier, [this, end = std::move(end)] {
            notifier.setEnabled(false);
            end();
        });
        for (const int number : {SIGINT, SIGTERM})
            std::signal(number, noteSignal);
    }
    ~Signals()
    {
        for (const int number : {SIGINT, SIGTERM})
            std::signal(number, SIG_DFL);
        ::close(signalPipe[0]);
        ::close(signalPipe[1]);
    }
    Q_DISABLE_COPY_MOVE(Signals)

private:
    static int readEnd()
    {
        if (::pipe2(signalPipe, O_CLOEXEC | O_NONBLOCK) != 0)
            qFatal("no pipe for signals");
        return signalPipe[0];
    }

    QSocketNotifier notifier;
};

OnTermination::OnTermination(std::function<void()> end) : signals_(std::make_unique<Signals>(std::move(end))) {}
OnTermination::~OnTermination() = default;

}  // namespace kest::app
