// The words after `kest2`: options, command and its arguments.
#pragma once

#include <QString>
#include <QStringList>

namespace kest::app {

enum ExitCode : int { Done = 0, Refused = 1, Usage = 2, NoConnection = 3, NeedsAPerson = 4 };

struct CommandLine {
    QString profile;  // empty: the default place
    QString script;   // a file; empty for none
    QString reports;  // a folder; empty for none
    bool json = false;
    QString command;
    QStringList arguments;
    QString error;  // why the words are no command; empty when they are
};

/// Options stand before the command; `--json`, `--profile`, `--script` and `--reports` are taken behind it too, except
/// behind `setting`, whose value may be any text.
CommandLine parsed(const QStringList& words);

QString usage();

}  // namespace kest::app
