// Files and folders with the names of the host. All files are read and written here.
#pragma once

#include <QByteArray>
#include <QString>
#include <QStringList>

namespace kest::files {

// A path is either in the host's form or an absolute path of this system. Both slashes are separators.
//   c:\wirdoc\AUnread\x.xml   drive_c/wirdoc/AUnread/x.xml of the profile
//   d:\...                    drive_d/...
//   \\s\share\x               unc/s/share/x
// A path without a drive is on C:, and ".." never leads out of a drive.
// Names are found in any case: first in the exact spelling, then the first one in alphabetical order. If a name on the
// disk is not UTF-8, its other bytes become the characters U+DC80 to U+DCFF.
// Errors throw RuntimeError: FileNotFound, PathNotFound, PermissionDenied, DiskFull, FileInputOutput.

/// Returns the path on this system. A name that does not exist keeps its spelling.
QString systemPath(const QString& path);

bool exists(const QString& path);        // false for a folder
bool folderExists(const QString& path);  // false for a file
/// Returns the size in bytes.
qint64 size(const QString& path);

/// Reads a file as text in Windows-1252. All 256 bytes survive a round trip.
QString read(const QString& path);
/// Reads a file as it is.
QByteArray readBytes(const QString& path);
/// Reads at most that many bytes from the beginning of a file, as they are.
QByteArray readStart(const QString& path, qint64 most);

/// What the caller knows of a target: if list() has not shown its name in any case, the folder is not searched again.
enum class Target { Unknown, Free };
/// Writes a file in Windows-1252; other characters become "?". Writes to a temporary name first, which list() never
/// returns, and then renames it, so that no reader sees part of a file. A file in another case is replaced and gets the
/// new spelling.
void write(const QString& path, const QString& text, Target target = Target::Unknown);
/// Who can read a written file.
enum class Access { AsBefore, OwnerAlone };
void writeBytes(const QString& path, const QByteArray& bytes, Access access = Access::AsBefore);
/// Writes a file at exactly this path of this system, such as a file dialog returns: a file in another case stays, and
/// a backslash is part of a name.
void writeExactly(const QString& systemPath, const QByteArray& bytes);
/// Removes the rights of everyone except the owner.
void restrictToOwner(const QString& path);
/// Adds text to the end of a file. Creates a missing file.
void append(const QString& path, const QString& text);

/// Copies a file and replaces the target. No reader sees part of the target.
void copy(const QString& from, const QString& to, Target target = Target::Unknown);
/// Moves a file and replaces the target.
void move(const QString& from, const QString& to, Target target = Target::Unknown);
enum class Force { No, Yes };
/// Deletes a file. Throws FileNotFound if it does not exist, and PermissionDenied if it is read-only, unless forced.
void remove(const QString& path, Force force = Force::No);
/// Creates the folder and those above it, if they don't exist.
void makeFolder(const QString& path);

/// Returns the names of the files in a folder that match the pattern, in which only "*" and "?" have a meaning. Case is
/// ignored. The names are sorted by their upper-case forms in code order. Temporary files are left out. A folder that
/// does not exist has no files.
QStringList list(const QString& folder, const QString& pattern = QStringLiteral("*"));
/// Returns true if a name matches a pattern as in list().
bool matches(const QString& name, const QString& pattern);

/// Removes temporary files that are older than a day, which killed processes have left. Ignores files that it can't
/// remove.
void removeLeftOvers(const QString& folder);

/// Returns true if the name can't lead out of its folder: it is not empty and has no separator, "..", drive or control
/// character. Check all names from messages and tables. For reading, a bad name is a file that does not exist.
bool isPlainName(const QString& name);
/// Returns `folder` + `name` for a file that will be written. Throws PathNotFound if the name is not plain.
QString pathForWriting(const QString& folder, const QString& name);

}  // namespace kest::files
