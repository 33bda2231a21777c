// Checks for a display.
#pragma once

namespace kest::desktop {

/// Returns true if windows can be shown. Ask before creating a QApplication: without a display, Qt ends the process.
bool hasDisplay();

}  // namespace kest::desktop
