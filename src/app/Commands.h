// Runs the commands of `kest2`.
#pragma once

#include "app/CommandLine.h"

namespace kest::app {

/// Runs a command and returns its exit code. Prints the answer on standard output and the boxes on standard error.
/// `line` must have no error, and an application object must exist.
int run(const CommandLine& line);

/// Prints on standard error why a command is not run, and the JSON answer if the line asks for it. Returns `exitCode`.
int refuse(const CommandLine& line, const QString& why, int exitCode);

/// Returns true if the command opens a window for a person.
bool isInteractive(const CommandLine& line);
/// If the command can also do its work without a window, changes `line` to that form and returns true.
bool withoutWindow(CommandLine& line);

}  // namespace kest::app
