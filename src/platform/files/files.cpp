#include "platform/files/files.h"

#include "platform/RuntimeError.h"
#include "platform/files/CodePage.h"
#include "platform/files/SystemFile.h"

#include <QDir>

#include <fcntl.h>
#include <sys/stat.h>

#include <cerrno>
#include <optional>

namespace kest::files {

namespace {

constexpr unsigned ownerAlone = 0600;
constexpr qint64 largestFile = 512LL * 1024 * 1024;  // bytes; larger files are not read

}  // namespace

bool exists(const QString& path)
{
    return !path.isEmpty() && isFile(systemPath(path));
}

bool folderExists(const QString& path)
{
    return !path.isEmpty() && isFolder(systemPath(path));
}

qint64 size(const QString& path)
{
    return SystemFile(systemPath(path)).size();
}

QByteArray readBytes(const QString& path)
{
    const QString place = systemPath(path);
    SystemFile file(place);
    const qint64 bytes = file.size();
    if (bytes > largestFile)
        throwFileError(FileInputOutput, place);
    return file.read(bytes);
}

QByteArray readStart(const QString& path, qint64 most)
{
    SystemFile file(systemPath(path));
    return file.read(qMin(file.size(), most));
}

QString read(const QString& path)
{
    return fromCodePage(readBytes(path));
}

void writeBytes(const QString& path, const QByteArray& bytes, Access access)
{
    replaceFile(
        systemPath(path), spelledPath(path), [&](SystemFile& file) { file.write(bytes); },
        access == Access::OwnerAlone ? std::optional(ownerAlone) : std::nullopt);
}

void writeExactly(const QString& systemPath, const QByteArray& bytes)
{
    replaceFile(systemPath, systemPath, [&](SystemFile& file) { file.write(bytes); });
}

void restrictToOwner(const QString& path)
{
    SystemFile(systemPath(path), O_RDONLY).setMode(ownerAlone);
}

void write(const QString& path, const QString& text, Target target)
{
    replaceFile(placeOf(path, target), spelledPath(path), [&](SystemFile& file) { file.write(toCodePage(text)); });
}

void append(const QString& path, const QString& text)
{
    const QString place = systemPath(path);
    checkWritable(place);
    if (!isFile(place))
        checkFolderWritable(place);
    SystemFile file(place, O_WRONLY | O_APPEND | O_CREAT);
    const qint64 before = file.size();
    try {
        file.write(toCodePage(text));
    } catch (const RuntimeError&) {
        attempt([&] { file.cutTo(before); });  // removes an incomplete record
        throw;
    }
    file.commit();
}

void copy(const QString& from, const QString& to, Target target)
{
    constexpr qsizetype piece = 1024LL * 1024;
    SystemFile original(systemPath(from));
    replaceFile(placeOf(to, target), spelledPath(to), [&](SystemFile& file) {
        for (QByteArray bytes = original.read(piece); !bytes.isEmpty(); bytes = original.read(piece))
            file.write(bytes);
    });
}

void move(const QString& from, const QString& to, Target target)
{
    const QString source = systemPath(from);
    const QString place = placeOf(to, target);
    checkReadable(source);
    checkFolderWritable(source);
    checkFolderWritable(place);
    checkWritable(place);
    if (sameVolume(source, place)) {
        renameFile(source, place);
        const QString asAsked = spelledPath(to);
        if (asAsked != place)
            renameFile(place, asAsked);
        return;
    }
    copy(from, to, target);
    removeFile(source);
}

void remove(const QString& path, Force force)
{
    const QString place = systemPath(path);
    if (force == Force::No)
        checkWritable(place);
    removeFile(place);
}

void makeFolder(const QString& path)
{
    const QString place = systemPath(path);
    if (isFolder(place))
        return;
    if (place.isEmpty() || place.contains(QChar(u'\0')))
        throwFileError(PathNotFound, place);
    if (isFile(place))
        throwFileError(FileExists, place);
    if (const QString above = folderOf(place); above != place)
        makeFolder(above);
    failOnRequest(place);
    if (::mkdir(encodedPath(place).constData(), 0777) != 0 && errno != EEXIST)
        throwSystemError(place);
}

}  // namespace kest::files
