// Runs one command of `kest2` and says what it did.
#pragma once

#include "app/CommandLine.h"

namespace kest::app {

/// Runs the command of a line that was parsed without an error, prints its answer on standard output and its boxes on
/// standard error, and gives the exit code. An application object must exist.
int run(const CommandLine& line);

/// Says on standard error why a command is not run, and gives the exit code; the JSON answer comes all the same.
int refuse(const CommandLine& line, const QString& why, int exitCode);

/// True for the commands that open a window for a person.
bool isInteractive(const CommandLine& line);
/// Takes the window off a command that does its work without one too; false for any other.
bool withoutWindow(CommandLine& line);

}  // namespace kest::app
