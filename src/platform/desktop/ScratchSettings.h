// Keeps unattended runs from changing what Qt's own dialogs remember for a person.
#pragma once

#include <QSettings>
#include <QTemporaryDir>

namespace kest::desktop {

/// Once it exists, dialogs of Qt store their last folder and their view in a temporary folder instead of the user's
/// settings, and start as if the user had none. It must live as long as the program shows dialogs.
class ScratchSettings {
public:
    ScratchSettings() { QSettings::setPath(QSettings::NativeFormat, QSettings::UserScope, folder.path()); }

private:
    QTemporaryDir folder;
};

}  // namespace kest::desktop
