// A lock between processes. If a process ends, the system releases its locks.
#pragma once

#include <QString>

#include <memory>

namespace kest::files {

class SystemFile;

/// A lock on a name in a file. Only one object can hold it at a time, in this process and all others. The file is never
/// deleted, and its content does not matter.
class Lock {
public:
    /// Tries to get the lock and waits up to this time. A new file gets the group and the rights of the file `like`, so
    /// that all who may write that one can lock. Throws RuntimeError if the file can't be opened or locked.
    explicit Lock(const QString& path, const QString& name = {}, int milliseconds = 0, const QString& like = {});
    ~Lock();
    Lock(const Lock&) = delete;
    Lock& operator=(const Lock&) = delete;

    bool isHeld() const { return file != nullptr; }

private:
    std::unique_ptr<SystemFile> file;
};

}  // namespace kest::files
