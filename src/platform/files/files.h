// Files and folders under the host's names: the only place that reads and writes files.
#pragma once

#include <QByteArray>
#include <QString>
#include <QStringList>

namespace kest::files {

// A path is one in the host's form or an absolute one of this system; both slashes separate.
//   c:\wirdoc\AUnread\x.xml   drive_c/wirdoc/AUnread/x.xml of the profile
//   d:\...                    drive_d/...
//   \\s\share\x               unc/s/share/x
// A path without a drive lies on c:, and ".." never leads out of a drive.
// Names are found without regard to case: the exact spelling first, then the first by name. A name on the disk that is
// no UTF-8 keeps each of its other bytes as a character of its own, U+DC80 to U+DCFF.
// Failures throw RuntimeError: FileNotFound, PathNotFound, PermissionDenied, DiskFull, FileInputOutput.

/// The path on this system. What does not exist keeps the spelling that was asked for.
QString systemPath(const QString& path);

bool exists(const QString& path);        // a file
bool folderExists(const QString& path);  // a folder
qint64 size(const QString& path);

/// The whole file as text of the code page Windows-1252; all 256 bytes survive a round trip.
QString read(const QString& path);
QByteArray readBytes(const QString& path);

/// Written to a temporary name that no reader of the folder takes, flushed, then renamed: nobody sees half a file.
/// A variant of the name in another case is replaced and takes the new spelling. Characters outside the code page
/// become "?".
void write(const QString& path, const QString& text);
/// Who can read a written file.
enum class Access { AsBefore, OwnerAlone };
void writeBytes(const QString& path, const QByteArray& bytes, Access access = Access::AsBefore);
/// Takes the rights of everybody but the owner.
void restrictToOwner(const QString& path);
/// Adds to the end of the file; a missing file is created.
void append(const QString& path, const QString& text);

/// Overwrites the target, which appears whole or not at all.
void copy(const QString& from, const QString& to);
void move(const QString& from, const QString& to);
enum class Force { No, Yes };
/// A missing file is FileNotFound, one marked read-only PermissionDenied unless forced.
void remove(const QString& path, Force force = Force::No);
/// Makes the folder and those above it; nothing happens when it is there.
void makeFolder(const QString& path);

/// The names of the files of a folder whose name matches a pattern of "*" and "?" in any case, everything else literal.
/// Ordered by the upper-cased name, in code order. Temporary names of `write` are never among them. A folder that is
/// not there has no files.
QStringList list(const QString& folder, const QString& pattern = QStringLiteral("*"));
bool matches(const QString& name, const QString& pattern);

/// Removes the temporary files of `write` that are older than a day: those of processes that were killed. What can't be
/// removed stays.
void removeLeftOvers(const QString& folder);

/// True for a name that stays in its folder: not empty, no separator, no "..", no drive, no control character.
/// Names out of a message or a table pass through here: for reading a bad one is a file that does not exist.
bool isPlainName(const QString& name);
/// `folder` + `name`; throws PathNotFound for a name that is not plain. For names that are about to be written.
QString pathForWriting(const QString& folder, const QString& name);

/// Deletes a file that another process may still have open: now, or else every 100 ms while windows are open.
void removeInBackground(const QString& path);
/// Waits for these deletions and returns true if all files are gone. What is left is remembered in the profile.
bool waitForBackground(int milliseconds);
/// Takes up the deletions that an earlier process left, unless a file has changed since.
void resumeRemovals();

QByteArray toCodePage(const QString& text);
QString fromCodePage(const QByteArray& bytes);
/// Strict base64 once white space is taken out; throws TypeMismatch for anything else.
QByteArray fromBase64(QByteArrayView text);

}  // namespace kest::files
