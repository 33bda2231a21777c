// Simulates a full disk.
#pragma once

#include <QtGlobal>

#include <sys/resource.h>

#include <csignal>

namespace kest::test {

/// Limits the size of all files that this process writes, as a full disk would.
class FullDisk {
public:
    explicit FullDisk(rlim_t bytes) : handler(std::signal(SIGXFSZ, SIG_IGN))
    {
        ::getrlimit(RLIMIT_FSIZE, &before);
        const rlimit small{bytes, before.rlim_max};
        ::setrlimit(RLIMIT_FSIZE, &small);
    }
    ~FullDisk()
    {
        ::setrlimit(RLIMIT_FSIZE, &before);
        std::signal(SIGXFSZ, handler);
    }
    Q_DISABLE_COPY_MOVE(FullDisk)

private:
    rlimit before{};
    void (*handler)(int);
};

}  // namespace kest::test
