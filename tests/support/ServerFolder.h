// Where a server of tests keeps its data.
#pragma once

#include <QDir>
#include <QFileInfo>
#include <QString>

namespace kest::test {

/// A template for QTemporaryDir, in memory if there is such a place: a server waits for the disk at each change of a
/// table, whatever its options.
inline QString serverFolder(const QString& server)
{
    const QFileInfo memory(QStringLiteral("/dev/shm"));
    return (memory.isWritable() ? memory.filePath() : QDir::tempPath()) +
           QStringLiteral("/kest2-%1-XXXXXX").arg(server);
}

}  // namespace kest::test
