// Chooses the folder for the data of a test server.
#pragma once

#include <QDir>
#include <QFileInfo>
#include <QString>

namespace kest::test {

/// Returns a template for QTemporaryDir, in memory if possible: even with all options against it, a server waits for
/// the disk at each change of a table.
inline QString serverFolder(const QString& server)
{
    const QFileInfo memory(QStringLiteral("/dev/shm"));
    return (memory.isWritable() ? memory.filePath() : QDir::tempPath()) +
           QStringLiteral("/kest2-%1-XXXXXX").arg(server);
}

}  // namespace kest::test
