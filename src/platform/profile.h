// The profile: the folder with everything that belongs to a workstation.
#pragma once

#include <QString>

namespace kest::profile {

/// Returns the folder that was set with setRoot(), or else that of the variable KEST2_PROFILE, or else `kest2` in the
/// user's data directory. The path is an absolute path of this system without a separator at the end. The folder may
/// not exist.
QString root();
/// Chooses another profile for this process.
void setRoot(const QString& folder);

/// Returns the component's own folder: that of KEST2_COMPONENT_DIR, or else `component/` in the profile.
QString componentFolder();

}  // namespace kest::profile
