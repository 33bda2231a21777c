// Starts another program and leaves it to itself.
#pragma once

#include <QString>

namespace kest::desktop {

/// Starts the program, a path in the host's form, which finds the profile by KEST2_PROFILE. Throws FileNotFound, or PermissionDenied for a file that this system
/// cannot run.
void startDetached(const QString& path);

}  // namespace kest::desktop
