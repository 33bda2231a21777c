// The calls of this system behind files.h: open files, their failures as RuntimeError, writes that appear whole.
#pragma once

#include <QByteArray>
#include <QString>

#include <functional>
#include <optional>

namespace kest::files {

/// An open file that is closed with its owner.
class SystemFile {
public:
    /// A file that is made takes that mode, less what the process withholds from new files.
    SystemFile(const QString& path, int flags, unsigned mode = 0666);
    ~SystemFile();
    SystemFile(const SystemFile&) = delete;
    SystemFile& operator=(const SystemFile&) = delete;

    qint64 size() const;
    /// The next bytes, at most so many; none at the end.
    QByteArray read(qsizetype most);
    void write(const QByteArray& bytes);
    void cutTo(qint64 size);
    void setMode(unsigned mode);
    /// Locks one byte, there or not, until the file is closed. False while another open file has it locked.
    bool lockByte(qint64 at);
    /// Waits until the bytes are on the disk and closes, so that no failure stays unseen.
    void commit();

private:
    QString path;
    int descriptor;
};

/// The bytes that a path takes in a call of this system; a path with a NUL in it is PathNotFound.
QByteArray encodedPath(const QString& systemPath);
/// A name as a folder of this system gives it; `encodedPath` makes the same bytes of it.
QString decodedName(const char* name);

/// Throws what the last call's `errno` means for this path.
[[noreturn]] void throwSystemError(const QString& systemPath);
[[noreturn]] void throwFileError(int number, const QString& systemPath);

/// Throws where the file may not be read, changed or replaced. The permission bits count even for a user whom this
/// system refuses nothing.
void checkReadable(const QString& systemPath);
void checkWritable(const QString& systemPath);
void checkFolderWritable(const QString& systemPath);

bool isFile(const QString& systemPath);
bool isFolder(const QString& systemPath);

/// Puts a file in place that `fill` has written under a temporary name. `spelled` is its path as it was asked for.
/// Without a mode it keeps that of the file before.
void replaceFile(const QString& target, const QString& spelled, const std::function<void(SystemFile&)>& fill,
                 std::optional<unsigned> mode = {});
bool sameVolume(const QString& from, const QString& to);
void renameFile(const QString& from, const QString& to);
void removeFile(const QString& systemPath);

/// Seconds since the last write; 0 for a file that is not there.
qint64 ageOf(const QString& systemPath);

/// True for the temporary names of `replaceFile`.
bool isTemporaryName(const QString& name);

/// The path on this system with the last element as it was asked for, even where a variant in another case exists.
QString spelledPath(const QString& path);

/// Throws when a test wants this operation to fail.
void failOnRequest(const QString& path);

}  // namespace kest::files
