// Starts other programs.
#pragma once

#include <QString>

namespace kest::desktop {

/// Starts a program and does not wait for it. `path` is in the host's form; the variable KEST2_PROFILE tells the
/// program the profile. Throws FileNotFound, or PermissionDenied if this system can't run the file.
void startDetached(const QString& path);

}  // namespace kest::desktop
