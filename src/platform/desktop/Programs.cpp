#include "platform/desktop/Programs.h"

#include "platform/RuntimeError.h"

#include <QFileInfo>
#include <QProcess>

namespace kest::desktop {

using namespace Qt::StringLiterals;

void startDetached(const QString& systemPath)
{
    if (!QFileInfo(systemPath).isFile())
        throw RuntimeError(FileNotFound, u"File not found: "_s + systemPath);
    if (!QProcess::startDetached(systemPath, {}))
        throw RuntimeError(PermissionDenied, u"This program can't be started: "_s + systemPath);
}

}  // namespace kest::desktop
