#include "platform/files/Lock.h"

#include "platform/RuntimeError.h"
#include "platform/files/SystemFile.h"
#include "platform/files/files.h"

#include <QCryptographicHash>
#include <QDeadlineTimer>
#include <QThread>
#include <QtEndian>

#include <fcntl.h>

namespace kest::files {

namespace {

/// Returns the byte of the file whose lock belongs to a name. The byte need not exist.
qint64 byteOf(const QString& name)
{
    if (name.isEmpty())
        return 0;
    const QByteArray hash = QCryptographicHash::hash(name.toUtf8(), QCryptographicHash::Sha1);
    return static_cast<qint64>(qFromBigEndian<quint64>(hash.constData()) >> 2);
}

}  // namespace

Lock::Lock(const QString& path, const QString& name, int milliseconds, const QString& like)
{
    constexpr unsigned long pause = 2;  // milliseconds
    const QDeadlineTimer deadline(milliseconds);
    auto opened = std::make_unique<SystemFile>(systemPath(path), O_RDWR | O_CREAT);
    if (!like.isEmpty())
        attempt([&] { opened->shareLike(systemPath(like)); });  // only its owner can do this
    const qint64 byte = byteOf(name);
    while (!opened->lockByte(byte)) {
        if (deadline.hasExpired())
            return;
        QThread::msleep(pause);
    }
    file = std::move(opened);
}

Lock::~Lock() = default;

}  // namespace kest::files
