#include "platform/files/SystemFile.h"

#include "platform/RuntimeError.h"
#include "platform/files/FaultInjection.h"

#include <QRandomGenerator>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <mutex>
#include <optional>
#include <utility>

using namespace Qt::StringLiterals;

namespace kest::files {

namespace {

constexpr mode_t anyoneMayRead = S_IRUSR | S_IRGRP | S_IROTH;
constexpr mode_t anyoneMayWrite = S_IWUSR | S_IWGRP | S_IWOTH;

// The characters for bytes of names that are not UTF-8. No valid text contains them.
constexpr char16_t byteOffset = 0xDC00;
constexpr char16_t firstByte = 0xDC80;
constexpr char16_t lastByte = 0xDCFF;

std::mutex faultMutex;
std::function<bool()> currentFault;

std::optional<struct stat> stateOf(const QString& systemPath)
{
    struct stat state {};
    if (systemPath.contains(QChar(u'\0')) || ::stat(encodedPath(systemPath).constData(), &state) != 0)
        return {};
    return state;
}

void checkMayRead(const struct stat& state, const QString& systemPath)
{
    if (!S_ISREG(state.st_mode) || (state.st_mode & anyoneMayRead) == 0)
        throwFileError(PermissionDenied, systemPath);
}

QString temporaryName()
{
    return u".kest-"_s + QString::number(QRandomGenerator::global()->generate64(), 36) + u".tmp"_s;
}

/// Writes a folder to the disk. A rename is safe only after that.
void commitFolder(const QString& folder)
{
    SystemFile(folder, O_RDONLY | O_DIRECTORY).commit();
}

int withoutInterruption(const std::function<int()>& call)
{
    int result = 0;
    do {
        result = call();
    } while (result < 0 && errno == EINTR);
    return result;
}

}  // namespace

void setFault(std::function<bool()> fault)
{
    const std::lock_guard lock(faultMutex);
    currentFault = std::move(fault);
}

void failOnRequest(const QString& path)
{
    const std::lock_guard lock(faultMutex);
    if (currentFault && currentFault())
        throwFileError(FileInputOutput, path);
}

QByteArray encodedPath(const QString& systemPath)
{
    if (systemPath.contains(QChar(u'\0')))
        throwFileError(PathNotFound, systemPath);
    QByteArray path;
    qsizetype from = 0;  // where the part of the text begins that is not yet in `path`
    for (qsizetype i = 0; i < systemPath.size(); ++i) {
        const char16_t c = systemPath[i].unicode();
        const bool isByte = c >= firstByte && c <= lastByte && !(i > 0 && systemPath[i - 1].isHighSurrogate());
        if (!isByte)
            continue;
        path += QStringView(systemPath).sliced(from, i - from).toUtf8() + static_cast<char>(c - byteOffset);
        from = i + 1;
    }
    return path + QStringView(systemPath).sliced(from).toUtf8();
}

QString decodedName(const char* name)
{
    const QByteArrayView bytes(name);
    if (bytes.isValidUtf8())
        return QString::fromUtf8(bytes);
    QString text;
    for (const char c : bytes) {
        const auto byte = static_cast<unsigned char>(c);
        text += QChar(byte < 0x80 ? byte : byteOffset + byte);
    }
    return text;
}

void throwFileError(int number, const QString& systemPath)
{
    const auto meaning = [&] {
        switch (number) {
            case FileNotFound:
                return u"File not found"_s;
            case PathNotFound:
                return u"Path not found"_s;
            case PermissionDenied:
                return u"Permission denied"_s;
            case DiskFull:
                return u"Disk full"_s;
            default:
                return u"Device I/O error"_s;
        }
    };
    throw RuntimeError(number, meaning() + u": "_s + systemPath);
}

void throwSystemError(const QString& systemPath)
{
    switch (errno) {
        case ENOENT:
            throwFileError(isFolder(folderOf(systemPath)) ? FileNotFound : PathNotFound, systemPath);
        case ENOTDIR:
        case ENAMETOOLONG:
        case EINVAL:
        case ELOOP:
            throwFileError(PathNotFound, systemPath);
        case EACCES:
        case EPERM:
        case EROFS:
        case EBUSY:
        case ETXTBSY:
        case EISDIR:
        case ENXIO:
        case ENOTEMPTY:
            throwFileError(PermissionDenied, systemPath);
        case ENOSPC:
        case EDQUOT:
        case EFBIG:
            throwFileError(DiskFull, systemPath);
        default:
            throwFileError(FileInputOutput, systemPath);
    }
}

SystemFile::SystemFile(const QString& systemPath, int flags, unsigned mode) : path(systemPath), descriptor(-1)
{
    failOnRequest(path);
    const QByteArray name = encodedPath(path);
    descriptor = withoutInterruption([&] { return ::open(name.constData(), flags | O_CLOEXEC | O_NONBLOCK, mode); });
    if (descriptor < 0)
        throwSystemError(path);
}

// Checks the open file, because a question by name would be one more trip to a share.
SystemFile::SystemFile(const QString& systemPath) : SystemFile(systemPath, O_RDONLY)
{
    checkMayRead(state(), path);
}

SystemFile::~SystemFile()
{
    if (descriptor >= 0)
        ::close(descriptor);
}

struct stat SystemFile::state() const
{
    struct stat state {};
    if (::fstat(descriptor, &state) != 0)
        throwSystemError(path);
    return state;
}

qint64 SystemFile::size() const
{
    return state().st_size;
}

QByteArray SystemFile::read(qsizetype most)
{
    failOnRequest(path);
    QByteArray bytes(most, Qt::Uninitialized);
    qsizetype have = 0;
    while (have < most) {
        const ssize_t count = ::read(descriptor, bytes.data() + have, static_cast<size_t>(most - have));
        if (count == 0)
            break;
        if (count < 0 && errno != EINTR)
            throwSystemError(path);
        have += qMax<qsizetype>(count, 0);
    }
    bytes.truncate(have);
    return bytes;
}

void SystemFile::write(const QByteArray& bytes)
{
    failOnRequest(path);
    qsizetype done = 0;
    while (done < bytes.size()) {
        const ssize_t count = ::write(descriptor, bytes.constData() + done, static_cast<size_t>(bytes.size() - done));
        if (count < 0 && errno != EINTR)
            throwSystemError(path);
        done += qMax<qsizetype>(count, 0);
    }
}

void SystemFile::cutTo(qint64 size)
{
    failOnRequest(path);
    if (::ftruncate(descriptor, size) != 0)
        throwSystemError(path);
}

void SystemFile::setMode(unsigned mode)
{
    failOnRequest(path);
    if (::fchmod(descriptor, mode) != 0)
        throwSystemError(path);
}

void SystemFile::shareLike(const QString& other)
{
    constexpr mode_t rights = 07777;
    struct stat own {};
    const auto model = stateOf(other);
    if (!model || ::fstat(descriptor, &own) != 0)
        throwSystemError(other);
    if (own.st_gid != model->st_gid && ::fchown(descriptor, uid_t(-1), model->st_gid) != 0)
        throwSystemError(path);
    if ((own.st_mode & rights) != (model->st_mode & rights))
        setMode(model->st_mode & rights);
}

bool SystemFile::lockByte(qint64 at)
{
    struct flock range {};
    range.l_type = F_WRLCK;
    range.l_whence = SEEK_SET;
    range.l_start = at;
    range.l_len = 1;
    if (withoutInterruption([&] { return ::fcntl(descriptor, F_OFD_SETLK, &range); }) == 0)
        return true;
    if (errno != EAGAIN && errno != EACCES)
        throwSystemError(path);
    return false;
}

void SystemFile::commit()
{
    failOnRequest(path);
    if (::fsync(descriptor) != 0 && errno != EINVAL && errno != EROFS)  // some file systems can't do this
        throwSystemError(path);
    const int closing = std::exchange(descriptor, -1);
    if (::close(closing) != 0 && errno != EINTR)
        throwSystemError(path);
}

QString folderOf(const QString& systemPath)
{
    const qsizetype slash = systemPath.lastIndexOf(u'/');
    return slash <= 0 ? u"/"_s : systemPath.first(slash);
}

bool isFile(const QString& systemPath)
{
    const auto state = stateOf(systemPath);
    return state && S_ISREG(state->st_mode);
}

bool isFolder(const QString& systemPath)
{
    const auto state = stateOf(systemPath);
    return state && S_ISDIR(state->st_mode);
}

void checkReadable(const QString& systemPath)
{
    const auto state = stateOf(systemPath);
    if (!state)
        throwFileError(isFolder(folderOf(systemPath)) ? FileNotFound : PathNotFound, systemPath);
    checkMayRead(*state, systemPath);
}

void checkWritable(const QString& systemPath)
{
    const auto state = stateOf(systemPath);
    if (state && (!S_ISREG(state->st_mode) || (state->st_mode & anyoneMayWrite) == 0))
        throwFileError(PermissionDenied, systemPath);
}

void checkFolderWritable(const QString& systemPath)
{
    const auto state = stateOf(folderOf(systemPath));
    if (!state || !S_ISDIR(state->st_mode))
        throwFileError(PathNotFound, systemPath);
    if ((state->st_mode & anyoneMayWrite) == 0)
        throwFileError(PermissionDenied, systemPath);
}

void replaceFile(const QString& target, const QString& spelled, const std::function<void(SystemFile&)>& fill,
                 std::optional<unsigned> mode)
{
    checkFolderWritable(target);
    checkWritable(target);
    const QString temporary = folderOf(target) + u'/' + temporaryName();
    try {
        SystemFile file(temporary, O_WRONLY | O_CREAT | O_EXCL, mode.value_or(0666));
        fill(file);
        if (const auto old = stateOf(target); old && !mode)
            file.setMode(old->st_mode & 07777);
        file.commit();
        renameFile(temporary, target);
    } catch (...) {
        ::unlink(encodedPath(temporary).constData());
        throw;
    }
    // a file in another spelling is renamed last, so that there is always exactly one file
    if (spelled != target)
        renameFile(target, spelled);
}

bool sameVolume(const QString& from, const QString& to)
{
    const auto source = stateOf(from);
    const auto folder = stateOf(folderOf(to));
    return source && folder && source->st_dev == folder->st_dev;
}

void renameFile(const QString& from, const QString& to)
{
    failOnRequest(from);
    if (::rename(encodedPath(from).constData(), encodedPath(to).constData()) != 0)
        throwSystemError(from);
    attempt([&] { commitFolder(folderOf(to)); });  // the file is there now, whether or not this fails
}

void removeFile(const QString& systemPath)
{
    checkFolderWritable(systemPath);
    if (isFolder(systemPath))
        throwFileError(PermissionDenied, systemPath);
    failOnRequest(systemPath);
    if (::unlink(encodedPath(systemPath).constData()) != 0)
        throwSystemError(systemPath);
}

qint64 ageOf(const QString& systemPath)
{
    const auto state = stateOf(systemPath);
    return state ? ::time(nullptr) - state->st_mtime : 0;
}

bool isTemporaryName(const QString& name)
{
    return name.startsWith(".kest-"_L1) && name.endsWith(".tmp"_L1);
}

}  // namespace kest::files
