// Whether there is a display to show windows on.
#pragma once

namespace kest::desktop {

/// True where an application object can start: without a display Qt ends the whole process.
bool hasDisplay();

}  // namespace kest::desktop
