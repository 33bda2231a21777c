// Simulates a full disk.
#pragma once

#include <QScopeGuard>

#include <sys/resource.h>

#include <csignal>

namespace kest::test {

/// Limits the size of all files that this process writes, as a full disk would, as long as the result lives.
[[nodiscard]] inline auto fullDisk(rlim_t bytes)
{
    rlimit before{};
    ::getrlimit(RLIMIT_FSIZE, &before);
    const rlimit small{bytes, before.rlim_max};
    ::setrlimit(RLIMIT_FSIZE, &small);
    return qScopeGuard([before, handler = std::signal(SIGXFSZ, SIG_IGN)] {
        ::setrlimit(RLIMIT_FSIZE, &before);
        std::signal(SIGXFSZ, handler);
    });
}

}  // namespace kest::test
