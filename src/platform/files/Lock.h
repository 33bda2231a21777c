// A lock between processes that the system frees with the process that holds it.
#pragma once

#include <QString>

#include <memory>

namespace kest::files {

class SystemFile;

/// Held by one object at a time among all that ask for the same name in the same file, in this process or another one.
/// The file only carries the locks: it stays behind, and what is in it does not matter.
class Lock {
public:
    /// Waits so long for another one to let go. Throws if the file cannot be opened or carries no locks.
    explicit Lock(const QString& path, const QString& name = {}, int milliseconds = 0);
    ~Lock();
    Lock(const Lock&) = delete;
    Lock& operator=(const Lock&) = delete;

    bool isHeld() const { return file != nullptr; }

private:
    std::unique_ptr<SystemFile> file;
};

}  // namespace kest::files
