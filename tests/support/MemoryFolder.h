// Chooses the folder in which tests write.
#pragma once

#include <QDir>
#include <QStorageInfo>
#include <QString>

namespace kest::test {

/// Returns a template for QTemporaryDir, in memory if there is room, because databases and safe writes wait for the
/// disk at each change.
inline QString memoryFolder(const QString& use)
{
    constexpr qint64 room = qint64(1) << 30;
    const QStorageInfo memory(QStringLiteral("/dev/shm"));
    const bool hasRoom = memory.fileSystemType() == "tmpfs" && !memory.isReadOnly() && memory.bytesAvailable() > room;
    return (hasRoom ? memory.rootPath() : QDir::tempPath()) + QStringLiteral("/kest2-%1-XXXXXX").arg(use);
}

}  // namespace kest::test
