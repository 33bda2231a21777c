#include "platform/TrialRun.h"

#include <poll.h>
#include <sys/prctl.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

#include <array>
#include <cerrno>
#include <csignal>

namespace kest {

namespace {

/// Does the work and says through the pipe that it has ended. A crash says nothing, and is not one of this process.
[[noreturn]] void runAndEnd(const std::function<void()>& work, int pipe) noexcept
{
    ::prctl(PR_SET_PDEATHSIG, SIGKILL);
    const rlimit none{0, 0};
    ::setrlimit(RLIMIT_CORE, &none);
    for (const int crash : {SIGSEGV, SIGBUS, SIGFPE, SIGILL, SIGABRT})
        std::signal(crash, SIG_DFL);
    work();
    const char done = 1;
    ::_exit(::write(pipe, &done, 1) == 1 ? 0 : 1);
}

}  // namespace

bool endsInTime(const std::function<void()>& work, int milliseconds)
{
    std::array<int, 2> ends{};
    if (::pipe(ends.data()) != 0)
        return true;
    const pid_t copy = ::fork();
    if (copy == 0)
        runAndEnd(work, ends[1]);
    ::close(ends[1]);
    char done = 0;
    pollfd answer{ends[0], POLLIN, 0};
    int answers = 0;
    while (copy > 0 && (answers = ::poll(&answer, 1, milliseconds)) < 0 && errno == EINTR) {
    }
    const bool ended = copy < 0 || (answers == 1 && ::read(ends[0], &done, 1) == 1);
    ::close(ends[0]);
    if (copy > 0) {
        ::kill(copy, SIGKILL);
        ::waitpid(copy, nullptr, 0);
    }
    return ended;
}

}  // namespace kest
