#include "platform/desktop/Programs.h"

#include "platform/RuntimeError.h"
#include "platform/files/files.h"
#include "platform/profile.h"

#include <QFileInfo>
#include <QProcess>

namespace kest::desktop {

using namespace Qt::StringLiterals;

void startDetached(const QString& path)
{
    const QString systemPath = files::systemPath(path);
    if (!QFileInfo(systemPath).isFile())
        throw RuntimeError(FileNotFound, u"File not found: "_s + systemPath);
    QProcess program;
    program.setProgram(systemPath);
    QProcessEnvironment environment = QProcessEnvironment::systemEnvironment();
    environment.insert(u"KEST2_PROFILE"_s, profile::root());  // an option may have chosen another profile
    program.setProcessEnvironment(environment);
    if (!program.startDetached())
        throw RuntimeError(PermissionDenied, u"This program can't be started: "_s + systemPath);
}

}  // namespace kest::desktop
