// The command `transport`, and its installation in a demo shop.
#pragma once

#include "loopback/TransportRunner.h"

#include <QString>

namespace kest::app {

enum class TransportMode { Once, Watching, Window };

/// Runs the transport once, or until the program receives SIGINT or SIGTERM or its window is closed. Calls `heard`
/// after each run, except in the mode Window, in which the window shows it. Returns false if another transport is
/// already running for this profile. In the mode Window, the window that is open comes to the front, and true is
/// returned; if there is none, a box says that a transport is running.
bool runTransport(TransportMode mode, const TransportRunner::Heard& heard);

/// Writes a program to the component's folder that the panel can start as KESTWeb: a shell script that runs `command`
/// and opens the transport's window. It is not a link, so that replacing it can't overwrite the command.
void installTransport(const QString& command);

}  // namespace kest::app
