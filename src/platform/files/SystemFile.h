// The system calls for files.h: open files, errors as RuntimeError, and atomic writes.
#pragma once

#include "platform/files/files.h"

#include <QByteArray>
#include <QString>

#include <sys/stat.h>

#include <functional>
#include <optional>

namespace kest::files {

/// An open file. The destructor closes it.
class SystemFile {
public:
    /// Opens a file to read it. Throws PermissionDenied if it is not a file or if nobody may read it.
    explicit SystemFile(const QString& path);
    /// A new file gets this mode, reduced by the umask of the process.
    SystemFile(const QString& path, int flags, unsigned mode = 0666);
    ~SystemFile();
    SystemFile(const SystemFile&) = delete;
    SystemFile& operator=(const SystemFile&) = delete;

    /// Returns the size in bytes.
    qint64 size() const;
    /// Reads at most `most` bytes. Returns none at the end of the file.
    QByteArray read(qsizetype most);
    void write(const QByteArray& bytes);
    /// Cuts the file to that size in bytes.
    void cutTo(qint64 size);
    /// Sets the permission bits.
    void setMode(unsigned mode);
    /// Sets the group and the permission bits to those of another file.
    void shareLike(const QString& other);
    /// Locks a byte, which need not exist, until the file is closed. Returns false if another open file has locked it.
    bool lockByte(qint64 at);
    /// Waits until the bytes are on the disk and closes the file. Throws RuntimeError if this fails.
    void commit();

private:
    struct stat state() const;

    QString path;
    int descriptor;
};

/// Returns a path for a system call. Throws PathNotFound if it contains a NUL.
QByteArray encodedPath(const QString& systemPath);
/// Returns the text for a name in a folder. encodedPath() turns it back into the same bytes.
QString decodedName(const char* name);

/// Throws the RuntimeError for the `errno` of the last call.
[[noreturn]] void throwSystemError(const QString& systemPath);
[[noreturn]] void throwFileError(int number, const QString& systemPath);

/// Throw if the file may not be read, changed or replaced. The permission bits count even for root.
void checkReadable(const QString& systemPath);
void checkWritable(const QString& systemPath);
void checkFolderWritable(const QString& systemPath);

/// Returns the path of the folder that contains a file or folder.
QString folderOf(const QString& systemPath);
bool isFile(const QString& systemPath);
bool isFolder(const QString& systemPath);

/// Lets `fill` write a temporary file and renames it to `target`. `spelled` is the path in the spelling of the caller.
/// Without a mode, the file keeps the mode of the one that it replaces.
void replaceFile(const QString& target, const QString& spelled, const std::function<void(SystemFile&)>& fill,
                 std::optional<unsigned> mode = {});
/// Returns true if both paths are on the same file system, so that a rename can move the file.
bool sameVolume(const QString& from, const QString& to);
void renameFile(const QString& from, const QString& to);
void removeFile(const QString& systemPath);

/// Returns the seconds since the last write, or 0 if the file does not exist.
qint64 ageOf(const QString& systemPath);

/// Returns true for the temporary names of replaceFile().
bool isTemporaryName(const QString& name);

/// Returns the path on this system with the last name in the spelling of the caller, even if it exists in another case.
QString spelledPath(const QString& path);

/// Returns the path on this system of a file that will be written.
QString placeOf(const QString& path, Target target);

/// Throws if a test has requested that this operation fails.
void failOnRequest(const QString& path);

}  // namespace kest::files
