// The profile: the folder of everything that belongs to one workstation.
#pragma once

#include <QString>

namespace kest::profile {

/// The folder chosen with `setRoot`, else by the variable KEST2_PROFILE, else `kest2` in the user's data directory.
/// An absolute path of this system without a trailing separator; the folder need not exist.
QString root();
void setRoot(const QString& folder);

/// The component's own folder: KEST2_COMPONENT_DIR, else `component/` of the profile.
QString componentFolder();

}  // namespace kest::profile
