#include "platform/profile.h"

#include <QDir>
#include <QStandardPaths>

namespace kest::profile {

namespace {
QString chosenRoot;
}

QString root()
{
    if (!chosenRoot.isEmpty())
        return chosenRoot;
    const QString fromEnvironment = qEnvironmentVariable("KEST2_PROFILE");
    if (!fromEnvironment.isEmpty())
        return QDir::cleanPath(QDir(fromEnvironment).absolutePath());
    return QStandardPaths::writableLocation(QStandardPaths::GenericDataLocation) + QStringLiteral("/kest2");
}

void setRoot(const QString& folder)
{
    chosenRoot = folder.isEmpty() ? QString() : QDir::cleanPath(QDir(folder).absolutePath());
}

QString componentFolder()
{
    const QString fromEnvironment = qEnvironmentVariable("KEST2_COMPONENT_DIR");
    return fromEnvironment.isEmpty() ? root() + QStringLiteral("/component")
                                     : QDir::cleanPath(QDir(fromEnvironment).absolutePath());
}

}  // namespace kest::profile
