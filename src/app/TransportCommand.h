// The command `transport`, and its place in a demo.
#pragma once

#include "loopback/TransportRunner.h"

#include <QString>

namespace kest::app {

enum class TransportMode { Once, Watching, Window };

/// Carries once, or until the program is told to end or its window is closed. `heard` hears of every carry but those of
/// the window, which shows them. False, with a box in place of the window, where another transport works for this
/// profile already.
bool runTransport(TransportMode mode, const TransportRunner::Heard& heard);

/// Puts a program of the name that the panel starts into the component's folder: `command`, told to open the window.
/// It is a text of its own and no link: who replaces it must not hit the command.
void installTransport(const QString& command);

}  // namespace kest::app
