#include "support/Places.h"

#include <QDir>
#include <QStorageInfo>

namespace kest::test {

QString checkoutFile(const QString& path)
{
    return QStringLiteral(KEST_SOURCE_DIR "/") + path;
}

QString memoryFolder(const QString& use)
{
    constexpr qint64 room = qint64(1) << 30;
    const QStorageInfo memory(QStringLiteral("/dev/shm"));
    const bool hasRoom = memory.fileSystemType() == "tmpfs" && !memory.isReadOnly() && memory.bytesAvailable() > room;
    return (hasRoom ? memory.rootPath() : QDir::tempPath()) + QStringLiteral("/kest2-%1-XXXXXX").arg(use);
}

}  // namespace kest::test
