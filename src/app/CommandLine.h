// Parses the command line of `kest2`.
#pragma once

#include <QString>
#include <QStringList>

namespace kest::app {

/// The exit codes of `kest2`.
enum ExitCode : int { Done = 0, Refused = 1, Usage = 2, NoConnection = 3, NeedsAPerson = 4 };

/// The options, the command and its arguments.
struct CommandLine {
    QString profile;  // empty: the default place
    QString script;   // a file; empty for none
    QString reports;  // a folder; empty for none
    bool json = false;
    QString command;
    QStringList arguments;
    QString error;  // why the words are not a command; empty if they are
};

/// Parses the words after `kest2`. Options come before the command. `--json`, `--profile`, `--script` and `--reports`
/// are also accepted after it, except after `setting`, whose value may be any text.
CommandLine parsed(const QStringList& words);

/// Returns the text of `kest2 --help`.
QString usage();

}  // namespace kest::app
