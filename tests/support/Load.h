// Loads a message as the list window does after a click on "Load", without the window.
#pragma once

#include "support/Text.h"

namespace kest::test {

/// The message arrives in the unread folder under that name, and goes through LoadXML.
bool load(const Text& message, const Text& fileName = "message.xml");

/// The window's way with a file of the unread folder, the move to the read folder included; false where a failure
/// reaches the window.
bool loadAsTheWindow(const QString& fileName);

}  // namespace kest::test
